// TransportCheck: compares decisions with the code blocks that were sent, and checks their CRCs.
#include "TransportCheck.h"

#include "link/coding/PackedBits.h"

namespace morvik::simulation {

TransportCheck::TransportCheck(const link::TransportSource& source) : itsSource(source), itsWords{0}
{
    const link::CodeBlocks& blocks = source.code().blocks();
    for (unsigned r = 0; r < blocks.count; ++r) {
        itsWords.push_back(itsWords.back() + link::wordsOf(blocks.size(r)));
    }
    itsDecided.resize(link::wordsOf(blocks.sizePlus));
}

void TransportCheck::begin(unsigned count)
{
    itsSent.assign(count * itsWords.back(), 0);
    for (unsigned frame = 0; frame < count; ++frame) {
        for (unsigned r = 0; r + 1 < itsWords.size(); ++r) {
            itsSource.sentBlock(frame, r, &itsSent[frame * itsWords.back() + itsWords[r]]);
        }
    }
}

BlockVerdict TransportCheck::check(unsigned frame, unsigned r, const std::uint8_t* decided)
{
    const link::CodeBlocks& blocks = itsSource.code().blocks();
    const unsigned size = blocks.size(r);
    const unsigned fillers = blocks.fillersOf(r);
    link::packBits(decided, size, itsDecided.data());
    for (unsigned i = 0; i < fillers; i += 64) {
        itsDecided[i / 64] &= ~link::lowBits(std::min(64U, fillers - i));
    }
    BlockVerdict verdict;
    for (std::size_t i = 0; i < link::wordsOf(size); ++i) {
        const std::uint64_t wrong = itsDecided[i] ^ sent(frame, r)[i];
        verdict.wrongBits += static_cast<std::uint32_t>(wrong == 0 ? 0 : __builtin_popcountll(wrong));
    }
    verdict.fits =
        verdict.wrongBits == 0 || (blocks.count > 1 ? link::crc24b(itsDecided.data(), fillers, size - fillers)
                                                    : link::crc24a(itsDecided.data(), fillers, size - fillers)) == 0;
    return verdict;
}

bool TransportCheck::fits(unsigned frame, const std::vector<Decisions>& others) const
{
    const link::TransportBlockCode& code = itsSource.code();
    std::vector<std::uint64_t> row(link::wordsOf(std::size_t{code.blocks().bits} + link::crcBits));
    for (unsigned r = 0; r < code.blocks().count; ++r) {
        code.join(sentBits(frame, r).data(), r, row.data());
    }
    for (const auto& [r, decided] : others) {
        code.join(decided.data(), r, row.data());
    }
    return code.fits(row.data());
}

void TransportCheck::sentBits(unsigned frame, unsigned r, std::uint8_t* bits) const
{
    link::unpackBits(sent(frame, r), itsSource.code().blocks().size(r), bits);
}

std::vector<std::uint8_t> TransportCheck::sentBits(unsigned frame, unsigned r) const
{
    std::vector<std::uint8_t> bits(itsSource.code().blocks().size(r));
    sentBits(frame, r, bits.data());
    return bits;
}

}  // namespace morvik::simulation
