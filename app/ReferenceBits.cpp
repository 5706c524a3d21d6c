// ReferenceBits: reads the transmitted bits, one line of 0 and 1 per block.
#include "ReferenceBits.h"

#include <string_view>

#include "base/Shown.h"

namespace morvik {

ReferenceBits::ReferenceBits(std::istream& input, const std::string& name)
    : itsLines(input, name, base::LineReader::shortLines)
{
}

std::vector<std::uint8_t> ReferenceBits::next()
{
    std::vector<std::uint8_t> bits;
    for (const char bit : nextLine()) {
        bits.push_back(bit == '1' ? 1 : 0);
    }
    return bits;
}

std::size_t ReferenceBits::countErrors(const std::vector<std::uint8_t>& decisions)
{
    const std::string_view line = nextLine();
    if (line.size() != decisions.size()) {
        itsLines.fail(std::to_string(line.size()) + " bits, expected the " + std::to_string(decisions.size()) +
                      " of the block");
    }
    std::size_t errors = 0;
    for (std::size_t i = 0; i < decisions.size(); ++i) {
        const char decided = decisions[i] != 0 ? '1' : '0';
        if (decided != line[i]) {
            ++errors;
        }
    }
    return errors;
}

void ReferenceBits::fail(const std::string& what) const
{
    itsLines.fail(what);
}

std::string_view ReferenceBits::nextLine()
{
    if (!itsLines.next()) {
        const std::size_t missing = itsLines.number() + 1;
        itsLines.failAt(missing, "no line for block " + std::to_string(missing) + ", expected one for each block");
    }
    const std::string_view line = itsLines.text();
    const std::size_t other = line.find_first_not_of("01");
    if (other != std::string_view::npos) {
        itsLines.fail("character " + base::shown(line.substr(other, 1)) + " in column " + std::to_string(other + 1) +
                      ", allowed are 0 and 1");
    }
    return line;
}

void ReferenceBits::expectEnd()
{
    const std::size_t blocks = itsLines.number();
    while (itsLines.next()) {
        if (!itsLines.text().empty()) {
            itsLines.fail("more lines than blocks, expected " + std::to_string(blocks));
        }
        itsLines.expectAnEnd(blocks);
    }
}

}  // namespace morvik
