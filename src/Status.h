// Status: how a call of the C interface ends, and its line when it is refused.
#ifndef MORVIK_SRC_STATUS_H
#define MORVIK_SRC_STATUS_H

#include <cstdint>

namespace morvik::simulation_call {

enum Status : std::int32_t { success = 0, refused = 1, decodeFailed = 2, exceptionRaised = 99 };

/// Writes the line of a refusal.
Status refuse(const char* reason);

/// Runs a part of a call that may throw: exhausted memory becomes the line and the status of an exception.
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
