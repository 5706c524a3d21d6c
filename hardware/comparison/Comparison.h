// Comparison: where a dump leaves the model, and which values are wrong by themselves.
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

/// What is counted of a signal.
struct SignalCount {
    std::uint64_t compared = 0;   ///< with the unknown ones, unless they are ignored
    std::uint64_t different = 0;  ///< likewise
    std::uint64_t unknown = 0;
    std::uint64_t missing = 0;        ///< values that the core computes and the dump does not have
    std::uint64_t faults = 0;         ///< values that do not follow from the dump's own inputs of them
    std::uint64_t unknownFaults = 0;  ///< unknown ones of these, whose inputs are known
    std::optional<Place> first;       ///< difference
};

/// A known value that is wrong by itself.
struct Fault {
    Place place;
    std::int16_t got;
    std::int16_t wanted;  ///< what follows from its inputs
};

/// How an input of the first wrong value stands.
struct InputState {
    Stage stage;
    unsigned pass;
    unsigned step;
    unsigned present = 0;    ///< signals of the stage that the dump has
    unsigned different = 0;  ///< of these, unknown ones among them
};

struct Comparison {
    std::array<SignalCount, signalCount> signals;
    unsigned passes = 0;             ///< half-iterations of which values are compared
    std::optional<Place> first;      ///< difference, in the order of computation
    std::vector<InputState> inputs;  ///< of the first difference
    std::vector<Fault> faults;       ///< in the order of computation, of known values
    /// Whether the faults are those of values whose inputs the dump has. Else all that differ in the first stage that
    /// does are taken for faults.
    bool inputsAreKnown = true;
    bool ignoresUnknown = false;

    std::uint64_t compared() const;
    std::uint64_t different() const;
    std::uint64_t unknown() const;
    std::uint64_t allFaults() const;
    /// Of these counts, what known values have a part in.
    std::uint64_t knownCompared() const;
    std::uint64_t knownDifferent() const;
};

/// What an unknown value is that should be known.
enum class Unknown : std::uint8_t { differs, isIgnored };

Comparison compare(const Model& model, const Values& dump, Unknown unknown = Unknown::differs);

/// What the operation at a place takes from other values: stages, passes and steps.
std::vector<InputState> inputsOf(const Model& model, const Place& place);

}  // namespace morvik::comparison

#endif
