// Kernels: the lanes, compiled once for each instruction set (lanes/CMakeLists.txt).
#include "Kernels.h"

#include <algorithm>
#include <iterator>

#include "Pass.h"
#include "StatePass.h"
#include "Transpose.h"
#include "rules/Schedule.h"

namespace morvik::lanes::MORVIK_LANES {
namespace {

/// Calls run(half) for half-iterations. Even ones belong to decoder 1, odd ones to decoder 0 (rule 15). The first one
/// has no a-priori values.
template <class Run>
void forHalfIterations(const Workspace& workspace, unsigned from, unsigned to, Run run)
{
    for (unsigned h = from; h < to; ++h) {
        const unsigned d = rules::constituentOf(h);
        const Constituent& other = workspace.constituent[1 - d];
        run(HalfIteration{d, h == 0 ? other.systematic : other.joint, rules::isFirstPass(h), h + 1 == to});
    }
}

/// Decodes by Decoder::decodeBy<rule, extrinsic>.
template <class Decoder>
void decodeByAlgorithm(const Workspace& workspace, Algorithm algorithm, unsigned from, unsigned to)
{
    switch (algorithm) {
    case Algorithm::greatest:
        return Decoder::template decodeBy<Greatest, Extrinsic::whole>(workspace, from, to);
    case Algorithm::greatestScaled:
        return Decoder::template decodeBy<Greatest, Extrinsic::scaled>(workspace, from, to);
    case Algorithm::corrected:
        return Decoder::template decodeBy<Corrected, Extrinsic::whole>(workspace, from, to);
    }
}

/// The kernel of a shape (Machine.h).
template <class OfShape>
struct KernelOf;

template <unsigned count, unsigned vectors, unsigned plainAbreast, unsigned correctedAbreast>
struct KernelOf<Shape<count, vectors, plainAbreast, correctedAbreast>> {
    using Permutation = Machine::Permutation<count>;

    template <class Input>
    static bool fill(const Input* const* arrays, unsigned steps, std::int16_t* slices)
    {
        bool within = true;
        for (std::size_t v = 0; v < vectors; ++v) {
            within = fillSlices<count>(arrays + v * count, steps, slices + v * steps * count) && within;
        }
        return within;
    }

    template <class Output>
    static void spread(const std::int16_t* slices, unsigned steps, Output* const* arrays)
    {
        for (std::size_t v = 0; v < vectors; ++v) {
            spreadSlices<count>(slices + v * steps * count, steps, arrays + v * count);
        }
    }

    static void decode(const Workspace& workspace, Algorithm algorithm, unsigned from, unsigned to)
    {
        if (from == 0) {
            interleave(workspace);
        }
        decodeByAlgorithm<KernelOf>(workspace, algorithm, from, to);
    }

    template <template <unsigned> class RuleOf, Extrinsic extrinsic>
    static void decodeBy(const Workspace& workspace, unsigned from, unsigned to)
    {
        constexpr unsigned abreast[] = {plainAbreast, correctedAbreast};
        decodeAbreast<RuleOf, abreast[RuleOf<count>::corrects ? 1 : 0], extrinsic>(workspace, from, to);
    }

    template <template <unsigned> class RuleOf, unsigned abreast, Extrinsic extrinsic>
    static void decodeAbreast(const Workspace& workspace, unsigned from, unsigned to)
    {
        if constexpr (abreast > 1) {
            if (!pays(workspace, abreast)) {
                return decodeAbreast<RuleOf, abreast / 2, extrinsic>(workspace, from, to);
            }
        }
        forHalfIterations(workspace, from, to, [&](const HalfIteration& half) {
            runPass<RuleOf, count, vectors, abreast, extrinsic>(workspace, half);
        });
    }

    /// Whether `abreast` windows should run side by side rather than half as many. The last window may start from a
    /// column that the first one reaches, and then runs after it (Pass.h). Windows of different lengths cannot run side
    /// by side, so wider vectors may repeat windows: against single ones that pays up to two fifths more steps, else up
    /// to none.
    static bool pays(const Workspace& workspace, unsigned abreast)
    {
        if (workspace.windows > 2 && workspace.windows <= abreast) {
            return false;
        }
        const unsigned run = stepsRun(workspace, abreast);
        return abreast == 2 ? 5 * run <= 7 * workspace.steps : run <= stepsRun(workspace, abreast / 2);
    }

    /// Returns how many steps of a segment run if `abreast` windows run side by side, repeated ones included.
    static unsigned stepsRun(const Workspace& workspace, unsigned abreast)
    {
        const unsigned* const start = workspace.windowStart;
        unsigned run = 0;
        for (unsigned r = 0; r < workspace.windows;) {
            const unsigned end = std::min(r + abreast, workspace.windows);
            const unsigned length = start[r + 1] - start[r];
            run += abreast * length;
            do {
                ++r;
            } while (r < end && start[r + 1] - start[r] == length);
        }
        return run;
    }

    /// Fills decoder 1's systematic values: decoder 0's in interleaved order.
    static void interleave(const Workspace& workspace)
    {
        const Constituent& to = workspace.constituent[1];
        for (std::size_t at = 0; at < std::size_t{workspace.steps} * vectors; ++at) {
            Permutation::gather(workspace.constituent[0].systematic,
                                to.interleaver.sources + at * Permutation::sources,
                                to.interleaver.controls + at * Permutation::bytes)
                .store(to.systematic + at * count);
        }
    }

    static constexpr unsigned slotBytes =
        Pass<Greatest, count, vectors, std::max(plainAbreast, correctedAbreast), Extrinsic::whole>::slotBytes;
    /// For the larger rule, which keeps a pending correction with each metric.
    static constexpr unsigned forwardBytes = Pass<Corrected, count, vectors, 1, Extrinsic::whole>::forwardBytes;

    static constexpr Kernel kernel = {count * vectors,
                                      count,
                                      Permutation::group,
                                      Permutation::sources,
                                      Permutation::bytes,
                                      slotBytes,
                                      forwardBytes,
                                      Permutation::prepare,
                                      fill<std::int32_t>,
                                      fill<std::int16_t>,
                                      fill<std::int8_t>,
                                      decode,
                                      spread<std::uint8_t>,
                                      spread<std::int16_t>};
};

/// For a single lane.
template <>
struct KernelOf<Shape<1, 1>> {
    static void prepare(const std::uint8_t*, std::uint8_t*) {}

    template <class Input>
    static bool fill(const Input* const* arrays, unsigned steps, std::int16_t* slices)
    {
        return fillSteps(arrays[0], steps, slices);
    }

    template <class Output>
    static void spread(const std::int16_t* slices, unsigned steps, Output* const* arrays)
    {
        spreadSteps(slices, steps, arrays[0]);
    }

    static void decode(const Workspace& workspace, Algorithm algorithm, unsigned from, unsigned to)
    {
        if (from == 0) {
            const Constituent& interleaved = workspace.constituent[1];
            for (std::size_t i = 0; i < workspace.steps; ++i) {
                interleaved.systematic[i] = workspace.constituent[0].systematic[interleaved.interleaver.sources[i]];
            }
        }
        decodeByAlgorithm<KernelOf>(workspace, algorithm, from, to);
    }

    template <template <unsigned> class RuleOf, Extrinsic extrinsic>
    static void decodeBy(const Workspace& workspace, unsigned from, unsigned to)
    {
        forHalfIterations(
            workspace, from, to, [&](const HalfIteration& half) { runPass<RuleOf, extrinsic>(workspace, half); });
    }

    static constexpr Kernel kernel = {1,  // lanes
                                      1,  // vectorLanes
                                      1,  // groupLanes
                                      1,  // sources
                                      0,  // permutationBytes
                                      StatePass<Greatest, Extrinsic::whole>::slotBytes,
                                      0,  // forwardBytes
                                      prepare,
                                      fill<std::int32_t>,
                                      fill<std::int16_t>,
                                      fill<std::int8_t>,
                                      decode,
                                      spread<std::uint8_t>,
                                      spread<std::int16_t>};
};

template <class OfShapes>
struct KernelsOf;

template <class... OfShapes>
struct KernelsOf<Shapes<OfShapes...>> {
    static constexpr Kernel kernels[] = {KernelOf<OfShapes>::kernel...};
};

constexpr const auto& kernels = KernelsOf<Machine::Kernels>::kernels;

}  // namespace

extern const InstructionSet instructionSet;
const InstructionSet instructionSet = {MORVIK_LANES_NAME, kernels, static_cast<unsigned>(std::size(kernels))};

}  // namespace morvik::lanes::MORVIK_LANES
