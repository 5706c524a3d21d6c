// RandomBits: the information bits of a frame.
#ifndef MORVIK_LINK_RANDOMBITS_H
#define MORVIK_LINK_RANDOMBITS_H

#include <cstdint>

#include "link/random/Random.h"
#include "link/random/RandomBatch.h"

namespace morvik::link {

/// Draws `count` packed bits of a frame. Clears the rest of the last word.
void drawBits(RandomBatch& batch, const FrameRandom& random, std::size_t count, std::uint64_t* row);

}  // namespace morvik::link

#endif
