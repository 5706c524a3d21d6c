// Model: every value that the core computes on a block, and how it cuts the block.
#include "Model.h"

#include <sstream>
#include <string>

#include "src/TDecoder3GPU.h"
#include "testbench/Decoder.h"

namespace morvik::comparison {

namespace {

constexpr unsigned tailSteps = 3;

/// An aligned word in steps; bits below a step are dropped (rule 22).
std::int16_t inSteps(short aligned)
{
    return static_cast<std::int16_t>(aligned >> 4);
}

Division divisionOf(const TDecoder3GPU& decoder, unsigned K)
{
    Division division;
    division.K = K;
    division.numPu = decoder.itsNumPU;
    division.segments = decoder.itsNT;
    division.segmentLength = K / decoder.itsNT;
    division.rows = static_cast<unsigned>(decoder.itsBetaSegment.size()) / division.segments;
    division.windowOf.resize(K);
    for (const TDecoder3GPU::ABSegment& each : decoder.itsBetaSegment) {
        const auto number = static_cast<unsigned>(division.windows.size());
        // The block's first window ends at its own first step, the others before theirs.
        const Window window = {
            each.from / division.segmentLength, number / division.segments, number == 0 ? 0 : each.to + 1, each.from};
        for (unsigned step = window.first; step <= window.last; ++step) {
            division.windowOf[step] = number;
        }
        division.windows.push_back(window);
    }
    return division;
}

void keepColumns(const T8* columns, Stage stage, unsigned pass, unsigned steps, Values& values)
{
    const auto [first, count] = signalsOf(stage);
    for (unsigned step = 0; step < steps; ++step) {
        for (unsigned i = 0; i < count; ++i) {
            values.set({pass, first + i, step}, inSteps(columns[step][i]));
        }
    }
}

void keepVector(const std::vector<short>& vector, Stage stage, unsigned pass, unsigned steps, Values& values)
{
    for (unsigned step = 0; step < steps; ++step) {
        values.set({pass, signalsOf(stage).first, step}, inSteps(vector[step]));
    }
}

/// Keeps what the pass computed: the forward recursion ends at step K, and only intrinsic values go on into the tail.
void keepPass(const TDecoder3GPU& decoder, unsigned pass, unsigned K, Values& values)
{
    keepVector(decoder.itsIntrinsic, Stage::intrinsic, pass, K + tailSteps, values);
    keepColumns(decoder.itsGamma, Stage::branch, pass, K, values);
    keepColumns(decoder.itsAlpha, Stage::forward, pass, K + 1, values);
    keepColumns(decoder.itsBeta, Stage::backward, pass, K, values);
    keepVector(decoder.itsLLR, Stage::ratio, pass, K, values);
    keepVector(decoder.itsExtrinsic, Stage::extrinsic, pass, K, values);
}

}  // namespace

Model::Model(const SoftBlock& block, const veltra_ip_morvik_v1_0_generics& coreGenerics, unsigned iterations)
    : generics(coreGenerics), values(2 * iterations, static_cast<unsigned>(block.size() - tailPositions) + tailSteps)
{
    std::ostringstream warnings;
    Decoder decoder(generics, warnings);
    auto& component = dynamic_cast<TDecoder3GPU&>(decoder.component());
    std::vector<std::uint8_t> bits;
    decoder.decode(block, 1, 0, bits);  // leaves the streams in the component, as the core takes them
    const auto K = static_cast<unsigned>(bits.size());
    division = divisionOf(component, K);
    for (unsigned pass = 0; pass < values.passes(); ++pass) {
        component.calcSISO(pass);
        keepPass(component, pass, K, values);
    }
    codes[0] = {component.itsSys[0], component.itsPar0[0], component.itsInterleaver->itsPiInv};
    codes[1] = {component.itsSys[1], component.itsPar0[1], component.itsInterleaver->itsPi};
}

std::vector<unsigned> stepsInOrder(const Division& division, Stage stage)
{
    std::vector<unsigned> steps;
    if (stage == Stage::backward) {
        for (unsigned row = 0; row < division.rows; ++row) {
            const Window* const windows = &division.windows[std::size_t{row} * division.segments];
            for (unsigned back = 0; back <= windows->last - windows->first; ++back) {
                for (unsigned u = 0; u < division.segments; ++u) {
                    steps.push_back(windows[u].last - back);
                }
            }
        }
        return steps;
    }
    for (unsigned time = 0; time < division.segmentLength; ++time) {
        for (unsigned u = 0; u < division.segments; ++u) {
            steps.push_back(u * division.segmentLength + time);
        }
    }
    const unsigned behind = stage == Stage::intrinsic ? tailSteps : stage == Stage::forward ? 1 : 0;
    for (unsigned step = 0; step < behind; ++step) {
        steps.push_back(division.K + step);
    }
    return steps;
}

}  // namespace morvik::comparison
