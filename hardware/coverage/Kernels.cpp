// Kernels: which situations the recursions and ratios of a pass meet.
#include "Kernels.h"

#include <optional>

#include "PassWalk.h"
#include "hardware/testbench/Corrections.h"
#include "hardware/testbench/WatchedDecision.h"
#include "rules/Schedule.h"

namespace morvik::coverage {

namespace {

constexpr int entryCount = 6;  // of the correction table, that are not 0

/// The members of families that tell kernels apart.
enum Kernel : unsigned { forwardKernel = 0, backwardKernel = 1, ratioKernel = 2 };

/// Decisions of one bit in a ratio's tree.
constexpr unsigned nodesOfTree = 7;

/// Walks through the decisions of a pass.
template <class Rule>
class KernelWalk : private PassWalk {
public:
    KernelWalk(const comparison::Model& model, unsigned pass, Taker& taker, const Rule& rule)
        : PassWalk(model, pass, taker), itsRule(rule)
    {
    }

    void run()
    {
        for (unsigned segment = 0; segment < itsModel.cut.segments(); ++segment) {
            runSegment(segment);
        }
        for (unsigned window = 0; window < itsModel.cut.windows(); ++window) {
            runWindow(itsModel.cut.window(window));
        }
        for (unsigned step = 0; step < K(); ++step) {
            findInRatio(step);
        }
    }

private:
    /// A recursion from a column of the model.
    class Recursion {
    public:
        Recursion(KernelWalk& walk, Kernel kernel, const Column& start)
            : itsWatch(walk.itsRule, false, See{this}), itsWalk(walk), itsKernel(kernel)
        {
            for (unsigned state = 0; state < start.size(); ++state) {
                itsMetrics[state] = itsWatch.metric(start[state]);
            }
        }

        Recursion(const Recursion&) = delete;
        Recursion& operator=(const Recursion&) = delete;

        /// Decides the next column, whose state 0 is at a place.
        void step(const Branches& branches, const Place& place)
        {
            itsPlace = place;
            itsWatch.restart();
            itsMetrics = itsKernel == forwardKernel ? rules::forwardStep(itsWatch, itsMetrics, branches)
                                                    : rules::backwardStep(itsWatch, itsMetrics, branches);
        }

        Column column() const
        {
            Column values{};
            for (unsigned state = 0; state < values.size(); ++state) {
                values[state] = itsWatch.stored(itsMetrics[state]);
            }
            return values;
        }

    private:
        struct See {
            Recursion* recursion;

            template <class Metric>
            void operator()(unsigned state, const Metric& c1, const Metric& c2) const
            {
                const Family ties = recursion->itsKernel == forwardKernel ? Family::tieForward : Family::tieBackward;
                const Place place = placeOf(recursion->itsPlace, state);
                recursion->itsWalk.takeDecided(recursion->itsKernel, c1, c2, ties, state, place);
            }
        };

        using Watch = WatchedDecision<Rule, See>;

        Watch itsWatch;
        KernelWalk& itsWalk;
        Kernel itsKernel;
        Place itsPlace = {};
        rules::Column<Watch> itsMetrics = {};
    };

    /// The next pass over the code, if there is one.
    std::optional<unsigned> passAfter() const
    {
        const unsigned next = itsPass + 2;
        return next < itsModel.values.passes() ? std::optional(next) : std::nullopt;
    }

    Branches branches(unsigned step) const
    {
        return wordsOf<Branches>(Stage::branch, step);
    }

    /// The forward recursion of a segment. Its last column is where another pass starts from it, masked (rule 19).
    void runSegment(unsigned segment)
    {
        const unsigned from = segment * itsModel.cut.segmentLength();
        const unsigned to = from + itsModel.cut.segmentLength();
        const unsigned kind = segment == 0 ? 0 : rules::isFirstPass(itsPass) ? 1 : 2;
        take(situation(Family::startForward, kind), placeOf(Stage::forward, from));
        Recursion recursion(*this, forwardKernel, wordsOf<Column>(Stage::forward, from));
        for (unsigned step = from; step + 1 < to; ++step) {
            recursion.step(branches(step), placeOf(Stage::forward, step + 1));
        }
        const std::optional<unsigned> pass = to == K() ? itsPass : passAfter();
        if (pass) {
            const Place place = placeOf(*pass, Stage::forward, to);
            recursion.step(branches(to - 1), place);
            if (to < K()) {
                takeBorder(forwardKernel, recursion.column(), place);
            }
        }
    }

    /// The pass in which a window starts from the column that the one behind it reaches in this pass (rule 20).
    std::optional<unsigned> passStarting(const rules::Window& window) const
    {
        if (!itsModel.cut.startsFromThisPass(window)) {
            return passAfter();
        }
        return rules::isFirstPass(itsPass) ? std::nullopt : std::optional(itsPass);
    }

    /// The backward recursion of a window. Its last column is where the window before it starts from it, masked.
    void runWindow(const rules::Window& window)
    {
        const rules::Cut& cut = itsModel.cut;
        const unsigned later = cut.startsFromThisPass(window) ? 3 : 2;
        const unsigned kind = cut.startsAtTail(window) ? 0 : rules::isFirstPass(itsPass) ? 1 : later;
        take(situation(Family::startBackward, kind), placeOf(Stage::backward, window.last));
        Recursion recursion(*this, backwardKernel, wordsOf<Column>(Stage::backward, window.last));
        for (unsigned step = window.last; step > window.first; --step) {
            recursion.step(branches(step), placeOf(Stage::backward, step - 1));
        }
        if (window.first == 0) {
            return;  // no window starts where the block's first one ends
        }
        if (const auto pass = passStarting(cut.windowAt(window.first - 1))) {
            const Place place = placeOf(*pass, Stage::backward, window.first - 1);
            recursion.step(branches(window.first), place);
            takeBorder(backwardKernel, recursion.column(), place);
        }
    }

    void findInRatio(unsigned step)
    {
        const Place place = placeOf(Stage::ratio, step);
        const auto a = wordsOf<Column>(Stage::forward, step);
        const auto b = wordsOf<Column>(Stage::backward, step);
        const Branches g = branches(step);
        for (unsigned state = 0; state < a.size(); ++state) {
            for (const unsigned bit : {1U, 0U}) {
                takeWrap(Family::wrapOfSum, 0, wrapOf(a[state] + b[rules::successor(state, bit)]), place);
            }
        }
        const Word one = bestPath<1>(a, b, g, place);
        const Word zero = bestPath<0>(a, b, g, place);
        takeWrap(Family::wrapOfDifference, 0, wrapOf(one - zero), place);
    }

    template <unsigned bit>
    Word bestPath(const Column& a, const Column& b, const Branches& g, const Place& place)
    {
        const auto see = [this, &place](unsigned node, const auto& c1, const auto& c2) {
            this->takeDecided(ratioKernel, c1, c2, Family::tieRatio, (1 - bit) * nodesOfTree + node - 1, place);
        };
        WatchedDecision<Rule, decltype(see)> watch(itsRule, true, see);
        watch.restart();
        return rules::bestPath<bit>(watch, a, b, g);
    }

    /// Takes the `member` of a family for a wrap above the range, the next one for a wrap below it.
    void takeWrap(Family family, unsigned member, Wrap wrap, const Place& place)
    {
        if (wrap != Wrap::none) {
            take(situation(family) + member + (wrap == Wrap::above ? upper : lower), place);
        }
    }

    /// What a decision shows, at the value for which it is made; a member of `ties` if the candidates are equal.
    template <class Metric>
    void takeDecided(
        Kernel kernel, const Metric& c1, const Metric& c2, Family ties, unsigned member, const Place& place)
    {
        for (const Metric* each : {&c1, &c2}) {
            takeWrap(Family::wrapOfBranch, 4 * kernel + (each->isSum ? 0 : 2), each->wrap, place);
        }
        takeWrap(Family::wrapOfCompare, 2 * kernel, wrapOf(c1.value() - c2.value()), place);
        if (c1.value() == c2.value()) {
            take(situation(ties) + member, place);
        }
        if (algorithm() == 2) {
            takeCorrected(kernel, c1, c2, place);
        }
    }

    template <class Metric>
    void takeCorrected(Kernel kernel, const Metric& c1, const Metric& c2, const Place& place)
    {
        const Word difference = rules::wrap16(c1.value() - c2.value());
        const Metric& winner = difference < 0 ? c2 : c1;
        if (wrapOf(winner.value() + winner.pending()) != Wrap::none) {
            take(situation(Family::wrapOfPending, kernel), place);
        }
        if (difference == 0 && c1.pending() != c2.pending()) {
            take(situation(Family::pendingTie, kernel), place);
        }
        const int entry = (difference < 0 ? ~difference : difference) >> correctionEntryBits;
        if (entry >= entryCount) {
            take(situation(Family::noCorrection, kernel), place);
            return;
        }
        const unsigned sign = difference < 0 ? lower : upper;
        take(situation(Family::correction, kernel, 2 * static_cast<unsigned>(entry) + sign), place);
        if (difference < 0 && corrections()[difference] != corrections()[-difference]) {
            take(situation(Family::inverted, kernel), place);
        }
    }

    Rule itsRule;
};

}  // namespace

void findInKernels(const comparison::Model& model, unsigned pass, Taker& taker)
{
    if (model.generics.C_ALGORITHM_TYPE == 2) {
        using Rule = rules::DecideMaxHash<Word, CorrectionTable>;
        KernelWalk<Rule>(model, pass, taker, Rule(CorrectionTable())).run();
    } else {
        using Rule = rules::DecideMax<Word>;
        KernelWalk<Rule>(model, pass, taker, Rule()).run();
    }
}

}  // namespace morvik::coverage
