// Accidents: what people do to a file of soft values by mistake, done on purpose.
#ifndef MORVIK_TESTS_SUPPORT_ACCIDENTS_H
#define MORVIK_TESTS_SUPPORT_ACCIDENTS_H

#include <functional>
#include <string>
#include <vector>

#include "Blocks.h"

namespace morvik::support {

/// A block on its way to a file, and its line of the reference.
struct SentFrame {
    blocks::Block soft;
    std::vector<int> bits;
};

/// Frames of random bits, amplitude 8 steps, noise of the given deviation in steps.
std::vector<SentFrame> sentFrames(unsigned K, unsigned count, double deviation, unsigned seed);

struct Accident {
    std::string kind;  ///< accidents of one kind exclude each other
    std::string what;  ///< how the doctor calls it
    std::function<void(SentFrame&)> happen;
};

/// All but those of the scale and of the size, in the order in which they have to happen.
const std::vector<Accident>& accidents();

/// Values in other units: multiplied and rounded.
void multiply(SentFrame& frame, double factor);

/// The text of a file of soft values, and of its reference.
std::string softText(const std::vector<SentFrame>& frames);
std::string bitText(const std::vector<SentFrame>& frames);

}  // namespace morvik::support

#endif
