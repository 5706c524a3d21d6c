// Decoder: decodes batches on several threads, each with its own state of the C interface.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_DECODER_H
#define MORVIK_BINDINGS_PYTHON_MODULE_DECODER_H

#include <array>
#include <cstdint>
#include <memory>
#include <mutex>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "ThreadMessages.h"
#include "morvik_v1_0_batch.h"
#include "rules/Tail.h"

namespace morvik::python {

/// A refusal by the library, with its text.
class Refusal : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Consecutive blocks of one size, and where their results go.
template <class Input>
struct Batch {
    std::array<const Input*, 3> streams;  ///< systematic, parity 1, parity 2
    std::int32_t positions = 0;           ///< K + 4
    std::uint32_t blocks = 0;
    std::uint32_t iterations = 0;
    const std::uint32_t* tags = nullptr;
    std::uint8_t* bits = nullptr;
    std::int16_t* ratios = nullptr;  ///< or null
    std::uint32_t* keptTags = nullptr;

    /// The blocks `first` to `last` - 1.
    Batch part(std::uint32_t first, std::uint32_t last) const;

    std::size_t blockSize() const
    {
        return positions > std::int32_t{rules::tailPositions}
                   ? static_cast<std::size_t>(positions) - rules::tailPositions
                   : 0;
    }
};

/// Status and messages of a call of the C interface.
struct Outcome {
    std::int32_t status = 0;
    Messages messages;
};

/// Thread-safe; concurrent calls take turns.
class Decoder {
public:
    /// With an empty instruction set, the library chooses. Throws Refusal.
    Decoder(std::int32_t numPu, std::int32_t algorithm, std::int32_t tagWidth, std::string instructionSet);

    /// Decodes a batch on at most the given number of threads. Results and warnings are those of one state that decodes
    /// all blocks in order. Throws Refusal when closed.
    template <class Input>
    Outcome decode(const Batch<Input>& batch, unsigned threads);

    /// The name of the instruction set in use. Throws Refusal when closed.
    std::string instructionSet();

    /// Releases the states when no call is decoding any more.
    void close();

    bool isClosed();

private:
    struct DestroyState {
        void operator()(veltra_ip_morvik_v1_0_state* state) const
        {
            veltra_ip_morvik_v1_0_destroy_state(state);
        }
    };
    using State = std::unique_ptr<veltra_ip_morvik_v1_0_state, DestroyState>;

    State makeState() const;
    void expectOpen() const;
    void add(Outcome part, Outcome& whole);

    veltra_ip_morvik_v1_0_generics itsGenerics;
    std::string itsInstructionSet;
    std::mutex itsMutex;              // guards everything below
    std::vector<State> itsStates;     // one for each thread; none when closed
    std::set<std::string> itsWarned;  // kinds of warnings already given; each comes once
};

}  // namespace morvik::python

#endif
