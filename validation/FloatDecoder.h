// FloatDecoder: the floating-point reference: max-log-MAP over whole blocks, with extrinsic values times 0.75. Neither
// segments nor windows, no quantisation.
#ifndef MORVIK_VALIDATION_FLOATDECODER_H
#define MORVIK_VALIDATION_FLOATDECODER_H

#include <array>
#include <cstddef>
#include <vector>

namespace morvik::validation {

/// Decodes several blocks at once, so that the recursions work on vectors.
class FloatDecoder {
public:
    static constexpr std::size_t blocksAtOnce = 4;

    /// One value of each block: a vector that every machine has.
    using Values = float __attribute__((vector_size(blocksAtOnce * sizeof(float))));
    using Stream = std::vector<Values>;

    /// Systematic, first and second parity: K + 4 log-likelihood ratios each, ln P(1) / P(0), their tail as in
    /// include/morvik_v1_0_bitacc_cmodel.h. Finite; a common positive factor does not change the decisions.
    using Received = std::array<Stream, 3>;

    /// Throws std::invalid_argument if K is not a block size.
    explicit FloatDecoder(unsigned K);

    /// The ratios of the information bits after full iterations. One above 0 decides for bit 1.
    const Stream& decode(const Received& received, unsigned iterations);

private:
    static constexpr std::size_t states = 8;
    using Metrics = std::array<Values, states>;

    /// What a constituent decoder receives: K values in its encoder's order, then those of its tail.
    struct Constituent {
        Stream systematic;
        Stream parity;
    };

    void takeIn(const Received& received);
    void pass(const Constituent& received);
    void runForward(const Constituent& received);
    void runBackward(const Constituent& received);
    Metrics endMetrics(const Constituent& received) const;
    static Metrics onlyStateZero();
    static Metrics unreachedStates();
    static Metrics relative(const Metrics& metrics);

    std::size_t itsK;
    std::vector<std::size_t> itsPermutation;
    std::array<Constituent, 2> itsConstituents;
    std::vector<Metrics> itsForward;  ///< before each step
    Stream itsApriori;                ///< of a pass, in its order; so are the next three
    Stream itsInput;                  ///< systematic and a-priori values
    Stream itsTotal;                  ///< ratios
    Stream itsExtrinsic;              ///< what the pass adds to its input, scaled
    Stream itsRatios;
};

}  // namespace morvik::validation

#endif
