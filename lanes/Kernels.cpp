// Kernels: the lanes, compiled once for each instruction set (lanes/CMakeLists.txt).
#include "Kernels.h"

#include "Pass.h"
#include "Transpose.h"
#include "rules/Schedule.h"

namespace MORVIK_LANES {
namespace {

/// Rows of `vectors` vectors; up to `mostAbreast` windows of one go abreast.
template <unsigned count, unsigned vectors, unsigned mostAbreast = 1>
struct Shape {
    static constexpr unsigned lanes = count * vectors;
    using LanesOfRow = Permutation<count>;

    template <class Input>
    static bool load(const Input* const* arrays, unsigned steps, std::int16_t* rows)
    {
        bool within = true;
        for (std::size_t v = 0; v < vectors; ++v) {
            within = loadRows<count>(arrays + v * count, steps, rows + v * steps * count) && within;
        }
        return within;
    }

    template <class Output>
    static void store(const std::int16_t* rows, unsigned steps, Output* const* arrays)
    {
        for (std::size_t v = 0; v < vectors; ++v) {
            storeRows<count>(rows + v * steps * count, steps, arrays + v * count);
        }
    }

    static void decode(const lanes::Workspace& workspace, lanes::Algorithm algorithm, unsigned from, unsigned to)
    {
        if (from == 0) {
            interleave(workspace);
        }
        // Where the first two windows are not equally long, none are but by chance.
        const bool abreast = workspace.windows > 1 && workspace.windowStart[2] == 2 * workspace.windowStart[1];
        if (mostAbreast > 1 && abreast) {
            decodeAbreast<mostAbreast>(workspace, algorithm, from, to);
        } else {
            decodeAbreast<1>(workspace, algorithm, from, to);
        }
    }

    template <unsigned abreast>
    static void decodeAbreast(const lanes::Workspace& workspace, lanes::Algorithm algorithm, unsigned from, unsigned to)
    {
        switch (algorithm) {
        case lanes::Algorithm::greatest:
            return runPasses<Greatest, abreast, false>(workspace, from, to);
        case lanes::Algorithm::greatestScaled:
            return runPasses<Greatest, abreast, true>(workspace, from, to);
        case lanes::Algorithm::corrected:
            return runPasses<Corrected, abreast, false>(workspace, from, to);
        }
    }

    /// Decoder 1's systematic values are decoder 0's, in interleaved order.
    static void interleave(const lanes::Workspace& workspace)
    {
        const lanes::ConstituentRows& rows = workspace.constituent[1];
        for (std::size_t at = 0; at < std::size_t{workspace.steps} * vectors; ++at) {
            LanesOfRow::load(workspace.constituent[0].systematic,
                             rows.interleaver.sources + at * LanesOfRow::sources,
                             rows.interleaver.controls + at * LanesOfRow::bytes)
                .store(rows.systematic + at * count);
        }
    }

    /// Even passes belong to decoder 1, odd ones to decoder 0 (rule 15). Pass 0 knows nothing beforehand.
    template <template <unsigned> class RuleOf, unsigned abreast, bool scaled>
    static void runPasses(const lanes::Workspace& workspace, unsigned from, unsigned to)
    {
        for (unsigned h = from; h < to; ++h) {
            const unsigned d = rules::constituentOf(h);
            const lanes::ConstituentRows& other = workspace.constituent[1 - d];
            const std::int16_t* joint = h == 0 ? other.systematic : other.joint;
            if (h + 1 < to) {
                runPass<RuleOf, count, vectors, abreast, scaled, false>(workspace, d, joint, rules::isFirstPass(h));
            } else {
                runPass<RuleOf, count, vectors, abreast, scaled, true>(workspace, d, joint, rules::isFirstPass(h));
            }
        }
    }

    static constexpr unsigned slotBytes = Pass<Greatest, count, vectors, mostAbreast, false>::slotBytes;
    /// Of the rule that keeps more: what is pending with its values.
    static constexpr unsigned forwardBytes = Pass<Corrected, count, vectors, 1, false>::forwardBytes;

    static constexpr lanes::Kernel kernel = {lanes,
                                             count,
                                             LanesOfRow::group,
                                             LanesOfRow::sources,
                                             LanesOfRow::bytes,
                                             slotBytes,
                                             forwardBytes,
                                             LanesOfRow::prepare,
                                             load<std::int32_t>,
                                             load<std::int16_t>,
                                             load<std::int8_t>,
                                             decode,
                                             store<std::uint8_t>,
                                             store<std::int16_t>};
};

constexpr lanes::Kernel kernels[] = {
#if defined(__AVX2__)
    Shape<8, 1, 2>::kernel,
#else
    Shape<8, 1>::kernel,
#endif
#if defined(__AVX512BW__)
    Shape<16, 1>::kernel,
    Shape<32, 1>::kernel,
    Shape<32, 2>::kernel,
#elif defined(__AVX2__)
    Shape<16, 1>::kernel,
    Shape<16, 2>::kernel,
#else
    Shape<8, 2>::kernel,
    Shape<8, 4>::kernel,
#endif
};

}  // namespace

extern const lanes::InstructionSet instructionSet;
const lanes::InstructionSet instructionSet = {
    MORVIK_LANES_NAME, kernels, static_cast<unsigned>(sizeof kernels / sizeof kernels[0])};

}  // namespace MORVIK_LANES
