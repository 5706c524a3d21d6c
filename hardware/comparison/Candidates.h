// Candidates: the mistakes that may explain the faults of a stage.
#ifndef MORVIK_HARDWARE_COMPARISON_CANDIDATES_H
#define MORVIK_HARDWARE_COMPARISON_CANDIDATES_H

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "Comparison.h"
#include "Model.h"
#include "Replay.h"

namespace morvik::comparison {

/// Whether a value of the dump is what a mistake gives. Unknown if that depends on values that the dump lacks; open if
/// cores with the mistake may differ there.
enum class Fit : std::uint8_t { no, yes, unknown, open };

/// A value of the dump and the expected one; equal if the value is right.
using Sample = Fault;

/// A mistake that may explain faults. It must reproduce the wrong values and keep the right ones.
struct Candidate {
    /// Among equally good fits, the lowest rank wins: `telling` says how an operation goes wrong, `included` is covered
    /// by one of these, `descriptive` only describes values.
    enum Rank : std::uint8_t { telling, included, descriptive };
    /// Where the mistake would show: in the wrong borders, in the whole operation, in all operations or, if it is known
    /// by its effect alone, in the place that the faults share.
    enum Reach : std::uint8_t { borders, operation, core, place };

    std::string text;
    Rank rank;
    Reach reach;
    std::function<Fit(const Sample&)> fits;
    /// Candidates of one family, other than 0, differ in a number alone. Among equally good ones, those with the least
    /// detail win: a factor of 0.5 needs no 33/64.
    unsigned family = 0;
    unsigned detail = 0;
    /// Whether it computes an intrinsic value from its inputs. Others take it from the dump, which lacks its last bit.
    bool recomputes = false;
};

/// All candidates for the faults of a stage. The arguments must outlive them.
std::vector<Candidate> candidates(const Model& model, const Replay& replay, const std::vector<Fault>& faults);

}  // namespace morvik::comparison

#endif
