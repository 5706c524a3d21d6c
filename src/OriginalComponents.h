// OriginalComponents: a state's components as create_state made them, and whether they have changed since.
#ifndef MORVIK_SRC_ORIGINALCOMPONENTS_H
#define MORVIK_SRC_ORIGINALCOMPONENTS_H

#include <cstdint>
#include <memory>
#include <vector>

#include "DecoderState.h"
#include "TDecoder3GPU.h"

/// Detects whether a test bench has replaced a state's components or changed their members. The state then no longer
/// decodes as its generics say.
class OriginalComponents {
public:
    using State = veltra_ip_morvik_v1_0_state;

    /// Records a state whose components have just been created.
    explicit OriginalComponents(const State& state);

    /// Valid while the state still holds it.
    TDecoder3GPU& decoder()
    {
        return itsDecoder;
    }

    const veltra_ip_morvik_v1_0_generics& generics() const
    {
        return itsGenerics;
    }

    /// Whether the state still holds these components, unchanged. Cheap, since it is called for each block: skips the
    /// tables that decoder and interleaver cache for a block size, and checks correction tables only for differences
    /// below 64 eighths, beyond which the hardware has no corrections.
    bool areIn(const State& state) const;

    /// Drops the tables that decoder and interleaver cache for other block sizes, which a decode of K bits would
    /// replace. This and the next function require the state to hold these components.
    void dropTablesOfOtherSizes(unsigned K);

    /// Whether the cached tables for K bits, if any, are the components' own, not a test bench's, which they would use.
    bool haveOwnTables(unsigned K);

    /// Returns the decoder of a second, private set of such components, created on first use. Throws std::bad_alloc.
    TDecoder3GPU& twin();

private:
    struct Release {
        void operator()(State* state) const;
    };

    TDecoder3GPU& itsDecoder;
    const veltra_ip_morvik_v1_0_generics itsGenerics;
    const std::vector<std::uint64_t> itsValues;
    const std::vector<unsigned char> itsCorrections;
    std::unique_ptr<State, Release> itsTwin;  ///< null until needed
};

#endif
