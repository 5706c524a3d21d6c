// Messages: the one way in which the library writes to the process's standard streams.
//
// Every message is one line, written at once and flushed. Parts are put together as characters, never
// with formatted insertion, so that a host program's stream flags (std::hex, a field width) and
// locale cannot change a line, and so that a message needs no memory from the heap.
#ifndef MORVIK_SRC_MESSAGES_H
#define MORVIK_SRC_MESSAGES_H

#include <charconv>
#include <cstddef>
#include <ostream>
#include <string_view>
#include <type_traits>

namespace morvik::messages {

/// The stream that carries warnings and traces: the process's standard output (MessageStreams.cpp).
std::ostream& output();

/// The stream that carries errors: the process's standard error (MessageStreams.cpp).
std::ostream& error();

/// The characters of one part of a line: a text, a character, or an integer in decimal.
class Characters {
public:
    template <class Part>
    explicit Characters(const Part& part)
    {
        if constexpr (std::is_same_v<Part, char>) {
            itsDigits[0] = part;
            itsText = {itsDigits, 1};
        } else if constexpr (std::is_integral_v<Part>) {
            const auto end = std::to_chars(itsDigits, itsDigits + sizeof itsDigits, part);
            itsText = {itsDigits, static_cast<std::size_t>(end.ptr - itsDigits)};
        } else {
            itsText = part;
        }
    }

    Characters(const Characters&) = delete;
    Characters& operator=(const Characters&) = delete;

    std::string_view text() const
    {
        return itsText;
    }

private:
    char itsDigits[24];  // the longest integer, -9223372036854775808, has 20 characters
    std::string_view itsText;
};

/// Writes one part of a line that is longer than a message.
template <class Part>
void writePart(std::ostream& os, const Part& part)
{
    const Characters characters(part);
    os.write(characters.text().data(), static_cast<std::streamsize>(characters.text().size()));
}

/// Collects a line and writes it at once, so that the lines of two threads do not mix; one of more
/// than 1023 characters goes out in pieces.
class LineBuffer {
public:
    explicit LineBuffer(std::ostream& os) : itsStream(os) {}

    void add(std::string_view text);

    /// Ends the line, writes it and flushes the stream.
    void end();

private:
    void writeOut();

    std::ostream& itsStream;
    std::size_t itsSize = 0;
    char itsText[1024] = {};
};

/// Writes the parts one after the other as a line and flushes the stream.
template <class... Parts>
void writeLine(std::ostream& os, const Parts&... parts)
{
    LineBuffer line(os);
    (line.add(Characters(parts).text()), ...);
    line.end();
}

/// Writes a line on a standard stream. A host program may have set that stream to throw when it
/// fails; a message that is lost so must not cost the caller more than the message.
template <class... Parts>
void writeMessage(std::ostream& os, const Parts&... parts) noexcept
{
    try {
        writeLine(os, parts...);
    } catch (...) {
        return;
    }
}

/// Writes an error line on the standard error stream.
template <class... Parts>
void writeError(const Parts&... parts) noexcept
{
    writeMessage(error(), parts...);
}

/// Writes a warning line on the standard output stream.
template <class... Parts>
void writeWarning(const Parts&... parts) noexcept
{
    writeMessage(output(), parts...);
}

}  // namespace morvik::messages

#endif
