// Measure: computes the figures of a line from its samples.
#include "Measure.h"

#include <algorithm>
#include <numeric>

namespace morvik::bench {

double median(std::vector<double> values)
{
    std::sort(values.begin(), values.end());
    const std::size_t half = values.size() / 2;
    return values.size() % 2 != 0 ? values[half] : (values[half - 1] + values[half]) / 2;
}

Figures figures(const Work& work, const Decoding& decoding, const Sample& sample, double limit)
{
    // An iteration takes two steps per bit, one in each pass; a probe step is for 16 lanes.
    constexpr double passes = 2;
    constexpr double lanes = 16;
    const std::vector<unsigned> sizes = work.blockSizes();
    const double bits = std::accumulate(sizes.begin(), sizes.end(), 0.0);
    const double cycles = sample.cycles / bits / iterations;
    return {bits / sample.seconds * 1e-6,
            cycles,
            sample.seconds / work.calls() * 1e6,
            limit == 0 ? 0 : cycles / passes * lanes / limit,
            decoding.bitErrorRate()};
}

Figures medians(const std::vector<Figures>& all)
{
    const auto of = [&all](double Figures::*figure) {
        std::vector<double> values;
        values.reserve(all.size());
        for (const Figures& one : all) {
            values.push_back(one.*figure);
        }
        return median(values);
    };
    return {of(&Figures::megabitsPerSecond),
            of(&Figures::cyclesPerBitAndIteration),
            of(&Figures::latency),
            of(&Figures::ratio),
            of(&Figures::bitErrorRate)};
}

}  // namespace morvik::bench
