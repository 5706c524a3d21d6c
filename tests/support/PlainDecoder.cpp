// An independent formulation of the whole LTE decoder for checking, window by window from the flow of border metrics.
#include "PlainDecoder.h"

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <map>

#include "QppTable.h"

namespace morvik::plain {

namespace {

constexpr unsigned tailSteps = 3;
constexpr unsigned threadsPerUnit = 4;
constexpr unsigned windowLimit = 64;
constexpr int lowestSoft = -128 * 16;  // of the 8-bit formats, aligned as 12-bit values
constexpr int highestSoft = 127 * 16;

constexpr Column unknownState = {0, 0, 0, 0, 0, 0, 0, 0};
constexpr Column knownStateZero = {0, -16384, -16384, -16384, -16384, -16384, -16384, -16384};

// Converts a caller's value to the state format. This includes a left shift by eight in a 32-bit word, so only the
// value's low 24 bits count.
int alignedSoft(int value)
{
    constexpr std::int64_t half = 1 << 23;
    const auto low24 = static_cast<int>(((value + half) & 0xFFFFFF) - half);
    return 16 * clip(low24, -128, 127);
}

int stateFormat(int value)  // drops the low bits outside the format
{
    return value & ~0xF;
}

Column stored(Column column)  // border metrics lose their seven low bits
{
    for (int& metric : column) {
        metric &= ~0x7F;
    }
    return column;
}

// The soft values of one constituent code, K + 3 of each.
struct Constituent {
    std::vector<int> sys;
    std::vector<int> par;
};

// Separates the values of the three streams, K + 4 each. 3GPP TS 36.212, 5.1.3.2.2: the twelve termination values fill
// the last four positions, position by position, as three pairs of systematic and parity value for each code.
std::array<Constituent, 2> constituents(const std::vector<int>& sys,
                                        const std::vector<int>& par1,
                                        const std::vector<int>& par2)
{
    std::array<Constituent, 2> codes;
    const auto K = static_cast<unsigned>(sys.size()) - 4;
    const std::vector<unsigned> interleaved = permutation(K);
    for (unsigned k = 0; k < K; ++k) {
        codes[0].sys.push_back(alignedSoft(sys[k]));
        codes[0].par.push_back(alignedSoft(par1[k]));
        codes[1].sys.push_back(alignedSoft(sys[interleaved[k]]));
        codes[1].par.push_back(alignedSoft(par2[k]));
    }
    std::vector<int> tail;
    for (unsigned k = K; k < K + 4; ++k) {
        tail.insert(tail.end(), {alignedSoft(sys[k]), alignedSoft(par1[k]), alignedSoft(par2[k])});
    }
    for (std::size_t i = 0; i < tail.size(); i += 2) {
        codes[i / 6].sys.push_back(tail[i]);
        codes[i / 6].par.push_back(tail[i + 1]);
    }
    return codes;
}

// From each state, one path of three steps empties the encoder's register. Its metric is the sum of its unclipped
// branch metrics.
Column terminationColumn(const Constituent& code)
{
    const std::size_t K = code.sys.size() - tailSteps;
    Column column;
    for (std::size_t state = 0; state < column.size(); ++state) {
        int sum = 0;
        std::size_t current = state;
        for (std::size_t k = K; k < K + tailSteps; ++k) {
            const bool zeroShiftsIn = transition(current, 0).to < 4;
            const Transition edge = transition(current, zeroShiftsIn ? 0 : 1);
            sum += edge.bit == 1 ? code.sys[k] : -code.sys[k];
            sum += edge.parity0 == 1 ? code.par[k] : -code.par[k];
            current = edge.to;
        }
        column[state] = wrap16(sum);
    }
    return stored(column);
}

// Decodes one block. Every recursion of every pass stores the column beyond its end under a key of its own, and looks
// up its start column by key: nothing is overwritten.
class BlockDecoder {
public:
    BlockDecoder(const Segmentation& cut, const std::array<Constituent, 2>& codes, unsigned algorithm)
        : itsCut(cut),
          itsCodes(codes),
          itsK(cut.segments * cut.length),
          itsPermutation(permutation(itsK)),
          itsScaled(algorithm == 1),
          itsRule(algorithm == 2 ? Decision::maxHash : Decision::max),
          itsTable(algorithm == 2 ? correctionTable(16) : std::vector<int>())
    {
    }

    Result decode(unsigned iterations)
    {
        Result result;
        result.llr.resize(itsK);
        result.extrinsic.resize(itsK);
        for (unsigned pass = 0; pass < 2 * iterations; ++pass) {
            result.passes.push_back(runPass(pass, result.extrinsic));
            result.llr = result.passes.back().llr;
            result.extrinsic = result.passes.back().extrinsic;
        }
        for (const int llr : result.llr) {
            result.bits.push_back(llr >= 0 ? 1 : 0);
        }
        return result;
    }

private:
    using ForwardBorder = std::array<unsigned, 2>;   // pass, segment
    using BackwardBorder = std::array<unsigned, 3>;  // pass, row of the window in its segment, segment

    // Passes 0, 2, 4, ... belong to the second constituent code, whose bits are interleaved.
    const Constituent& code(unsigned pass) const
    {
        return itsCodes[1 - pass % 2];
    }

    // The extrinsic values of the previous pass in this one's order; none for the termination.
    std::vector<int> aPriori(unsigned pass, const std::vector<int>& extrinsic) const
    {
        std::vector<int> values(itsK + tailSteps);
        for (unsigned i = 0; i < itsK; ++i) {
            const unsigned natural = itsPermutation[i];
            if (pass % 2 == 0) {
                values[i] = extrinsic[natural];
            } else {
                values[natural] = extrinsic[i];
            }
        }
        return values;
    }

    int extrinsicValue(int llr, int intrinsic) const
    {
        const int value = llr - 4 * intrinsic;
        if (itsScaled) {
            return stateFormat(clip(3 * value / 4, lowestSoft, highestSoft));
        }
        return clip(value, lowestSoft, highestSoft);
    }

    // A segment starts from the column that its left neighbour reached in the code's previous pass.
    Column forwardStart(unsigned pass, unsigned segment) const
    {
        if (segment == 0) {
            return knownStateZero;
        }
        if (pass < 2) {
            return unknownState;
        }
        return stored(itsForwardBorders.at({pass - 2, segment - 1}));
    }

    // A window starts from the column that its right neighbour in the block reached, normally in the code's previous
    // pass. With three or more rows, the last window of a segment starts from this pass's: the hardware fetches a start
    // column one row ahead, when the neighbour's row, the first, is already done.
    Column backwardStart(unsigned pass, unsigned row, unsigned segment) const
    {
        const auto rows = static_cast<unsigned>(itsCut.windowOffsets.size());
        const bool lastRow = row + 1 == rows;
        if (lastRow && segment + 1 == itsCut.segments) {
            return terminationColumn(code(pass));
        }
        if (pass < 2) {
            return unknownState;
        }
        if (!lastRow) {
            return stored(itsBackwardBorders.at({pass - 2, row + 1, segment}));
        }
        return stored(itsBackwardBorders.at({rows >= 3 ? pass : pass - 2, 0, segment + 1}));
    }

    void runForward(unsigned pass, Pass& values)
    {
        for (unsigned segment = 0; segment < itsCut.segments; ++segment) {
            const unsigned first = segment * itsCut.length;
            std::vector<BranchColumn> g;
            for (unsigned k = first; k < first + itsCut.length; ++k) {
                g.push_back(values.gamma[k]);
            }
            g.push_back({});  // for one more column, after the segment
            const std::vector<Column> columns = forward(g, forwardStart(pass, segment), itsRule, itsTable);
            std::copy(columns.begin(), columns.end(), &values.alpha[first]);
            itsForwardBorders[{pass, segment}] = columns.back();
        }
    }

    void runBackward(unsigned pass, Pass& values)
    {
        for (unsigned row = 0; row < itsCut.windowOffsets.size(); ++row) {
            for (unsigned segment = 0; segment < itsCut.segments; ++segment) {
                const unsigned first = segment * itsCut.length + itsCut.windowOffsets[row];
                std::vector<BranchColumn> g = {{}};  // for one more column, before the window
                for (unsigned k = first; k < first + itsCut.windowLengths[row]; ++k) {
                    g.push_back(values.gamma[k]);
                }
                const std::vector<Column> columns = backward(g, backwardStart(pass, row, segment), itsRule, itsTable);
                std::copy(columns.begin() + 1, columns.end(), &values.beta[first]);
                itsBackwardBorders[{pass, row, segment}] = columns.front();
            }
        }
    }

    Pass runPass(unsigned pass, const std::vector<int>& extrinsic)
    {
        const Constituent& soft = code(pass);
        const std::vector<int> priors = aPriori(pass, extrinsic);
        Pass values;
        for (unsigned k = 0; k < itsK + tailSteps; ++k) {
            values.intrinsic.push_back((stateFormat(priors[k] / 2) + soft.sys[k]) / 2);
        }
        for (unsigned k = 0; k < itsK; ++k) {
            values.gamma.push_back(branchMetrics(values.intrinsic[k], soft.par[k], 0));
        }
        values.alpha.resize(itsK + 1);
        values.beta.resize(itsK);
        runForward(pass, values);
        runBackward(pass, values);
        for (unsigned k = 0; k < itsK; ++k) {
            const int llr = logLikelihoodRatio(values.alpha[k], values.beta[k], values.gamma[k], itsRule, itsTable);
            values.llr.push_back(llr);
            values.extrinsic.push_back(extrinsicValue(llr, values.intrinsic[k]));
        }
        return values;
    }

    Segmentation itsCut;
    std::array<Constituent, 2> itsCodes;
    unsigned itsK;
    std::vector<unsigned> itsPermutation;
    bool itsScaled;
    Decision itsRule;
    std::vector<int> itsTable;
    std::map<ForwardBorder, Column> itsForwardBorders;
    std::map<BackwardBorder, Column> itsBackwardBorders;
};

}  // namespace

bool knownBlockSize(unsigned K)
{
    return std::any_of(std::begin(qppTable), std::end(qppTable), [K](const QppParameters& row) { return row.K == K; });
}

std::vector<unsigned> permutation(unsigned K)
{
    std::vector<unsigned> positions;
    for (const QppParameters& row : qppTable) {
        for (std::uint64_t i = 0; row.K == K && i < K; ++i) {
            positions.push_back(static_cast<unsigned>((row.f1 * i + row.f2 * i * i) % K));
        }
    }
    return positions;
}

std::optional<Segmentation> segmentation(unsigned K, unsigned processors)
{
    Segmentation cut;
    cut.segments = 1;
    while (cut.segments < processors && 128 * cut.segments <= K) {
        cut.segments *= 2;
    }
    if (K % cut.segments != 0) {
        return std::nullopt;
    }
    cut.length = K / cut.segments;
    unsigned offset = 0;
    while (offset < cut.length) {
        const unsigned left = cut.length - offset;
        unsigned window = left;
        if (left >= 2 * windowLimit) {
            window = windowLimit;
        } else if (left > windowLimit) {
            window = (left + 1) / 2;
        }
        cut.windowOffsets.push_back(offset);
        cut.windowLengths.push_back(window);
        offset += window;
    }
    return cut;
}

std::optional<Result> decode(const std::vector<int>& sys,
                             const std::vector<int>& par1,
                             const std::vector<int>& par2,
                             unsigned units,
                             unsigned algorithm,
                             unsigned iterations)
{
    if (sys.size() < 4 || par1.size() != sys.size() || par2.size() != sys.size()) {
        return std::nullopt;
    }
    const auto K = static_cast<unsigned>(sys.size()) - 4;
    const auto cut = segmentation(K, units * threadsPerUnit);
    if (!cut || (K != 0 && !knownBlockSize(K))) {
        return std::nullopt;
    }
    return BlockDecoder(*cut, constituents(sys, par1, par2), algorithm).decode(iterations);
}

}  // namespace morvik::plain
