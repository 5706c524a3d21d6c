// TextFile: reads a file as a whole.
#ifndef MORVIK_SIMULATION_TEXTFILE_H
#define MORVIK_SIMULATION_TEXTFILE_H

#include <string>

namespace simulation {

/// The content of a file. Throws Error.
std::string readText(const std::string& fileName);

}  // namespace simulation

#endif
