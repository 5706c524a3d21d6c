// Core: the model as the source of expected values.
#include "Core.h"

#include "hardware/comparison/Model.h"
#include "rules/Formats.h"
#include "rules/Tail.h"

namespace morvik::vectors {

namespace {

SoftBlock softBlock(const Stimulus& stimulus)
{
    const auto widened = [](const std::vector<std::int8_t>& stream) {
        return std::vector<std::int32_t>(stream.begin(), stream.end());
    };
    return {widened(stimulus.streams[0]), widened(stimulus.streams[1]), widened(stimulus.streams[2])};
}

std::vector<InternalStep> internalSteps(Passes passes, std::uint32_t iterations)
{
    std::vector<InternalStep> steps;
    const std::uint32_t count = passes.cut().K() + rules::tailSteps;
    for (std::uint32_t halfIteration = 0; halfIteration < rules::halfIterations(iterations); ++halfIteration) {
        passes.next();
        for (std::uint32_t step = 0; step < count; ++step) {
            steps.push_back({halfIteration, step, {}});
            for (unsigned signal = 0; signal < passSignals.size(); ++signal) {
                if (passes.isComputed(signal, step)) {
                    steps.back().values[signal] = passes.value(signal, step);
                }
            }
        }
    }
    return steps;
}

}  // namespace

Core::Core(const Settings& settings) : itsSettings(settings), itsDecoder(settings.generics, itsMessages) {}

Expected Core::expect(const Stimulus& stimulus)
{
    const SoftBlock block = softBlock(stimulus);
    itsMessages.str({});
    Decoded decoded = itsDecoder.decodeWithRatios(block, itsSettings.iterations, stimulus.tag);

    Expected expected;
    expected.tag = decoded.tag;
    expected.bits = std::move(decoded.bits);
    if (itsSettings.ratios) {
        expected.ratios = std::move(decoded.ratios);
        for (std::int16_t& ratio : expected.ratios) {
            ratio = static_cast<std::int16_t>(ratio / (1 << rules::stateAlignment));
        }
    }
    if (itsSettings.internal) {
        expected.internal = internalSteps(Passes(block, itsSettings.generics, itsMessages), itsSettings.iterations);
    }
    return expected;
}

coverage::CoreCounts Core::situations(const Stimulus& stimulus)
{
    itsMessages.str({});
    return coverage::countsOf(
        comparison::computeModel(softBlock(stimulus), itsSettings.generics, itsSettings.iterations, itsMessages));
}

}  // namespace morvik::vectors
