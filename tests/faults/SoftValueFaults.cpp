// SoftValueFaults: wrong systematic, a-priori and extrinsic values.
#include <algorithm>
#include <cstddef>

#include "Fault.h"
#include "rules/Arithmetic.h"
#include "rules/SoftValues.h"

namespace morvik::faults {

namespace {

using morvik::rules::maskBits;
using morvik::rules::shiftRight;
using morvik::rules::wrap16;

/// The extrinsic values of a pass are altered once they are computed.
class AlteredExtrinsic : public FaultyDecoder {
public:
    using FaultyDecoder::FaultyDecoder;

    bool calcExtrinsic(unsigned int h) override
    {
        const bool computed = FaultyDecoder::calcExtrinsic(h);
        for (std::size_t j = 0; j < itsExtrinsic.size(); ++j) {
            itsExtrinsic[j] = altered(j, itsExtrinsic[j]);
        }
        return computed;
    }

private:
    virtual short altered(std::size_t j, short extrinsic) const = 0;
};

class StuckBit : public AlteredExtrinsic {
    using AlteredExtrinsic::AlteredExtrinsic;

    short altered(std::size_t j, short extrinsic) const override
    {
        return j >= 64 && j < 128 ? wrap16(extrinsic | 16) : extrinsic;
    }
};

class StuckBitOfOneUnit : public AlteredExtrinsic {
    using AlteredExtrinsic::AlteredExtrinsic;

    short altered(std::size_t j, short extrinsic) const override
    {
        return j >= 256 && j < 512 ? wrap16(extrinsic & ~32) : extrinsic;
    }
};

/// Extrinsic values (rule 14) by another formula.
class OtherExtrinsic : public FaultyDecoder {
public:
    using FaultyDecoder::FaultyDecoder;

    bool calcExtrinsic(unsigned int) override
    {
        for (std::size_t j = 0; j < itsExtrinsic.size(); ++j) {
            const int value = itsLLR[j] - 4 * itsIntrinsic[j];
            itsExtrinsic[j] =
                maskBits(wrap16(extrinsic(value * itsExtrinsicScale)), itsEngine->itsStateFormat->itsMask);
        }
        return true;
    }

protected:
    /// The limits of an extrinsic value: those of a branch metric, in the state format.
    int lowest() const
    {
        return limit(itsEngine->itsBranchFormat->itsMin);
    }

    int highest() const
    {
        return limit(itsEngine->itsBranchFormat->itsMax);
    }

    static int clipped(double product, int lo, int hi)
    {
        return static_cast<int>(std::clamp<double>(product, lo, hi));
    }

private:
    virtual int extrinsic(double product) const = 0;

    int limit(int ofBranch) const
    {
        return shiftRight(ofBranch, itsEngine->itsStateFormat->itsNBits - itsEngine->itsBranchFormat->itsNBits);
    }
};

class RoundedExtrinsic : public OtherExtrinsic {
    using OtherExtrinsic::OtherExtrinsic;

    int extrinsic(double product) const override
    {
        return clipped(product + 8, lowest(), highest());
    }
};

class UnclippedExtrinsic : public OtherExtrinsic {
    using OtherExtrinsic::OtherExtrinsic;

    int extrinsic(double product) const override
    {
        return clipped(product, -32768, 32767);
    }
};

class NegatedExtrinsic : public OtherExtrinsic {
    using OtherExtrinsic::OtherExtrinsic;

    int extrinsic(double product) const override
    {
        return -clipped(product, lowest(), highest());
    }
};

class SymmetricExtrinsic : public OtherExtrinsic {
    using OtherExtrinsic::OtherExtrinsic;

    int extrinsic(double product) const override
    {
        return clipped(product, -highest(), highest());
    }
};

template <int sixtyFourths>
class OtherFactor : public FaultyDecoder {
public:
    explicit OtherFactor(const TDecoder3GPU& sound) : FaultyDecoder(sound)
    {
        itsExtrinsicScale = sixtyFourths / 64.0;
    }
};

/// The difference of ratio and intrinsic value is narrowed before it is scaled, not afterwards.
class ClippedBeforeScale : public OtherExtrinsic {
    using OtherExtrinsic::OtherExtrinsic;

    int extrinsic(double product) const override
    {
        return static_cast<int>(clipped(product / itsExtrinsicScale, lowest(), highest()) * itsExtrinsicScale);
    }
};

class WrappedBeforeScale : public OtherExtrinsic {
    using OtherExtrinsic::OtherExtrinsic;

    int extrinsic(double product) const override
    {
        const int nineBits = wrap16(8 * static_cast<int>(product / itsExtrinsicScale)) / 8;
        return clipped(nineBits * itsExtrinsicScale, lowest(), highest());
    }
};

/// The two low bits that a dump shows are cleared.
class CoarseExtrinsic : public AlteredExtrinsic {
    using AlteredExtrinsic::AlteredExtrinsic;

    short altered(std::size_t, short extrinsic) const override
    {
        return wrap16(extrinsic & ~48);
    }
};

/// The a-priori values of a pass are altered before they are read in its order.
class AlteredApriori : public FaultyDecoder {
public:
    using FaultyDecoder::FaultyDecoder;

    bool calcIntrinsic(unsigned int h) override
    {
        itsExtrinsic = altered(h, itsExtrinsic);
        return FaultyDecoder::calcIntrinsic(h);
    }

private:
    virtual std::vector<short> altered(unsigned h, const std::vector<short>& extrinsic) = 0;
};

class RoundedIntrinsic : public AlteredApriori {
    using AlteredApriori::AlteredApriori;

    /// Halved, this adds all bits below an eighth.
    std::vector<short> altered(unsigned, const std::vector<short>& extrinsic) override
    {
        std::vector<short> raised;
        for (const short value : extrinsic) {
            raised.push_back(wrap16(value + 30));
        }
        return raised;
    }
};

class NoApriori : public AlteredApriori {
    using AlteredApriori::AlteredApriori;

    std::vector<short> altered(unsigned, const std::vector<short>& extrinsic) override
    {
        return std::vector<short>(extrinsic.size());
    }
};

/// Values of an earlier pass than the last.
template <unsigned passes>
class LateApriori : public AlteredApriori {
    using AlteredApriori::AlteredApriori;

    std::vector<short> altered(unsigned h, const std::vector<short>& extrinsic) override
    {
        itsHistory.resize(h);
        itsHistory.push_back(extrinsic);
        return h >= passes ? itsHistory[h - passes] : std::vector<short>(extrinsic.size());
    }

    std::vector<std::vector<short>> itsHistory;  ///< what each pass began with
};

/// Step j reads another place than the interleaver says. What is there is moved to where the sound core reads.
class MisreadApriori : public AlteredApriori {
    using AlteredApriori::AlteredApriori;
    using Order = std::vector<unsigned>;

    std::vector<short> altered(unsigned h, const std::vector<short>& extrinsic) override
    {
        Order natural(K());
        Order interleaved(K());
        itsInterleaver->calcDeinterleaver(natural, K());
        itsInterleaver->calcInterleaver(interleaved, K());
        const bool first = constituent(h) == 0;
        itsIsNatural = first;
        const Order& order = first ? natural : interleaved;
        const Order& other = first ? interleaved : natural;
        std::vector<short> moved = extrinsic;
        for (unsigned j = 0; j < K(); ++j) {
            moved[order[j]] = extrinsic[place(j, order, other)];
        }
        return moved;
    }

    virtual unsigned place(unsigned j, const Order& order, const Order& other) const = 0;

    bool itsIsNatural = false;

protected:
    /// Whether the pass is over the first code.
    bool isNatural() const
    {
        return itsIsNatural;
    }
};

class UnpermutedApriori : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned j, const std::vector<unsigned>&, const std::vector<unsigned>&) const override
    {
        return j;
    }
};

class InverselyPermutedApriori : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned j, const std::vector<unsigned>&, const std::vector<unsigned>& other) const override
    {
        return other[j];
    }
};

class AprioriOfNextStep : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned j, const std::vector<unsigned>& order, const std::vector<unsigned>&) const override
    {
        return order[(j + 1) % K()];
    }
};

class AprioriOfCellBefore : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned j, const std::vector<unsigned>& order, const std::vector<unsigned>&) const override
    {
        return (order[j] + K() - 1) % K();
    }
};

class AprioriAddressBit : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned j, const std::vector<unsigned>& order, const std::vector<unsigned>&) const override
    {
        return order[j] & ~8U;
    }
};

/// The same in a memory whose addresses are the bits of the block, in both passes.
class AprioriAddressBitInOrder : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned j, const std::vector<unsigned>& order, const std::vector<unsigned>&) const override
    {
        // The first code is decoded in the order of the bits, and reads what the second one has left.
        return isNatural() ? order[j & ~8U] : order[j] & ~8U;
    }
};

class AprioriAddressHeld : public MisreadApriori {
    using MisreadApriori::MisreadApriori;

    unsigned place(unsigned, const std::vector<unsigned>&, const std::vector<unsigned>&) const override
    {
        return 77;
    }
};

/// A cell of the extrinsic values' memory that cannot be written.
class AprioriCellStuck : public AlteredApriori {
    using AlteredApriori::AlteredApriori;

    std::vector<short> altered(unsigned h, const std::vector<short>& extrinsic) override
    {
        std::vector<short> values = extrinsic;
        values[77] = h > 0 ? short{16 * 90} : values[77];
        return values;
    }
};

/// Half of the cells do not answer.
class AprioriCellsDead : public AlteredApriori {
    using AlteredApriori::AlteredApriori;

    std::vector<short> altered(unsigned, const std::vector<short>& extrinsic) override
    {
        std::vector<short> values = extrinsic;
        for (std::size_t address = 0; address < values.size(); ++address) {
            values[address] = (address & 8) != 0 ? short{0} : values[address];
        }
        return values;
    }
};

/// Extrinsic values whose steps share a bit are not written.
class ExtrinsicHalfStuck : public AlteredExtrinsic {
    using AlteredExtrinsic::AlteredExtrinsic;

    short altered(std::size_t j, short extrinsic) const override
    {
        return (j & 4) != 0 ? short{16 * 13} : extrinsic;
    }
};

template <int shift>
class WeightedApriori : public AlteredApriori {
    using AlteredApriori::AlteredApriori;

    std::vector<short> altered(unsigned, const std::vector<short>& extrinsic) override
    {
        std::vector<short> weighted = extrinsic;
        for (short& value : weighted) {
            value = wrap16(shift > 0 ? 2 * value : value / 2);
        }
        return weighted;
    }
};

class IntrinsicNotHalved : public FaultyDecoder {
    using FaultyDecoder::FaultyDecoder;

    bool calcIntrinsic(unsigned int h) override
    {
        const bool computed = FaultyDecoder::calcIntrinsic(h);
        for (short& value : itsIntrinsic) {
            value = wrap16(2 * value);
        }
        return computed;
    }
};

/// The bit below an eighth, which dumps do not show, is lost.
class IntrinsicCut : public FaultyDecoder {
    using FaultyDecoder::FaultyDecoder;

    bool calcIntrinsic(unsigned int h) override
    {
        const bool computed = FaultyDecoder::calcIntrinsic(h);
        std::for_each_n(itsIntrinsic.begin(), K(), [](short& value) { value = wrap16(value & ~8); });
        return computed;
    }
};

/// Intrinsic values that are wrong where they are used: in branch metrics, ratios or extrinsic values.
class OtherIntrinsic : public FaultyDecoder {
public:
    using FaultyDecoder::FaultyDecoder;

    bool calcIntrinsic(unsigned int h) override
    {
        const bool computed = FaultyDecoder::calcIntrinsic(h);
        const unsigned d = constituent(h);
        const std::vector<unsigned>& order = d == 1 ? itsInterleaver->itsPi : itsInterleaver->itsPiInv;
        itsOther = itsIntrinsic;
        for (unsigned j = 0; j < K(); ++j) {
            itsOther[j] = other(itsExtrinsic[order[j]], itsSys[d][j]);
        }
        return computed;
    }

protected:
    /// Calls compute() with the other values.
    template <class Compute>
    bool withOther(Compute compute)
    {
        itsIntrinsic.swap(itsOther);
        const bool computed = compute();
        itsIntrinsic.swap(itsOther);
        return computed;
    }

private:
    virtual short other(int apriori, int systematic) const = 0;

    std::vector<short> itsOther;
};

class BranchAprioriWhole : public OtherIntrinsic {
    using OtherIntrinsic::OtherIntrinsic;

    short other(int apriori, int systematic) const override
    {
        return rules::intrinsicValue(2 * apriori, systematic, -16);
    }

    bool calcGamma(unsigned int h) override
    {
        return withOther([&] { return OtherIntrinsic::calcGamma(h); });
    }
};

class ExtrinsicAprioriMissing : public OtherIntrinsic {
    using OtherIntrinsic::OtherIntrinsic;

    short other(int, int systematic) const override
    {
        return rules::intrinsicValue(0, systematic, -16);
    }

    bool calcExtrinsic(unsigned int h) override
    {
        return withOther([&] { return OtherIntrinsic::calcExtrinsic(h); });
    }
};

class RatioAprioriWhole : public OtherIntrinsic {
    using OtherIntrinsic::OtherIntrinsic;

    short other(int apriori, int systematic) const override
    {
        return rules::intrinsicValue(2 * apriori, systematic, -16);
    }

    bool calcLLR(unsigned int h) override
    {
        const std::vector<T8> branches(itsGamma, itsGamma + K());
        const bool computed = withOther([&] { return OtherIntrinsic::calcGamma(h) && OtherIntrinsic::calcLLR(h); });
        std::copy(branches.begin(), branches.end(), itsGamma);
        return computed;
    }
};

/// Half-iteration 0 decodes the natural code, and each one the other code than the sound core.
class OtherCodeFirst : public FaultyDecoder {
    using FaultyDecoder::FaultyDecoder;

    bool calcIntrinsic(unsigned int h) override
    {
        return FaultyDecoder::calcIntrinsic(h ^ 1U);
    }

    bool calcGamma(unsigned int h) override
    {
        return FaultyDecoder::calcGamma(h ^ 1U);
    }

    bool calcAlpha(unsigned int h) override
    {
        return FaultyDecoder::calcAlpha(h ^ 1U);
    }

    bool calcBeta(unsigned int h) override
    {
        return FaultyDecoder::calcBeta(h ^ 1U);
    }
};

/// The streams of a code are altered once they are separated.
class AlteredStreams : public FaultyDecoder {
public:
    using FaultyDecoder::FaultyDecoder;

    bool extract(const std::vector<short>& soft) override
    {
        const bool extracted = FaultyDecoder::extract(soft);
        alter();
        return extracted;
    }

protected:
    /// The distance of the tail from a stream's begin.
    std::ptrdiff_t tail() const
    {
        return static_cast<std::ptrdiff_t>(K());
    }

private:
    virtual void alter() = 0;
};

template <std::size_t bit>
class ParityAddressBit : public AlteredStreams {
    using AlteredStreams::AlteredStreams;

    void alter() override
    {
        for (std::size_t j = 0; j < K(); ++j) {
            itsPar0[0][j] = itsPar0[0][j & ~(std::size_t{1} << bit)];
            itsPar0[1][j] = itsPar0[1][j & ~(std::size_t{1} << bit)];
        }
    }
};

class TailSwapped : public AlteredStreams {
    using AlteredStreams::AlteredStreams;

    void alter() override
    {
        std::swap_ranges(itsSys[0].begin() + tail(), itsSys[0].end(), itsPar0[0].begin() + tail());
    }
};

class TailReversed : public AlteredStreams {
    using AlteredStreams::AlteredStreams;

    void alter() override
    {
        std::reverse(itsSys[1].begin() + tail(), itsSys[1].end());
        std::reverse(itsPar0[1].begin() + tail(), itsPar0[1].end());
    }
};

class TailOfOtherCode : public AlteredStreams {
    using AlteredStreams::AlteredStreams;

    void alter() override
    {
        std::copy(itsSys[0].begin() + tail(), itsSys[0].end(), itsSys[1].begin() + tail());
        std::copy(itsPar0[0].begin() + tail(), itsPar0[0].end(), itsPar0[1].begin() + tail());
    }
};

class UnpermutedSystematic : public FaultyDecoder {
    using FaultyDecoder::FaultyDecoder;

    bool extract(const std::vector<short>& soft) override
    {
        const bool extracted = FaultyDecoder::extract(soft);
        std::copy_n(itsSys[0].begin(), K(), itsSys[1].begin());
        return extracted;
    }
};

}  // namespace

const std::vector<Fault>& softValueFaults()
{
    static const std::vector<Fault> faults = {
        inDecoder<RoundedExtrinsic>("extrinsic_rounding"),
        inDecoder<OtherFactor<64>>("extrinsic_unscaled"),
        inDecoder<OtherFactor<32>>("extrinsic_half"),
        inDecoder<OtherFactor<40>>("extrinsic_five_eighths"),
        inDecoder<OtherFactor<56>>("extrinsic_seven_eighths"),
        inDecoder<OtherFactor<45>>("extrinsic_45_of_64"),
        inDecoder<ClippedBeforeScale>("extrinsic_clipped_first"),
        inDecoder<WrappedBeforeScale>("extrinsic_wrapped_first"),
        inDecoder<CoarseExtrinsic>("extrinsic_coarse"),
        inDecoder<ExtrinsicHalfStuck>("extrinsic_half_stuck"),
        inDecoder<UnclippedExtrinsic>("extrinsic_unclipped"),
        inDecoder<NegatedExtrinsic>("extrinsic_sign"),
        inDecoder<SymmetricExtrinsic>("extrinsic_symmetric"),
        inDecoder<StuckBit>("extrinsic_stuck_bit"),
        inDecoder<StuckBitOfOneUnit>("one_unit_stuck_bit"),
        inDecoder<RoundedIntrinsic>("intrinsic_rounding"),
        inDecoder<LateApriori<2>>("apriori_late"),
        inDecoder<LateApriori<1>>("apriori_before"),
        inDecoder<NoApriori>("apriori_missing"),
        inDecoder<UnpermutedApriori>("apriori_unpermuted"),
        inDecoder<InverselyPermutedApriori>("apriori_inverse"),
        inDecoder<AprioriOfNextStep>("apriori_behind"),
        inDecoder<AprioriOfCellBefore>("apriori_cell_before"),
        inDecoder<AprioriAddressBit>("apriori_address_bit"),
        inDecoder<AprioriCellsDead>("apriori_cells_dead"),
        inDecoder<AprioriAddressBitInOrder>("apriori_address_bit_in_order"),
        inDecoder<AprioriAddressHeld>("apriori_address_held"),
        inDecoder<AprioriCellStuck>("apriori_cell_stuck"),
        inDecoder<WeightedApriori<1>>("apriori_whole"),
        inDecoder<WeightedApriori<-1>>("apriori_quartered"),
        inDecoder<IntrinsicNotHalved>("intrinsic_not_halved"),
        inDecoder<IntrinsicCut>("intrinsic_cut"),
        inDecoder<BranchAprioriWhole>("branch_apriori_whole"),
        inDecoder<ExtrinsicAprioriMissing>("extrinsic_apriori_missing"),
        inDecoder<RatioAprioriWhole>("ratio_apriori_whole"),
        inDecoder<OtherCodeFirst>("other_code_first"),
        inDecoder<ParityAddressBit<4>>("parity_address_bit"),
        inDecoder<TailSwapped>("tail_swapped"),
        inDecoder<TailReversed>("tail_reversed"),
        inDecoder<TailOfOtherCode>("tail_of_other_code"),
        inDecoder<UnpermutedSystematic>("systematic_unpermuted"),
    };
    return faults;
}

}  // namespace morvik::faults
