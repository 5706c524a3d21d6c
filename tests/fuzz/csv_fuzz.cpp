// csv_fuzz: the command's readers of soft values and reference bits take any text.
#include <sstream>

#include "FuzzInput.h"
#include "ReferenceBits.h"
#include "SoftValueReader.h"
#include "base/Error.h"

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

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    FuzzInput input(data, size);
    const bool header = input.below(2) == 0;
    const std::string text = input.text();
    readBlocks(header ? std::string(morvik::softValueHeader) + "\n" + text : text);
    readBits(text);
    return 0;
}
