// Core: the model as the source of expected values.
#ifndef MORVIK_HARDWARE_VECTORS_CORE_H
#define MORVIK_HARDWARE_VECTORS_CORE_H

#include <sstream>

#include "Block.h"
#include "Settings.h"
#include "hardware/coverage/Counts.h"
#include "hardware/testbench/Decoder.h"

namespace morvik::vectors {

class Core {
public:
    explicit Core(const Settings& settings);

    Expected expect(const Stimulus& stimulus);

    /// Which situations of the arithmetic the block meets.
    coverage::CoreCounts situations(const Stimulus& stimulus);

private:
    Settings itsSettings;
    std::ostringstream itsMessages;
    Decoder itsDecoder;
};

}  // namespace morvik::vectors

#endif
