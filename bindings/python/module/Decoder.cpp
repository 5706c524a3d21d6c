// Decoder: decodes batches on several threads, each with its own state of the C interface.
#include "Decoder.h"

#include <algorithm>
#include <future>
#include <utility>

namespace morvik::python {

namespace {

constexpr auto simulateFor(const std::int8_t*)
{
    return veltra_ip_morvik_v1_0_batch_simulate_i8;
}

constexpr auto simulateFor(const std::int16_t*)
{
    return veltra_ip_morvik_v1_0_batch_simulate_i16;
}

constexpr auto simulateFor(const std::int32_t*)
{
    return veltra_ip_morvik_v1_0_batch_simulate_i32;
}

template <class Input>
Outcome decodeOn(veltra_ip_morvik_v1_0_state* state, const Batch<Input>& batch)
{
    veltra_ip_morvik_v1_0_batch_outputs outputs = {};
    outputs.dout = batch.bits;
    outputs.dout_alloc = batch.blocks * batch.blockSize();
    outputs.ratios = batch.ratios;
    outputs.ratios_alloc = outputs.dout_alloc;
    outputs.tags = batch.keptTags;
    outputs.tags_alloc = batch.blocks;
    takeMessages();  // left from a call that ended with an exception
    const auto& [sys, par1, par2] = batch.streams;
    Outcome outcome;
    outcome.status =
        simulateFor(sys)(state, sys, par1, par2, batch.positions, batch.blocks, batch.iterations, batch.tags, &outputs);
    outcome.messages = takeMessages();
    return outcome;
}

/// How to split a batch: 0, then the ends of the threads' parts.
template <class Input>
std::vector<std::uint32_t> cuts(const Batch<Input>& batch, unsigned threads)
{
    // A few tenths of a millisecond of work: long compared with starting a thread.
    constexpr std::uint64_t leastBitIterations = std::uint64_t{1} << 18;
    // The lanes decode several blocks at once.
    constexpr std::uint64_t together = 32;
    const std::uint64_t blocks = batch.blocks;
    const std::uint64_t useful = blocks * batch.blockSize() * batch.iterations / leastBitIterations;
    const std::uint64_t parts = std::clamp<std::uint64_t>(std::min(useful, blocks), 1, threads);
    const std::uint64_t grain = blocks / parts >= 2 * together ? together : 1;
    std::vector<std::uint32_t> ends = {0};
    for (std::uint64_t part = 1; part < parts; ++part) {
        ends.push_back(static_cast<std::uint32_t>(blocks * part / parts / grain * grain));
    }
    ends.push_back(batch.blocks);
    return ends;
}

/// "WARNING ... in position 7 ..., further saturation will not be reported": only the end is the same each time.
std::string kindOf(const std::string& warning)
{
    return warning.substr(std::min(warning.rfind(','), warning.size()));
}

}  // namespace

template <class Input>
Batch<Input> Batch<Input>::part(std::uint32_t first, std::uint32_t last) const
{
    Batch batch = *this;
    for (const Input*& stream : batch.streams) {
        stream += std::size_t{first} * static_cast<std::size_t>(positions);
    }
    batch.blocks = last - first;
    batch.tags += first;
    batch.bits += first * blockSize();
    batch.ratios = ratios == nullptr ? nullptr : ratios + first * blockSize();
    batch.keptTags += first;
    return batch;
}

Decoder::Decoder(std::int32_t numPu, std::int32_t algorithm, std::int32_t tagWidth, std::string instructionSet)
    : itsGenerics(veltra_ip_morvik_v1_0_get_default_generics()), itsInstructionSet(std::move(instructionSet))
{
    itsGenerics.C_NUM_PU = numPu;
    itsGenerics.C_ALGORITHM_TYPE = algorithm;
    itsGenerics.C_TAG_WIDTH = tagWidth;
    itsStates.push_back(makeState());
}

template <class Input>
Outcome Decoder::decode(const Batch<Input>& batch, unsigned threads)
{
    const std::lock_guard lock(itsMutex);
    expectOpen();
    const std::vector<std::uint32_t> ends = cuts(batch, threads);
    const std::size_t parts = ends.size() - 1;
    while (itsStates.size() < parts) {
        itsStates.push_back(makeState());
    }
    // If no further thread can be started, get() decodes the part.
    std::vector<std::future<Outcome>> others;
    for (std::size_t i = 1; i < parts; ++i) {
        others.push_back(std::async(std::launch::async | std::launch::deferred,
                                    decodeOn<Input>,
                                    itsStates[i].get(),
                                    batch.part(ends[i], ends[i + 1])));
    }
    Outcome whole;
    add(decodeOn(itsStates[0].get(), batch.part(ends[0], ends[1])), whole);
    for (std::future<Outcome>& other : others) {
        add(other.get(), whole);
    }
    return whole;
}

std::string Decoder::instructionSet()
{
    const std::lock_guard lock(itsMutex);
    expectOpen();
    return veltra_ip_morvik_v1_0_get_instruction_set(itsStates[0].get());
}

void Decoder::close()
{
    const std::lock_guard lock(itsMutex);
    itsStates.clear();
}

bool Decoder::isClosed()
{
    const std::lock_guard lock(itsMutex);
    return itsStates.empty();
}

Decoder::State Decoder::makeState() const
{
    State state(veltra_ip_morvik_v1_0_create_state(itsGenerics));
    const bool isMade = state && (itsInstructionSet.empty() || veltra_ip_morvik_v1_0_set_instruction_set(
                                                                   state.get(), itsInstructionSet.c_str()) == 0);
    if (!isMade) {
        throw Refusal(takeMessages().error);
    }
    return state;
}

void Decoder::expectOpen() const
{
    if (itsStates.empty()) {
        throw Refusal("the decoder is closed");
    }
}

/// Adds the result of the next part. Its state may repeat warnings of another state.
void Decoder::add(Outcome part, Outcome& whole)
{
    for (std::string& warning : part.messages.warnings) {
        if (itsWarned.insert(kindOf(warning)).second) {
            whole.messages.warnings.push_back(std::move(warning));
        }
    }
    if (whole.status == 0) {
        whole.status = part.status;
        whole.messages.error = std::move(part.messages.error);
    }
}

template Outcome Decoder::decode(const Batch<std::int8_t>& batch, unsigned threads);
template Outcome Decoder::decode(const Batch<std::int16_t>& batch, unsigned threads);
template Outcome Decoder::decode(const Batch<std::int32_t>& batch, unsigned threads);

}  // namespace morvik::python
