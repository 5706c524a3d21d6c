// SamplerFormX86: draws quantised values with vector instructions.
#ifndef MORVIK_LINK_RANDOM_SAMPLERFORMX86_H
#define MORVIK_LINK_RANDOM_SAMPLERFORMX86_H

#include "SamplerForm.h"

#if defined(__x86_64__) || defined(__i386__)
#define MORVIK_LINK_X86

namespace morvik::link {

// These need AVX-512 F, BW and VBMI.
void drawAvx512(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count);
void randomBlocksAvx512(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count);
void noiseAvx512(const AliasTable& table,
                 const RandomKey& key,
                 const NoiseCounters& counters,
                 std::size_t groups,
                 const DrawnNoise& drawn);

// These need AVX2.
void drawAvx2(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count);
void randomBlocksAvx2(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count);
void noiseAvx2(const AliasTable& table,
               const RandomKey& key,
               const NoiseCounters& counters,
               std::size_t groups,
               const DrawnNoise& drawn);

}  // namespace morvik::link
#endif

#endif
