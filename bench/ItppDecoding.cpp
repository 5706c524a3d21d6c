// ItppDecoding: IT++'s turbo decoder on the same blocks, for comparison.
#include "ItppDecoding.h"

#include <itpp/comm/turbo.h>

#include <stdexcept>

#include "TInterleaver.h"
#include "rules/Tail.h"

namespace morvik::bench {

namespace {

itpp::ivec lteInterleaver(unsigned K)
{
    const std::unique_ptr<TInterleaver> interleaver(TInterleaver::create("3GPPLTE"));
    interleaver->calcInterleaver(interleaver->itsPi, K);
    itpp::ivec sequence(static_cast<int>(K));
    for (unsigned i = 0; i < K; ++i) {
        sequence(static_cast<int>(i)) = static_cast<int>(interleaver->itsPi[i]);
    }
    return sequence;
}

/// A block in IT++'s input format: the three streams position by position, a positive value for bit 0. After the data
/// IT++ expects each encoder's tail as x z x z x z; 3GPP TS 36.212, clause 5.1.3.2.2, spreads the same order over the
/// last four positions.
itpp::vec received(const NoisyBlocks& blocks, unsigned block, unsigned K)
{
    const unsigned positions = K + rules::tailPositions;
    itpp::vec values(static_cast<int>(3 * positions));
    for (unsigned i = 0; i < 3 * positions; ++i) {
        values(static_cast<int>(i)) = -blocks.streams[i % 3][block * positions + i / 3];
    }
    return values;
}

class ItppDecoding : public Decoding {
public:
    explicit ItppDecoding(const Work& work) : Decoding(work)
    {
        const itpp::ivec generators = "11 13";  // octal 13, feedback, and octal 15
        constexpr int constraintLength = 4;
        itsCodec.set_parameters(generators,
                                generators,
                                constraintLength,
                                lteInterleaver(work.blockSize),
                                static_cast<int>(iterations),
                                "LOGMAX",
                                1.0,
                                false);
        checkWithoutNoise();
        for (unsigned block = 0; block < work.blocks; ++block) {
            itsReceived.push_back(received(itsBlocks, block, work.blockSize));
        }
    }

    void run() override
    {
        auto to = itsDecisions.begin();
        for (const itpp::vec& values : itsReceived) {
            to = decode(values, to);
        }
    }

    /// Its arithmetic is different, so some of its bits are. Without a decoder, more than every sixth bit would be
    /// wrong.
    void check() override
    {
        run();
        if (bitErrorRate() > 0.1) {
            throw std::runtime_error(itsWork.name() + ": the decoder decides wrongly, bit error rate " +
                                     std::to_string(bitErrorRate()));
        }
    }

private:
    using Decisions = std::vector<std::uint8_t>::iterator;

    Decisions decode(const itpp::vec& values, Decisions to)
    {
        itpp::bvec bits;
        itsCodec.decode(values, bits);
        for (int i = 0; i < bits.size(); ++i) {
            *to++ = static_cast<std::uint8_t>(static_cast<short>(bits(i)));
        }
        return to;
    }

    /// Without this check, a wrong input order would only look like a bad decoder.
    void checkWithoutNoise()
    {
        const NoisyBlocks clean = cleanBlocks({itsWork.blockSize});
        std::vector<std::uint8_t> bits(clean.sent.size());
        decode(received(clean, 0, itsWork.blockSize), bits.begin());
        if (bits != clean.sent) {
            throw std::runtime_error("IT++ does not decode a codeword without noise");
        }
    }

    itpp::Turbo_Codec itsCodec;
    std::vector<itpp::vec> itsReceived;
};

}  // namespace

bool itppAvailable()
{
    return true;
}

std::unique_ptr<Decoding> makeItppDecoding(const Work& work)
{
    return std::make_unique<ItppDecoding>(work);
}

}  // namespace morvik::bench
