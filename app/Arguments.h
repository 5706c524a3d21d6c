// Arguments: what option values are allowed, and how a refusal reads.
#ifndef MORVIK_APP_ARGUMENTS_H
#define MORVIK_APP_ARGUMENTS_H

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

/// Allows everything, and leaves the words for offered(). For CLI::Option::check of options that read their values
/// themselves.
CLI::Validator offer(const std::vector<std::string>& words);

/// The block sizes, for offer().
std::vector<std::string> blockSizeWords();

/// The words that a shell may offer as the option's value, from oneOf() or offer().
std::vector<std::string> offered(CLI::Option& option);

/// Throws CLI::ValidationError: `text` is not allowed for the option, and what is instead.
[[noreturn]] void refuse(const std::string& option, const std::string& text, const std::string& allowed);

/// Reads a block size, for a list; otherwise refuses it for --block-size and names the nearest ones.
void appendBlockSize(const std::string& text, std::vector<unsigned>& values);

/// Reads an Eb/N0 into thousandths of a decibel; otherwise refuses it for --ebn0. `otherwise` is what messages say is
/// allowed beside numbers.
int readMilliDecibels(const std::string& text, const std::string& otherwise = "");

}  // namespace morvik

#endif
