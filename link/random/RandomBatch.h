// RandomBatch: random blocks drawn together.
#ifndef MORVIK_LINK_RANDOM_RANDOMBATCH_H
#define MORVIK_LINK_RANDOM_RANDOMBATCH_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "Random.h"
#include "SamplerForm.h"

namespace morvik::link {

/// Use: clear, add counters, draw, then fetch.
class RandomBatch {
public:
    RandomBatch(const RandomKey& key, const SamplerForm& form) : itsKey(key), itsForm(form) {}

    void clear()
    {
        itsLow.clear();
        itsHigh.clear();
    }

    /// Adds `count` consecutive counters.
    void put(std::uint64_t counterLow, std::uint64_t counterHigh, std::size_t count)
    {
        const std::size_t before = itsLow.size();
        itsLow.resize(before + count);
        itsHigh.resize(before + count, counterHigh);
        for (std::size_t i = 0; i < count; ++i) {
            itsLow[before + i] = counterLow + i;
        }
    }

    void put(std::uint64_t counterLow, std::uint64_t counterHigh)
    {
        itsLow.push_back(counterLow);
        itsHigh.push_back(counterHigh);
    }

    void draw()
    {
        itsForm.randomBlocks(itsKey, itsLow.data(), itsHigh.data(), itsLow.size());
    }

    /// Words 0 and 1 of the random block of counter i.
    std::uint64_t low(std::size_t i) const
    {
        return itsLow[i];
    }

    /// Words 2 and 3.
    std::uint64_t high(std::size_t i) const
    {
        return itsHigh[i];
    }

    /// The same for all counters.
    const std::uint64_t* lows() const
    {
        return itsLow.data();
    }
    const std::uint64_t* highs() const
    {
        return itsHigh.data();
    }

private:
    RandomKey itsKey;
    SamplerForm itsForm;
    std::vector<std::uint64_t> itsLow;
    std::vector<std::uint64_t> itsHigh;
};

}  // namespace morvik::link

#endif
