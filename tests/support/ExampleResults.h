// ExampleResults: rows of result files for tests.
#ifndef MORVIK_TESTS_SUPPORT_EXAMPLERESULTS_H
#define MORVIK_TESTS_SUPPORT_EXAMPLERESULTS_H

#include <cstdint>

#include "simulation/Results.h"

namespace morvik::support {

/// A row of K = 40 at an Eb/N0 in thousandths of a decibel. Frames with numbers divisible by 10 have failed with 7
/// wrong bits.
inline simulation::ResultRow exampleRow(std::size_t number, int milliDecibels, simulation::FrameRange frames)
{
    simulation::ResultRow row;
    row.pointNumber = number;
    row.point = {40, 4, 1, std::nullopt, 8125, 8, milliDecibels};
    row.frames = simulation::FrameSet(frames);
    for (std::uint64_t frame = frames.from; frame < frames.to; ++frame) {
        row.errors.add(frame, frame % 10 == 0 ? 7 : 0);
    }
    row.clipped = 3 * row.frames.size();
    row.seconds = 0.125;
    row.seed = 1;
    row.version = "1.2.3";
    return row;
}

}  // namespace morvik::support

#endif
