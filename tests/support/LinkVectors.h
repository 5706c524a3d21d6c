// LinkVectors: transport blocks with their coded bits by another encoder, tests/data/link.
#ifndef MORVIK_TESTS_SUPPORT_LINKVECTORS_H
#define MORVIK_TESTS_SUPPORT_LINKVECTORS_H

#include <array>
#include <cstdint>
#include <vector>

namespace morvik::blocks {

struct LinkVector {
    unsigned A;
    unsigned G;
    unsigned Qm;
    unsigned rv;
    std::array<unsigned, 6> segmentation;  ///< C, C+, K+, C-, K-, F
    std::vector<std::uint8_t> bits;
    std::vector<std::uint8_t> coded;
};

std::vector<LinkVector> linkVectors();

}  // namespace morvik::blocks

#endif
