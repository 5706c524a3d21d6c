// How far apart metrics can lie: the proof of what lanes/Bounds.h states.
//
// Of a column, upper bounds of all differences of two metrics are known; a step of a recursion gives those of
// the next column. Each metric there is the greater of two candidates, which share a branch metric, so a
// difference is at most that of either candidate to the better one of the other two, whatever the branch
// metrics are.
#include <gtest/gtest.h>

#include <cstddef>

#include <algorithm>
#include <array>
#include <cstdint>
#include <functional>
#include <limits>
#include <numeric>
#include <vector>

#include "lanes/Bounds.h"
#include "rules/Correction.h"
#include "rules/Trellis.h"

namespace rules = morvik::rules;

namespace {

using morvik::rules::stateCount;

/// What a decision of MOD# may add to its winner, in steps.
constexpr int mostCorrection = 6;

/// No segment of a block, no window and no half of the smallest block is shorter.
constexpr unsigned fewestSteps = 8;
constexpr unsigned smallestHalf = 20;

/// Where metrics that wrap are still compared by their true difference.
constexpr int wrapsFrom = 2048;

/// [s][t]: the metric of state s is greater than that of t by so much at most.
using Leads = std::array<std::array<int, stateCount>, stateCount>;

int greatest(const Leads& leads)
{
    int most = 0;
    for (const auto& row : leads) {
        most = std::max(most, *std::max_element(row.begin(), row.end()));
    }
    return most;
}

Leads either(const Leads& a, const Leads& b)
{
    Leads both = a;
    for (unsigned s = 0; s < stateCount; ++s) {
        for (unsigned t = 0; t < stateCount; ++t) {
            both[s][t] = std::max(a[s][t], b[s][t]);
        }
    }
    return both;
}

/// Of a column that loses its low bits (rule 11).
Leads kept(Leads leads)
{
    for (unsigned s = 0; s < stateCount; ++s) {
        for (unsigned t = 0; t < stateCount; ++t) {
            leads[s][t] += s == t ? 0 : ~morvik::lanes::borderMask;
        }
    }
    return leads;
}

/// The leads in one column.
Leads leadsOf(const std::array<int, stateCount>& metrics)
{
    Leads leads{};
    for (unsigned s = 0; s < stateCount; ++s) {
        for (unsigned t = 0; t < stateCount; ++t) {
            leads[s][t] = metrics[s] - metrics[t];
        }
    }
    return leads;
}

/// Whether two pairs of states have the same branch metric: LTE has no second parity stream (rule 5).
bool shareBranch(unsigned pair, unsigned other)
{
    const auto sums = rules::branchSums(1, 10, 0);
    return sums[pair] == sums[other];
}

/// The greatest value of sign * g.
int greatestBranch(int sign)
{
    return sign > 0 ? morvik::lanes::branchMax : -morvik::lanes::branchMin;
}

int signOf(unsigned bit)
{
    return bit != 0 ? 1 : -1;
}

/// The greatest lead of a candidate, sign times the branch metric of `pair` included, over the better one of
/// two others, which count the branch metric of `other` + and -; before branch metrics it leads by over[bit].
int leadOverBetter(unsigned pair, int sign, unsigned other, const std::array<int, 2>& over)
{
    const bool shared = shareBranch(pair, other);
    int most = -wrapsFrom * wrapsFrom;
    for (int g = morvik::lanes::branchMin; g <= morvik::lanes::branchMax; ++g) {
        const int own = shared ? sign * g : greatestBranch(sign);
        most = std::max(most, own + std::min(over[1] - g, over[0] + g));
    }
    return most;
}

/// Forward, a state comes from its predecessors; backward, from its successors.
enum class Direction { forward, backward };

unsigned origin(Direction direction, unsigned state, unsigned bit)
{
    return direction == Direction::forward ? rules::predecessor(state, bit) : rules::successor(state, bit);
}

/// The pair whose branch metric the two candidates of a state share.
unsigned pairInto(Direction direction, unsigned state)
{
    return rules::branch(direction == Direction::forward ? rules::predecessor(state, 1) : state);
}

Leads step(Direction direction, const Leads& before)
{
    Leads after{};
    for (unsigned s = 0; s < stateCount; ++s) {
        for (unsigned t = 0; t < stateCount; ++t) {
            if (s == t) {
                continue;
            }
            int most = -wrapsFrom * wrapsFrom;
            for (const unsigned bit : {0U, 1U}) {
                const auto& from = before[origin(direction, s, bit)];
                const std::array<int, 2> over = {from[origin(direction, t, 0)], from[origin(direction, t, 1)]};
                most =
                    std::max(most, leadOverBetter(pairInto(direction, s), signOf(bit), pairInto(direction, t), over));
            }
            after[s][t] = most + mostCorrection;
        }
    }
    return after;
}

/// Two candidates of a recursion compared, in the step from such a column.
int greatestDecision(Direction direction, const Leads& before)
{
    int most = 0;
    for (unsigned s = 0; s < stateCount; ++s) {
        const unsigned one = origin(direction, s, 1);
        const unsigned zero = origin(direction, s, 0);
        most = std::max(
            {most, before[one][zero] + 2 * morvik::lanes::branchMax, before[zero][one] - 2 * morvik::lanes::branchMin});
    }
    return most;
}

/// The columns after 0, 1, ... steps, as many as a longest window has.
std::vector<Leads> columnsFrom(Direction direction, const Leads& start)
{
    std::vector<Leads> columns = {start};
    while (columns.size() <= morvik::lanes::longestWindow) {
        columns.push_back(step(direction, columns.back()));
    }
    return columns;
}

Leads anyOf(const std::vector<Leads>& columns, unsigned first)
{
    return std::accumulate(columns.begin() + static_cast<std::ptrdiff_t>(first), columns.end(), columns.back(), either);
}

Leads knownColumn()
{
    std::array<int, stateCount> metrics{};
    metrics.fill(morvik::lanes::unlikely);
    metrics[0] = 0;
    return leadsOf(metrics);
}

/// Of all tails: a difference of two metrics is linear in the six values, so it is greatest where each of
/// them is an extreme one.
Leads tailColumn()
{
    Leads leads = leadsOf({});
    for (unsigned signs = 0; signs < 64; ++signs) {
        const auto value = [signs](unsigned i) {
            return (signs >> i & 1U) != 0 ? morvik::lanes::branchMax : morvik::lanes::branchMin;
        };
        leads = either(leads,
                       leadsOf(rules::tailColumn<int>(
                           {{value(0), value(1), value(2)}, {value(3), value(4), value(5)}, {0, 0, 0}})));
    }
    return kept(leads);
}

/// One recursion: the columns from the block's end where it starts, by their number of steps; all columns
/// that segments or windows inside start from; and all that these and the settled ones come to.
struct Recursion {
    std::vector<Leads> fromEnd;
    Leads border{};
    Leads inside{};

    Recursion(Direction direction, const Leads& end) : fromEnd(columnsFrom(direction, end))
    {
        const Leads settled = anyOf(fromEnd, fewestSteps);
        Leads last{};
        do {
            last = border;
            const std::vector<Leads> columns = columnsFrom(direction, border);
            border = either(border, kept(either(settled, anyOf(columns, fewestSteps))));
            inside = either(anyOf(columns, 0), anyOf(fromEnd, smallestHalf));
        } while (border != last);
    }
};

const Recursion& forward()
{
    static const Recursion recursion(Direction::forward, knownColumn());
    return recursion;
}

const Recursion& backward()
{
    static const Recursion recursion(Direction::backward, tailColumn());
    return recursion;
}

/// The lead of the branch from s on `bit` over the branch from t on `other`, metrics at both ends included.
int branchLead(const Leads& a, const Leads& b, unsigned s, unsigned bit, unsigned t, unsigned other)
{
    const int own = signOf(bit);
    const int others = signOf(other);
    const int metrics = a[s][t] + b[rules::successor(s, bit)][rules::successor(t, other)];
    if (!shareBranch(rules::branch(s), rules::branch(t))) {
        return metrics + greatestBranch(own) + greatestBranch(-others);
    }
    return metrics + (own == others ? 0 : 2 * greatestBranch(own));
}

/// The greatest difference that is compared in the tree of a ratio: of two states, two pairs or two halves
/// (rule 8). What is compared there is the best branch of each, so each leads by its lead over whichever
/// branch of the other side it leads least. A half carries the correction of one of its pairs.
int greatestInTree(const Leads& a, const Leads& b)
{
    int most = 0;
    for (const unsigned bit : {0U, 1U}) {
        for (const unsigned size : {1U, 2U, 4U}) {
            for (unsigned s = 0; s < stateCount; ++s) {
                const unsigned first = (s / size ^ 1U) * size;
                int lead = branchLead(a, b, s, bit, first, bit);
                for (unsigned t = first + 1; t < first + size; ++t) {
                    lead = std::min(lead, branchLead(a, b, s, bit, t, bit));
                }
                most = std::max(most, lead + (size == 4 ? mostCorrection : 0));
            }
        }
    }
    return most;
}

/// The greatest ratio, with the corrections of three levels of a tree.
int greatestRatio(const Leads& a, const Leads& b)
{
    int most = 0;
    for (const unsigned bit : {0U, 1U}) {
        for (unsigned s = 0; s < stateCount; ++s) {
            int lead = branchLead(a, b, s, bit, 0, 1 - bit);
            for (unsigned t = 1; t < stateCount; ++t) {
                lead = std::min(lead, branchLead(a, b, s, bit, t, 1 - bit));
            }
            most = std::max(most, lead + 3 * mostCorrection);
        }
    }
    return most;
}

/// The greatest over all steps of a block: an end of it is at hand, or none is.
int overAllSteps(const std::function<int(const Leads&, const Leads&)>& figure)
{
    int most = figure(forward().inside, backward().inside);
    for (const Leads& a : forward().fromEnd) {
        most = std::max(most, figure(a, backward().inside));
    }
    for (const Leads& b : backward().fromEnd) {
        most = std::max(most, figure(forward().inside, b));
    }
    return most;
}

}  // namespace

TEST(LaneBounds, OfAColumn)
{
    EXPECT_EQ(greatest(forward().fromEnd[0]), -morvik::lanes::unlikely);
    EXPECT_EQ(greatest(anyOf(forward().fromEnd, 0)), 1228);
    EXPECT_EQ(greatest(backward().fromEnd[0]), 1287);
    EXPECT_EQ(greatest(anyOf(backward().fromEnd, 0)), 1287);
    for (const Recursion* recursion : {&forward(), &backward()}) {
        EXPECT_EQ(recursion->fromEnd[morvik::lanes::longestWindow],
                  recursion->fromEnd[morvik::lanes::longestWindow - 1])
            << "longer recursions have to be looked at";
        EXPECT_EQ(greatest(anyOf(recursion->fromEnd, 3)), 786);
        EXPECT_EQ(greatest(recursion->border), 670);
        EXPECT_EQ(greatest(recursion->inside), 670);
    }
}

TEST(LaneBounds, OfTheRecursionsDecisions)
{
    int most = 0;
    for (const Direction direction : {Direction::forward, Direction::backward}) {
        const Recursion& recursion = direction == Direction::forward ? forward() : backward();
        most = std::max(most, greatestDecision(direction, recursion.inside));
        for (const Leads& column : recursion.fromEnd) {
            most = std::max(most, greatestDecision(direction, column));
        }
    }
    EXPECT_EQ(most, 1484);
    EXPECT_LT(most, wrapsFrom);
}

/// A plain comparison decides as the hardware's wrapping one does, at the block's ends, too.
TEST(LaneBounds, OfARatiosDecisions)
{
    const int most = overAllSteps(greatestInTree);
    EXPECT_EQ(greatestInTree(forward().inside, backward().inside), 1340);
    EXPECT_EQ(most, 1898);
    EXPECT_LT(most, wrapsFrom);
}

TEST(LaneBounds, OfARatio)
{
    EXPECT_EQ(overAllSteps(greatestRatio), 944);
}

/// The entries kept in the lanes, the last of which is 0, are those of all differences that are compared.
TEST(LaneBounds, OfACorrectedDifference)
{
    constexpr std::uint32_t points = 16;
    constexpr std::uint32_t resolved = rules::resolvedFractionBits(rules::fractionBits, 4);
    constexpr std::uint32_t ignored = rules::fractionBits + rules::stateAlignment - resolved;
    constexpr std::int32_t eighth = 1 << rules::stateAlignment;
    const auto correction = [](std::int32_t difference) {
        return rules::correction(
            difference * eighth, ignored, points, rules::stateAlignment, 1U << rules::fractionBits);
    };
    constexpr int reach = morvik::lanes::correctionEntries * morvik::lanes::correctionStep;
    EXPECT_EQ(correction(0), mostCorrection);
    EXPECT_EQ(correction(reach - morvik::lanes::correctionStep), 0);
    for (int difference = -wrapsFrom; difference < wrapsFrom; ++difference) {
        const int within = std::clamp(difference, -reach, reach - 1) >> morvik::lanes::correctionStepBits;
        const int entry = morvik::lanes::correctionEntry(within);
        EXPECT_EQ(correction(difference), correction(entry * morvik::lanes::correctionStep)) << difference;
    }
}

/// The greatest magnitude of a metric that a recursion starts a window from: as it is given, or brought back
/// to 0 by state 0, up to a kept column's low bits.
TEST(LaneBounds, OfSixteenBits)
{
    const int tail = 6 * -morvik::lanes::branchMin + ~morvik::lanes::borderMask;
    const int broughtBack = std::max(greatest(anyOf(forward().fromEnd, fewestSteps)), greatest(forward().inside)) +
                            ~morvik::lanes::borderMask;
    const int start = std::max({-morvik::lanes::unlikely, tail, broughtBack, greatest(backward().border)});
    EXPECT_LE(start, 1300);
    const int reached =
        start + static_cast<int>(morvik::lanes::longestWindow) * (-morvik::lanes::branchMin + mostCorrection);
    EXPECT_LE(reached, 9900);
    const int sum = 2 * reached - morvik::lanes::branchMin + 3 * mostCorrection;
    EXPECT_LE(sum, 20000);
    // Forward metrics are lifted in the steps before, backward ones in those after, and a branch in its own.
    const int lift = static_cast<int>(morvik::lanes::longestWindow) * -morvik::lanes::branchMin;
    EXPECT_LE(sum + lift, std::numeric_limits<std::int16_t>::max());
}
