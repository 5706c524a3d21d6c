// LanePath: the C interface's quick way through the lane-parallel decoder, beside the components.
#ifndef MORVIK_SRC_LANEPATH_H
#define MORVIK_SRC_LANEPATH_H

#include <cstdint>
#include <memory>
#include <vector>

#include "Components.h"
#include "TDecoder3GPU.h"
#include "lanes/InstructionSets.h"
#include "lanes/LaneDecoder.h"

/// Decodes for a decoder whose metric columns nobody watches, and keeps its counters. The columns are not
/// computed here, but a trace shows what earlier blocks left in some of them; before the components work
/// again, catchUp therefore computes those of the blocks whose columns would still be there.
class LanePath {
public:
    using State = components::State;

    /// The path for a state whose components have just been made.
    LanePath(const State& state, const lanes::InstructionSet& instructionSet);

    const lanes::InstructionSet& instructionSet() const;
    void setInstructionSet(const lanes::InstructionSet& instructionSet);

    /// Whether the lanes decode a block of K bits as the state's components would, and nobody watches those; then
    /// everything is ready for it. Exhausted memory throws std::bad_alloc.
    bool takes(const State& state, unsigned K);

    /// Whether the state's components are those that were made with it.
    bool knows(const State& state) const
    {
        return itsCreated.matches(state);
    }

    /// The lanes' own load, decode and results, after takes.
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

    /// Leaves the columns of the state's decoder as they would be had it decoded everything itself.
    void catchUp(const State& state);

private:
    /// A decoded block whose columns would still be there: each later one is shorter.
    struct Past {
        lanes::LoadedBlock input;
        unsigned K;
        unsigned iterations;
    };

    struct Release {
        void operator()(State* state) const;
    };

    void forgetBlocksOfOthers(const State& state);
    void prepare(unsigned K);
    void dropOtherTables(unsigned K);
    bool keepsTheirTables(unsigned K);
    void count(unsigned iterations);
    void keepLast();
    TDecoder3GPU& twin();
    void computeColumns();

    const components::Snapshot itsCreated;
    const veltra_ip_morvik_v1_0_generics itsGenerics;
    TDecoder3GPU& itsDecoder;  ///< may be used while the state still has it
    const lanes::CorrectionTable itsCorrections;
    std::unique_ptr<State, Release> itsTwin;  ///< components that nobody changes, once there was something to catch up
    std::unique_ptr<lanes::LaneDecoder> itsLanes;
    std::vector<Past> itsPast;
    unsigned itsLoaded = 0;      ///< blocks
    unsigned itsIterations = 0;  ///< that the loaded blocks were decoded with; 0: not yet
};

#endif
