// Core: the model of the decoder as simulations call it.
#ifndef MORVIK_SIMULATION_CORE_H
#define MORVIK_SIMULATION_CORE_H

#include <array>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "morvik_v1_0_batch.h"

namespace morvik::simulation {

/// The three streams of blocks of K bits: K + 4 soft values of each.
using Streams = std::array<std::vector<std::int8_t>, 3>;

/// A decoder with one configuration. All functions throw std::runtime_error if it refuses.
class Core {
public:
    /// An empty instruction set leaves the choice to the decoder; all give the same bits.
    Core(unsigned numPu, unsigned algorithm, const std::string& instructionSet);

    /// The decisions on `count` blocks, K bytes of 0 and 1 each.
    void decode(
        const Streams& streams, unsigned K, std::size_t count, unsigned iterations, std::vector<std::uint8_t>& decided);

    /// The wrong bits of each block after each iteration.
    void countErrors(const Streams& streams,
                     unsigned K,
                     std::size_t count,
                     unsigned iterations,
                     const std::vector<std::uint8_t>& sent,
                     std::uint32_t* wrongBits);

private:
    struct DestroyState {
        void operator()(veltra_ip_morvik_v1_0_state* state) const
        {
            veltra_ip_morvik_v1_0_destroy_state(state);
        }
    };

    std::unique_ptr<veltra_ip_morvik_v1_0_state, DestroyState> itsState;
};

}  // namespace morvik::simulation

#endif
