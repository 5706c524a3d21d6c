// Arguments: validates option values and words the refusals.
#ifndef MORVIK_APP_ARGUMENTS_H
#define MORVIK_APP_ARGUMENTS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace morvik {

/// Accepts decimal integers from `min` to `max`. For CLI::Option::transform.
///
/// Rewrites the text in its shortest form, because the argument parser would read a leading zero as octal.
CLI::Validator integerFrom(std::uint32_t min, std::uint32_t max);

/// "2, 4 or 8".
std::string alternatives(const std::vector<std::string>& words);

/// Accepts the first text of each pair and replaces it by the second. For CLI::Option::transform.
CLI::Validator oneOf(const std::vector<std::pair<std::string, std::string>>& choices);

/// Accepts everything and keeps the words for offered(). For CLI::Option::check of options that parse their values
/// themselves.
CLI::Validator offer(const std::vector<std::string>& words);

/// The block sizes, for offer().
std::vector<std::string> blockSizeWords();

/// The words that a shell may complete as the option's value, from oneOf() or offer().
std::vector<std::string> offered(CLI::Option& option);

/// Throws CLI::ValidationError: `text` is not allowed for the option; `allowed` says what is.
[[noreturn]] void refuse(const std::string& option, const std::string& text, const std::string& allowed);

/// The block sizes next to a K that is none: "the nearest block sizes of 3GPP TS 36.212 are 40 and 48".
std::string blockSizesNear(std::uint32_t K);

/// Parses a block size and appends it. Otherwise refuses the text for --block-size and names the nearest sizes.
void appendBlockSize(const std::string& text, std::vector<unsigned>& values);

/// Parses a signal-to-noise ratio into thousandths of a decibel. Otherwise refuses the text for the option; `otherwise`
/// names what else is allowed.
int readMilliDecibels(const std::string& option, const std::string& text, const std::string& otherwise = "");

}  // namespace morvik

#endif
