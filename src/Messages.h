// Messages: the library's only output to the process's standard streams.
//
// Every message is one line, written in one piece and flushed. Parts are concatenated as characters, never
// with formatted insertion: a host program's stream flags (std::hex, a field width) and locale cannot
// change a line, and a message needs no heap memory.
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

/// The text of one part of a line: a string, a character, or an integer in decimal.
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

/// Writes one part of a line too long for a message.
template <class Part>
void writePart(std::ostream& os, const Part& part)
{
    const Characters characters(part);
    os.write(characters.text().data(), static_cast<std::streamsize>(characters.text().size()));
}

/// Collects a line and writes it in one piece, so that lines of two threads do not mix; a line of more than
/// 1023 characters is written in several.
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

/// Writes the parts as one line and flushes the stream.
template <class... Parts>
void writeLine(std::ostream& os, const Parts&... parts)
{
    LineBuffer line(os);
    (line.add(Characters(parts).text()), ...);
    line.end();
}

/// Writes a line to a standard stream. If the host program has set the stream to throw on failure, only
/// the message is lost.
template <class... Parts>
void writeMessage(std::ostream& os, const Parts&... parts) noexcept
{
    try {
        writeLine(os, parts...);
    } catch (...) {
        return;
    }
}

/// Writes an error line to standard error.
template <class... Parts>
void writeError(const Parts&... parts) noexcept
{
    writeMessage(error(), parts...);
}

/// Writes a warning line to standard output.
template <class... Parts>
void writeWarning(const Parts&... parts) noexcept
{
    writeMessage(output(), parts...);
}

}  // namespace morvik::messages

#endif
