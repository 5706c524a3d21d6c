// Status: the return codes of the C interface, and the error line of a refused call.
#ifndef MORVIK_SRC_STATUS_H
#define MORVIK_SRC_STATUS_H

#include <cstdint>

namespace morvik::simulation_call {

enum Status : std::int32_t { success = 0, refused = 1, decodeFailed = 2, exceptionRaised = 99 };

/// Writes the error line of a refused call.
Status refuse(const char* reason);

/// Runs a part of a call that may throw, and turns an exception into its error line and status.
template <class Part>
auto guarded(Part part) -> decltype(part())
{
    try {
        return part();
    } catch (...) {
        refuse("Unhandled exception has occurred");
        return exceptionRaised;
    }
}

}  // namespace morvik::simulation_call

#endif
