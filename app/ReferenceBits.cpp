// ReferenceBits: reads the transmitted bits, one line of 0 and 1 per block.
#include "ReferenceBits.h"

#include <string_view>

#include "BitLines.h"

namespace morvik {

ReferenceBits::ReferenceBits(std::istream& input, const std::string& name, std::size_t longest)
    : itsLines(input, name, longest)
{
}

std::vector<std::uint8_t> ReferenceBits::next()
{
    return bitsOf(nextLine());
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
    expectBits(itsLines);
    return itsLines.text();
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
