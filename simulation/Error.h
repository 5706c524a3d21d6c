// Error: what a simulation cannot go on with.
#ifndef MORVIK_SIMULATION_ERROR_H
#define MORVIK_SIMULATION_ERROR_H

#include <stdexcept>
#include <string>

namespace simulation {

/// Something is wrong with what the user gave or with a file. The text is one line.
class Error : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// "FILE: cannot be ACTION: " and the operating system's reason for the failure just seen, errno.
Error fileError(const std::string& file, const std::string& action);

}  // namespace simulation

#endif
