// Work: the decoding that is measured.
#include "Work.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>

#include "support/Blocks.h"

namespace bench {

namespace {

/// Soft values for amplitude 1: 8 steps to one and the channel's 2 / sigma^2 would be exact; this is a
/// usual quantiser.
constexpr int amplitude = 10;

std::vector<std::string> instructionSets()
{
    std::vector<std::string> sets;
    veltra_ip_morvik_v1_0_state* const state =
        veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_get_default_generics());
    const std::string best = veltra_ip_morvik_v1_0_get_instruction_set(state);
    bool reached = false;
    for (const char* name : {"avx512", "avx2", "ssse3", "generic"}) {
        reached = reached || name == best;
        if (reached) {
            sets.push_back(name);
        }
    }
    veltra_ip_morvik_v1_0_destroy_state(state);
    return sets;
}

}  // namespace

std::string Work::name() const
{
    return "K=" + std::to_string(blockSize) + "/units=" + std::to_string(units) + "/type=" + std::to_string(algorithm) +
           "/blocks=" + std::to_string(blocks) + "/iterations=" + std::to_string(iterations) + "/" +
           (instructionSet.empty() ? "best" : instructionSet);
}

std::vector<Work> allWork()
{
    std::vector<Work> all;
    for (const int algorithm : {0, 1, 2}) {
        for (const int units : {2, 4, 8}) {
            all.push_back({6144, units, algorithm, 1, 6, ""});
        }
        for (const int units : {2, 4, 8}) {
            all.push_back({6144, units, algorithm, 16, 6, ""});
        }
    }
    all.push_back({512, 4, 1, 64, 6, ""});
    all.push_back({40, 4, 1, 256, 6, ""});
    all.push_back({40, 4, 1, 1, 6, ""});
    const std::vector<std::string> sets = instructionSets();
    for (auto set = sets.begin() + 1; set < sets.end(); ++set) {
        all.push_back({6144, 4, 1, 1, 6, *set});
        all.push_back({6144, 8, 1, 1, 6, *set});
    }
    all.push_back({6144, 4, 1, 1, 6, "component"});
    return all;
}

Decoding::Decoding(const Work& work) : itsWork(work)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = work.units;
    generics.C_ALGORITHM_TYPE = work.algorithm;
    itsState = veltra_ip_morvik_v1_0_create_state(generics);
    if (itsState == nullptr) {
        throw std::runtime_error("no decoder state");
    }
    if (!work.instructionSet.empty()) {
        veltra_ip_morvik_v1_0_set_instruction_set(itsState, work.instructionSet.c_str());
    }
    blocks::Random random(work.blockSize);
    const double deviation = amplitude * std::sqrt(3.0 / 2.0 * std::pow(10.0, -0.1));
    for (unsigned b = 0; b < work.blocks; ++b) {
        const std::vector<int> bits = blocks::randomBits(random, work.blockSize);
        blocks::Block block = blocks::encode(bits, amplitude);
        blocks::addNoise(random, deviation, block);
        itsSent.insert(itsSent.end(), bits.begin(), bits.end());
        unsigned s = 0;
        for (const blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
            for (const std::int32_t value : *stream) {
                itsStreams[s].push_back(std::clamp(value, -128, 127));
            }
            ++s;
        }
    }
    itsDecisions.resize(itsSent.size());
}

Decoding::~Decoding()
{
    veltra_ip_morvik_v1_0_destroy_state(itsState);
}

bool Decoding::run()
{
    const auto size = static_cast<std::int32_t>(itsWork.blockSize + 4);
    if (itsWork.blocks == 1) {
        veltra_ip_morvik_v1_0_outputs outputs = {itsDecisions.data(), itsWork.blockSize, 0, 0};
        return veltra_ip_morvik_v1_0_bitacc_simulate(itsState,
                                                     itsStreams[0].data(),
                                                     itsStreams[1].data(),
                                                     itsStreams[2].data(),
                                                     size,
                                                     itsWork.iterations,
                                                     0,
                                                     &outputs) == 0;
    }
    veltra_ip_morvik_v1_0_batch_outputs outputs = {};
    outputs.dout = itsDecisions.data();
    outputs.dout_alloc = itsDecisions.size();
    return veltra_ip_morvik_v1_0_batch_simulate_i32(itsState,
                                                    itsStreams[0].data(),
                                                    itsStreams[1].data(),
                                                    itsStreams[2].data(),
                                                    size,
                                                    itsWork.blocks,
                                                    itsWork.iterations,
                                                    nullptr,
                                                    &outputs) == 0;
}

double Decoding::bits() const
{
    return static_cast<double>(itsSent.size());
}

double Decoding::bitErrorRate() const
{
    double errors = 0;
    for (std::size_t i = 0; i < itsSent.size(); ++i) {
        errors += itsSent[i] != itsDecisions[i] ? 1 : 0;
    }
    return errors / bits();
}

const char* Decoding::instructionSet() const
{
    return veltra_ip_morvik_v1_0_get_instruction_set(itsState);
}

}  // namespace bench
