// ResultFiles: results as CSV and JSON.
#ifndef MORVIK_SIMULATION_RESULTFILES_H
#define MORVIK_SIMULATION_RESULTFILES_H

#include <string>

#include "Results.h"

namespace morvik::simulation {

enum class ResultFormat { csv, json };

/// The format of the file name's extension, .csv or .json. Throws Error for any other.
ResultFormat formatOf(const std::string& fileName);

/// Format results as the content of a file.
std::string csvText(const Results& results);
std::string jsonText(const Results& results);

/// Writes results atomically, in the format of the file name's extension. Throws Error.
void writeResults(const std::string& fileName, const Results& results);

/// Reads a file of either format. Throws Error that says where the file is wrong.
Results readResults(const std::string& fileName);

/// Parses the content of such a file.
Results parseResults(const std::string& text, const std::string& fileName);

}  // namespace morvik::simulation

#endif
