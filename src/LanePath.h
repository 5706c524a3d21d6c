// LanePath: the C interface's quick way through the lane-parallel decoder, beside the components.
#ifndef MORVIK_LANEPATH_H
#define MORVIK_LANEPATH_H

#include <cstdint>
#include <memory>
#include <vector>

#include "../lanes/InstructionSets.h"
#include "../lanes/LaneDecoder.h"
#include "TCalculationEngine.h"
#include "TDecoder3GPU.h"
#include "TInterleaver.h"

/// Decodes for a decoder whose metric columns nobody watches, and keeps its counters. The columns are not
/// computed here, but a trace shows what earlier blocks left in some of them; before the components work
/// again, catchUp therefore lets them decode the blocks whose columns would still be there.
class LanePath {
public:
    /// The path for a decoder whose engine and interleaver are in place and are the interface's own.
    LanePath(TDecoder3GPU& decoder, lanes::Algorithm algorithm, const lanes::InstructionSet& instructionSet);

    const lanes::InstructionSet& instructionSet() const;
    void setInstructionSet(const lanes::InstructionSet& instructionSet);

    /// Makes everything ready for blocks of K bits. Exhausted memory throws std::bad_alloc.
    void prepare(unsigned K);

    /// The lanes' own load, decode and results, after prepare.
    unsigned blocksTaken(unsigned blocks) const;

    template <class Input>
    bool load(const lanes::Streams<Input>* blocks, unsigned count)
    {
        itsIterations = 0;
        itsLoaded = itsLanes->blocksTaken(count);
        return itsLanes->load(blocks, count);
    }

    void decode(unsigned iterations);

    /// Decodes likewise and calls afterEach(t) when results of full iteration t, from 0, are there.
    template <class AfterEach>
    void decode(unsigned iterations, AfterEach afterEach)
    {
        for (unsigned t = 0; t < iterations; ++t) {
            itsLanes->decode(2 * t, 2 * t + 2);
            afterEach(t);
        }
        count(iterations);
    }

    void decisions(std::uint8_t* const* blocks);
    void ratios(std::int16_t* const* blocks);

    /// Leaves the decoder's columns as they would be had it decoded everything itself.
    void catchUp();

private:
    /// A decoded block whose columns would still be there: each later one is shorter.
    struct Past {
        lanes::LoadedBlock input;
        unsigned K;
        unsigned iterations;
    };

    void count(unsigned iterations);
    void keepLast();

    TDecoder3GPU& itsDecoder;
    const lanes::Algorithm itsAlgorithm;
    std::unique_ptr<lanes::LaneDecoder> itsLanes;
    std::vector<Past> itsPast;
    unsigned itsLoaded = 0;      ///< blocks
    unsigned itsIterations = 0;  ///< that the loaded blocks were decoded with; 0: not yet
};

#endif
