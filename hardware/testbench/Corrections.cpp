// Corrections: the correction table of algorithm type 2.
#include "Corrections.h"

#include <cstdint>
#include <limits>
#include <vector>

namespace morvik {

namespace {

unsigned char entryOf(std::int32_t difference)
{
    const std::int32_t eighths = rules::correction(
        difference, correctionEntryBits, 1U << log2CorrectionPoints, rules::stateAlignment, 1U << rules::fractionBits);
    return static_cast<unsigned char>(rules::shiftLeftWrap(eighths, rules::stateAlignment));
}

}  // namespace

const unsigned char* corrections()
{
    using Difference = std::numeric_limits<std::int16_t>;
    static const std::vector<unsigned char> table = [] {
        std::vector<unsigned char> entries;
        entries.reserve(rules::correctionEntries);
        for (std::int32_t difference = Difference::min(); difference <= Difference::max(); ++difference) {
            entries.push_back(entryOf(difference));
        }
        return entries;
    }();
    return table.data() + table.size() / 2;
}

}  // namespace morvik
