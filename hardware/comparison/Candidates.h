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

/// Whether a value of the dump is what a mistake gives. It is not known where that follows from values that the dump
/// lacks.
enum class Fit : std::uint8_t { no, yes, unknown };

/// A value of the dump and what is wanted there: of right values both are the same.
using Sample = Fault;

/// A mistake that may explain faults. It has to give the wrong values as they are, and the right ones, too.
struct Candidate {
    /// Of those that fit as well, the least counts: what says how an operation goes wrong, what one of these includes,
    /// what describes values.
    enum Rank : std::uint8_t { telling, included, descriptive };
    /// Which values it would show in: those of the borders that are wrong, those of the whole operation, or, where the
    /// mistake is known by its effect alone, those in the place that the faults have in common.
    enum Reach : std::uint8_t { borders, operation, place };

    std::string text;
    Rank rank;
    Reach reach;
    std::function<Fit(const Sample&)> fits;
};

/// All candidates for the faults of a stage. What is given outlives them.
std::vector<Candidate> candidates(const Model& model, const Replay& replay, const std::vector<Fault>& faults);

}  // namespace morvik::comparison

#endif
