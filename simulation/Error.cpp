// Error: what a simulation cannot go on with.
#include "Error.h"

#include <cerrno>
#include <system_error>

namespace simulation {

Error fileError(const std::string& file, const std::string& action)
{
    return Error(file + ": cannot be " + action + ": " + std::generic_category().message(errno));
}

}  // namespace simulation
