// Warnings: what a user should know of a run beside its results.
#include "Warnings.h"

#include <algorithm>
#include <charconv>

#include "LinkFormats.h"
#include "LinkWords.h"
#include "base/Numbers.h"
#include "base/Text.h"

namespace morvik::simulation {

std::string highRateWarning(const Plan& plan)
{
    constexpr double skipped = 0.931;
    std::vector<LinkFormat> high;
    for (const Point& point : plan.points) {
        const bool isNew = high.empty() || !(high.back() == point.link);
        if (isNew && point.link.hasTransportBlocks() && effectiveRate(point.link) > skipped) {
            high.push_back(point.link);
        }
    }
    if (high.empty()) {
        return "";
    }
    const LinkFormat& highest = *std::max_element(
        high.begin(), high.end(), [](const auto& a, const auto& b) { return effectiveRate(a) < effectiveRate(b); });
    return "the code rate with CRCs is " + base::numberText(effectiveRate(highest), std::chars_format::fixed, 3) +
           " for " +
           (highest.mcs
                ? "MCS " + mcsText(highest.mcs)
                : "A = " + std::to_string(highest.transportBlockSize) + ", G = " + std::to_string(highest.codedBits)) +
           (high.size() > 1 ? ", the highest of " + std::to_string(high.size()) + " above 0.931" : "") +
           ": above 0.931, a terminal may leave out decoding (3GPP TS 36.213, 7.1.7)";
}

std::string narrowBufferWarning(const Plan& plan)
{
    constexpr unsigned enough = 6;  // bits (docs/scale.md)
    unsigned narrowest = enough;
    for (const Point& point : plan.points) {
        const unsigned bits = point.link.softBufferBits;
        if (!point.scaleOption && bits != 0) {
            narrowest = std::min(narrowest, bits);
        }
    }
    return narrowest == enough ? ""
                               : "soft buffers of " + std::to_string(narrowest) +
                                     " bits saturate with the automatic scale, which suits 6 bits or more; a smaller "
                                     "scale, such as 2, may decode more blocks";
}

std::string unfallenWarning(const Plan& plan, const std::vector<PointResult>& ended)
{
    constexpr double most = 0.01;
    const std::vector<PointResult> ends = unfallenEnds(plan, ended, most);
    if (ends.empty()) {
        return "";
    }
    const Tally& tally = ends.front().tally;
    const Point& point = plan.points[ends.front().number];
    const double rate = static_cast<double>(tally.errors.back().blockErrors) / static_cast<double>(tally.blocks);
    return (ends.size() > 1 ? base::counted(ends.size(), "curve") + " end" : "a curve ends") +
           " at a block error rate above 0.01: " + base::numberText(rate, std::chars_format::general, 2) + " at " +
           placeText(point) + ", " + curveText(point) + "; --esn0 or --ebn0 sets the range";
}

}  // namespace morvik::simulation
