// Counts the situations of a block plainly: from the second model's values, candidate by candidate, by their names.
#include "PlainSituations.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <set>
#include <vector>

#include "support/PlainDecoder.h"

namespace morvik::plain {

namespace {

struct Candidate {
    int sum;          // with the branch metric, not wrapped
    int pending = 0;  // correction
    int value() const
    {
        return wrap16(sum);
    }
};

using Pending = std::array<int, 8>;

class Counter {
public:
    Counter(const blocks::Block& block, unsigned units, unsigned algorithm, unsigned iterations)
        : itsK(static_cast<unsigned>(block.sys.size()) - 4),
          itsAlgorithm(algorithm),
          itsBlock(block),
          itsCut(*segmentation(itsK, 4 * units)),
          itsOrder(permutation(itsK)),
          itsResult(*decode({block.sys.begin(), block.sys.end()},
                            {block.par1.begin(), block.par1.end()},
                            {block.par2.begin(), block.par2.end()},
                            units,
                            algorithm,
                            iterations)),
          itsTable(correctionTable(16))
    {
        countBlock(units);
        for (itsPass = 0; itsPass < itsResult.passes.size(); ++itsPass) {
            itsInterleaved = itsPass % 2 == 0;
            countSoftValues();
            countTail();
            countForward();
            countBackward();
            countRatios();
        }
    }

    NamedCounts counts;

private:
    void met(const std::string& name, bool is = true)
    {
        counts[name] += is ? 1 : 0;
    }

    void ends(const std::string& name, int value, int low, int high)
    {
        met(name + ".above", value > high);
        met(name + ".below", value < low);
    }

    void wraps(const std::string& name, int value)
    {
        ends(name, value, -32768, 32767);
    }

    const Pass& pass() const
    {
        return itsResult.passes[itsPass];
    }

    // The low 24 bits of a caller's integer count.
    static int aligned(int value)
    {
        const std::int64_t low = ((std::int64_t{value} + 0x800000) & 0xFFFFFF) - 0x800000;
        return 16 * clip(static_cast<int>(low), -128, 127);
    }

    // Value t of the tail: x z x z x z of the first encoder, then of the second, in columns of three.
    int tailValue(unsigned step, bool isParity) const
    {
        const unsigned t = (itsInterleaved ? 6 : 0) + 2 * step + (isParity ? 1 : 0);
        const auto& stream = t % 3 == 0 ? itsBlock.sys : t % 3 == 1 ? itsBlock.par1 : itsBlock.par2;
        return aligned(stream[itsK + t / 3]);
    }

    int systematic(unsigned k) const
    {
        return k < itsK ? aligned(itsBlock.sys[itsInterleaved ? itsOrder[k] : k]) : tailValue(k - itsK, false);
    }

    int parity(unsigned k) const
    {
        return aligned(itsInterleaved ? itsBlock.par2[k] : itsBlock.par1[k]);
    }

    int apriori(unsigned k) const
    {
        if (itsPass == 0 || k >= itsK) {
            return 0;
        }
        const std::vector<int>& extrinsic = itsResult.passes[itsPass - 1].extrinsic;
        const auto inverse = std::find(itsOrder.begin(), itsOrder.end(), k) - itsOrder.begin();
        return extrinsic[itsInterleaved ? itsOrder[k] : static_cast<std::size_t>(inverse)];
    }

    void countBlock(unsigned units)
    {
        met("core." + std::to_string(units) + "_units");
        met(std::string("core.") + std::array{"max-log", "scaled", "table"}[itsAlgorithm]);
        met("size." + std::to_string(itsK), itsK == 40 || itsK == 6144);
        met("segments." + std::to_string(itsCut.segments));
        met("units." + std::to_string(std::min(units, itsCut.segments)));
        const std::size_t rows = itsCut.windowLengths.size();
        met("rows." + (rows > 3 ? "more" : std::to_string(rows)));
        std::set<std::string> kinds;
        for (const unsigned length : itsCut.windowLengths) {
            kinds.insert(length == 64 ? "window.full" : rows == 1 ? "window.short" : "window.half");
        }
        for (const std::string& kind : kinds) {
            met(kind);
        }
    }

    void input(const std::string& stream, int value)
    {
        met("input." + stream + ".highest", value == 127 * 16);
        met("input." + stream + ".lowest", value == -128 * 16);
    }

    void countSoftValues()
    {
        for (unsigned k = 0; k < itsK + 3; ++k) {
            const int a = apriori(k);
            const int twice = 2 * pass().intrinsic[k];
            input(k < itsK ? "systematic" : "tail", systematic(k));
            met("intrinsic.odd.positive", a > 0 && a / 16 % 2 != 0);
            met("intrinsic.odd.negative", a < 0 && a / 16 % 2 != 0);
            ends("intrinsic.wide", twice, -2048, 2032);
            met("intrinsic.half.positive", twice > 0 && twice / 16 % 2 != 0);
            met("intrinsic.half.negative", twice < 0 && twice / 16 % 2 != 0);
            if (k < itsK) {
                input("parity", parity(k));
                ends("branch.g0", twice + parity(k), -2048, 2032);
                ends("branch.g1", twice - parity(k), -2048, 2032);
                met("branch.negated", parity(k) == -2048);
                countRatio(k, twice);
            }
        }
    }

    void countRatio(unsigned k, int twice)
    {
        met(std::string("pass.") + (itsPass < 2 ? "first" : "later") + (itsInterleaved ? ".interleaved" : ".natural"));
        const int ratio = pass().llr[k];
        if (itsPass + 1 == itsResult.passes.size()) {
            met(ratio == 0 ? "decision.zero" : ratio > 0 ? "decision.one" : "decision.none");
        }
        const int x = ratio - 2 * twice;
        const int scaled = itsAlgorithm == 1 ? 3 * x / 4 : x;
        const bool isClipped = scaled >= 2048 || scaled < -2048;
        if (isClipped) {
            met(x > 0 ? "extrinsic.above" : "extrinsic.below");
        } else if (itsAlgorithm == 1) {
            ends("extrinsic.inside", x, -2048, 2032);
            met("extrinsic.rounded.positive", scaled > 0 && scaled % 16 != 0);
            met("extrinsic.rounded.negative", scaled < 0 && scaled % 16 != 0);
        }
    }

    void border(const std::string& kind, const Column& column)
    {
        for (const int metric : column) {
            met("border." + kind + (metric < 0 ? ".negative" : ".positive"), metric % 128 != 0);
        }
    }

    // Follows each state through the trellis back to state 0.
    void countTail()
    {
        Column column{};
        for (std::size_t state = 0; state < 8; ++state) {
            std::size_t at = state;
            for (unsigned step = 0; step < 3; ++step) {
                const unsigned bit = transition(at, 0).to < 4 ? 0 : 1;
                const Transition edge = transition(at, bit);
                const int sign = edge.parity0 == bit ? 1 : -1;  // of parity beside systematic
                const int sum = systematic(itsK + step) + sign * tailValue(step, true);
                column[state] += bit != 0 ? sum : -sum;
                at = edge.to;
            }
        }
        for (unsigned step = 0; step < 3; ++step) {
            const int x = systematic(itsK + step);
            const int p = tailValue(step, true);
            input("tail", p);
            ends("tail.sum", x + p, -2048, 2032);
            if (step < 2) {
                ends("tail.sum", x - p, -2048, 2032);
            }
        }
        border("tail", column);
        const int best = *std::max_element(column.begin(), column.end());
        for (std::size_t state = 0; state < 8; ++state) {
            met(std::string("tail.") + (itsInterleaved ? "interleaved." : "natural.") + std::to_string(state),
                column[state] == best && std::count(column.begin(), column.end(), best) == 1);
        }
    }

    // Counts a decision; returns the winner with what it leaves pending.
    Candidate decide(const std::string& kernel, const std::string& tie, const Candidate& c1, const Candidate& c2)
    {
        const int exact = c1.value() - c2.value();
        const int d = wrap16(exact);
        wraps("compare." + kernel, exact);
        met(tie, exact == 0);
        const Candidate& winner = d < 0 ? c2 : c1;
        if (itsAlgorithm != 2) {
            return {winner.value(), 0};
        }
        met("wrap.pending." + kernel, winner.value() + winner.pending > 32767);
        met("pending.tie." + kernel, exact == 0 && c1.pending != c2.pending);
        const int magnitude = d < 0 ? -d - 1 : d;
        if (magnitude >= 6 * 64) {
            met("table." + kernel + ".none");
        } else {
            met("table." + kernel + '.' + std::to_string(magnitude / 64) + (d < 0 ? ".negative" : ".positive"));
            met("table." + kernel + ".inverted", d < 0 && d % 64 == 0 && d != -320);
        }
        return {wrap16(winner.value() + winner.pending), itsTable[static_cast<std::size_t>(d + 32768)]};
    }

    int branch(const Transition& edge, unsigned k) const
    {
        const int g = pass().gamma[k][edge.bit == edge.parity0 ? 0 : 1];
        return edge.bit != 0 ? g : -g;
    }

    void step(const std::string& kernel, unsigned k, Column& column, Pending& pending)
    {
        const bool isForward = kernel == "forward";
        std::array<std::array<Candidate, 8>, 2> candidates{};
        for (std::size_t state = 0; state < 8; ++state) {
            for (const unsigned bit : {0U, 1U}) {
                const Transition edge = transition(state, bit);
                const std::size_t from = isForward ? edge.from : edge.to;
                Candidate& candidate = candidates[bit][isForward ? edge.to : edge.from];
                candidate = {column[from] + branch(edge, k), pending[from]};
                wraps("wrap." + kernel + (bit != 0 ? ".one" : ".zero"), candidate.sum);
            }
        }
        for (std::size_t state = 0; state < 8; ++state) {
            const Candidate best = decide(
                kernel, "tie." + kernel + '.' + std::to_string(state), candidates[1][state], candidates[0][state]);
            column[state] = best.value();
            pending[state] = best.pending;
        }
    }

    void countForward()
    {
        for (unsigned u = 0; u < itsCut.segments; ++u) {
            const unsigned from = u * itsCut.length;
            met(u == 0 ? "start.forward.known" : itsPass < 2 ? "start.forward.unknown" : "start.forward.kept");
            Column column = pass().alpha[from];
            Pending pending{};
            const bool isLastKept = u + 1 == itsCut.segments || itsPass + 2 < itsResult.passes.size();
            for (unsigned k = from; k + (isLastKept ? 0 : 1) < from + itsCut.length; ++k) {
                step("forward", k, column, pending);
            }
            if (u + 1 < itsCut.segments && isLastKept) {
                border("forward", column);
            }
        }
    }

    void countBackward()
    {
        const std::size_t rows = itsCut.windowLengths.size();
        for (unsigned u = 0; u < itsCut.segments; ++u) {
            for (std::size_t row = 0; row < rows; ++row) {
                const unsigned first = u * itsCut.length + itsCut.windowOffsets[row];
                const unsigned end = first + itsCut.windowLengths[row];
                const bool isFresh = rows > 2 && row + 1 == rows;
                met(std::string("start.backward.") + (end == itsK   ? "tail"
                                                      : itsPass < 2 ? "unknown"
                                                      : isFresh     ? "fresh"
                                                                    : "kept"));
                Column column = pass().beta[end - 1];
                Pending pending{};
                for (unsigned k = end - 1; k > first; --k) {
                    step("backward", k, column, pending);
                }
                // Row 0 ends where the last row of the segment before starts, in this pass if there are three rows.
                const bool startsFresh = rows > 2 && row == 0;
                const bool isUsed = startsFresh ? itsPass >= 2 : itsPass + 2 < itsResult.passes.size();
                if (first > 0 && isUsed) {
                    step("backward", first, column, pending);
                    border("backward", column);
                }
            }
        }
    }

    int tree(unsigned k, unsigned bit)
    {
        const std::string tie = std::string("tie.ratio.") + (bit != 0 ? "one." : "zero.");
        std::array<Candidate, 4> pairs{};
        for (std::size_t i = 0; i < 4; ++i) {
            std::array<Candidate, 2> two{};
            for (const std::size_t odd : {0U, 1U}) {
                const Transition edge = transition(2 * i + odd, bit);
                two[odd] = {pass().alpha[k][edge.from] + pass().beta[k][edge.to]};
                wraps("wrap.sum", two[odd].sum);
                two[odd].sum = two[odd].value();
            }
            pairs[i] = decide("ratio", tie + "pair" + std::to_string(i), two[1], two[0]);
            pairs[i].sum += branch(transition(2 * i, bit), k);
            wraps(std::string("wrap.ratio.") + (bit != 0 ? "one" : "zero"), pairs[i].sum);
        }
        const Candidate half0 = decide("ratio", tie + "half0", pairs[0], pairs[1]);
        const Candidate half1 = decide("ratio", tie + "half1", pairs[2], pairs[3]);
        const Candidate last = decide("ratio", tie + "last", half0, half1);
        return wrap16(last.value() + last.pending);
    }

    void countRatios()
    {
        for (unsigned k = 0; k < itsK; ++k) {
            const int one = tree(k, 1);
            wraps("wrap.difference", one - tree(k, 0));
        }
    }

    unsigned itsK;
    unsigned itsAlgorithm;
    const blocks::Block& itsBlock;
    Segmentation itsCut;
    std::vector<unsigned> itsOrder;
    Result itsResult;
    std::vector<int> itsTable;
    std::size_t itsPass = 0;
    bool itsInterleaved = false;
};

}  // namespace

NamedCounts plainSituations(const blocks::Block& block, unsigned units, unsigned algorithm, unsigned iterations)
{
    return Counter(block, units, algorithm, iterations).counts;
}

}  // namespace morvik::plain
