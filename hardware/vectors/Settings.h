// Settings: which blocks a set of vectors holds, for which core, and in which form.
#ifndef MORVIK_HARDWARE_VECTORS_SETTINGS_H
#define MORVIK_HARDWARE_VECTORS_SETTINGS_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"
#include "simulation/Point.h"

namespace morvik::vectors {

/// The most ways in which a set sends transport blocks.
constexpr std::size_t mostFormats = 1000;

struct Settings {
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    std::uint32_t iterations = 8;

    std::vector<unsigned> blockSizes;          ///< of plain random blocks and of the patterns
    std::vector<simulation::Point> transport;  ///< how transport blocks are sent, up to mostFormats, instead of sizes
    unsigned blocks = 8;                       ///< random ones of each size or format
    int milliDecibels = 1000;                  ///< Eb/N0 of plain random blocks, in thousandths of a decibel
    std::uint64_t seed = 1;
    bool directed = true;  ///< whether directed blocks follow the random ones

    std::vector<std::string> cover;  ///< situations of hardware/coverage/, by names, that further blocks are to meet
    std::uint32_t coverLimit = 500;  ///< blocks that are drawn for them

    std::vector<std::string> formats;
    unsigned width = 8;            ///< bits of a soft value in the files: 8 or 16
    bool separateStreams = false;  ///< whether memh has a file for each stream
    bool ratios = false;
    bool internal = false;  ///< every value of each pass
};

}  // namespace morvik::vectors

#endif
