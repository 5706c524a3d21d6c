// BorderFaults: wrong columns at the borders of segments and windows, and at the ends of the block.
#include <array>
#include <cstddef>

#include "Fault.h"
#include "rules/Arithmetic.h"
#include "rules/Cut.h"
#include "rules/Schedule.h"
#include "rules/Starts.h"
#include "rules/Trellis.h"

namespace morvik::faults {

namespace {

using Tail = rules::Tail<int>;
using TailColumn = std::array<int, rules::stateCount>;

T8 masked(const T8& column, int mask)
{
    T8 kept{};
    for (unsigned state = 0; state < rules::stateCount; ++state) {
        kept[state] = rules::wrap16(column[state] & mask);
    }
    return kept;
}

/// The recursions over segments and windows, as rules 11 and 19 tell them; subclasses have one of the columns wrong.
/// The model offers no function to override between two segments.
class Borders : public FaultyDecoder {
public:
    using FaultyDecoder::FaultyDecoder;

    bool calcAlpha(unsigned int h) override
    {
        std::vector<T8>& starts = itsAlphaInit[constituent(h)];
        if (rules::isFirstPass(h)) {
            starts.assign(starts.size(), T8{});
            starts[0] = firstColumn();
        }
        T8 reached = starts[0];
        for (std::size_t u = 0; u < starts.size(); ++u) {
            const auto [from, to] = itsAlphaSegment[u];
            const T8 held = starts[u];
            itsAlpha[from] = forwardStart({h, u}, held, reached);
            keepForward({h, u}, held, reached);
            if (!FaultyDecoder::calcAlpha(h, from, to)) {
                return false;
            }
            reached = itsAlpha[to];
        }
        return true;
    }

    bool calcBeta(unsigned int h) override
    {
        std::vector<T8>& starts = itsBetaInit[constituent(h)];
        if (rules::isFirstPass(h)) {
            starts.assign(starts.size(), T8{});
            starts.back() = tailColumn(h);
        }
        // A column is fetched a row before it is used.
        std::vector<T8> row(itsNT);
        for (std::size_t u = 0; u < row.size(); ++u) {
            row[u] = starts[startOf(u)];
        }
        for (std::size_t i = 0; i < starts.size(); ++i) {
            const bool unknown = rules::isFirstPass(h) && i + 1 < starts.size();
            T8& fetched = row[i % itsNT];
            const T8 start = unknown ? T8{} : backwardStart(fetched, starts[i]);
            if (i + itsNT < starts.size()) {
                fetched = starts[startOf(i + itsNT)];
            }
            if (!runWindow(h, i, start)) {
                return false;
            }
        }
        return true;
    }

protected:
    /// A segment of a pass.
    struct Place {
        unsigned h;
        std::size_t u;
    };

    /// A column as it is kept.
    virtual T8 border(const T8& column) const
    {
        return masked(column, rules::borderMask);
    }

    std::vector<T8>& forwardStarts(unsigned h)
    {
        return itsAlphaInit[constituent(h)];
    }

private:
    virtual T8 firstColumn() const
    {
        T8 column{};
        setInitialState(&column);
        return column;
    }

    /// From which column a segment starts: of the one held from the pass before over the same code, and the one that
    /// the segment before has just reached.
    virtual T8 forwardStart(const Place&, const T8& held, const T8&)
    {
        return held;
    }

    virtual void keepForward(const Place& place, const T8& held, const T8& reached)
    {
        forwardStarts(place.h)[place.u] = forwardKept(place, held, reached);
    }

    virtual T8 forwardKept(const Place&, const T8&, const T8& reached)
    {
        return border(reached);
    }

    /// The window whose start column a window fetches.
    virtual std::size_t startOf(std::size_t i) const
    {
        return i;
    }

    /// From which column a window starts: of the one fetched, and the one held by now.
    virtual T8 backwardStart(const T8& fetched, const T8&) const
    {
        return fetched;
    }

    virtual T8 backwardKept(unsigned, const T8&, const T8& reached) const
    {
        return border(reached);
    }

    virtual TailColumn tailMetrics(const Tail& tail) const
    {
        return rules::tailColumn(tail);
    }

    virtual T8 keptTail(const T8& column) const
    {
        return border(column);
    }

    T8 tailColumn(unsigned h) const
    {
        const unsigned d = constituent(h);
        Tail tail{};
        for (unsigned step = 0; step < tailSteps; ++step) {
            tail.x[step] = itsSys[d][K() + step];
            tail.p[step] = itsPar0[d][K() + step];
            tail.q[step] = itsPar1[d][K() + step];
        }
        const TailColumn metrics = tailMetrics(tail);
        T8 column{};
        for (unsigned state = 0; state < rules::stateCount; ++state) {
            column[state] = rules::wrap16(metrics[state]);
        }
        return keptTail(column);
    }

    bool runWindow(unsigned h, std::size_t i, const T8& start)
    {
        const auto [from, to] = itsBetaSegment[i];
        const T8 neighbours = itsBeta[to];
        itsBeta[from] = start;
        if (!FaultyDecoder::calcBeta(h, from, to)) {
            return false;
        }
        if (i > 0) {
            std::vector<T8>& starts = itsBetaInit[constituent(h)];
            T8& stored = starts[rules::windowBefore<std::size_t>(i, itsNT, starts.size())];
            stored = backwardKept(h, stored, itsBeta[to]);
            itsBeta[to] = neighbours;
        }
        return true;
    }
};

template <int mask>
class OtherMask : public Borders {
    using Borders::Borders;

    T8 border(const T8& column) const override
    {
        return masked(column, mask);
    }
};

class UnknownFirstState : public Borders {
    using Borders::Borders;

    T8 firstColumn() const override
    {
        return T8{};
    }
};

class ForwardBitsKept : public Borders {
    using Borders::Borders;

    T8 forwardKept(const Place&, const T8&, const T8& reached) override
    {
        return reached;
    }
};

class ForwardUnknown : public Borders {
    using Borders::Borders;

    T8 forwardKept(const Place& place, const T8&, const T8& reached) override
    {
        return place.u == 0 ? border(reached) : T8{};
    }
};

class ForwardUnknownInOneSegment : public Borders {
    using Borders::Borders;

    T8 forwardKept(const Place& place, const T8&, const T8& reached) override
    {
        return place.u == 3 ? T8{} : border(reached);
    }
};

class ForwardStale : public Borders {
    using Borders::Borders;

    T8 forwardKept(const Place& place, const T8& held, const T8& reached) override
    {
        return rules::isFirstPass(place.h) ? border(reached) : held;
    }
};

class ForwardLate : public Borders {
    using Borders::Borders;

    T8 forwardKept(const Place& place, const T8& held, const T8& reached) override
    {
        std::vector<T8>& late = itsLate[constituent(place.h)];
        late.resize(forwardStarts(place.h).size());
        const T8 kept = place.u == 0 ? held : rules::isFirstPass(place.h) ? T8{} : late[place.u];
        late[place.u] = border(reached);
        return kept;
    }

    std::array<std::vector<T8>, 2> itsLate;
};

class ForwardEarly : public Borders {
    using Borders::Borders;

    T8 forwardStart(const Place& place, const T8& held, const T8& reached) override
    {
        return place.u == 0 || rules::isFirstPass(place.h) ? held : border(reached);
    }
};

class ForwardOfOtherCode : public Borders {
    using Borders::Borders;

    void keepForward(const Place& place, const T8&, const T8& reached) override
    {
        forwardStarts(place.h + 1)[place.u] = border(reached);
    }
};

/// Border columns of an earlier pass, whatever its code.
template <unsigned passes>
class ForwardOfEarlierPass : public Borders {
    using Borders::Borders;

    T8 forwardStart(const Place& place, const T8& held, const T8&) override
    {
        return place.u == 0 ? held : place.h < passes ? T8{} : itsKept[place.h - passes][place.u];
    }

    T8 forwardKept(const Place& place, const T8&, const T8& reached) override
    {
        itsKept.resize(place.h + 1);
        itsKept.back().push_back(border(reached));
        return border(reached);
    }

    std::vector<std::vector<T8>> itsKept;  ///< of each pass
};

/// Each segment but the last one starts from what it has reached itself.
class ForwardOfNeighbour : public Borders {
    using Borders::Borders;

    T8 forwardStart(const Place& place, const T8& held, const T8&) override
    {
        const bool hasNext = place.u + 1 < forwardStarts(place.h).size();
        return place.u > 0 && hasNext ? forwardStarts(place.h)[place.u + 1] : held;
    }
};

class ForwardOfStepBefore : public Borders {
    using Borders::Borders;

    T8 forwardKept(const Place& place, const T8&, const T8& reached) override
    {
        return border(place.u == 0 ? reached : itsAlpha[itsAlphaSegment[place.u].from - 1]);
    }
};

/// Each window but the first and the last one starts from the column of the window before.
class BackwardOfNeighbour : public Borders {
    using Borders::Borders;

    std::size_t startOf(std::size_t i) const override
    {
        return i > 0 && i + 1 < itsBetaSegment.size() ? i - 1 : i;
    }
};

/// Windows that start some steps behind, except the last one.
template <int steps>
class ShiftedWindows : public FaultyDecoder {
    using FaultyDecoder::FaultyDecoder;

    bool allocate(unsigned int blockSize) override
    {
        const bool allocated = FaultyDecoder::allocate(blockSize);
        const rules::Cut cut(K(), itsNumPU, itsThreadsPerPU);
        for (std::uint32_t i = 0; i < cut.windows(); ++i) {
            const rules::Window window = cut.window(i);
            itsBetaSegment[i] = {cut.startsAtTail(window) ? window.last : shifted(window.last),
                                 window.first == 0 ? 0 : shifted(window.first - 1)};
        }
        return allocated;
    }

    static std::uint32_t shifted(std::uint32_t step)
    {
        return step + static_cast<std::uint32_t>(steps);
    }
};

class LateSegments : public FaultyDecoder {
    using FaultyDecoder::FaultyDecoder;

    bool allocate(unsigned int blockSize) override
    {
        const bool allocated = FaultyDecoder::allocate(blockSize);
        const std::uint32_t length = K() / itsNT;
        for (std::uint32_t u = 1; u < itsNT; ++u) {
            itsAlphaSegment[u].from = u * length + 1;
            itsAlphaSegment[u - 1].to = u * length + 1;
        }
        return allocated;
    }
};

class BackwardBitsKept : public Borders {
    using Borders::Borders;

    T8 backwardKept(unsigned, const T8&, const T8& reached) const override
    {
        return reached;
    }
};

class BackwardEarly : public Borders {
    using Borders::Borders;

    T8 backwardStart(const T8&, const T8& now) const override
    {
        return now;
    }
};

class BackwardStale : public Borders {
    using Borders::Borders;

    T8 backwardKept(unsigned h, const T8& stored, const T8& reached) const override
    {
        return rules::isFirstPass(h) ? border(reached) : stored;
    }
};

class TailBitsKept : public Borders {
    using Borders::Borders;

    T8 keptTail(const T8& column) const override
    {
        return column;
    }
};

class TailSign : public Borders {
    using Borders::Borders;

    /// The first step's branch metric counts for state 0 as it does for state 1.
    TailColumn tailMetrics(const Tail& tail) const override
    {
        TailColumn metrics = rules::tailColumn(tail);
        metrics[0] = metrics[1];
        return metrics;
    }
};

class ClippedTail : public Borders {
    using Borders::Borders;

    /// The sums of a step's systematic and parity value are clipped like branch metrics.
    TailColumn tailMetrics(const Tail& tail) const override
    {
        const auto sum = [&tail](unsigned step, int sign) {
            return rules::clip(tail.x[step] + sign * tail.p[step], -2048, 2032);
        };
        const int e2 = sum(2, 1);
        const int e1 = sum(1, 1);
        const int f1 = sum(1, -1);
        const int g0 = sum(0, 1);
        const int g1 = sum(0, -1);
        return {-e2 - e1 - g0,
                -e2 - e1 + g0,
                -e2 + e1 + g1,
                -e2 + e1 - g1,
                e2 + f1 - g1,
                e2 + f1 + g1,
                e2 - f1 + g0,
                e2 - f1 - g0};
    }
};

}  // namespace

const std::vector<Fault>& borderFaults()
{
    static const std::vector<Fault> faults = {
        inDecoder<Borders>("borders_alone"),
        inDecoder<OtherMask<-64>>("border_six_bits"),
        inDecoder<OtherMask<-512>>("border_nine_bits"),
        inDecoder<OtherMask<-97>>("border_bit_kept"),
        inDecoder<UnknownFirstState>("first_state_unknown"),
        inDecoder<ForwardBitsKept>("forward_bits_kept"),
        inDecoder<ForwardUnknown>("forward_border_unknown"),
        inDecoder<ForwardUnknownInOneSegment>("forward_border_unknown_in_one"),
        inDecoder<ForwardStale>("forward_border_stale"),
        inDecoder<ForwardLate>("forward_border_late"),
        inDecoder<ForwardEarly>("forward_border_early"),
        inDecoder<ForwardOfOtherCode>("forward_border_other_code"),
        inDecoder<OtherMask<-1152>>("border_bit_lost"),
        inDecoder<ForwardOfEarlierPass<1>>("forward_border_both_codes"),
        inDecoder<ForwardOfEarlierPass<3>>("forward_border_third_pass"),
        inDecoder<ForwardOfNeighbour>("forward_border_neighbour"),
        inDecoder<ForwardOfStepBefore>("forward_border_step_before"),
        inDecoder<LateSegments>("segments_late"),
        inDecoder<ShiftedWindows<1>>("windows_early"),
        inDecoder<ShiftedWindows<-1>>("windows_late"),
        inDecoder<BackwardOfNeighbour>("backward_border_neighbour"),
        inDecoder<BackwardBitsKept>("backward_bits_kept"),
        inDecoder<BackwardEarly>("backward_border_early"),
        inDecoder<BackwardStale>("backward_border_stale"),
        inDecoder<TailBitsKept>("tail_bits_kept"),
        inDecoder<TailSign>("tail_sign"),
        inDecoder<ClippedTail>("tail_clipped"),
    };
    return faults;
}

}  // namespace morvik::faults
