// SelfCheck: compares what this machine decodes with the digests that every machine must produce.
#include "SelfCheck.h"

#include <algorithm>
#include <chrono>
#include <memory>
#include <numeric>
#include <ostream>
#include <stdexcept>

#include "hardware/testbench/Decoder.h"
#include "morvik_v1_0_batch.h"
#include "rules/Tail.h"
#include "src/InstructionSetNames.h"

namespace morvik::selftest {

namespace {

using State = std::shared_ptr<veltra_ip_morvik_v1_0_state>;

veltra_ip_morvik_v1_0_generics genericsOf(int numPu, int algorithm)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = numPu;
    generics.C_ALGORITHM_TYPE = algorithm;
    return generics;
}

State makeState(int numPu, int algorithm)
{
    State state(veltra_ip_morvik_v1_0_create_state(genericsOf(numPu, algorithm)), veltra_ip_morvik_v1_0_destroy_state);
    if (!state) {
        throw std::runtime_error("the decoder cannot be made");
    }
    return state;
}

template <class Value, class Simulate>
void decodeAs(const State& state, const CheckBatch& batch, Decided& decided, Simulate simulate)
{
    std::array<std::vector<Value>, 3> streams;
    for (std::size_t stream = 0; stream < 3; ++stream) {
        streams[stream].assign(batch.streams[stream].begin(), batch.streams[stream].end());
    }
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = decided.bits.data();
    outputs.dout_alloc = decided.bits.size();
    outputs.ratios = decided.ratios.data();
    outputs.ratios_alloc = decided.ratios.size();
    const std::int32_t status = simulate(state.get(),
                                         streams[0].data(),
                                         streams[1].data(),
                                         streams[2].data(),
                                         static_cast<std::int32_t>(batch.K + rules::tailPositions),
                                         batch.blocks,
                                         batch.iterations,
                                         nullptr,
                                         &outputs);
    if (status != 0) {
        throw std::runtime_error("the decoder refused a block");
    }
}

void decodeBatch(const State& state, const CheckBatch& batch, Decided& decided)
{
    const std::size_t bits = std::size_t{batch.blocks} * batch.K;
    decided.bits.assign(bits, 0);
    decided.ratios.assign(bits, 0);
    switch (batch.K / 8 % 3) {
    case 0:
        decodeAs<std::int8_t>(state, batch, decided, veltra_ip_morvik_v1_0_batch_simulate_i8);
        break;
    case 1:
        decodeAs<std::int16_t>(state, batch, decided, veltra_ip_morvik_v1_0_batch_simulate_i16);
        break;
    default:
        decodeAs<std::int32_t>(state, batch, decided, veltra_ip_morvik_v1_0_batch_simulate_i32);
    }
}

std::uint64_t digestOf(const std::vector<CheckBatch>& batches, const Decode& decode)
{
    Digest digest;
    Decided decided;
    for (const CheckBatch& batch : batches) {
        decode(batch, decided);
        for (const std::uint8_t bit : decided.bits) {
            digest.add(bit);
        }
        for (const std::int16_t ratio : decided.ratios) {
            const auto word = static_cast<std::uint16_t>(ratio);
            digest.add(static_cast<std::uint8_t>(word & 0xFF));
            digest.add(static_cast<std::uint8_t>(word >> 8));
        }
    }
    return digest.value();
}

Outcome checkInstructionSet(const std::string& name,
                            const std::vector<CheckBatch>& batches,
                            const Promise& promised,
                            const MakeDecode& makeDecode)
{
    Outcome outcome;
    outcome.instructionSet = name;
    const auto start = std::chrono::steady_clock::now();
    for (const Expectation& expected : promised.configurations) {
        const Decode decode = makeDecode(expected.numPu, expected.algorithm, name);
        if (!decode) {
            break;
        }
        ++outcome.configurations;
        const std::uint64_t found = digestOf(batches, decode);
        if (found != expected.digest) {
            outcome.differences.push_back({expected.numPu, expected.algorithm, expected.digest, found});
        }
    }
    outcome.available = outcome.configurations > 0;
    outcome.seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    return outcome;
}

}  // namespace

Decode libraryDecode(int numPu, int algorithm, const std::string& instructionSet)
{
    // Drops the library's message about an instruction set that the machine lacks.
    std::ostream silence(nullptr);
    try {
        Decoder(genericsOf(numPu, algorithm), silence).useInstructionSet(instructionSet);
    } catch (const Refusal&) {
        return {};
    }
    const State state = makeState(numPu, algorithm);
    if (veltra_ip_morvik_v1_0_set_instruction_set(state.get(), instructionSet.c_str()) != 0) {
        throw std::runtime_error("the instruction set " + instructionSet + " cannot be chosen");
    }
    return [state](const CheckBatch& batch, Decided& decided) {
        decodeBatch(state, batch, decided);
    };
}

bool Findings::needs(const Outcome& outcome) const
{
    return outcome.instructionSet == inUse || outcome.instructionSet == "generic" ||
           outcome.instructionSet == byComponents;
}

std::size_t Findings::configurations() const
{
    return std::accumulate(
        outcomes.begin(), outcomes.end(), std::size_t{0}, [](std::size_t sum, const Outcome& outcome) {
            return sum + outcome.configurations;
        });
}

bool Findings::right() const
{
    const bool hasUsedOne = std::any_of(
        outcomes.begin(), outcomes.end(), [this](const Outcome& outcome) { return outcome.instructionSet == inUse; });
    return blocksRight && hasUsedOne && std::all_of(outcomes.begin(), outcomes.end(), [this](const Outcome& outcome) {
               const bool isWhole = outcome.configurations == promise.configurations.size();
               return outcome.differences.empty() && (isWhole || (!outcome.available && !needs(outcome)));
           });
}

Findings check(const Promise& promised, const MakeDecode& makeDecode)
{
    const std::vector<CheckBatch> batches = checkBatches();
    Findings findings;
    findings.inUse = veltra_ip_morvik_v1_0_get_instruction_set(makeState(2, 1).get());
    for (const CheckBatch& batch : batches) {
        findings.blocks += batch.blocks;
        findings.bits += std::uint64_t{batch.blocks} * batch.K;
    }
    findings.blockDigest = digestOf(batches);
    findings.blocksRight = findings.blockDigest == promised.blocks;
    for (const char* name : instructionSetNames) {
        findings.outcomes.push_back(checkInstructionSet(name, batches, promised, makeDecode));
    }
    return findings;
}

const Promise promise = {0xa4e667df32ffcf76,
                         {{{2, 0, 0x10af5ffabf5fcaab},
                           {2, 1, 0x47cf865929cccb22},
                           {2, 2, 0x8e2cb7fda0107864},
                           {4, 0, 0x17b1e30f7dbb1f40},
                           {4, 1, 0xa5585a2534812ae7},
                           {4, 2, 0x0f02f709c3592ff8},
                           {8, 0, 0x68c5ec341ccda376},
                           {8, 1, 0x7f6e3372600ebc69},
                           {8, 2, 0x5d83e63394c30670}}}};

}  // namespace morvik::selftest
