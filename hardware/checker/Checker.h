// Checker: compares the values of a simulation with the model while they appear.
#ifndef MORVIK_HARDWARE_CHECKER_CHECKER_H
#define MORVIK_HARDWARE_CHECKER_CHECKER_H

#include <array>
#include <cstdint>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

#include "hardware/comparison/Model.h"
#include "hardware/comparison/Values.h"
#include "hardware/coverage/Counts.h"
#include "hardware/testbench/SoftBlock.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::checker {

using comparison::Place;
using comparison::Values;

/// Values of one signal.
struct Seen {
    std::uint32_t seen = 0;
    std::uint32_t expected = 0;  ///< the core computes so many
};

/// How a block stands.
enum class Standing : std::uint8_t {
    agrees,
    differs,
    incomplete  ///< nothing is seen, or values of the seen signals are missing
};

/// One block at a time. Every value that the core computes on it is known from `start` on, so observing a value costs
/// a look into a table; only the first difference is reasoned about, by what `morvik compare` knows.
class Checker {
public:
    /// Throws Refusal if the generics are not allowed.
    explicit Checker(const veltra_ip_morvik_v1_0_generics& generics);

    /// Decodes a block, and ends the one before. The library's warnings go to `warnings`. Throws Refusal, and has no
    /// block then.
    void start(const SoftBlock& block, unsigned iterations, std::ostream& warnings);

    /// Ends the block, of which nothing is known any more but the situations that it has met, if they are counted.
    void forget();

    bool hasBlock() const
    {
        return itsModel.has_value();
    }

    /// Half-iterations of the block, and its steps, the tail's included: 0 without a block.
    unsigned passes() const
    {
        return itsPasses;
    }

    unsigned steps() const
    {
        return itsSteps;
    }

    /// What the core computes; nothing where it computes none. The place must be one of the block.
    std::optional<std::int16_t> expected(const Place& place) const
    {
        const std::int16_t wanted = itsPairs[index(place)].wanted;
        return wanted == Values::missing ? std::nullopt : std::optional(wanted);
    }

    /// Takes the values of `count` signals from a place on, each of them known or Values::unknown, and tells whether
    /// all agree. The places must be of the block. Where the core computes nothing, everything agrees. Of several
    /// values observed at a place, the first wrong one stays.
    bool observe(const Place& first, const std::int16_t* values, unsigned count)
    {
        Pair* const pairs = &itsPairs[index(first)];
        bool agrees = true;
        for (unsigned i = 0; i < count; ++i) {
            agrees = observe(pairs[i], itsCounts[first.signal + i], values[i]) && agrees;
        }
        return agrees;
    }

    /// Places with a wrong value.
    std::uint64_t differences() const
    {
        return itsDifferences;
    }

    Seen seen(unsigned signal) const;
    Standing standing() const;

    /// The first of the differences in the order of computation, in a line and in full. There must be one.
    std::string headline() const;
    std::string firstDifference() const;

    /// What has been compared, what has not, all differences, and a line about situations() if they are counted. There
    /// must be a block.
    std::string report() const;

    /// Counts situations from now on, also those of values of this block that were observed before. It takes longer
    /// than all else that is done for a value, so nobody pays for it who does not ask.
    void countSituations();

    bool countsSituations() const
    {
        return itsSituations.has_value();
    }

    /// The situations of the arithmetic that all blocks have met since countSituations(), as far as it was observed:
    /// those at values that were observed and are right. They must be counted.
    coverage::Counts situations() const;

private:
    /// What the core computes at a place, and what has been observed there; or Values::missing.
    struct Pair {
        std::int16_t wanted;
        std::int16_t got;
    };

    bool observe(Pair& pair, std::uint32_t& count, std::int16_t value)
    {
        if (pair.wanted == Values::missing) {
            return true;
        }
        count += pair.got == Values::missing ? 1U : 0U;
        if (pair.got == Values::missing || pair.got == pair.wanted) {
            pair.got = value;
            itsDifferences += value == pair.wanted ? 0U : 1U;
        }
        return value == pair.wanted;
    }

    /// Those of a step are neighbours, as they are observed together.
    std::size_t index(const Place& place) const
    {
        return (std::size_t{place.pass} * itsSteps + place.step) * signalCount + place.signal;
    }

    /// Calls a function with each place of the block, in the order of the pairs.
    template <class Function>
    void forAllPlaces(Function function) const;

    std::string name() const;

    /// Whether the value of a place, or of its twin, has been observed and is right.
    bool isRight(const Place& place) const;
    template <class Format>
    std::string formatted(Format format) const;

    veltra_ip_morvik_v1_0_generics itsGenerics;
    std::uint64_t itsBlocks = 0;                    ///< started
    std::optional<coverage::Counts> itsSituations;  ///< of the blocks before, if they are counted
    std::optional<comparison::Model> itsModel;
    unsigned itsPasses = 0;
    unsigned itsSteps = 0;
    std::vector<Pair> itsPairs;
    std::array<std::uint32_t, signalCount> itsCounts = {};
    std::uint64_t itsDifferences = 0;
};

}  // namespace morvik::checker

#endif
