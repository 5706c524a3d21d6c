// SoftValueFaults: wrong systematic, a-priori and extrinsic values.
#include <algorithm>
#include <cstddef>

#include "Fault.h"
#include "rules/Arithmetic.h"

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

class UnscaledExtrinsic : public FaultyDecoder {
public:
    explicit UnscaledExtrinsic(const TDecoder3GPU& sound) : FaultyDecoder(sound)
    {
        itsExtrinsicScale = 1.0;
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
        const Order& order = first ? natural : interleaved;
        const Order& other = first ? interleaved : natural;
        std::vector<short> moved = extrinsic;
        for (unsigned j = 0; j < K(); ++j) {
            moved[order[j]] = extrinsic[place(j, order, other)];
        }
        return moved;
    }

    virtual unsigned place(unsigned j, const Order& order, const Order& other) const = 0;
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
        inDecoder<UnscaledExtrinsic>("extrinsic_unscaled"),
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
        inDecoder<UnpermutedSystematic>("systematic_unpermuted"),
    };
    return faults;
}

}  // namespace morvik::faults
