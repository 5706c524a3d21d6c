// Misc: the support functions that the library exports beside the model.
//
// All of them are free functions without state. Numbers are read and written in the classic "C"
// form (a decimal point, no grouping) whatever the global C++ or C locale is, and letters change
// case as in the "C" locale, A to Z only. Characters are signed 8-bit values: where a function
// speaks of a blank, a character of code 32 or less, the bytes 128 to 255 are blanks as well.
//
// None of the functions throws for the content of what it is given; exhausted memory surfaces as
// std::bad_alloc or std::length_error.
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
///         taken away. Without a delimiter: the whole text and an empty string.
///
/// splitString("Fix_12_3", "_") gives ("Fix", "12_3"); splitString("MOD", ":") gives ("MOD", "");
/// splitString(":", ":") gives ("", "").
MORVIK_API std::pair<std::string, std::string> splitString(const std::string& text, const char* delimiters);

/// Reads a parameter file, lines of the form "name = value", into a map.
///
/// A comment starts at "//" or "#" and ends with its line; a line that is empty or has nothing but
/// characters of code 1 to 32 before its comment is skipped. Name and value are what stands before
/// and after the first "=", both tidied by stripws. A line without "=" is a name with an empty
/// value; a line that begins with "=" has an empty name.
///
/// \param stream      read line by line until its end, or until it fails; a stream that is at its
///                    end already is not touched
/// \param parameters  receives the values. With checkNames it must hold every allowed name on
///                    entry, with its default value.
/// \param checkNames  whether a name that is not yet in the map is refused with the line
///                    "ERROR:<line number>:Parameter name '<name>' is invalid" on the standard
///                    error stream; otherwise it is inserted. Lines are counted from 1, skipped
///                    ones included. The lines after a refused one are still read and applied.
/// \return false if a name was refused, else true; also after a failure of the stream, which the
///         caller finds in the stream's state. Memory that is exhausted by a line is such a failure, as
///         it is for std::getline.
///
/// With {rate: "1", K: "40"} in the map, the two lines "K = 6144  // largest" and "# done" change
/// the map to {rate: "1", K: "6144"}.
MORVIK_API bool parse(std::istream& stream, std::map<std::string, std::string>& parameters, bool checkNames = true);

/// Reads the parameter file of the given name as parse does with a stream.
///
/// \return false after the line "ERROR:Could not open input file '<fileName>'" on the standard
///         error stream if the file cannot be opened for reading, else the result of the stream
///         form. (A folder can be opened; it reads as a file without lines.)
MORVIK_API bool parse(const std::string& fileName,
                      std::map<std::string, std::string>& parameters,
                      bool checkNames = true);

/// Splits a text into tokens.
///
/// \param text        any text
/// \param delimiters  the characters that end a token
/// \param whitespace  the characters that are skipped before a token; those behind it stay
/// \return the tokens in their order. Two neighbouring delimiters enclose an empty token unless
///         the delimiter is whitespace too; a delimiter at the very end adds none.
///
/// stringtok("a,,b", ",") gives "a", "", "b"; stringtok("a , b,", ",") gives "a ", "b";
/// stringtok("a  b", " ") gives "a", "b".
MORVIK_API std::vector<std::string> stringtok(const std::string& text,
                                              const std::string& delimiters,
                                              const std::string& whitespace = " \t\r\n");

/// Removes the blanks (code 32 or less) at both ends of a text and makes one space of every run of
/// blanks inside it.
///
/// stripws("  a \t b  ") gives "a b"; a text of blanks gives "".
MORVIK_API std::string stripws(const std::string& text);

/// Replaces each tab of a text by spaces, so that columns line up.
///
/// The character after the k-th tab lands at column widths[0] + ... + widths[k-1], counted from 0
/// at the start of the text; where the text is there or beyond already, the tab becomes one space.
/// Further tabs repeat the last width. A line feed is an ordinary character: it does not return to
/// column 0.
///
/// \param text    any text
/// \param widths  column widths, each of the whole range; no widths at all stand for 16. The
///                result is as long as the widths ask for.
///
/// expandTabs("a\tb\tc", {4, 2}) gives "a   b c"; expandTabs("long name\tx", {4}) gives
/// "long name x".
MORVIK_API std::string expandTabs(std::string text, const std::vector<std::uint32_t>& widths);

/// Tells whether two texts are equal when the case of the letters A to Z is ignored.
///
/// nocase_compare("MOD#", "mod#") is true; nocase_compare("MOD", "MOD#") is false.
MORVIK_API bool nocase_compare(const std::string& a, const std::string& b);

/// Tells whether two characters are equal when the case of the letters A to Z is ignored.
///
/// nocase_compare2('k', 'K') is true; nocase_compare2('[', '{') is false.
MORVIK_API bool nocase_compare2(char a, char b);

/// Turns a text, up to its first NUL character, into one that can stand in a file name.
///
/// A run of blanks (code 32 or less) becomes one "_", or nothing at the end of the text; "+" and
/// "." become "p", "-" becomes "m", "," becomes "c", "%" becomes "pc", "<" becomes "[" and ">"
/// becomes "]"; "=" is dropped, and blanks before it and behind it are runs of their own. All other
/// characters, "/" among them, stay as they are.
///
/// toFilename(" x = -1.5 %") gives "_x__m1p5_pc".
MORVIK_API std::string toFilename(const std::string& text);

/// Writes a value in fixed notation with an SI prefix, ready for a unit to be appended.
///
/// \param value      any value. Its magnitude a chooses the prefix:
///
///                       a > 5e14   " P"        a > 0.5     " " (no prefix)
///                       a > 5e11   " T"        a < 1e-15   " " (no prefix)
///                       a > 5e8    " G"        a > 5e-4    " m"
///                       a > 5e5    " M"        a > 5e-10   " u"
///                       a > 500    " k"        a > 5e-13   " n"
///                                              otherwise   " p"
///
///                   The limits of u and n lie below the usual ones: 1e-9 is written as "0.001 u".
///                   The limits are double values and the scaling is done in long double.
///                   Infinity gives "inf P", not-a-number "nan p"; a zero and a not-a-number that
///                   carry a minus sign keep it.
/// \param precision  number of digits after the point, of the whole range
///
/// toSIString(1500.0) gives "1.50 k"; toSIString(-3e9, 1) gives "-3.0 G"; toSIString(0.0) gives
/// "0.00 ". An argument of another type, such as int, has to be converted to one of these four.
MORVIK_API std::string toSIString(long double value, unsigned precision = 2);
MORVIK_API std::string toSIString(double value, unsigned precision = 2);
MORVIK_API std::string toSIString(std::uint64_t value, unsigned precision = 2);
MORVIK_API std::string toSIString(std::uint32_t value, unsigned precision = 2);

/// Writes a number of seconds with six significant digits in a unit that suits it: "s" below 60,
/// "min" below 3600, "hr" up to 259199 and "days" from 259200 on.
///
/// A day counts 259200 seconds here, three times 86400, as it does in stringToTime.
///
/// timeToString(59u) gives "59s"; timeToString(90u) gives "1.5min"; timeToString(345600u) gives
/// "1.33333days". An argument of another type, such as int, has to be converted to one of the three
/// that follow: unsigned 32-bit, double or long.
MORVIK_API std::string timeToString(std::uint32_t seconds);

/// As above, for the low 32 bits of the number truncated toward zero to a signed 64-bit integer.
/// What that integer cannot hold, not-a-number included, counts as 0.
///
/// timeToString(90.9) gives "1.5min"; timeToString(-1.0) is timeToString(4294967295u).
MORVIK_API std::string timeToString(double seconds);

/// As above, for the low 32 bits of the number.
///
/// timeToString(90L) gives "1.5min"; timeToString(-1L) is timeToString(4294967295u).
MORVIK_API std::string timeToString(long seconds);

/// Reads a number and a unit and returns the time in seconds, truncated toward zero.
///
/// The number is one as input streams read it: leading blanks, a sign, a fraction and an exponent
/// are allowed, "inf" and "nan" are none. The next character that is not white space is the unit,
/// in either case: "m" for minutes, "h" for hours, "d" for days of 259200 seconds; any other
/// character or none leaves the number in seconds. What follows is not looked at.
///
/// \return the seconds, clipped to the range of the result; 0 when the text begins with no number.
///         The number is read as a double and multiplied without rounding it to a double again, so
///         that "0.7m", just below 42, gives 41.
///
/// stringToTime("90") and stringToTime("1.5m") give 90; stringToTime("2 hours") gives 7200;
/// stringToTime("1D") gives 259200.
MORVIK_API std::int32_t stringToTime(std::string text);

#endif
