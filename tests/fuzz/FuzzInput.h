// FuzzInput: takes numbers and texts off the bytes that a fuzzer gives.
#ifndef MORVIK_TESTS_FUZZ_FUZZINPUT_H
#define MORVIK_TESTS_FUZZ_FUZZINPUT_H

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <exception>
#include <iostream>
#include <streambuf>
#include <string>
#include <string_view>

/// Reads zeros when the bytes are used up.
class FuzzInput {
public:
    static constexpr std::string_view partEnd = "\n\x1E\n";

    FuzzInput(const std::uint8_t* data, std::size_t size) : itsNext(data), itsEnd(data + size) {}

    bool empty() const
    {
        return itsNext == itsEnd;
    }

    std::uint8_t byte()
    {
        return empty() ? std::uint8_t{0} : *itsNext++;
    }

    /// A number below `count`, from one byte.
    unsigned below(unsigned count)
    {
        return byte() % count;
    }

    std::uint32_t word()
    {
        std::uint32_t value = 0;
        for (unsigned i = 0; i < 4; ++i) {
            value = value << 8 | byte();
        }
        return value;
    }

    std::int32_t integer()
    {
        return static_cast<std::int32_t>(word());
    }

    /// As many bytes as the next one says, or those that are left.
    std::string shortText()
    {
        std::string taken;
        for (unsigned left = byte(); left > 0 && !empty(); --left) {
            taken += static_cast<char>(byte());
        }
        return taken;
    }

    /// What stands before the next partEnd, or all that is left.
    std::string part()
    {
        const std::string rest(itsNext, itsEnd);
        const std::size_t end = rest.find(partEnd);
        itsNext = end == std::string::npos ? itsEnd : itsNext + end + partEnd.size();
        return rest.substr(0, end);
    }

    /// All that is left.
    std::string text()
    {
        std::string rest(itsNext, itsEnd);
        itsNext = itsEnd;
        return rest;
    }

private:
    const std::uint8_t* itsNext;
    const std::uint8_t* itsEnd;
};

/// Keeps the library's lines from the terminal while it lives.
class SilencedStreams {
public:
    SilencedStreams() : itsCout(std::cout.rdbuf(&itsNowhere)), itsCerr(std::cerr.rdbuf(&itsNowhere)) {}

    ~SilencedStreams()
    {
        std::cout.rdbuf(itsCout);
        std::cerr.rdbuf(itsCerr);
    }

    SilencedStreams(const SilencedStreams&) = delete;
    SilencedStreams& operator=(const SilencedStreams&) = delete;

private:
    struct Nowhere : std::streambuf {
        int overflow(int c) override
        {
            return c;
        }
    };

    Nowhere itsNowhere;
    std::streambuf* itsCout;
    std::streambuf* itsCerr;
};

/// Ends the program, which a fuzzer reports with the input, when a promise is broken.
inline void require(bool kept, const char* promise)
{
    if (!kept) {
        std::cerr << "broken: " << promise << std::endl;
        std::abort();
    }
}

/// A message is one line that opens with the place.
inline void requireOneLine(const std::exception& error, const std::string& opening)
{
    const std::string line = error.what();
    require(line.rfind(opening, 0) == 0 && line.find('\n') == std::string::npos, "an error is one line with its place");
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

#endif
