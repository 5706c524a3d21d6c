// TransportFit: whether a transport block can be sent as options ask for, and what would fit.
#include "TransportFit.h"

#include <stdexcept>

#include "base/Error.h"
#include "base/Text.h"
#include "link/coding/TransportBlock.h"

namespace morvik::simulation {

namespace {

/// Whether a soft buffer has room for a bit of each code block.
bool fitsBuffer(const TransportChoice& choice, unsigned softBufferSize)
{
    try {
        const link::TransportBlockCode code(
            {choice.bits, choice.codedBits, bitsPerSymbol(choice.modulation), 1, softBufferSize});
        return code.softSize() > 0;
    } catch (const std::invalid_argument&) {
        return false;
    }
}

/// The smallest soft buffer that does, above one that does not.
unsigned leastBufferSize(const TransportChoice& choice)
{
    unsigned tooSmall = choice.softBufferSize;
    unsigned large = link::unlimitedBuffer - 1;
    while (tooSmall + 1 < large) {
        const unsigned middle = tooSmall + (large - tooSmall) / 2;
        (fitsBuffer(choice, middle) ? large : tooSmall) = middle;
    }
    return large;
}

}  // namespace

void checkFit(const TransportChoice& choice, const std::string& block)
{
    const unsigned perSymbol = bitsPerSymbol(choice.modulation);
    const unsigned blocks = link::codeBlocksOf(choice.bits).count;
    const unsigned G = choice.codedBits;
    const std::string coded = "--coded-bits " + std::to_string(G);
    const std::string modulation = "--modulation " + std::string(nameOf(choice.modulation));
    if (G % perSymbol != 0) {
        const unsigned below = G / perSymbol * perSymbol;
        const std::string above = std::to_string(below + perSymbol);
        throw base::Error(coded + " is no multiple of the " + std::to_string(perSymbol) + " bits of " + modulation +
                          ", the " +
                          (below > 0 ? "nearest are " + std::to_string(below) + " and " + above : "least is " + above));
    }
    if (G < blocks * perSymbol) {
        throw base::Error(coded + " is too small for " + block + ", whose " + base::counted(blocks, "code block") +
                          " take " + std::to_string(blocks * perSymbol) + " or more with " + modulation);
    }
    if (choice.softBufferSize > 0 && !fitsBuffer(choice, choice.softBufferSize)) {
        throw base::Error("--soft-buffer-size " + std::to_string(choice.softBufferSize) + " is too small for " + block +
                          ", the least that holds a bit of " +
                          (blocks > 1 ? "each of its " + std::to_string(blocks) + " code blocks" : "it") + " is " +
                          std::to_string(leastBufferSize(choice)));
    }
}

}  // namespace morvik::simulation
