// Comparison: where a dump departs from the model, and which values do not follow from their inputs.
#ifndef MORVIK_HARDWARE_COMPARISON_COMPARISON_H
#define MORVIK_HARDWARE_COMPARISON_COMPARISON_H

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "Model.h"
#include "Replay.h"
#include "Values.h"

namespace morvik::comparison {

/// The counts of a signal.
struct SignalCount {
    std::uint64_t compared = 0;   ///< including unknown values, unless ignored
    std::uint64_t different = 0;  ///< likewise
    std::uint64_t unknown = 0;
    std::uint64_t missing = 0;        ///< values that the core computes and the dump lacks
    std::uint64_t faults = 0;         ///< values that do not follow from their inputs in the dump
    std::uint64_t unknownFaults = 0;  ///< of these, unknown values with known inputs
    std::optional<Place> first;       ///< difference
};

/// A known value that does not follow from its inputs.
struct Fault {
    Place place;
    std::int16_t got;
    std::int16_t wanted;  ///< what follows from its inputs
};

/// The state of an input of the first wrong value.
struct InputState {
    Stage stage;
    unsigned pass;
    unsigned step;
    unsigned present = 0;    ///< signals of the stage that the dump has
    unsigned different = 0;  ///< of these, including unknown ones
};

struct Comparison {
    std::array<SignalCount, signalCount> signals;
    unsigned passes = 0;             ///< half-iterations with compared values
    std::optional<Place> first;      ///< first difference in order of computation
    std::vector<InputState> inputs;  ///< of the first difference
    std::vector<Fault> faults;       ///< in order of computation; known values only
    /// Whether the dump has the inputs of the faulty values. Otherwise all differences of the first differing stage are
    /// taken for faults.
    bool inputsAreKnown = true;
    bool ignoresUnknown = false;

    std::uint64_t compared() const;
    std::uint64_t different() const;
    std::uint64_t unknown() const;
    std::uint64_t allFaults() const;
    /// The same counts, of known values only.
    std::uint64_t knownCompared() const;
    std::uint64_t knownDifferent() const;
};

/// How to treat an unknown value that should be known.
enum class Unknown : std::uint8_t { differs, isIgnored };

Comparison compare(const Model& model, const Values& dump, Unknown unknown = Unknown::differs);

/// The inputs of the operation at a place: stages, passes and steps.
std::vector<InputState> inputsOf(const Model& model, const Place& place);

}  // namespace morvik::comparison

#endif
