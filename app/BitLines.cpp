// BitLines: reads blocks of bits, a line of 0 and 1 for each.
#include "BitLines.h"

#include "base/Shown.h"

namespace morvik {

std::vector<std::uint8_t> bitsOf(std::string_view line)
{
    std::vector<std::uint8_t> bits;
    bits.reserve(line.size());
    for (const char bit : line) {
        bits.push_back(bit == '1' ? 1 : 0);
    }
    return bits;
}

std::string lineOf(const std::vector<std::uint8_t>& bits)
{
    std::string line;
    line.reserve(bits.size() + 1);
    for (const std::uint8_t bit : bits) {
        line += bit != 0 ? '1' : '0';
    }
    return line + '\n';
}

void expectBits(const base::LineReader& lines)
{
    const std::size_t other = lines.text().find_first_not_of("01");
    if (other != std::string_view::npos) {
        lines.fail("character " + base::shown(lines.text().substr(other, 1)) + " in column " +
                   std::to_string(other + 1) + ", expected 0 or 1");
    }
}

BitLines::BitLines(std::istream& input, const std::string& name, std::size_t longest) : itsLines(input, name, longest)
{
}

bool BitLines::next()
{
    if (!itsLines.next()) {
        return false;
    }
    if (text().empty()) {
        itsLines.expectOnlyBlankLines();
        return false;
    }
    expectBits(itsLines);
    return true;
}

}  // namespace morvik
