// Algorithms: what the algorithms of the core are called.
#ifndef MORVIK_RULES_ALGORITHMS_H
#define MORVIK_RULES_ALGORITHMS_H

#include <array>
#include <cstddef>
#include <optional>
#include <string_view>

namespace morvik::rules {

/// By the numbers of C_ALGORITHM_TYPE, 0 to 2.
constexpr std::array<std::string_view, 3> algorithmNames = {"max-log", "scaled", "table"};

/// The number of the algorithm of that name; nothing if there is none.
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
