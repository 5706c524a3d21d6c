// Counts: how often cores have met the situations, in blocks, sets and simulations; and files of such counts.
#ifndef MORVIK_HARDWARE_COVERAGE_COUNTS_H
#define MORVIK_HARDWARE_COVERAGE_COUNTS_H

#include <cstdint>
#include <istream>
#include <optional>
#include <string>
#include <vector>

#include "Meetings.h"
#include "Situations.h"

namespace morvik::coverage {

/// How often a core has met each situation.
struct CoreCounts {
    Core core;
    std::uint64_t blocks = 0;
    std::vector<std::uint64_t> met = std::vector<std::uint64_t>(situations().size());
};

/// The counts of a block at the values that a predicate of their places accepts.
template <class IsTaken>
CoreCounts countsAt(const comparison::Model& model, IsTaken isTaken)
{
    struct Counter : Taker {
        Counter(CoreCounts& sums, IsTaken predicate) : counts(sums), isTaken(predicate) {}

        void atValue(unsigned situation, const comparison::Place& place) override
        {
            counts.met[situation] += isTaken(place) ? 1U : 0U;
        }

        void ofBlock(unsigned situation) override
        {
            ++counts.met[situation];
        }

        CoreCounts& counts;
        IsTaken isTaken;
    };
    CoreCounts counts;
    counts.core = coreOf(model.generics);
    counts.blocks = 1;
    Counter counter(counts, isTaken);
    findSituations(model, counter);
    return counts;
}

/// The counts of a block whose values are all computed.
CoreCounts countsOf(const comparison::Model& model);

/// The counts of several cores.
class Counts {
public:
    /// Adds to what the same core has met.
    void add(const CoreCounts& counts);
    void add(const Counts& counts);

    const std::vector<CoreCounts>& cores() const
    {
        return itsCores;
    }

    std::uint64_t blocks() const;

    /// How often any core has met a situation.
    std::uint64_t met(unsigned situation) const;

    /// Why none of the cores can meet a situation; nothing if one can.
    std::optional<std::string> whyImpossible(unsigned situation) const;

    /// The situations that can be met, and are not.
    std::vector<unsigned> missing() const;

private:
    std::vector<CoreCounts> itsCores;
};

/// "142 of 160 met; missing: tie.forward.3, border.tail.negative and 16 more", naming at most `longest`; none is named
/// for 0.
std::string summary(const Counts& counts, std::size_t longest = 4);

/// The counts as a file: CSV with a line for each core and situation.
std::string textOf(const Counts& counts);

/// Reads a file of counts. Throws base::Error, naming the line, unless it is one that textOf() gives.
Counts readCounts(std::istream& file, const std::string& name);

}  // namespace morvik::coverage

#endif
