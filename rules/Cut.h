// Cut: how the core cuts a block into segments and windows, and which unit and thread computes a trellis step.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_RULES_CUT_H
#define MORVIK_RULES_CUT_H

#include <algorithm>
#include <cstdint>

namespace morvik::rules {

/// Hardware threads of each processing unit.
constexpr std::uint32_t threadsOfUnit = 4;

/// Maximum steps of a window; minimum steps of a segment if there are several.
constexpr std::uint32_t longestWindow = 64;

/// Returns the number of segments: doubled until every thread has one or segments would become shorter than 64 steps
/// (rule 17).
constexpr std::uint32_t segmentCount(std::uint32_t K, std::uint64_t threads)
{
    std::uint64_t count = 1;
    while (count < threads && 2 * count * longestWindow <= K) {
        count *= 2;
    }
    return static_cast<std::uint32_t>(count);
}

/// Returns the window that starts at the step where window `number`, other than 0, ends: the one before it in its
/// segment, or the last one of the segment before. Windows are numbered row by row (rule 20).
template <class Number>
constexpr Number windowBefore(Number number, Number segments, Number windows)
{
    return number >= segments ? number - segments : windows - segments + number - 1;
}

/// A window of the backward recursion, which runs from the last step down to the first.
struct Window {
    std::uint32_t row;  ///< index within the segment
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

/// The cut of a block of K bits for a number of units. Windows are numbered in the order of the backward recursion: one
/// window of each segment, row by row. Neighbouring segments share a unit. With fewer segments than threads, the
/// segments spread over as many units as possible, since units run in parallel.
class Cut {
public:
    /// No block.
    constexpr Cut() : Cut(0, 1) {}

    constexpr Cut(std::uint32_t K, std::uint32_t units, std::uint32_t threadsOfEach = threadsOfUnit)
        : itsK(K),
          itsUnits(units),
          itsThreads(std::uint64_t{units} * threadsOfEach),
          itsSegments(segmentCount(K, itsThreads)),
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

    /// Of all units.
    constexpr std::uint64_t threads() const
    {
        return itsThreads;
    }

    /// Whether all segments are equally long; the core refuses any other block (rule 17).
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

    /// Windows in each segment (rule 18).
    constexpr std::uint32_t rows() const
    {
        return fullRows() + (rest() > longestWindow ? 2 : rest() > 0 ? 1 : 0);
    }

    /// Returns the first step of a window, counted from the segment's start: windows have 64 steps while 128 or more
    /// remain; the rest is one window, or two halves if it has 65 to 127 steps, the longer one first (rule 18). After
    /// the last window: the segment's end.
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

    /// Units with at least one segment.
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

    /// Whether this is the block's last window, whose recursion starts from the tail (rule 20).
    constexpr bool startsAtTail(const Window& window) const
    {
        return window.last + 1 == itsK;
    }

    /// Whether the window starts from a column of the same pass (except in the first pass). The units fetch a row's
    /// start columns before they compute the preceding row, so the columns of row 0 reach the last row in time only if
    /// there is a row in between (rule 20).
    constexpr bool startsFromThisPass(const Window& window) const
    {
        return rows() > 2 && window.row + 1 == rows() && !startsAtTail(window);
    }

private:
    constexpr std::uint32_t fullRows() const
    {
        return itsLength < longestWindow ? 0 : itsLength / longestWindow - 1;
    }

    /// Steps of a segment after its full rows, at most 127.
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
    std::uint64_t itsThreads;
    std::uint32_t itsSegments;
    std::uint32_t itsLength;
};

}  // namespace morvik::rules

#endif
