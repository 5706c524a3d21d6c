// Frames: ranges of frame numbers. A frame is one block of a run; its number determines everything random in it.
#include "Frames.h"

#include <algorithm>
#include <numeric>
#include <utility>
#include "base/Numbers.h"

namespace morvik::simulation {

namespace {

/// Sorts the ranges and joins adjacent ones; nothing if any overlap.
std::optional<std::vector<FrameRange>> joinedRanges(std::vector<FrameRange> all)
{
    std::sort(all.begin(), all.end(), [](const FrameRange& a, const FrameRange& b) { return a.from < b.from; });
    std::vector<FrameRange> joined;
    for (const FrameRange& range : all) {
        if (joined.empty() || joined.back().to < range.from) {
            joined.push_back(range);
        } else if (joined.back().to == range.from) {
            joined.back().to = range.to;
        } else {
            return std::nullopt;
        }
    }
    return joined;
}

}  // namespace

std::optional<FrameRange> parseFrameRange(std::string_view text)
{
    const std::size_t colon = text.find(':');
    if (colon == std::string_view::npos) {
        return std::nullopt;
    }
    const auto from = base::parseNumber<std::uint64_t>(text.substr(0, colon));
    const auto to = base::parseNumber<std::uint64_t>(text.substr(colon + 1));
    if (!from || !to || *from >= *to) {
        return std::nullopt;
    }
    return FrameRange{*from, *to};
}

FrameSet::FrameSet(FrameRange range)
{
    if (range.from < range.to) {
        itsRanges.push_back(range);
    }
}

bool FrameSet::join(const FrameSet& other)
{
    std::vector<FrameRange> all = itsRanges;
    all.insert(all.end(), other.itsRanges.begin(), other.itsRanges.end());
    auto joined = joinedRanges(std::move(all));
    if (!joined) {
        return false;
    }
    itsRanges = std::move(*joined);
    return true;
}

bool FrameSet::has(std::uint64_t frame) const
{
    return std::any_of(itsRanges.begin(), itsRanges.end(), [frame](const FrameRange& range) {
        return range.from <= frame && frame < range.to;
    });
}

std::uint64_t FrameSet::size() const
{
    return std::accumulate(
        itsRanges.begin(), itsRanges.end(), std::uint64_t{0}, [](std::uint64_t sum, const FrameRange& range) {
            return sum + (range.to - range.from);
        });
}

const std::vector<FrameRange>& FrameSet::ranges() const
{
    return itsRanges;
}

std::string FrameSet::text() const
{
    std::string text;
    for (const FrameRange& range : itsRanges) {
        text += (text.empty() ? "" : " ") + std::to_string(range.from) + ':' + std::to_string(range.to);
    }
    return text;
}

std::optional<FrameSet> FrameSet::parse(std::string_view text)
{
    std::vector<FrameRange> ranges;
    while (!text.empty()) {
        const std::string_view first = text.substr(0, text.find(' '));
        const auto range = parseFrameRange(first);
        if (!range) {
            return std::nullopt;
        }
        ranges.push_back(*range);
        text.remove_prefix(std::min(first.size() + 1, text.size()));
    }
    auto joined = joinedRanges(std::move(ranges));
    if (!joined) {
        return std::nullopt;
    }
    FrameSet frames;
    frames.itsRanges = *std::move(joined);
    return frames;
}

}  // namespace morvik::simulation
