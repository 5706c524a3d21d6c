// Wording: strings and figures as plots and pages show them, independent of the locale.
#ifndef MORVIK_REPORT_WORDING_H
#define MORVIK_REPORT_WORDING_H

#include <cstdint>
#include <string>
#include <string_view>

namespace morvik::report {

/// The string as valid UTF-8 on one line: a blank for each control character, and ? for each invalid byte.
std::string printable(std::string_view text);

/// The printable string with XML and HTML markup escaped, including quotation marks.
std::string escaped(std::string_view text);

/// The printable string cut to at most the given number of characters, ending in an ellipsis if it was cut.
std::string shortened(const std::string& text, std::size_t most);

/// The number of characters of a printable string.
std::size_t characters(std::string_view text);

/// Eb/N0 in dB with two decimals, or three if needed: "1.20", "0.125".
std::string decibels(double value);

/// A rate with three digits: "1.30e-03".
std::string rate(double value);

/// A count, with its digits in groups of three separated by narrow spaces.
std::string grouped(std::uint64_t count);

}  // namespace morvik::report

#endif
