// TextTrace: half-iterations cut out of the library's own trace.
#include <cstdint>
#include <exception>
#include <optional>
#include <ostream>
#include <streambuf>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "TraceWriter.h"
#include "base/Numbers.h"
#include "hardware/testbench/Decoder.h"

namespace morvik::trace {

namespace {

/// The half-iteration whose table begins with the line, "decode=N siso=N".
std::optional<std::int64_t> beginningPass(std::string_view line)
{
    if (base::take(line, "decode=") && base::takeInteger(line) && base::take(line, " siso=")) {
        return base::takeInteger(line);
    }
    return std::nullopt;
}

/// Filters a trace as it is written, dropping the tables of other half-iterations.
class PassFilter : public std::streambuf {
public:
    PassFilter(const Selection& selection, base::OutputFile file)
        : itsFirst(selection.first), itsLast(selection.last), itsFile(std::move(file))
    {
    }

    /// Rethrows what went wrong: the library lets no exception pass.
    void finish()
    {
        if (itsFailure) {
            std::rethrow_exception(itsFailure);
        }
        itsFile.commit();
    }

protected:
    int_type overflow(int_type character) override
    {
        const char one = traits_type::to_char_type(character);
        return xsputn(&one, 1) == 1 ? character : traits_type::eof();
    }

    std::streamsize xsputn(const char* text, std::streamsize size) override
    {
        std::string_view rest(text, static_cast<std::size_t>(size));
        for (std::size_t end = rest.find('\n'); end != std::string_view::npos; end = rest.find('\n')) {
            itsLine += rest.substr(0, end + 1);
            rest.remove_prefix(end + 1);
            if (!takeLine()) {
                return 0;
            }
            itsLine.clear();
        }
        itsLine += rest;
        return size;
    }

private:
    /// A line of dashes belongs to what follows it.
    bool takeLine()
    {
        if (itsLine.rfind("---", 0) == 0) {
            itsDashes = itsLine;
            return true;
        }
        if (const auto pass = beginningPass(itsLine)) {
            itsShows = *pass >= itsFirst && *pass <= itsLast;
        }
        const std::string text = std::exchange(itsDashes, {}) + itsLine;
        return !itsShows || write(text);
    }

    bool write(const std::string& text)
    {
        try {
            itsFile.write(text);
        } catch (...) {
            itsFailure = std::current_exception();
            return false;
        }
        return true;
    }

    std::int64_t itsFirst;
    std::int64_t itsLast;
    base::OutputFile itsFile;
    std::string itsLine;  // the current one, so far
    std::string itsDashes;
    bool itsShows = true;
    std::exception_ptr itsFailure;
};

}  // namespace

void writeText(const SoftBlock& block,
               const veltra_ip_morvik_v1_0_generics& generics,
               const Selection& selection,
               base::OutputFile file)
{
    PassFilter filter(selection, std::move(file));
    std::ostream messages(&filter);
    Decoder decoder(generics, messages);
    decoder.armTrace(selection.last + 1);
    std::vector<std::uint8_t> bits;
    decoder.decode(block, selection.last / 2 + 1, 0, bits);
    filter.finish();
}

}  // namespace morvik::trace
