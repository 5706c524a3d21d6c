// Core: the model as the source of what is expected.
#include "Core.h"

#include <algorithm>

namespace morvik::vectors {

namespace {

SoftBlock softBlock(const Stimulus& stimulus)
{
    const auto widened = [](const std::vector<std::int8_t>& stream) {
        return std::vector<std::int32_t>(stream.begin(), stream.end());
    };
    return {widened(stimulus.streams[0]), widened(stimulus.streams[1]), widened(stimulus.streams[2])};
}

}  // namespace

Core::Core(const Settings& settings) : itsSettings(settings), itsDecoder(settings.generics, itsMessages) {}

Expected Core::expect(const Stimulus& stimulus)
{
    // A trace shows metric columns that earlier blocks left: each traced block gets a decoder of its own.
    std::ostringstream trace;
    std::unique_ptr<Decoder> tracing;
    if (itsSettings.internal) {
        tracing = std::make_unique<Decoder>(itsSettings.generics, trace);
        tracing->armTrace(2 * itsSettings.iterations);
    }
    itsMessages.str({});
    Decoder& decoder = tracing ? *tracing : itsDecoder;
    Decoded decoded = decoder.decodeWithRatios(softBlock(stimulus), itsSettings.iterations, stimulus.tag);

    Expected expected;
    expected.tag = decoded.tag;
    expected.bits = std::move(decoded.bits);
    if (itsSettings.ratios) {
        expected.ratios = std::move(decoded.ratios);
        constexpr int unitsOfEighth = 16;  // the interface counts 128 to one
        for (std::int16_t& ratio : expected.ratios) {
            ratio = static_cast<std::int16_t>(ratio / unitsOfEighth);
        }
    }
    if (tracing) {
        std::istringstream text(trace.str());
        TraceReader reader(text, "the trace of the model");
        for (TraceStep step; reader.next(step);) {
            expected.internal.push_back(step);
        }
    }
    return expected;
}

}  // namespace morvik::vectors
