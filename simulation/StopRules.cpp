// StopRules: when to end a point and a curve.
#include "StopRules.h"

#include <algorithm>

namespace morvik::simulation {

namespace {

bool reaches(std::uint64_t count, const std::optional<std::uint64_t>& limit)
{
    return limit && count >= *limit;
}

double share(double count, double limit)
{
    return limit > 0 ? std::min(count / limit, 1.0) : 1.0;
}

double share(std::uint64_t count, const std::optional<std::uint64_t>& limit)
{
    return limit ? share(static_cast<double>(count), static_cast<double>(*limit)) : 0.0;
}

}  // namespace

bool isReached(const StopRules& rules, std::uint64_t blocks, const ErrorCounts& errors)
{
    return reaches(blocks, rules.maxBlocks) || reaches(errors.blockErrors, rules.blockErrors) ||
           reaches(errors.bitErrors, rules.bitErrors);
}

double progressOf(const StopRules& rules, std::uint64_t blocks, const ErrorCounts& errors, double seconds)
{
    return std::max({share(blocks, rules.maxBlocks),
                     share(errors.blockErrors, rules.blockErrors),
                     share(errors.bitErrors, rules.bitErrors),
                     rules.maxSeconds ? share(seconds, *rules.maxSeconds) : 0.0});
}

}  // namespace morvik::simulation
