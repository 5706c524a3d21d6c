// VariantDecoder: decoders made of the model's components that lead, step by step, from fine, undivided arithmetic to
// the hardware's.
#ifndef MORVIK_VALIDATION_VARIANTDECODER_H
#define MORVIK_VALIDATION_VARIANTDECODER_H

#include <array>
#include <cstddef>
#include <memory>
#include <vector>

#include "src/TDecoder3G.h"

namespace morvik::validation {

/// A decoder between the reference and the hardware. More than three fraction bits resolve more than eighths.
struct Variant {
    const char* name;
    std::size_t predecessor;  ///< the variant that differs by one step
    const char* stateFormat;
    const char* branchFormat;
    const char* decoder;  ///< property string; empty: neither segments nor windows
};

/// The limit of the branch metrics is 64 in `fine`, 16 in all others. `hardware_N` is the model with N units.
constexpr std::array<Variant, 7> variants = {{
    {"fine", 0, "Fix_16_6", "Fix_13_6", ""},
    {"clipped", 0, "Fix_16_6", "Fix_11_6", ""},
    {"undivided", 1, "Fix_12_3", "Fix_8_3", ""},
    {"windows", 2, "Fix_12_3", "Fix_8_3", "3GPPPU:1,1"},
    {"hardware_2", 3, "Fix_12_3", "Fix_8_3", "3GPPPU:2"},
    {"hardware_4", 3, "Fix_12_3", "Fix_8_3", "3GPPPU:4"},
    {"hardware_8", 3, "Fix_12_3", "Fix_8_3", "3GPPPU:8"},
}};

/// The variant of a name that is in the list.
const Variant& variantOf(const char* name);

class VariantDecoder {
public:
    VariantDecoder(const Variant& variant, int algorithm);

    /// The decisions for a received block, a value of each stream position by position, in units of the transmitted
    /// amplitude. `scale` is the hardware's soft value for amplitude 1.
    const std::vector<unsigned char>& decode(const std::vector<double>& received, double scale, unsigned iterations);

private:
    std::unique_ptr<TNumberFormat> itsState;
    std::unique_ptr<TNumberFormat> itsBranch;
    std::unique_ptr<TInterleaver> itsInterleaver;
    std::unique_ptr<TCalculationEngine> itsEngine;
    std::unique_ptr<TDecoder> itsDecoder;
    std::vector<short> itsSoft;
    std::vector<unsigned char> itsHard;
};

}  // namespace morvik::validation

#endif
