// Series: what of the curves can be drawn, and how series look: the same in plots and on pages.
#include "Series.h"

#include <algorithm>
#include <cmath>

namespace report {

bool Rate::canBeDrawn() const
{
    const double place = below ? high : value;
    return std::isfinite(place) && place > 0;
}

bool Rate::hasInterval() const
{
    return std::isfinite(low) && std::isfinite(high);
}

const Quantity bitErrorRate = {"BER", "Bit error rate", [](const Sample& sample) {
                                   return Rate{sample.ber, sample.berLow, sample.berHigh, sample.berBelow};
                               }};
const Quantity blockErrorRate = {"BLER", "Block error rate", [](const Sample& sample) {
                                     return Rate{sample.bler, sample.blerLow, sample.blerHigh, sample.blerBelow};
                                 }};

const std::vector<Colour> colours = {{"#0072b2", "#4aa8e8"},
                                     {"#d55e00", "#ff8a47"},
                                     {"#009e73", "#2cc79b"},
                                     {"#aa3377", "#e888bb"},
                                     {"#e69f00", "#f2b73c"},
                                     {"#56b4e9", "#a5d8f6"},
                                     {"#222222", "#f0f0f0"}};
const Colour referenceColour = {"#6b6b6b", "#a8a8a8"};

namespace {

/// Whether the places of both are the same to the eye.
bool areAlike(const Rate& a, const Rate& b)
{
    if (!a.canBeDrawn() || !b.canBeDrawn() || a.below != b.below) {
        return !a.canBeDrawn() && !b.canBeDrawn();
    }
    constexpr double visible = 0.03;  // decades
    return std::abs(std::log10(a.below ? a.high / b.high : a.value / b.value)) < visible;
}

/// Whether most points of a curve are points of the other as well.
bool covers(const Curve& above, const Curve& below)
{
    const auto alike = std::count_if(below.samples.begin(), below.samples.end(), [&above](const Sample& sample) {
        return std::any_of(above.samples.begin(), above.samples.end(), [&sample](const Sample& other) {
            return other.ebn0 == sample.ebn0 && areAlike(bitErrorRate.of(other), bitErrorRate.of(sample)) &&
                   areAlike(blockErrorRate.of(other), blockErrorRate.of(sample));
        });
    });
    return 2 * static_cast<std::size_t>(alike) > below.samples.size();
}

}  // namespace

Look lookOf(const std::vector<Curve>& curves, std::size_t curve)
{
    const bool reference = curves[curve].reference;
    const auto end = curves.begin() + static_cast<std::ptrdiff_t>(curve);  // of those before it
    const auto before = static_cast<std::size_t>(
        std::count_if(curves.begin(), end, [reference](const Curve& other) { return other.reference == reference; }));
    constexpr std::ptrdiff_t mostLayers = 3;
    const auto layers = std::count_if(end + 1, curves.end(), [&below = *end](const Curve& above) {
        return !above.reference && !below.reference && covers(above, below);
    });
    return {reference ? referenceColour : colours[before % colours.size()],
            before % markers,
            reference ? 1 + before % 3 : 0,
            static_cast<std::size_t>(std::min(layers, mostLayers))};
}

std::vector<Curve> inOrder(const std::vector<Curve>& curves)
{
    std::vector<Curve> ordered = curves;
    std::stable_partition(ordered.begin(), ordered.end(), [](const Curve& curve) { return !curve.reference; });
    return ordered;
}

}  // namespace report
