// Messages: tests that lines are whole, flushed and out of reach of the stream's settings.
#include "Messages.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <iomanip>
#include <limits>
#include <locale>
#include <sstream>

#include "support/CapturedStreams.h"
#include "support/CommaLocale.h"

namespace {

/// Counts how often it is written to and flushed.
class CallCounter : public std::stringbuf {
public:
    int writes = 0;
    int flushes = 0;

protected:
    std::streamsize xsputn(const char* text, std::streamsize size) override
    {
        ++writes;
        return std::stringbuf::xsputn(text, size);
    }

    int sync() override
    {
        ++flushes;
        return 0;
    }
};

}  // namespace

TEST(Messages, ComposesALineOfTextsCharactersAndIntegers)
{
    std::ostringstream os;
    morvik::messages::writeLine(os, "a", std::string("b "), 'c', 0U, ' ', short{-7}, ' ', (std::uint8_t{200}));
    morvik::messages::writeLine(
        os, std::numeric_limits<std::int64_t>::min(), ' ', std::numeric_limits<std::uint64_t>::max());
    morvik::messages::writeLine(os);
    EXPECT_EQ(os.str(), "ab c0 -7 200\n-9223372036854775808 18446744073709551615\n\n");
}

TEST(Messages, AreIndependentOfTheStreamsSettings)
{
    std::ostringstream os;
    os.imbue(std::locale(std::locale::classic(), new CommaPunctuation));
    os << std::hex << std::showbase << std::showpos << std::setfill('*') << std::setw(30);
    morvik::messages::writeLine(os, "n=", 1234567, ';');
    EXPECT_EQ(os.str(), "n=1234567;\n");
}

TEST(Messages, AreWrittenAndFlushedOnceEach)
{
    CallCounter buffer;
    std::ostream os(&buffer);
    morvik::messages::writePart(os, "part");
    EXPECT_EQ(buffer.flushes, 0);
    EXPECT_EQ(buffer.writes, 1);
    morvik::messages::writeLine(os, 1, 2, 3);
    EXPECT_EQ(buffer.writes, 2);
    EXPECT_EQ(buffer.flushes, 1);
}

TEST(Messages, AreWholeAtAnyLength)
{
    for (const std::size_t length : {1000U, 1022U, 1023U, 1024U, 1025U, 5000U}) {
        const std::string text(length, 'x');
        std::ostringstream os;
        morvik::messages::writeLine(os, "a", text, 1, text, "z");
        EXPECT_EQ(os.str(), std::string("a").append(text).append("1").append(text).append("z\n")) << length;
    }
}

TEST(Messages, ThatAreLostThrowNothing)
{
    const CapturedStreams streams;
    struct : std::streambuf {
    } takesNothing;
    std::cerr.rdbuf(&takesNothing);
    std::cerr.exceptions(std::ios::badbit);
    morvik::messages::writeError("lost");
    EXPECT_TRUE(std::cerr.bad());
    std::cerr.exceptions(std::ios::goodbit);
    std::cerr.clear();
}

TEST(Messages, SendErrorsToTheErrorStreamAndWarningsToTheOutputStream)
{
    const CapturedStreams streams;
    morvik::messages::writeError("ERROR:x:", 1);
    morvik::messages::writeWarning("WARNING:x:", 2);
    EXPECT_EQ(streams.err(), "ERROR:x:1\n");
    EXPECT_EQ(streams.out(), "WARNING:x:2\n");
}
