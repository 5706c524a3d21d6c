// Cases: the noisy blocks of the conformance file, with what the components of the model decide.
#include "Cases.h"

#include <array>
#include <sstream>
#include <stdexcept>

#include "link/FrameSource.h"
#include "link/channel/DefaultScale.h"

namespace morvik::conformance {

namespace {

constexpr std::uint64_t seed = 36212;

/// How a block is made. The noise is chosen so that wrong bits are left, and other decoders leave others.
struct Recipe {
    unsigned K;
    int milliDecibels;
    unsigned iterations;
    double loudness;  ///< times the usual scale
};

/// For each configuration. The loud ones have values at both ends of the range.
constexpr std::array<Recipe, 6> recipes{{
    {40, 500, 1, 1},
    {40, 500, 2, 1},
    {40, 1000, 8, 1},
    {40, 0, 15, 8},
    {512, 500, 5, 1},
    {2112, 0, 4, 2},  // large enough for eight units to cut it otherwise than four
}};

/// For three configurations that have every number of units and every algorithm among them.
constexpr Recipe largest{6144, 100, 4, 1};

Case make(const Recipe& recipe, int units, int algorithm, std::uint64_t number)
{
    const double scale = recipe.loudness * morvik::link::defaultScale(algorithm, recipe.K, recipe.milliDecibels);
    morvik::link::FrameSource source(recipe.K, recipe.milliDecibels, scale, seed);
    morvik::link::Frames frames;
    source.make(number, 1, frames);
    const auto stream = [&](unsigned s) {
        return blocks::Stream(frames.streams[s].begin(), frames.streams[s].end());
    };
    Case made{recipe.K, units, algorithm, recipe.iterations, {stream(0), stream(1), stream(2)}, {}};
    blocks::Decoder decoder(units, algorithm);
    decoder.decodeByComponents();
    made.bits = decoder.decode(made.soft, made.iterations).bits;
    return made;
}

int next(std::istream& text, int first, int last)
{
    int value = 0;
    if (!(text >> value) || value < first || value > last) {
        throw std::runtime_error("A number is missing or out of its range");
    }
    return value;
}

}  // namespace

std::vector<Case> makeCases()
{
    std::vector<Case> cases;
    for (const int units : {2, 4, 8}) {
        for (const int algorithm : {0, 1, 2}) {
            for (const Recipe& recipe : recipes) {
                cases.push_back(make(recipe, units, algorithm, cases.size()));
            }
        }
    }
    cases.push_back(make(largest, 2, 0, cases.size()));
    cases.push_back(make(largest, 4, 1, cases.size()));
    cases.push_back(make(largest, 8, 2, cases.size()));
    return cases;
}

std::string textOf(const std::vector<Case>& cases)
{
    std::ostringstream text;
    text << cases.size() << '\n';
    for (const Case& each : cases) {
        text << each.K << ' ' << each.units << ' ' << each.algorithm << ' ' << each.iterations << '\n';
        for (unsigned i = 0; i < each.K + 4; ++i) {
            text << each.soft.sys[i] << ' ' << each.soft.par1[i] << ' ' << each.soft.par2[i] << '\n';
        }
        const char* separator = "";
        for (const std::uint8_t bit : each.bits) {
            text << separator << unsigned{bit};
            separator = " ";
        }
        text << '\n';
    }
    return text.str();
}

std::vector<Case> readCases(std::istream& text)
{
    std::vector<Case> cases(static_cast<std::size_t>(next(text, 1, 1000)));
    for (Case& each : cases) {
        each.K = static_cast<unsigned>(next(text, 40, 6144));
        each.units = next(text, 2, 8);
        each.algorithm = next(text, 0, 2);
        each.iterations = static_cast<unsigned>(next(text, 1, 15));
        for (unsigned i = 0; i < each.K + 4; ++i) {
            for (blocks::Stream* stream : {&each.soft.sys, &each.soft.par1, &each.soft.par2}) {
                stream->push_back(next(text, -128, 127));
            }
        }
        for (unsigned i = 0; i < each.K; ++i) {
            each.bits.push_back(static_cast<std::uint8_t>(next(text, 0, 1)));
        }
    }
    return cases;
}

}  // namespace morvik::conformance
