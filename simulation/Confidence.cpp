// Confidence: confidence intervals of simulated error rates.
#include "Confidence.h"

#include <algorithm>
#include <boost/math/distributions/normal.hpp>
#include <boost/math/distributions/students_t.hpp>
#include <boost/math/special_functions/beta.hpp>

namespace morvik::simulation {

namespace {

constexpr double missed = 0.05;  // the fraction of intervals that may miss the rate

/// The effective sample size: how many independent bits would give a rate with the variance that the blocks show.
double effectiveBits(const ErrorCounts& errors, double blocks, double blockSize)
{
    const double bits = blocks * blockSize;
    const auto wrong = static_cast<double>(errors.bitErrors);
    const double spread = static_cast<double>(errors.bitErrorSquares) - wrong * wrong / blocks;
    if (blocks < 2 || spread <= 0) {
        return blocks;  // variance unknown: as if all bits of a block failed or none
    }
    const double variance = spread / (blocks - 1) / (bits * blockSize);  // of the rate
    const double rate = wrong / bits;
    const double few =
        quantile(boost::math::normal(), missed / 2) / quantile(boost::math::students_t(blocks - 1), missed / 2);
    return std::min(rate * (1 - rate) / variance, bits) * few * few;
}

}  // namespace

Bounds clopperPearson(double events, double trials)
{
    if (events <= 0) {
        return {0, boost::math::ibetac_inv(1.0, trials, missed)};
    }
    if (events >= trials) {
        return {boost::math::ibeta_inv(trials, 1.0, missed), 1};
    }
    return {boost::math::ibeta_inv(events, trials - events + 1, missed / 2),
            boost::math::ibetac_inv(events + 1, trials - events, missed / 2)};
}

Bounds blockErrorBounds(const ErrorCounts& errors, std::uint64_t blocks)
{
    return clopperPearson(static_cast<double>(errors.blockErrors), static_cast<double>(blocks));
}

Bounds bitErrorBounds(const ErrorCounts& errors, std::uint64_t blocks, unsigned blockSize)
{
    if (errors.bitErrors == 0) {
        return blockErrorBounds(errors, blocks);  // no bit fails where no block does
    }
    const double bits = effectiveBits(errors, static_cast<double>(blocks), blockSize);
    const double rate = static_cast<double>(errors.bitErrors) / (static_cast<double>(blocks) * blockSize);
    return clopperPearson(rate * bits, bits);
}

}  // namespace morvik::simulation
