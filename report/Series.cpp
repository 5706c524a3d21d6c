// Series: which curves can be drawn, and how they look, in plots and on pages alike.
#include "Series.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <iterator>

namespace morvik::report {

bool Rate::canBeDrawn() const
{
    const double place = below ? high : value;
    return std::isfinite(place) && (place > 0 || isLinear);
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

const Quantity throughput = {
    "bits",
    "Throughput in bits per symbol",
    [](const Sample& sample) {
        return Rate{sample.throughput, sample.throughputLow, sample.throughputHigh, false, true};
    },
    true};

std::vector<const Quantity*> quantitiesOf(const std::vector<Curve>& curves)
{
    const bool hasThroughput = std::any_of(curves.begin(), curves.end(), [](const Curve& curve) {
        return !curve.reference && std::any_of(curve.samples.begin(), curve.samples.end(), [](const Sample& sample) {
            return std::isfinite(sample.throughput);
        });
    });
    return hasThroughput ? std::vector{&blockErrorRate, &throughput} : std::vector{&bitErrorRate, &blockErrorRate};
}

const Axis ebn0Axis = {"ebn0", "Eb/N0", "E_b/N_0 (dB)", false, [](const Sample& sample) {
                           return sample.ebn0;
                       }};
const Axis esn0Axis = {"esn0", "Es/N0", "E_s/N_0 (dB)", false, [](const Sample& sample) {
                           return sample.esn0;
                       }};
const Axis iterationAxis = {"iterations", "iterations", "Iterations", true, [](const Sample& sample) {
                                return static_cast<double>(sample.iterations);
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

/// Whether both are at the same place to the eye.
bool areAlike(const Rate& a, const Rate& b)
{
    if (!a.canBeDrawn() || !b.canBeDrawn() || a.below != b.below) {
        return !a.canBeDrawn() && !b.canBeDrawn();
    }
    constexpr double visible = 0.03;  // decades
    return std::abs(std::log10(a.below ? a.high / b.high : a.value / b.value)) < visible;
}

using Rgb = std::array<int, 3>;

/// Colours at equal distances along the colour gradient of a family.
using Way = std::array<Rgb, 4>;
struct Run {
    Way onLight;
    Way onDark;
};
constexpr Run runs[] = {
    {{{{149, 200, 62}, {32, 163, 134}, {43, 111, 172}, {48, 24, 96}}},
     {{{72, 92, 190}, {34, 148, 190}, {86, 204, 140}, {244, 240, 150}}}},
    {{{{245, 178, 50}, {232, 106, 42}, {186, 40, 66}, {84, 12, 56}}},
     {{{176, 48, 88}, {226, 84, 64}, {246, 154, 74}, {252, 232, 160}}}},
    {{{{238, 150, 196}, {194, 84, 164}, {126, 46, 140}, {52, 16, 74}}},
     {{{132, 66, 172}, {190, 96, 190}, {234, 150, 208}, {252, 224, 240}}}},
};

/// The colour at a position along the gradient, 0 to 1.
std::string colourAt(const Way& way, double place)
{
    const double scaled = place * static_cast<double>(way.size() - 1);
    const auto from = std::min(static_cast<std::size_t>(scaled), way.size() - 2);
    std::string text = "#";
    for (std::size_t i = 0; i < 3; ++i) {
        const int start = way.at(from).at(i);
        const double change = (way.at(from + 1).at(i) - start) * (scaled - static_cast<double>(from));
        const auto level = static_cast<unsigned>(std::lround(start + change));
        text += {"0123456789abcdef"[level / 16], "0123456789abcdef"[level % 16]};
    }
    return text;
}

/// A curve's rank in its family.
struct Rank {
    std::size_t family = 0;  // number of earlier families with their own colours
    std::size_t index = 0;
    std::size_t size = 0;
};

bool areFamily(const Curve& a, const Curve& b)
{
    return a.reference == b.reference && !a.family.empty() && a.family == b.family;
}

/// The number of curves before `end` in the curve's family.
std::size_t relatives(const std::vector<Curve>& curves, std::size_t curve, std::size_t end)
{
    return static_cast<std::size_t>(std::count_if(curves.begin(),
                                                  curves.begin() + static_cast<std::ptrdiff_t>(end),
                                                  [&](const Curve& other) { return areFamily(other, curves[curve]); }));
}

Rank rankOf(const std::vector<Curve>& curves, std::size_t curve)
{
    Rank rank = {0, relatives(curves, curve, curve), relatives(curves, curve, curves.size())};
    for (std::size_t i = 0; i < curve && !areFamily(curves[i], curves[curve]); ++i) {
        const bool isFirst = relatives(curves, i, i) == 0;
        rank.family += isFirst && relatives(curves, i, curves.size()) >= smallestRun ? 1U : 0U;
    }
    return rank;
}

Colour colourIn(const Rank& rank)
{
    const Run& run = runs[rank.family % std::size(runs)];
    const double place = static_cast<double>(rank.index) / static_cast<double>(rank.size - 1);
    return {colourAt(run.onLight, place), colourAt(run.onDark, place)};
}

/// Whether most points of the lower curve coincide with points of the upper one.
bool covers(const Curve& above, const Curve& below, const Axis& axis)
{
    const auto alike = std::count_if(below.samples.begin(), below.samples.end(), [&](const Sample& sample) {
        return std::any_of(above.samples.begin(), above.samples.end(), [&](const Sample& other) {
            return axis.of(other) == axis.of(sample) && areAlike(bitErrorRate.of(other), bitErrorRate.of(sample)) &&
                   areAlike(blockErrorRate.of(other), blockErrorRate.of(sample));
        });
    });
    return 2 * static_cast<std::size_t>(alike) > below.samples.size();
}

}  // namespace

std::vector<View> viewsOf(const std::vector<Curve>& curves)
{
    constexpr std::size_t mostCurves = 40;
    const bool isOnEsn0 = std::any_of(curves.begin(), curves.end(), [](const Curve& curve) {
        return !curve.reference && std::any_of(curve.samples.begin(), curve.samples.end(), [](const Sample& sample) {
            return std::isfinite(sample.esn0);
        });
    });
    std::vector<View> views = {{isOnEsn0 ? &esn0Axis : &ebn0Axis, inOrder(curves)}};
    const std::vector<Curve> across = againstIterations(views[0].curves);
    const auto own = std::count_if(across.begin(), across.end(), [](const Curve& curve) { return !curve.reference; });
    if (own > 0 && across.size() <= mostCurves) {
        views.push_back({&iterationAxis, across});
    }
    return views;
}

Look lookOf(const std::vector<Curve>& curves, std::size_t curve, const Axis& axis)
{
    const Curve& drawn = curves[curve];
    const auto end = curves.begin() + static_cast<std::ptrdiff_t>(curve);  // of those before it
    const auto before = static_cast<std::size_t>(std::count_if(
        curves.begin(), end, [&drawn](const Curve& other) { return other.reference == drawn.reference; }));
    if (drawn.reference) {
        return {referenceColour, before % markers, 1 + before % (dashes - 1), 0};
    }
    const Rank rank = rankOf(curves, curve);
    if (rank.size >= smallestRun) {
        // Curves that cover it have nearly the same colour, so layers would not tell neighbours apart.
        return {colourIn(rank), before % markers, before / markers % dashes, 0};
    }
    constexpr std::ptrdiff_t mostLayers = 3;
    const auto layers = std::count_if(
        end + 1, curves.end(), [&](const Curve& above) { return !above.reference && covers(above, drawn, axis); });
    return {colours[before % colours.size()],
            before % markers,
            before / colours.size() % dashes,
            static_cast<std::size_t>(std::min(layers, mostLayers))};
}

std::vector<Curve> inOrder(const std::vector<Curve>& curves)
{
    std::vector<Curve> ordered = curves;
    std::stable_partition(ordered.begin(), ordered.end(), [](const Curve& curve) { return !curve.reference; });
    return ordered;
}

}  // namespace morvik::report
