// Received: the code blocks of a set's transport blocks, as they come out of rate recovery.
//
// Each transport block gives its code blocks after each of its transmissions, whether the earlier ones would have been
// enough or not, so that a set's size does not depend on decoding.
#ifndef MORVIK_HARDWARE_VECTORS_RECEIVED_H
#define MORVIK_HARDWARE_VECTORS_RECEIVED_H

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "Block.h"
#include "Settings.h"
#include "link/coding/TransportBlock.h"

namespace morvik::vectors {

/// The name of these blocks.
constexpr char receivedName[] = "rate_recovered";

/// How many there are.
std::uint64_t countOfReceived(const Settings& settings);

/// Where the block of a number below countOfReceived() comes from.
Origin originOf(const Settings& settings, std::uint64_t number);

/// "transport block 3 of format 0, code block 1, 2 transmissions".
std::string textOf(const Origin& origin);

/// The size K of a code block.
unsigned sizeOf(const Settings& settings, const Origin& origin);

/// Calls `take` with all of them, in the order of their numbers. Tags are left to `take`.
void forEachReceived(const Settings& settings, const std::function<void(Stimulus&)>& take);

/// The CRCs of decisions on code blocks.
class CrcCheck {
public:
    /// The settings must outlive the check.
    explicit CrcCheck(const Settings& settings);

    /// Whether the CRC of sizeOf() decisions fits: the code block's own or, if it is alone, the transport block's.
    bool fits(const Origin& origin, const std::vector<std::uint8_t>& bits);

private:
    const Settings& itsSettings;
    std::optional<link::TransportBlockCode> itsCode;
    std::uint32_t itsFormat = 0;  // that itsCode is of
};

}  // namespace morvik::vectors

#endif
