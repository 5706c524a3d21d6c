// Frames: ranges of frame numbers. A frame is one block of a run, and everything random about it follows from its
// number.
#ifndef MORVIK_SIMULATION_FRAMES_H
#define MORVIK_SIMULATION_FRAMES_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace morvik::simulation {

/// The frames from `from` up to, but without, `to`.
struct FrameRange {
    std::uint64_t from = 0;
    std::uint64_t to = 0;
};

inline bool operator==(const FrameRange& a, const FrameRange& b)
{
    return a.from == b.from && a.to == b.to;
}

/// The range that the text FROM:TO writes; nothing if it is no such text or the range is empty or reversed.
std::optional<FrameRange> parseFrameRange(std::string_view text);

/// Any number of frames, as disjoint ranges in ascending order with gaps between them.
class FrameSet {
public:
    FrameSet() = default;
    explicit FrameSet(FrameRange range);

    /// Adds the frames of the other; refuses, and returns false, if both have some frame.
    bool join(const FrameSet& other);

    /// Whether a frame is among them.
    bool has(std::uint64_t frame) const;

    /// How many frames there are.
    std::uint64_t size() const;

    const std::vector<FrameRange>& ranges() const;

    /// The ranges as FROM:TO, with a space between them.
    std::string text() const;

    /// The frames that text() has written; nothing if it is no such text.
    static std::optional<FrameSet> parse(std::string_view text);

private:
    std::vector<FrameRange> itsRanges;
};

}  // namespace morvik::simulation

#endif
