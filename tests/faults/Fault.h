// Fault: cores with one fault each: the model, with a component of a class that overrides what is wrong.
#ifndef MORVIK_TESTS_FAULTS_FAULT_H
#define MORVIK_TESTS_FAULTS_FAULT_H

#include <memory>
#include <string>
#include <vector>

#include "src/TCalculationEngineModBase.h"
#include "src/TDecoder3GPU.h"

namespace morvik::faults {

/// A fault is in the decoder or in its engine: the other pointer is null. Each takes the place of a sound component,
/// and its settings.
struct Fault {
    const char* name;
    std::unique_ptr<TDecoder> (*decoder)(const TDecoder3GPU& sound);
    std::unique_ptr<TCalculationEngine> (*engine)(const TCalculationEngineModBase& sound);
};

/// Wrong soft values: what goes into a pass and what comes out of it (rules 13 and 14).
const std::vector<Fault>& softValueFaults();

/// Wrong columns at the borders of segments and windows, and at the ends of the block (rules 10 to 12 and 19).
const std::vector<Fault>& borderFaults();

/// Wrong kernels: branch metrics, recursions and ratios (rules 2 to 8).
const std::vector<Fault>& kernelFaults();

template <class Decoder>
std::unique_ptr<TDecoder> makeDecoder(const TDecoder3GPU& sound)
{
    return std::make_unique<Decoder>(sound);
}

template <class Engine>
std::unique_ptr<TCalculationEngine> makeEngine(const TCalculationEngineModBase& sound)
{
    return std::make_unique<Engine>(sound);
}

template <class Decoder>
Fault inDecoder(const char* name)
{
    return {name, makeDecoder<Decoder>, nullptr};
}

template <class Engine>
Fault inEngine(const char* name)
{
    return {name, nullptr, makeEngine<Engine>};
}

/// A decoder with the settings of another.
class FaultyDecoder : public TDecoder3GPU {
public:
    explicit FaultyDecoder(const TDecoder3GPU& sound)
        : TDecoder3GPU(sound.is3GPP2, sound.itsNumPU, sound.itsThreadsPerPU)
    {
        itsInterleaver = sound.itsInterleaver;
        itsEngine = sound.itsEngine;
        itsExtrinsicScale = sound.itsExtrinsicScale;
    }

protected:
    std::uint32_t K() const
    {
        return itsBlockSize - tailSteps;
    }
};

}  // namespace morvik::faults

#endif
