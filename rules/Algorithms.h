// Algorithms: the core's algorithm types: their names, and the factor of their extrinsic values.
#ifndef MORVIK_RULES_ALGORITHMS_H
#define MORVIK_RULES_ALGORITHMS_H

#include <array>
#include <cstddef>
#include <optional>
#include <string_view>

namespace morvik::rules {

/// Indexed by C_ALGORITHM_TYPE, 0 to 2.
constexpr std::array<std::string_view, 3> algorithmNames = {"max-log", "scaled", "table"};

/// Returns the number of the named algorithm, or nullopt if there is none.
constexpr std::optional<unsigned> findAlgorithm(std::string_view name)
{
    for (std::size_t i = 0; i < algorithmNames.size(); ++i) {
        if (name == algorithmNames[i]) {
            return static_cast<unsigned>(i);
        }
    }
    return std::nullopt;
}

/// The factor of type 1's extrinsic values, 0.75: scaleNumerator / 2^scaleBits (rule 14 of docs/arithmetic.md).
constexpr int scaleNumerator = 3;
constexpr int scaleBits = 2;

/// The factor of the extrinsic values of an algorithm type (rule 14).
constexpr double extrinsicScale(int algorithmType)
{
    return algorithmType == 1 ? static_cast<double>(scaleNumerator) / (1 << scaleBits) : 1.0;
}

}  // namespace morvik::rules

#endif
