// ChainSender: transport blocks sent bit by bit as 3GPP TS 36.212 words it, with mistakes made on purpose. Shares no
// code with link/ or the doctor.
#ifndef MORVIK_TESTS_SUPPORT_CHAINSENDER_H
#define MORVIK_TESTS_SUPPORT_CHAINSENDER_H

#include <functional>
#include <string>
#include <vector>

#include "Blocks.h"
#include "PlainLink.h"

namespace morvik::support {

/// A sender's settings, and the mistakes in it.
struct ChainSender {
    plain::Format format{};
    std::vector<unsigned> versions;

    bool sendsFillers = false;
    std::vector<unsigned> columnOrder = {0, 16, 8, 24, 4, 20, 12, 28, 2, 18, 10, 26, 6, 22, 14, 30,
                                         1, 17, 9, 25, 5, 21, 13, 29, 3, 19, 11, 27, 7, 23, 15, 31};
    bool interleaves = true;
    unsigned delay = 1;  ///< of the second parity
    bool dummiesLast = false;
    std::vector<unsigned> order = {0, 1, 2};  ///< of the streams in the circular buffer
    bool alternates = true;                   ///< parities
    unsigned offset = 2;                      ///< columns before redundancy version 0
    bool longerFirst = false;
    bool backwards = false;
    std::vector<unsigned> symbol;                         ///< bits of a symbol in the order sent; empty: as they are
    std::function<bool(unsigned)> flips = [](unsigned) {  ///< whether the values of a bit of a symbol are negated
        return false;
    };
    double factor = 1;

    /// The values of each transmission: log-likelihood ratios of bits over noise of this deviation for amplitude 1.
    std::vector<std::vector<float>> send(const plain::Bits& block, double deviation, blocks::Random& random) const;

private:
    std::vector<int> bufferOf(const plain::Bits& block, unsigned fillers) const;
    plain::Bits codedBits(const plain::Bits& block, unsigned version) const;
};

struct ChainAccident {
    std::string kind;  ///< accidents of one kind exclude each other
    std::string what;  ///< the doctor's name for it
    std::function<void(ChainSender&)> happen;
};

/// Accidents that concern a format.
std::vector<ChainAccident> accidentsOf(const ChainSender& sender);

}  // namespace morvik::support

#endif
