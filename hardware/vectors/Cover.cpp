// Cover: random blocks that meet situations of the arithmetic which a set lacks.
#include "Cover.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <set>
#include <string>

#include "Blocks.h"
#include "link/FrameSource.h"
#include "link/channel/DefaultScale.h"
#include "link/random/Random.h"
#include "rules/SoftValues.h"
#include "rules/Tail.h"

namespace morvik::vectors {

namespace {

/// The first frame of the code words; other blocks of a set have lower numbers.
constexpr std::uint64_t firstFrame = std::uint64_t{1} << 40;

enum class Kind : std::uint8_t { small, noiseless, noisy, quiet, extreme, uniform };

constexpr std::array<Kind, 6> kinds = {
    Kind::small, Kind::noiseless, Kind::noisy, Kind::quiet, Kind::extreme, Kind::uniform};

std::int8_t soft(int value)
{
    return static_cast<std::int8_t>(value);
}

/// A value of a block without a code word, of 16 random bits.
std::int8_t valueOf(Kind kind, std::uint32_t bits)
{
    if (kind == Kind::small) {
        return soft(static_cast<int>(bits % 5) - 2);  // so that metrics are often equal
    }
    return kind == Kind::extreme ? soft(bits % 2 == 0 ? -128 : 127) : soft(static_cast<int>(bits % 256) - 128);
}

void drawValues(Kind kind, const link::FrameRandom& random, Stimulus& stimulus)
{
    std::uint32_t next = 0;
    for (std::vector<std::int8_t>& stream : stimulus.streams) {
        for (std::size_t i = 0; i < stimulus.K + rules::tailPositions; ++i, ++next) {
            const link::RandomBlock block = random.block(link::random_index::softValues + next / 8);
            stream.push_back(valueOf(kind, block[next % 8 / 2] >> (next % 2 * 16) & 0xFFFF));
        }
    }
}

void drawCodeWord(Kind kind, const Settings& settings, std::uint64_t frame, Stimulus& stimulus)
{
    constexpr int noNoise = 100000;  // 100 dB
    const int noise = kind == Kind::noiseless ? noNoise : settings.milliDecibels;
    const double scale = link::defaultScale(settings.generics.C_ALGORITHM_TYPE, stimulus.K, settings.milliDecibels);
    constexpr double low = 0.25;
    link::Frames frames;
    link::FrameSource(stimulus.K, noise, kind == Kind::quiet ? low * scale : scale, settings.seed)
        .make(frame, 1, frames);
    stimulus.streams = frames.streams;
}

/// The possible ones of those that the settings name.
std::set<unsigned> wanted(const Settings& settings)
{
    const coverage::Core core = coverage::coreOf(settings.generics);
    std::set<unsigned> numbers;
    for (const std::string& name : settings.cover) {
        for (const unsigned number : coverage::situationsNamed(name)) {
            if (!whyImpossible(number, core)) {
                numbers.insert(number);
            }
        }
    }
    return numbers;
}

}  // namespace

std::vector<unsigned> uncovered(const Settings& settings, const coverage::Counts& counts)
{
    std::vector<unsigned> numbers;
    for (const unsigned number : wanted(settings)) {
        if (counts.met(number) == 0) {
            numbers.push_back(number);
        }
    }
    return numbers;
}

std::vector<unsigned> coverSizes(const Settings& settings)
{
    const std::vector<unsigned> sizes = sizesOf(settings);
    return sizes.empty() ? edgeSizes(static_cast<unsigned>(settings.generics.C_NUM_PU)) : sizes;
}

Stimulus drawn(const Settings& settings, std::uint64_t number)
{
    const std::vector<unsigned> sizes = coverSizes(settings);
    const Kind kind = kinds[static_cast<std::size_t>(number % kinds.size())];
    Stimulus stimulus{coverName, {}, sizes[static_cast<std::size_t>(number / kinds.size() % sizes.size())], 0, {}};
    if (kind == Kind::noiseless || kind == Kind::noisy || kind == Kind::quiet) {
        drawCodeWord(kind, settings, firstFrame + number, stimulus);
    } else {
        const link::RandomKey key = link::randomKey(settings.seed);
        drawValues(kind, link::FrameRandom(key, stimulus.K, settings.milliDecibels, firstFrame + number), stimulus);
    }
    return stimulus;
}

void cover(const Settings& settings,
           Core& core,
           coverage::Counts& counts,
           const std::function<void(const Stimulus&)>& keep)
{
    std::vector<unsigned> missing = uncovered(settings, counts);
    std::uint32_t tag = 0;
    for (std::uint64_t number = 0; number < settings.coverLimit && !missing.empty(); ++number) {
        Stimulus stimulus = drawn(settings, number);
        const coverage::CoreCounts met = core.situations(stimulus);
        if (std::any_of(missing.begin(), missing.end(), [&met](unsigned each) { return met.met[each] > 0; })) {
            stimulus.tag = tag++ & rules::tagMask(static_cast<std::uint32_t>(settings.generics.C_TAG_WIDTH));
            counts.add(met);
            keep(stimulus);
            missing = uncovered(settings, counts);
        }
    }
}

}  // namespace morvik::vectors
