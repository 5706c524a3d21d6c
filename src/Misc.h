// Misc: the support functions that the library exports besides the model.
//
// All are stateless free functions. Numbers are read and written in the classic "C" form (a decimal
// point, no grouping) and letters change case as in the "C" locale, A to Z only, whatever the global C++
// or C locale. Characters are signed 8-bit values: blanks are the characters of code 32 or less,
// which include the bytes 128 to 255.
//
// No function throws because of its input's content; exhausted memory throws std::bad_alloc or
// std::length_error.
#ifndef MORVIK_SRC_MISC_H
#define MORVIK_SRC_MISC_H

#include <cstdint>
#include <istream>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

/// Splits a property string at the first of a set of delimiter characters.
///
/// \param text        any text; blanks and NUL characters are ordinary characters
/// \param delimiters  the delimiter characters, NUL-terminated, in any order; must not be null
/// \return the text before the first delimiter and the text after it. Only that one delimiter is
///         removed. Without a delimiter: the whole text and an empty string.
///
/// splitString("Fix_12_3", "_") gives ("Fix", "12_3"); splitString("MOD", ":") gives ("MOD", "");
/// splitString(":", ":") gives ("", "").
MORVIK_API std::pair<std::string, std::string> splitString(const std::string& text, const char* delimiters);

/// Reads a parameter file, lines of the form "name = value", into a map.
///
/// A comment starts at "//" or "#" and ends with its line. A line is skipped if it is empty or has only
/// characters of code 1 to 32 before its comment. The first "=" separates name and value, both
/// tidied by stripws. A line without "=" is a name with an empty value; a line that begins with "="
/// has an empty name.
///
/// \param stream      read line by line until it ends or fails; not touched if already at its end
/// \param parameters  receives the values. With checkNames it must hold every allowed name on
///                    entry, with its default value.
/// \param checkNames  whether to refuse a name that is not yet in the map, with the line
///                    "ERROR:<line number>:Parameter name '<name>' is invalid" on standard
///                    error; otherwise the name is inserted. Lines are counted from 1, skipped
///                    ones included. The lines after a refused one are still read and applied.
/// \return false if a name was refused, else true, even if the stream failed (see the stream's
///         state). Exhausted memory fails the stream, as in std::getline.
///
/// With {rate: "1", K: "40"} in the map, the two lines "K = 6144  // largest" and "# done" change
/// the map to {rate: "1", K: "6144"}.
MORVIK_API bool parse(std::istream& stream, std::map<std::string, std::string>& parameters, bool checkNames = true);

/// Reads the named parameter file like the stream form.
///
/// \return false, after the line "ERROR:Could not open input file '<fileName>'" on standard error,
///         if the file cannot be opened for reading; else the result of the stream form. (A folder
///         can be opened; it reads as an empty file.)
MORVIK_API bool parse(const std::string& fileName,
                      std::map<std::string, std::string>& parameters,
                      bool checkNames = true);

/// Splits a text into tokens.
///
/// \param text        any text
/// \param delimiters  the characters that end a token
/// \param whitespace  the characters skipped before a token; those after it stay
/// \return the tokens in order. Two adjacent delimiters enclose an empty token, unless the delimiter
///         is also whitespace; a delimiter at the very end adds none.
///
/// stringtok("a,,b", ",") gives "a", "", "b"; stringtok("a , b,", ",") gives "a ", "b";
/// stringtok("a  b", " ") gives "a", "b".
MORVIK_API std::vector<std::string> stringtok(const std::string& text,
                                              const std::string& delimiters,
                                              const std::string& whitespace = " \t\r\n");

/// Trims blanks (code 32 or less) at both ends and replaces every inner run of blanks by one space.
///
/// stripws("  a \t b  ") gives "a b"; a text of blanks gives "".
MORVIK_API std::string stripws(const std::string& text);

/// Replaces each tab by spaces, so that columns line up.
///
/// The character after the k-th tab lands at column widths[0] + ... + widths[k-1], counted from 0
/// at the start of the text; if the text already reaches that column, the tab becomes one space.
/// Further tabs repeat the last width. A line feed is an ordinary character: it does not return to
/// column 0.
///
/// \param text    any text
/// \param widths  column widths, any values; none at all means 16. The result is as long as they
///                require.
///
/// expandTabs("a\tb\tc", {4, 2}) gives "a   b c"; expandTabs("long name\tx", {4}) gives
/// "long name x".
MORVIK_API std::string expandTabs(std::string text, const std::vector<std::uint32_t>& widths);

/// Whether two texts are equal, ignoring the case of the letters A to Z.
///
/// nocase_compare("MOD#", "mod#") is true; nocase_compare("MOD", "MOD#") is false.
MORVIK_API bool nocase_compare(const std::string& a, const std::string& b);

/// Whether two characters are equal, ignoring the case of the letters A to Z.
///
/// nocase_compare2('k', 'K') is true; nocase_compare2('[', '{') is false.
MORVIK_API bool nocase_compare2(char a, char b);

/// Converts a text, up to its first NUL character, to one suitable for a file name.
///
/// A run of blanks (code 32 or less) becomes one "_", or nothing at the end of the text; "+" and
/// "." become "p", "-" becomes "m", "," becomes "c", "%" becomes "pc", "<" becomes "[" and ">"
/// becomes "]"; "=" is dropped, and the blanks before and after it are separate runs. All other
/// characters, including "/", stay.
///
/// toFilename(" x = -1.5 %") gives "_x__m1p5_pc".
MORVIK_API std::string toFilename(const std::string& text);

/// Formats a value in fixed notation with an SI prefix, ready for a unit to be appended.
///
/// \param value      any value. Its magnitude a selects the prefix:
///
///                       a > 5e14   " P"        a > 0.5     " " (no prefix)
///                       a > 5e11   " T"        a < 1e-15   " " (no prefix)
///                       a > 5e8    " G"        a > 5e-4    " m"
///                       a > 5e5    " M"        a > 5e-10   " u"
///                       a > 500    " k"        a > 5e-13   " n"
///                                              otherwise   " p"
///
///                   The limits of u and n are lower than usual: 1e-9 gives "0.001 u".
///                   The limits are double values; the scaling is done in long double.
///                   Infinity gives "inf P", NaN "nan p"; zero and NaN keep a minus sign.
/// \param precision  number of digits after the point, any value
///
/// toSIString(1500.0) gives "1.50 k"; toSIString(-3e9, 1) gives "-3.0 G"; toSIString(0.0) gives
/// "0.00 ". An argument of another type, such as int, must be converted to one of these four.
MORVIK_API std::string toSIString(long double value, unsigned precision = 2);
MORVIK_API std::string toSIString(double value, unsigned precision = 2);
MORVIK_API std::string toSIString(std::uint64_t value, unsigned precision = 2);
MORVIK_API std::string toSIString(std::uint32_t value, unsigned precision = 2);

/// Formats a number of seconds with six significant digits in a suitable unit: "s" below 60, "min"
/// below 3600, "hr" up to 259199 and "days" from 259200 on.
///
/// A day is 259200 seconds, three times 86400, as in stringToTime.
///
/// timeToString(59u) gives "59s"; timeToString(90u) gives "1.5min"; timeToString(345600u) gives
/// "1.33333days". An argument of another type, such as int, must be converted to one of the three
/// overloads: unsigned 32-bit, double or long.
MORVIK_API std::string timeToString(std::uint32_t seconds);

/// As above, for the low 32 bits of the number truncated toward zero to a signed 64-bit integer.
/// A number that it cannot hold, or NaN, counts as 0.
///
/// timeToString(90.9) gives "1.5min"; timeToString(-1.0) is timeToString(4294967295u).
MORVIK_API std::string timeToString(double seconds);

/// As above, for the low 32 bits of the number.
///
/// timeToString(90L) gives "1.5min"; timeToString(-1L) is timeToString(4294967295u).
MORVIK_API std::string timeToString(long seconds);

/// Parses a number and a unit and returns the time in seconds, truncated toward zero.
///
/// The number has the form that input streams read: leading blanks, a sign, a fraction and an
/// exponent are allowed, "inf" and "nan" are not. The next character other than white space is the
/// unit, in either case: "m" for minutes, "h" for hours, "d" for days of 259200 seconds; with any
/// other character or none, the number is in seconds. The rest is ignored.
///
/// \return the seconds, clipped to the range of the result; 0 if the text does not begin with a
///         number. The number is read as a double and the product not rounded to double, so "0.7m",
///         just below 42, gives 41.
///
/// stringToTime("90") and stringToTime("1.5m") give 90; stringToTime("2 hours") gives 7200;
/// stringToTime("1D") gives 259200.
MORVIK_API std::int32_t stringToTime(std::string text);

#endif
