// Messages: the one way in which the library writes to the process's standard streams.
//
// Every message is one line, flushed when it is complete. Parts are written as characters, never
// with formatted insertion, so that a host program's stream flags (std::hex, a field width) and
// locale cannot change a line, and so that a message needs no memory from the heap.
#ifndef MORVIK_MESSAGES_H
#define MORVIK_MESSAGES_H

#include <charconv>
#include <ostream>
#include <string_view>
#include <type_traits>

namespace messages {

/// The stream that carries warnings and traces: the process's standard output.
std::ostream& output();

/// The stream that carries errors: the process's standard error.
std::ostream& error();

/// Writes one part of a line: a text, a character, or an integer in decimal.
template <class Part>
void writePart(std::ostream& os, const Part& part)
{
    if constexpr (std::is_same_v<Part, char>) {
        os.put(part);
    } else if constexpr (std::is_integral_v<Part>) {
        char digits[24];  // the longest, -9223372036854775808, has 20 characters
        const auto end = std::to_chars(digits, digits + sizeof digits, part);
        os.write(digits, end.ptr - digits);
    } else {
        const std::string_view text(part);
        os.write(text.data(), static_cast<std::streamsize>(text.size()));
    }
}

/// Writes the parts one after the other as a line and flushes the stream.
template <class... Parts>
void writeLine(std::ostream& os, const Parts&... parts)
{
    (writePart(os, parts), ...);
    os.put('\n');
    os.flush();
}

/// Writes an error line on the standard error stream.
template <class... Parts>
void writeError(const Parts&... parts)
{
    writeLine(error(), parts...);
}

/// Writes a warning line on the standard output stream.
template <class... Parts>
void writeWarning(const Parts&... parts)
{
    writeLine(output(), parts...);
}

}  // namespace messages

#endif
