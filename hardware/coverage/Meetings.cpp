// Meetings: which situations of the arithmetic a block meets, and at which values.
#include "Meetings.h"

#include <algorithm>
#include <cstdint>

#include "Kernels.h"
#include "PassWalk.h"
#include "rules/Algorithms.h"
#include "rules/Schedule.h"
#include "rules/SoftValues.h"
#include "rules/Tail.h"

namespace morvik::coverage {

namespace {

/// The members of Family::input.
enum Stream : unsigned { systematicStream = 0, parityStream = 1, tailStream = 2 };

/// Walks through all values of a pass but those that the kernels decide.
class ValueWalk : private PassWalk {
public:
    ValueWalk(const comparison::Model& model, unsigned pass, Taker& taker) : PassWalk(model, pass, taker) {}

    void run()
    {
        for (unsigned step = 0; step < K() + rules::tailSteps; ++step) {
            findInIntrinsic(step);
        }
        for (unsigned step = 0; step < K(); ++step) {
            findInBranches(step);
            findInRatio(step);
            findInExtrinsic(step);
        }
        findInTail();
    }

private:
    std::int32_t apriori(unsigned step) const
    {
        return itsPass == 0 || step >= K() ? 0 : at(placeOf(itsPass - 1, Stage::extrinsic, code().order[step]));
    }

    /// Dumps and models lack the bit of an intrinsic value below an eighth.
    std::int32_t twiceIntrinsic(unsigned step) const
    {
        return rules::twiceIntrinsicValue(apriori(step), code().systematic[step], eighthMask);
    }

    /// Takes a soft value that is the largest or smallest one.
    void takeEnd(Stream stream, Word value, const Place& place)
    {
        if (value == rules::branchLargest || value == rules::branchSmallest) {
            take(situation(Family::input, stream, value > 0 ? upper : lower), place);
        }
    }

    void findInIntrinsic(unsigned step)
    {
        const Place place = placeOf(Stage::intrinsic, step);
        takeEnd(step < K() ? systematicStream : tailStream, code().systematic[step], place);
        const std::int32_t half = apriori(step) / 2;
        if ((half & ~eighthMask) != 0) {
            takeSign(Family::aprioriOdd, half, place);
        }
        const std::int32_t twice = twiceIntrinsic(step);
        takeBeyond(Family::intrinsicWide, 0, twice, place);
        if ((twice / 2 & ~eighthMask) != 0) {
            takeSign(Family::intrinsicHalf, twice, place);
        }
    }

    void findInBranches(unsigned step)
    {
        const Word parity = code().parity[step];
        const Place g0 = placeOf(Stage::branch, step);
        const Place g1 = placeOf(itsPass, Stage::branch, step, 1);
        const auto sums = rules::branchSums<std::int32_t>(twiceIntrinsic(step), parity, 0);
        takeBeyond(Family::branchClip, 0, sums[0], g0);
        takeBeyond(Family::branchClip, 1, sums[1], g1);
        takeEnd(parityStream, parity, g0);
        if (parity == rules::branchSmallest) {
            take(situation(Family::branchNegated), g1);
        }
    }

    void findInRatio(unsigned step)
    {
        const Place place = placeOf(Stage::ratio, step);
        take(situation(Family::pass, rules::isFirstPass(itsPass) ? 0 : 1, codeNumber()), place);
        if (itsPass + 1 == itsModel.values.passes()) {
            const Word ratio = at(place);
            take(situation(Family::decision, ratio == 0 ? 0 : rules::decision(ratio) ? 1 : 2), place);
        }
    }

    void findInExtrinsic(unsigned step)
    {
        const Place place = placeOf(Stage::extrinsic, step);
        const double scale = rules::extrinsicScale(itsModel.generics.C_ALGORITHM_TYPE);
        const std::int32_t exact = at(placeOf(Stage::ratio, step)) - 2 * twiceIntrinsic(step);
        const auto scaled = static_cast<std::int32_t>(exact * scale);
        // Rounded first, as between the largest value and the next eighth the clip changes nothing.
        const std::int32_t rounded = scaled & rules::extrinsicMask(scale, eighthMask);
        const bool isClipped = rules::clip(rounded, rules::branchSmallest, rules::branchLargest) != rounded;
        takeBeyond(isClipped ? Family::extrinsicClip : Family::scaledInside, 0, exact, place);
        if (!isClipped && rounded != scaled) {
            takeSign(Family::scaledRounded, scaled, place);
        }
    }

    /// The tail's column is where the last window starts.
    void findInTail()
    {
        const Place place = placeOf(Stage::backward, K() - 1);
        rules::Tail<std::int32_t> tail{};
        for (unsigned step = 0; step < rules::tailSteps; ++step) {
            tail.x[step] = code().systematic[K() + step];
            tail.p[step] = code().parity[K() + step];
            takeEnd(tailStream, code().parity[K() + step], place);
            takeBeyond(Family::tailSum, 0, tail.x[step] + tail.p[step], place);
            if (step + 1 < rules::tailSteps) {  // one branch alone leads to state 0
                takeBeyond(Family::tailSum, 0, tail.x[step] - tail.p[step], place);
            }
        }
        const auto metrics = rules::tailColumn(tail);
        Column words{};
        std::transform(metrics.begin(), metrics.end(), words.begin(), rules::wrap16);
        takeBorder(2, words, place);
        const auto* const best = std::max_element(metrics.begin(), metrics.end());
        if (std::count(metrics.begin(), metrics.end(), *best) == 1) {
            const auto state = static_cast<unsigned>(best - metrics.begin());
            take(situation(Family::tailState, codeNumber(), state), placeOf(place, state));
        }
    }
};

}  // namespace

void findSituations(const comparison::Model& model, Taker& taker)
{
    forEachOfCut(model.cut, static_cast<unsigned>(model.generics.C_ALGORITHM_TYPE), [&taker](unsigned number) {
        taker.ofBlock(number);
    });
    for (unsigned pass = 0; pass < model.values.passes(); ++pass) {
        ValueWalk(model, pass, taker).run();
        findInKernels(model, pass, taker);
    }
}

}  // namespace morvik::coverage
