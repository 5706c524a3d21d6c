// Error: what a program cannot go on with.
#ifndef MORVIK_BASE_ERROR_H
#define MORVIK_BASE_ERROR_H

#include <stdexcept>
#include <string>

namespace morvik::base {

/// Something is wrong with what the user gave or with a file. The text is one line.
class Error : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// "FILE: cannot be ACTION: " and the operating system's reason for the failure just seen, errno.
Error fileError(const std::string& file, const std::string& action);

}  // namespace morvik::base

#endif
