// Accidents: common mistakes in files of soft values, made on purpose.
#ifndef MORVIK_TESTS_SUPPORT_ACCIDENTS_H
#define MORVIK_TESTS_SUPPORT_ACCIDENTS_H

#include <functional>
#include <string>
#include <vector>

#include "Blocks.h"

namespace morvik::support {

/// The soft values of a block, and its reference bits.
struct SentFrame {
    blocks::Block soft;
    std::vector<int> bits;
};

/// Frames of random bits, amplitude 8, noise of the given standard deviation.
std::vector<SentFrame> sentFrames(unsigned K, unsigned count, double deviation, unsigned seed);

struct Accident {
    std::string kind;  ///< accidents of one kind exclude each other
    std::string what;  ///< the doctor's name for it
    std::function<void(SentFrame&)> happen;
};

/// All accidents except those of scale and size, in the order in which they must happen.
const std::vector<Accident>& accidents();

/// Converts values to other units: multiplies and rounds.
void multiply(SentFrame& frame, double factor);

/// The text of a file of soft values, and that of its reference.
std::string softText(const std::vector<SentFrame>& frames);
std::string bitText(const std::vector<SentFrame>& frames);

}  // namespace morvik::support

#endif
