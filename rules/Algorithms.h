// Algorithms: the names of the core's algorithms.
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

}  // namespace morvik::rules

#endif
