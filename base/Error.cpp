// Error: the errors that a program reports to its user.
#include "Error.h"

#include <cerrno>
#include <system_error>

namespace morvik::base {

Error fileError(const std::string& file, const std::string& action)
{
    return Error(file + ": cannot be " + action + ": " + std::generic_category().message(errno));
}

}  // namespace morvik::base
