// Wording: texts and figures as plots and pages show them, whatever the locale.
#ifndef MORVIK_REPORT_WORDING_H
#define MORVIK_REPORT_WORDING_H

#include <cstdint>
#include <string>
#include <string_view>

namespace morvik::report {

/// The text as valid UTF-8 on one line: a blank in the place of each control character, and ? for each byte that
/// makes no character.
std::string printable(std::string_view text);

/// The printable text with what XML and HTML take as markup escaped, quotation marks too.
std::string escaped(std::string_view text);

/// At most so many characters of a printable text, the last being an ellipsis where it was cut.
std::string shortened(const std::string& text, std::size_t most);

/// The number of characters of a printable text.
std::size_t characters(std::string_view text);

/// Eb/N0 in dB with two decimals, three where they are needed: "1.20", "0.125".
std::string decibels(double value);

/// Three digits of a rate: "1.30e-03".
std::string rate(double value);

/// A count, its digits in groups of three with narrow spaces between them.
std::string grouped(std::uint64_t count);

/// All the digits that a program needs; the value is finite.
std::string exact(double value);

}  // namespace morvik::report

#endif
