// Frames: ranges of frame numbers. A frame is one block of a run; its number determines everything random in it.
#ifndef MORVIK_SIMULATION_FRAMES_H
#define MORVIK_SIMULATION_FRAMES_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace morvik::simulation {

/// The half-open range of frames [from, to).
struct FrameRange {
    std::uint64_t from = 0;
    std::uint64_t to = 0;
};

inline bool operator==(const FrameRange& a, const FrameRange& b)
{
    return a.from == b.from && a.to == b.to;
}

/// Parses FROM:TO. Returns nothing if the text is malformed or the range is empty or reversed.
std::optional<FrameRange> parseFrameRange(std::string_view text);

/// A set of frames: disjoint ranges in ascending order with gaps between them.
class FrameSet {
public:
    FrameSet() = default;
    explicit FrameSet(FrameRange range);

    /// Adds the frames of another set. Returns false and adds none if the sets overlap.
    bool join(const FrameSet& other);

    /// Whether the set contains the frame.
    bool has(std::uint64_t frame) const;

    /// The number of frames.
    std::uint64_t size() const;

    const std::vector<FrameRange>& ranges() const;

    /// The ranges as FROM:TO, separated by spaces.
    std::string text() const;

    /// Parses the output of text(); nothing if it is malformed.
    static std::optional<FrameSet> parse(std::string_view text);

private:
    std::vector<FrameRange> itsRanges;
};

}  // namespace morvik::simulation

#endif
