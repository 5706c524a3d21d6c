// Cut: how the core cuts a block into segments and windows, and which unit and thread works on a trellis step.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_RULES_CUT_H
#define MORVIK_RULES_CUT_H

#include <algorithm>
#include <cstdint>

namespace morvik::rules {

/// Hardware threads of each processing unit.
constexpr std::uint32_t threadsOfUnit = 4;

/// Steps of a window at most, and of a segment at least where there is more than one.
constexpr std::uint32_t longestWindow = 64;

/// The number of segments doubles until every thread has one or they would become shorter than 64 steps
/// (rule 17).
constexpr std::uint32_t segmentCount(std::uint32_t K, std::uint64_t threads)
{
    std::uint64_t count = 1;
    while (count < threads && 2 * count * longestWindow <= K) {
        count *= 2;
    }
    return static_cast<std::uint32_t>(count);
}

/// Of windows that are numbered row by row, that which starts at the step where window `number`, other than 0,
/// ends: the one before it in its segment, or the last one of the segment before (rule 20).
template <class Number>
constexpr Number windowBefore(Number number, Number segments, Number windows)
{
    return number >= segments ? number - segments : windows - segments + number - 1;
}

/// A window of the backward recursion, which runs from its last step down to its first.
struct Window {
    std::uint32_t row;  ///< which window of its segment, from the segment's start
    std::uint32_t segment;
    std::uint32_t first;  ///< trellis step
    std::uint32_t last;
};

/// Where a trellis step is computed.
struct StepPlace {
    std::uint32_t segment;
    std::uint32_t row;  ///< of its window
    std::uint32_t unit;
    std::uint32_t thread;  ///< of the unit
};

/// A block of K bits, cut for a number of units. Windows are numbered in the order in which the backward recursion
/// takes them: one of each segment, row by row. Neighbouring segments share a unit; where there are fewer segments than
/// threads, they are dealt to as many units as there are, since those compute at the same time.
class Cut {
public:
    /// No block.
    constexpr Cut() : Cut(0, 1) {}

    constexpr Cut(std::uint32_t K, std::uint32_t units, std::uint32_t threadsOfEach = threadsOfUnit)
        : itsK(K),
          itsUnits(units),
          itsSegments(segmentCount(K, std::uint64_t{units} * threadsOfEach)),
          itsLength(K / itsSegments)
    {
    }

    constexpr std::uint32_t K() const
    {
        return itsK;
    }

    constexpr std::uint32_t units() const
    {
        return itsUnits;
    }

    /// Whether the segments are equally long; the core refuses a block in which they are not (rule 17).
    constexpr bool dividesEvenly() const
    {
        return itsK == itsSegments * itsLength;
    }

    constexpr std::uint32_t segments() const
    {
        return itsSegments;
    }

    /// In trellis steps.
    constexpr std::uint32_t segmentLength() const
    {
        return itsLength;
    }

    /// Windows of each segment (rule 18).
    constexpr std::uint32_t rows() const
    {
        return fullRows() + (rest() > longestWindow ? 2 : rest() > 0 ? 1 : 0);
    }

    /// The first step of a segment's window, counted from the segment's start: windows of 64 steps while 128 or more
    /// remain, then the rest, whose 65 to 127 steps are two halves, the longer one first (rule 18). Behind the last
    /// window, the segment's end.
    constexpr std::uint32_t windowStart(std::uint32_t row) const
    {
        if (row <= fullRows()) {
            return longestWindow * row;
        }
        return row < rows() ? longestWindow * fullRows() + (rest() + 1) / 2 : itsLength;
    }

    constexpr std::uint32_t windowLength(std::uint32_t row) const
    {
        return windowStart(row + 1) - windowStart(row);
    }

    /// Of all segments.
    constexpr std::uint32_t windows() const
    {
        return itsSegments * rows();
    }

    constexpr Window window(std::uint32_t number) const
    {
        return windowOf(number % itsSegments, number / itsSegments);
    }

    /// The window of a step from 0 to K + 2; the tail belongs to the last one.
    constexpr Window windowAt(std::uint32_t step) const
    {
        const StepPlace place = placeOf(step);
        return windowOf(place.segment, place.row);
    }

    constexpr StepPlace placeOf(std::uint32_t step) const
    {
        const std::uint32_t ofBlock = std::min(step, itsK - 1);
        const std::uint32_t segment = ofBlock / itsLength;
        return {segment, rowOf(ofBlock % itsLength), segment / segmentsOfUnit(), segment % segmentsOfUnit()};
    }

    /// Units that have a segment.
    constexpr std::uint32_t unitsAtWork() const
    {
        return itsSegments / segmentsOfUnit();
    }

    constexpr std::uint32_t segmentsOfUnit() const
    {
        return std::max(itsSegments / itsUnits, 1U);
    }

    /// Whether the forward recursion of a segment starts at the step.
    constexpr bool startsSegment(std::uint32_t step) const
    {
        return step < itsK && step % itsLength == 0;
    }

    /// Whether no window follows: the backward recursion starts from the tail (rule 20).
    constexpr bool startsAtTail(const Window& window) const
    {
        return window.last + 1 == itsK;
    }

    /// Whether, but in the first pass, the window starts from a column of the same pass. The units fetch the start
    /// columns of a row before they work on the row in front of it, so those of row 0 come in time for the last row
    /// where a row lies between (rule 20).
    constexpr bool startsFromThisPass(const Window& window) const
    {
        return rows() > 2 && window.row + 1 == rows() && !startsAtTail(window);
    }

private:
    constexpr std::uint32_t fullRows() const
    {
        return itsLength < longestWindow ? 0 : itsLength / longestWindow - 1;
    }

    /// Steps of a segment behind its full rows, at most 127.
    constexpr std::uint32_t rest() const
    {
        return itsLength - longestWindow * fullRows();
    }

    constexpr std::uint32_t rowOf(std::uint32_t stepOfSegment) const
    {
        const std::uint32_t row = std::min(stepOfSegment / longestWindow, fullRows());
        return stepOfSegment < windowStart(row + 1) ? row : row + 1;
    }

    constexpr Window windowOf(std::uint32_t segment, std::uint32_t row) const
    {
        const std::uint32_t start = segment * itsLength;
        return {row, segment, start + windowStart(row), start + windowStart(row + 1) - 1};
    }

    std::uint32_t itsK;
    std::uint32_t itsUnits;
    std::uint32_t itsSegments;
    std::uint32_t itsLength;
};

}  // namespace morvik::rules

#endif
