// csv_fuzz: the command's readers of soft values, of coded bits and of bits take any text.
#include <cmath>
#include <sstream>

#include "BitLines.h"
#include "FuzzInput.h"
#include "ReferenceBits.h"
#include "SoftValueReader.h"
#include "base/Error.h"
#include "decode/CodedValueReader.h"

namespace {

void readBlocks(const std::string& text)
{
    std::istringstream stream(text);
    try {
        morvik::SoftValueReader reader(stream, "in");
        morvik::SoftBlock block;
        while (reader.next(block)) {
            require(block.size() > 0 && block.size() <= morvik::maxPositions, "a block has 1 to 6148 positions");
            require(block.rsc1Par.size() == block.size() && block.rsc2Par.size() == block.size(),
                    "the three streams are of one length");
        }
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in:");
    }
}

void readBits(const std::string& text)
{
    std::istringstream stream(text);
    try {
        morvik::ReferenceBits reference(stream, "in");
        for (unsigned block = 0; block < 4; ++block) {
            require(reference.countErrors({0, 1, 0, 1}) <= 4, "no more bits differ than there are");
        }
        reference.expectEnd();
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in:");
    }
}

void readCodedValues(const std::string& text, unsigned codedBits)
{
    std::istringstream stream(text);
    try {
        morvik::CodedValueReader reader(stream, "in", codedBits);
        while (reader.next()) {
            require(reader.values().size() == codedBits, "a row has a value for each coded bit");
            for (const float value : reader.values()) {
                require(std::isfinite(value), "values are finite");
            }
        }
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in:");
    }
}

void readBitLines(const std::string& text)
{
    std::istringstream stream(text);
    try {
        morvik::BitLines lines(stream, "in");
        while (lines.next()) {
            require(morvik::lineOf(morvik::bitsOf(lines.text())) == std::string(lines.text()) + '\n',
                    "a line of bits is what it was read from");
        }
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in:");
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    FuzzInput input(data, size);
    const bool header = input.below(2) == 0;
    const std::string text = input.text();
    readBlocks(header ? std::string(morvik::softValueHeader) + "\n" + text : text);
    readBits(text);
    readBitLines(text);
    const auto codedBits = static_cast<unsigned>(1 + text.size() % 3);
    readCodedValues(header ? std::string(morvik::codedValueHeader) + "\n" + text : text, codedBits);
    return 0;
}
