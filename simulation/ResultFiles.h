// ResultFiles: results as CSV and JSON.
#ifndef MORVIK_SIMULATION_RESULTFILES_H
#define MORVIK_SIMULATION_RESULTFILES_H

#include <string>

#include "Results.h"

namespace morvik::simulation {

enum class ResultFormat { csv, json };

/// The format that the ending of the name asks for, .csv or .json. Throws Error for any other.
ResultFormat formatOf(const std::string& fileName);

/// The content of a file of results.
std::string csvText(const Results& results);
std::string jsonText(const Results& results);

/// Writes a file of results, atomically, in the format that its name asks for. Throws Error.
void writeResults(const std::string& fileName, const Results& results);

/// Reads a file of either format. Throws Error with the place of what is wrong.
Results readResults(const std::string& fileName);

/// Reads the content of such a file.
Results parseResults(const std::string& text, const std::string& fileName);

}  // namespace morvik::simulation

#endif
