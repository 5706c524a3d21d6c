// Signals: the values of a trellis step, and the operations that compute them.
#ifndef MORVIK_HARDWARE_TESTBENCH_SIGNALS_H
#define MORVIK_HARDWARE_TESTBENCH_SIGNALS_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "rules/Formats.h"
#include "rules/Tail.h"

namespace morvik {

/// The operations of a pass, in their order.
enum class Stage : std::uint8_t { intrinsic, branch, forward, backward, ratio, extrinsic };

constexpr std::array<Stage, 6> stages = {
    Stage::intrinsic, Stage::branch, Stage::forward, Stage::backward, Stage::ratio, Stage::extrinsic};

struct Signal {
    const char* name;
    Stage stage;
};

/// The signals of a trellis step, in the order in which a pass computes them. This order gives them their numbers.
constexpr std::array<Signal, 23> passSignals = {
    {{"intrinsic", Stage::intrinsic}, {"g0", Stage::branch},          {"g1", Stage::branch},
     {"g2", Stage::branch},           {"g3", Stage::branch},          {"alpha0", Stage::forward},
     {"alpha1", Stage::forward},      {"alpha2", Stage::forward},     {"alpha3", Stage::forward},
     {"alpha4", Stage::forward},      {"alpha5", Stage::forward},     {"alpha6", Stage::forward},
     {"alpha7", Stage::forward},      {"beta0", Stage::backward},     {"beta1", Stage::backward},
     {"beta2", Stage::backward},      {"beta3", Stage::backward},     {"beta4", Stage::backward},
     {"beta5", Stage::backward},      {"beta6", Stage::backward},     {"beta7", Stage::backward},
     {"llr", Stage::ratio},           {"extrinsic", Stage::extrinsic}}};

constexpr unsigned signalCount = passSignals.size();

/// Bits of each signal, in two's complement, in eighths: -2048 stands for -256, 2047 for 255.875.
constexpr unsigned passBits = rules::stateBits;

constexpr Stage stageOf(unsigned signal)
{
    return passSignals[signal].stage;
}

/// The signals of a stage, by their numbers.
struct SignalRange {
    unsigned first;
    unsigned count;
};

constexpr SignalRange signalsOf(Stage stage)
{
    unsigned first = 0;
    while (stageOf(first) != stage) {
        ++first;
    }
    unsigned count = 0;
    while (first + count < signalCount && stageOf(first + count) == stage) {
        ++count;
    }
    return {first, count};
}

/// Whether the stages, one after the other, compute all signals in their order.
constexpr bool stagesComputeAllSignals()
{
    unsigned next = 0;
    for (const Stage stage : stages) {
        const SignalRange range = signalsOf(stage);
        if (range.first != next) {
            return false;
        }
        next += range.count;
    }
    return next == signalCount;
}

static_assert(stagesComputeAllSignals());

/// The steps after the last bit for which a stage computes values: the tail has intrinsic values, and the last bit
/// leads to forward metrics.
constexpr std::uint32_t stepsAfterBits(Stage stage)
{
    switch (stage) {
    case Stage::intrinsic:
        return rules::tailSteps;
    case Stage::forward:
        return 1;
    case Stage::branch:
    case Stage::backward:
    case Stage::ratio:
    case Stage::extrinsic:
        break;
    }
    return 0;
}

/// The name of a stage's signals without their digits: "alpha".
std::string nameOf(Stage stage);

std::vector<unsigned> allSignals();

/// The names of signals given in ascending order: "intrinsic, alpha0 to alpha7, llr".
std::string signalNames(const std::vector<unsigned>& signals = allSignals());

}  // namespace morvik

#endif
