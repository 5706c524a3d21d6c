// FailureBlock: the block that the tests of failing allocations decode.
#ifndef MORVIK_TESTS_SUPPORT_FAILUREBLOCK_H
#define MORVIK_TESTS_SUPPORT_FAILUREBLOCK_H

#include <cstdint>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

constexpr unsigned manyAllocations = 100000;  // more than any call makes; bounds the loop

inline veltra_ip_morvik_v1_0_generics genericsOf(int algorithm)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_ALGORITHM_TYPE = algorithm;
    return generics;
}

/// A block with three equal streams, and room for its decisions.
struct Block {
    std::vector<std::int32_t> stream;
    std::vector<std::uint8_t> bits;
    veltra_ip_morvik_v1_0_outputs outputs{};

    explicit Block(unsigned K) : stream(K + 4), bits(K)
    {
        unsigned seed = K;
        for (std::int32_t& value : stream) {
            seed = seed * 1664525U + 1013904223U;
            value = static_cast<std::int32_t>(seed) >> 24;
        }
    }

    std::int32_t decode(veltra_ip_morvik_v1_0_state* state)
    {
        outputs = {bits.data(), static_cast<std::uint32_t>(bits.size()), 777, 777};
        return veltra_ip_morvik_v1_0_bitacc_simulate(state,
                                                     stream.data(),
                                                     stream.data(),
                                                     stream.data(),
                                                     static_cast<std::int32_t>(stream.size()),
                                                     2,
                                                     1,
                                                     &outputs);
    }
};

#endif
