// Values: the values of all signals in all passes over a block.
#ifndef MORVIK_HARDWARE_COMPARISON_VALUES_H
#define MORVIK_HARDWARE_COMPARISON_VALUES_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "hardware/testbench/Signals.h"

namespace morvik::comparison {

/// The branch metric that always equals this one, as the code has one parity bit for each data bit (rule 5): g3 is g0,
/// and g2 is g1. Other signals are returned unchanged.
constexpr unsigned twinOf(unsigned signal)
{
    const SignalRange branch = signalsOf(Stage::branch);
    return stageOf(signal) == Stage::branch ? 2 * branch.first + branch.count - 1 - signal : signal;
}

/// A value of a block: half-iteration, signal, trellis step.
struct Place {
    unsigned pass;
    unsigned signal;
    unsigned step;
};

/// Values of the state metrics' format: 12 bits, in eighths.
class Values {
public:
    static constexpr std::int16_t smallest = rules::smallestOf(passBits);
    static constexpr std::int16_t largest = rules::largestOf(passBits);
    static constexpr std::int16_t missing = INT16_MIN;
    static constexpr std::int16_t unknown = INT16_MIN + 1;  ///< x where there should be a value

    Values(unsigned passes, unsigned steps)
        : itsPasses(passes), itsSteps(steps), itsValues(std::size_t{passes} * signalCount * steps, missing)
    {
    }

    unsigned passes() const
    {
        return itsPasses;
    }

    unsigned steps() const
    {
        return itsSteps;
    }

    std::size_t index(const Place& place) const
    {
        return (std::size_t{place.pass} * signalCount + place.signal) * itsSteps + place.step;
    }

    std::int16_t at(const Place& place) const
    {
        return itsValues[index(place)];
    }

    /// Whether the value is present and known.
    bool has(const Place& place) const
    {
        return at(place) >= smallest;
    }

    bool isUnknown(const Place& place) const
    {
        return at(place) == unknown;
    }

    void set(const Place& place, std::int16_t value)
    {
        itsValues[index(place)] = value;
    }

    /// The values of a signal in a half-iteration, by step.
    std::int16_t* row(unsigned pass, unsigned signal)
    {
        return &itsValues[index({pass, signal, 0})];
    }

    /// Copies the values of the signal's twin: they serve as inputs, and are not compared again.
    void copyFromTwin(unsigned signal)
    {
        for (unsigned pass = 0; pass < itsPasses; ++pass) {
            for (unsigned step = 0; step < itsSteps; ++step) {
                set({pass, signal, step}, at({pass, twinOf(signal), step}));
            }
        }
        itsCopies[signal] = true;
    }

    bool isCopy(unsigned signal) const
    {
        return itsCopies[signal];
    }

private:
    unsigned itsPasses;
    unsigned itsSteps;
    std::vector<std::int16_t> itsValues;
    std::array<bool, signalCount> itsCopies = {};
};

}  // namespace morvik::comparison

#endif
