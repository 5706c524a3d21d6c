// PassWalk: the values of a pass as aligned words, and the ways to tell of situations at them.
#ifndef MORVIK_HARDWARE_COVERAGE_PASSWALK_H
#define MORVIK_HARDWARE_COVERAGE_PASSWALK_H

#include <array>
#include <cstddef>
#include <cstdint>

#include "Meetings.h"
#include "Situations.h"
#include "rules/Arithmetic.h"
#include "rules/Formats.h"
#include "rules/Starts.h"
#include "rules/Trellis.h"

namespace morvik::coverage {

using comparison::Place;
using Word = std::int16_t;
using Column = std::array<Word, rules::stateCount>;
using Branches = rules::BranchMetrics<Word>;

/// Clears the bits below an eighth.
constexpr Word eighthMask = rules::wrap16(-(1 << rules::stateAlignment));

/// The members of families that are named above and below, or positive and negative.
constexpr unsigned upper = 0;
constexpr unsigned lower = 1;

/// What is common to the parts of a walk through a pass.
class PassWalk {
protected:
    /// Both must outlive the walk.
    PassWalk(const comparison::Model& model, unsigned pass, Taker& taker)
        : itsModel(model), itsPass(pass), itsTaker(taker)
    {
    }

    unsigned K() const
    {
        return itsModel.cut.K();
    }

    unsigned algorithm() const
    {
        return static_cast<unsigned>(itsModel.generics.C_ALGORITHM_TYPE);
    }

    /// Of the constituent code of the pass.
    unsigned codeNumber() const
    {
        return comparison::codeOf(itsPass);
    }

    const comparison::Code& code() const
    {
        return itsModel.codes[codeNumber()];
    }

    static Place placeOf(unsigned pass, Stage stage, unsigned step, unsigned number = 0)
    {
        return {pass, firstSignals[static_cast<std::size_t>(stage)] + number, step};
    }

    Place placeOf(Stage stage, unsigned step) const
    {
        return placeOf(itsPass, stage, step);
    }

    /// The place of a state's metric, of a column whose state 0 is at the given one.
    static Place placeOf(const Place& column, unsigned state)
    {
        return {column.pass, column.signal + state, column.step};
    }

    Word at(const Place& place) const
    {
        return rules::wrap16(rules::shiftLeftWrap(itsModel.values.at(place), rules::stateAlignment));
    }

    /// All values of a stage at a step.
    template <class Words>
    Words wordsOf(Stage stage, unsigned step) const
    {
        Words words{};
        for (unsigned i = 0; i < words.size(); ++i) {
            words[i] = at(placeOf(itsPass, stage, step, i));
        }
        return words;
    }

    void take(unsigned number, const Place& place)
    {
        itsTaker.atValue(number, place);
    }

    /// Takes the member of a value that exceeds the limits of branch metrics.
    void takeBeyond(Family family, unsigned first, std::int32_t value, const Place& place)
    {
        if (value > rules::branchLargest || value < rules::branchSmallest) {
            take(situation(family, first, value > 0 ? upper : lower), place);
        }
    }

    void takeSign(Family family, std::int32_t value, const Place& place)
    {
        take(situation(family, value < 0 ? lower : upper), place);
    }

    /// What the mask of border columns takes off (rule 11). `kind` is that of Family::border.
    void takeBorder(unsigned kind, const Column& column, const Place& place)
    {
        for (unsigned state = 0; state < column.size(); ++state) {
            if (rules::maskBits(column[state], rules::borderMask) != column[state]) {
                take(situation(Family::border, kind, column[state] < 0 ? lower : upper), placeOf(place, state));
            }
        }
    }

    const comparison::Model& itsModel;
    unsigned itsPass;
    Taker& itsTaker;

private:
    /// Of each stage.
    static constexpr std::array<unsigned, stages.size()> firstSignals = [] {
        std::array<unsigned, stages.size()> signals{};
        for (const Stage stage : stages) {
            signals[static_cast<std::size_t>(stage)] = signalsOf(stage).first;
        }
        return signals;
    }();
};

}  // namespace morvik::coverage

#endif
