// Arguments: what option values are allowed, and how a refusal reads.
#ifndef MORVIK_ARGUMENTS_H
#define MORVIK_ARGUMENTS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace morvik {

/// Allows decimal integers from `min` to `max`. For CLI::Option::transform.
///
/// The text is rewritten in its shortest form, because the argument parser would read a leading zero as octal.
CLI::Validator integerFrom(std::uint32_t min, std::uint32_t max);

/// Allows the first texts of the pairs, and replaces each by its second. For CLI::Option::transform.
CLI::Validator oneOf(const std::vector<std::pair<std::string, std::string>>& choices);

}  // namespace morvik

#endif
