// Configurations: all combinations of processing units and algorithm types, for tests that run on each.
#ifndef MORVIK_TESTS_SUPPORT_CONFIGURATIONS_H
#define MORVIK_TESTS_SUPPORT_CONFIGURATIONS_H

#include <gtest/gtest.h>

#include <string>
#include <tuple>

/// Processing units and algorithm type.
using Configuration = std::tuple<int, int>;

inline auto everyConfiguration()
{
    return testing::Combine(testing::Values(2, 4, 8), testing::Values(0, 1, 2));
}

inline std::string configurationName(const testing::TestParamInfo<Configuration>& configuration)
{
    const auto [units, algorithm] = configuration.param;
    return "Units" + std::to_string(units) + "Type" + std::to_string(algorithm);
}

#endif
