// The constituent code's trellis and kernels for checking, computed plainly from the encoder's shift register.
#include "PlainTrellis.h"

#include <algorithm>
#include <cmath>

namespace morvik::plain {

namespace {

constexpr std::size_t stateCount = 8;
constexpr unsigned stateFraction = 3;  // fraction bits of the state format
constexpr unsigned stateShift = 4;     // unused low bits of its 16-bit words

// A metric, and the correction of its decision if still pending.
struct Metric {
    int value;
    int pending;
};

struct MetricColumn {
    Column value;
    Column pending;
};

// Decides between a candidate for an information bit of 1 and one for a bit of 0, or between two such results.
class Decider {
public:
    Decider(Decision rule, const std::vector<int>& table) : itsRule(rule), itsTable(table) {}

    Metric operator()(const Metric& first, const Metric& second) const
    {
        const int difference = wrap16(first.value - second.value);
        const Metric& winner = difference < 0 ? second : first;
        if (itsRule == Decision::max) {
            return winner;
        }
        const int index = difference + 32768;
        const int correction = itsTable.at(static_cast<std::size_t>(index));
        if (itsRule == Decision::maxStar) {
            return {wrap16(winner.value + correction), 0};
        }
        return {wrap16(winner.value + winner.pending), correction};
    }

private:
    Decision itsRule;
    const std::vector<int>& itsTable;
};

// The branch metrics are numbered g0 to g3 by the parity bits (1,1), (0,1), (0,0), (1,0).
std::size_t branchNumber(unsigned parity0, unsigned parity1)
{
    if (parity1 == 1) {
        return parity0 == 1 ? 0 : 1;
    }
    return parity0 == 1 ? 3 : 2;
}

// An edge for a bit of 0 has the negated metric of the edge with all three bits inverted: the hardware clips the metric
// for a bit of 1 and then negates it.
int branchMetric(const Transition& edge, const BranchColumn& g)
{
    if (edge.bit == 1) {
        return g[branchNumber(edge.parity0, edge.parity1)];
    }
    return -g[branchNumber(1 - edge.parity0, 1 - edge.parity1)];
}

enum class Direction { forward, backward };

// One step of a recursion: every state decides between its edge for a bit of 1 and that for a bit of 0.
MetricColumn advance(const MetricColumn& old, const BranchColumn& g, Direction direction, const Decider& decide)
{
    std::array<std::array<Metric, stateCount>, 2> candidates;
    for (std::size_t state = 0; state < stateCount; ++state) {
        for (unsigned bit = 0; bit < 2; ++bit) {
            const Transition edge = transition(state, bit);
            const std::size_t source = direction == Direction::forward ? edge.from : edge.to;
            const std::size_t target = direction == Direction::forward ? edge.to : edge.from;
            candidates[bit][target] = {wrap16(old.value[source] + branchMetric(edge, g)), old.pending[source]};
        }
    }
    MetricColumn result;
    for (std::size_t state = 0; state < stateCount; ++state) {
        const Metric best = decide(candidates[1][state], candidates[0][state]);
        result.value[state] = best.value;
        result.pending[state] = best.pending;
    }
    return result;
}

// The metric of the best path through the edges with the given information bit. States 2k and 2k + 1 share branch
// metric k, which is therefore added after the decision between them.
int bestPath(const Column& a, const Column& b, const BranchColumn& g, unsigned bit, const Decider& decide)
{
    std::array<Metric, 4> best;
    for (std::size_t k = 0; k < best.size(); ++k) {
        const Transition odd = transition(2 * k + 1, bit);
        const Transition even = transition(2 * k, bit);
        best[k] = decide({wrap16(a[odd.from] + b[odd.to]), 0}, {wrap16(a[even.from] + b[even.to]), 0});
        best[k].value = wrap16(best[k].value + branchMetric(even, g));
    }
    const Metric whole = decide(decide(best[0], best[1]), decide(best[2], best[3]));
    return wrap16(whole.value + whole.pending);
}

}  // namespace

// The encoder of 3GPP TS 36.212, 5.1.3.2.1: feedback 1 + D^2 + D^3, parity 1 + D + D^3. The second parity,
// 1 + D + D^2 + D^3, is for the rate-1/5 codes, which share the decoder. The newest register bit is the state's most
// significant.
Transition transition(std::size_t state, unsigned bit)
{
    const auto d1 = static_cast<unsigned>(state >> 2) & 1;
    const auto d2 = static_cast<unsigned>(state >> 1) & 1;
    const auto d3 = static_cast<unsigned>(state) & 1;
    const unsigned fed = bit ^ d2 ^ d3;
    return {state, (fed << 2) | (d1 << 1) | d2, bit, fed ^ d1 ^ d3, fed ^ d1 ^ d2 ^ d3};
}

int wrap16(int value)
{
    return ((value + 0x8000) & 0xFFFF) - 0x8000;
}

int clip(int value, int low, int high)
{
    return std::min(std::max(value, low), high);
}

std::vector<int> correctionTable(unsigned points)
{
    const unsigned range = points == 0 ? 65536 : points;
    if ((range & (range - 1)) != 0) {
        return {};
    }
    unsigned indexBits = 0;
    while ((range >> indexBits) > 1) {
        ++indexBits;
    }
    // Three index bits resolve whole units, the rest fractions; lower bits of a difference are ignored.
    const unsigned fraction = indexBits > 3 ? std::min(stateFraction, indexBits - 3) : 0;
    const int step = 1 << (stateFraction + stateShift - fraction);
    const double steps = 1 << stateFraction;

    std::vector<int> table;
    for (int difference = -32768; difference < 32768; ++difference) {
        const int magnitude = difference < 0 ? -1 - difference : difference;  // by inversion, as in the hardware
        const double real = (magnitude / step * step >> stateShift) / steps;
        const long correction = real < range ? std::lround(steps * std::log1p(std::exp(-real))) : 0;
        table.push_back(static_cast<int>(correction << stateShift) & 0xFF);
    }
    return table;
}

BranchColumn branchMetrics(int intrinsic, int parity0, int parity1)
{
    BranchColumn g;
    for (unsigned bit0 = 0; bit0 < 2; ++bit0) {
        for (unsigned bit1 = 0; bit1 < 2; ++bit1) {
            const int sum = 2 * intrinsic + (bit0 == 1 ? parity0 : -parity0) + (bit1 == 1 ? parity1 : -parity1);
            g[branchNumber(bit0, bit1)] = clip(sum, -128 * 16, 127 * 16);
        }
    }
    return g;
}

std::vector<Column> forward(const std::vector<BranchColumn>& g,
                            const Column& start,
                            Decision rule,
                            const std::vector<int>& table)
{
    std::vector<Column> columns = {start};
    MetricColumn metrics = {start, {}};
    for (std::size_t j = 0; j + 1 < g.size(); ++j) {
        metrics = advance(metrics, g[j], Direction::forward, Decider(rule, table));
        columns.push_back(metrics.value);
    }
    return columns;
}

std::vector<Column> backward(const std::vector<BranchColumn>& g,
                             const Column& start,
                             Decision rule,
                             const std::vector<int>& table)
{
    std::vector<Column> columns = {start};
    MetricColumn metrics = {start, {}};
    for (std::size_t j = g.size() - 1; j > 0; --j) {
        metrics = advance(metrics, g[j], Direction::backward, Decider(rule, table));
        columns.push_back(metrics.value);
    }
    std::reverse(columns.begin(), columns.end());
    return columns;
}

int logLikelihoodRatio(
    const Column& a, const Column& b, const BranchColumn& g, Decision rule, const std::vector<int>& table)
{
    const Decider decide(rule, table);
    return wrap16(bestPath(a, b, g, 1, decide) - bestPath(a, b, g, 0, decide));
}

}  // namespace morvik::plain
