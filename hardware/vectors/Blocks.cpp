// Blocks: the stimuli of a set, random and directed.
#include "Blocks.h"

#include <algorithm>
#include <set>
#include <string>
#include <utility>

#include "Received.h"
#include "hardware/testbench/SoftBlock.h"
#include "link/FrameSource.h"
#include "link/channel/DefaultScale.h"
#include "link/coding/CodeBlocks.h"
#include "rules/BlockSizes.h"
#include "rules/Cut.h"
#include "rules/SoftValues.h"

namespace morvik::vectors {

namespace {

constexpr std::int8_t lowest = -128;
constexpr std::int8_t highest = 127;
constexpr unsigned mostRows = 3;

/// Frame numbers of random blocks continue from size to size; directed blocks have numbers of their own, from this one
/// on.
constexpr std::uint64_t firstDirectedFrame = std::uint64_t{1} << 32;

/// A soft value by its stream, 0 to 2, its position, and whether that belongs to the tail.
using Pattern = std::int8_t (*)(unsigned stream, unsigned position, bool isTail);

struct NamedPattern {
    const char* name;
    Pattern pattern;
};

std::int8_t extreme(bool isHighest)
{
    return isHighest ? highest : lowest;
}

/// -1, 0 and 1, so small that metrics are often equal. The low bits of the product look random.
std::int8_t tie(unsigned stream, unsigned position, bool)
{
    const std::uint32_t mixed = (3 * position + stream + 1) * 2654435761U;  // 2^32 over the golden ratio
    return static_cast<std::int8_t>(static_cast<int>((mixed >> 16) % 3) - 1);
}

constexpr NamedPattern patterns[] = {
    {"zeros",
     [](unsigned, unsigned, bool) {
         return std::int8_t{0};
     }},
    {"highest",
     [](unsigned, unsigned, bool) {
         return highest;
     }},
    {"lowest",
     [](unsigned, unsigned, bool) {
         return lowest;
     }},
    {"ties", tie},
    {"alternating_positions",
     [](unsigned, unsigned position, bool) {
         return extreme(position % 2 == 0);
     }},
    {"alternating_streams",
     [](unsigned stream, unsigned position, bool) {
         return extreme((stream + position) % 2 == 0);
     }},
    {"opposed_parities",
     [](unsigned stream, unsigned, bool) {
         return extreme(stream != 1);
     }},
    {"opposed_tail",
     [](unsigned, unsigned, bool isTail) {
         return extreme(isTail);
     }},
};

/// Builds stimuli and hands them on, with tags 0, 1, 2 ... cut to the tag width.
class Source {
public:
    Source(const Settings& settings, const std::function<void(const Stimulus&)>& take)
        : itsSettings(settings), itsTake(take)
    {
    }

    void takeRandom(const std::string& name, unsigned K, std::uint64_t frame)
    {
        takeFrame(name, K, frame, nextTag());
    }

    void takeFrame(const std::string& name, unsigned K, std::uint64_t frame, std::uint32_t tag)
    {
        Stimulus stimulus{name, {}, K, tag, received(K, frame).streams};
        itsTake(stimulus);
    }

    /// A code block as it comes out of rate recovery.
    void takeReceived(Stimulus& stimulus)
    {
        stimulus.tag = nextTag();
        itsTake(stimulus);
    }

    /// A noiseless code word at full amplitude.
    void takeSaturated(unsigned K, std::uint64_t frame)
    {
        Stimulus stimulus{"saturated_code_word", {}, K, nextTag(), received(K, frame, noNoise).streams};
        for (std::vector<std::int8_t>& stream : stimulus.streams) {
            for (std::int8_t& value : stream) {
                value = extreme(value > 0);
            }
        }
        itsTake(stimulus);
    }

    void takePattern(const NamedPattern& named, unsigned K)
    {
        Stimulus stimulus{named.name, {}, K, nextTag(), {}};
        for (unsigned stream = 0; stream < stimulus.streams.size(); ++stream) {
            for (unsigned position = 0; position < K + rules::tailPositions; ++position) {
                stimulus.streams[stream].push_back(named.pattern(stream, position, position >= K));
            }
        }
        itsTake(stimulus);
    }

private:
    static constexpr int noNoise = 100000;  // 100 dB

    link::Frames received(unsigned K, std::uint64_t frame, int milliDecibels) const
    {
        const double scale = link::defaultScale(itsSettings.generics.C_ALGORITHM_TYPE, K, itsSettings.milliDecibels);
        link::Frames frames;
        link::FrameSource(K, milliDecibels, scale, itsSettings.seed).make(frame, 1, frames);
        return frames;
    }

    link::Frames received(unsigned K, std::uint64_t frame) const
    {
        return received(K, frame, itsSettings.milliDecibels);
    }

    std::uint32_t nextTag()
    {
        return itsTag++ & rules::tagMask(static_cast<std::uint32_t>(itsSettings.generics.C_TAG_WIDTH));
    }

    const Settings& itsSettings;
    const std::function<void(const Stimulus&)>& itsTake;
    std::uint32_t itsTag = 0;
};

void takeDirected(const Settings& settings, Source& source)
{
    std::uint64_t frame = firstDirectedFrame;
    for (const unsigned K : sizesOf(settings)) {
        for (const NamedPattern& named : patterns) {
            source.takePattern(named, K);
        }
        source.takeSaturated(K, frame++);
    }
    const auto units = static_cast<unsigned>(settings.generics.C_NUM_PU);
    for (const unsigned K : edgeSizes(units)) {
        const rules::Cut cut(K, units);
        source.takeRandom(
            "size_of_" + std::to_string(cut.segments()) + "_segments_" + std::to_string(cut.rows()) + "_rows",
            K,
            frame++);
    }
    for (const std::uint32_t tag : edgeTags(static_cast<unsigned>(settings.generics.C_TAG_WIDTH))) {
        source.takeFrame("tag_" + std::to_string(tag), rules::blockSizes.front().K, frame++, tag);
    }
}

}  // namespace

std::vector<unsigned> sizesOf(const Settings& settings)
{
    if (settings.transport.empty()) {
        return settings.blockSizes;
    }
    std::set<unsigned> sizes;
    for (const simulation::Point& point : settings.transport) {
        const link::CodeBlocks blocks = link::codeBlocksOf(point.link.transportBlockSize);
        for (const unsigned r : {0U, blocks.count - 1}) {  // smaller sizes come first
            sizes.insert(blocks.size(r));
        }
    }
    return {sizes.begin(), sizes.end()};
}

void forEachStimulus(const Settings& settings, const std::function<void(const Stimulus&)>& take)
{
    Source source(settings, take);
    forEachReceived(settings, [&source](Stimulus& stimulus) { source.takeReceived(stimulus); });
    for (const unsigned K : settings.blockSizes) {
        for (unsigned frame = 0; frame < settings.blocks; ++frame) {
            source.takeRandom(randomName, K, frame);
        }
    }
    if (settings.directed) {
        takeDirected(settings, source);
    }
}

std::vector<unsigned> edgeSizes(unsigned units)
{
    std::vector<unsigned> sizes = {rules::blockSizes.front().K};
    for (std::size_t i = 1; i < rules::blockSizes.size(); ++i) {
        const unsigned before = rules::blockSizes[i - 1].K;
        const unsigned K = rules::blockSizes[i].K;
        const rules::Cut cutBefore(before, units);
        const rules::Cut cut(K, units);
        const bool isOther = cut.segments() != cutBefore.segments() || cut.rows() != cutBefore.rows();
        if (isOther && std::min(cut.rows(), cutBefore.rows()) <= mostRows) {
            sizes.push_back(before);
            sizes.push_back(K);
        }
    }
    sizes.push_back(rules::blockSizes.back().K);
    sizes.erase(std::unique(sizes.begin(), sizes.end()), sizes.end());
    return sizes;
}

std::vector<std::uint32_t> edgeTags(unsigned width)
{
    const std::uint64_t above = std::uint64_t{1} << width;
    const auto tag = [](std::uint64_t value) {
        return static_cast<std::uint32_t>(value);
    };
    std::vector<std::uint32_t> tags = {0, 1, tag(above - 1), tag(above), tag(above + 1), 0xFFFFFFFF};
    std::sort(tags.begin(), tags.end());
    tags.erase(std::unique(tags.begin(), tags.end()), tags.end());
    return tags;
}

}  // namespace morvik::vectors
