// OriginalComponents: a state's components as create_state made them, and whether somebody has changed them since.
#ifndef MORVIK_SRC_ORIGINALCOMPONENTS_H
#define MORVIK_SRC_ORIGINALCOMPONENTS_H

#include <cstdint>
#include <memory>
#include <vector>

#include "DecoderState.h"
#include "TDecoder3GPU.h"

/// A test bench may put other components into a state, or change what they hold. The state then no longer decodes as
/// its generics say.
class OriginalComponents {
public:
    using State = veltra_ip_morvik_v1_0_state;

    /// Of a state whose components have just been made.
    explicit OriginalComponents(const State& state);

    /// May be used while the state still has it.
    TDecoder3GPU& decoder()
    {
        return itsDecoder;
    }

    const veltra_ip_morvik_v1_0_generics& generics() const
    {
        return itsGenerics;
    }

    /// Whether the state's components are still these, and hold the same. Cheap: it is asked for each block. The
    /// tables that decoder and interleaver keep for a block size are not looked at; of a correction table, the
    /// entries of differences below 64 steps are, beyond which the hardware's has no corrections.
    bool areIn(const State& state) const;

    /// Drops the tables that decoder and interleaver keep for another block size: a decode of K bits replaces them.
    /// The state must have these components, for this and the next.
    void dropTablesOfOtherSizes(unsigned K);

    /// Whether the tables for K bits, where there are any, are the components' own: they would use a test bench's.
    bool haveOwnTables(unsigned K);

    /// The decoder of a second set of such components, which nobody changes, counts in or watches. Exhausted memory
    /// throws std::bad_alloc.
    TDecoder3GPU& twin();

private:
    struct Release {
        void operator()(State* state) const;
    };

    TDecoder3GPU& itsDecoder;
    const veltra_ip_morvik_v1_0_generics itsGenerics;
    const std::vector<std::uint64_t> itsValues;
    const std::vector<unsigned char> itsCorrections;
    std::unique_ptr<State, Release> itsTwin;  ///< once it was needed
};

#endif
