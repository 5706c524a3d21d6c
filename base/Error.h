// Error: the errors that a program reports to its user.
#ifndef MORVIK_BASE_ERROR_H
#define MORVIK_BASE_ERROR_H

#include <stdexcept>
#include <string>

namespace morvik::base {

/// An error in the user's input or in accessing a file. The text is one line.
class Error : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// "FILE: cannot be ACTION: REASON", with the text of errno.
Error fileError(const std::string& file, const std::string& action);

}  // namespace morvik::base

#endif
