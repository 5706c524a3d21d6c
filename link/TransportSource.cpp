// TransportSource: transport blocks as a receiver's decoder gets them.
#include "TransportSource.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "RandomBits.h"
#include "link/coding/SoftValues.h"
#include "rules/Tail.h"

namespace morvik::link {

namespace {

/// The random numbers of points that differ in what is sent are independent.
RandomKey pointKey(const TransportSetting& setting, std::uint64_t seed)
{
    return derivedKey(
        randomKey(seed), std::uint64_t{setting.codedBits} << 32 | setting.bits, keyWordOf(setting.symbols));
}

TransportSetting checked(const TransportSetting& setting)
{
    const unsigned width = setting.softBufferBits;
    if (width == 1 || width > 16) {
        throw std::invalid_argument("a soft buffer of " + std::to_string(width) + " bits");
    }
    for (const unsigned version : setting.versions) {
        if (version >= redundancyVersions) {
            throw std::invalid_argument("redundancy version " + std::to_string(version));
        }
    }
    for (const double scale : setting.scales) {
        checkedScale(scale);
    }
    if (setting.versions.empty() || setting.scales.size() != setting.versions.size()) {
        throw std::invalid_argument("as many scales as transmissions");
    }
    return setting;
}

}  // namespace

TransportFormat formatOf(const TransportSetting& setting)
{
    return {setting.bits, setting.codedBits, bitsPerSymbol(setting.symbols.modulation), 1, setting.softBufferSize};
}

TransportSource::TransportSource(const TransportSetting& setting, std::uint64_t seed, const SamplerForm& form)
    : itsSetting(checked(setting)),
      itsCode(formatOf(setting)),
      itsKey(pointKey(setting, seed)),
      itsRandomBits(itsKey, form),
      itsLink(setting.symbols, itsKey, form),
      itsAddsNothing(setting.versions.size() == 1 && setting.softBufferBits == 0 && itsCode.sendsOnce()),
      itsRatios(setting.codedBits),
      itsRounded(setting.softBufferBits == 0 ? 0 : setting.codedBits),
      itsReceived(itsAddsNothing ? setting.codedBits : 0),
      itsValues(itsCode.softSize())
{
    itsInformation.words = wordsOf(setting.bits);
}

void TransportSource::begin(std::uint64_t first, unsigned count)
{
    itsFirst = first;
    itsInformation.bits.resize(count * itsInformation.words);
    for (unsigned i = 0; i < count; ++i) {
        drawBits(itsRandomBits, FrameRandom(itsKey, 0, first + i), itsSetting.bits, itsInformation.block(i));
    }
    itsCode.encode(itsInformation, count, itsBuffers);
    // One buffer serves all frames where nothing is sent again, and none is needed where nothing adds up.
    const std::size_t buffers = itsAddsNothing ? 0 : itsSetting.versions.size() > 1 ? count : 1;
    itsSoftBuffers.resize(itsSetting.softBufferBits == 0 ? buffers * itsCode.softSize() : 0);
    itsRoundedBuffers.resize(itsSetting.softBufferBits == 0 ? 0 : buffers * itsCode.softSize());
}

void TransportSource::transmit(const std::vector<unsigned>& frames,
                               unsigned transmission,
                               std::array<CodeBlockBatch, 2>& batches,
                               std::uint32_t* clipped)
{
    layOut(frames, batches);
    std::array<std::size_t, 2> next{};
    for (const unsigned frame : frames) {
        clipped[frame] += itsAddsNothing                   ? place(frame)
                          : itsSetting.softBufferBits == 0 ? recover(frame, transmission)
                                                           : recoverIntegers(frame, transmission);
        for (unsigned r = 0; r < itsCode.blocks().count; ++r) {
            const unsigned kind = r < itsCode.blocks().countMinus ? 0 : 1;
            CodeBlockBatch& batch = batches.at(kind);
            const std::size_t place = next.at(kind)++ * (batch.K + rules::tailPositions);
            itsCode.matching(r).deinterleave(
                &itsValues[itsCode.softOffset(r)],
                fillerValue,
                {&batch.streams[0][place], &batch.streams[1][place], &batch.streams[2][place]});
        }
    }
}

/// The ratios of one transmission's coded bits.
void TransportSource::receive(unsigned frame, unsigned transmission)
{
    itsCoded.assign(wordsOf(itsSetting.codedBits), 0);
    itsCode.select(itsBuffers.block(frame), itsSetting.versions[transmission], itsCoded.data());
    itsLink.receive(itsFirst + frame, transmission, itsCoded.data(), itsSetting.codedBits, itsRatios.data());
}

/// The soft buffer of a frame, empty before its first transmission.
template <class Value>
Value* TransportSource::bufferOf(std::vector<Value>& buffers, unsigned frame, unsigned transmission) const
{
    Value* const buffer = &buffers[(itsSetting.versions.size() > 1 ? frame : 0) * itsCode.softSize()];
    if (transmission == 0) {
        std::fill_n(buffer, itsCode.softSize(), Value{});
    }
    return buffer;
}

/// Rounds the only transmission of a frame. Returns the number of clipped values.
std::uint32_t TransportSource::place(unsigned frame)
{
    receive(frame, 0);
    const std::uint32_t clipped =
        softValues(itsRatios.data(), itsRatios.size(), static_cast<float>(itsSetting.scales[0]), itsReceived.data());
    itsCode.place(itsReceived.data(), itsSetting.versions[0], itsValues.data());
    return clipped;
}

/// Adds a transmission to the soft buffer of a frame and rounds what it holds. Returns the number of clipped values.
std::uint32_t TransportSource::recover(unsigned frame, unsigned transmission)
{
    receive(frame, transmission);
    float* const buffer = bufferOf(itsSoftBuffers, frame, transmission);
    itsCode.recover(itsRatios.data(), itsSetting.versions[transmission], buffer);
    const auto scale = static_cast<float>(itsSetting.scales[transmission]);
    return softValues(buffer, itsCode.softSize(), scale, itsValues.data());
}

/// The same with a soft buffer of few bits. What it holds at an end of its range counts as clipped.
std::uint32_t TransportSource::recoverIntegers(unsigned frame, unsigned transmission)
{
    const unsigned width = itsSetting.softBufferBits;
    receive(frame, transmission);
    softValues(itsRatios.data(),
               itsRatios.size(),
               static_cast<float>(itsSetting.scales[transmission]),
               width,
               itsRounded.data());
    std::int16_t* const buffer = bufferOf(itsRoundedBuffers, frame, transmission);
    itsCode.recover(itsRounded.data(), itsSetting.versions[transmission], width, buffer);
    softValues(buffer, itsCode.softSize(), itsValues.data());
    const int end = 1 << (std::min(width, 8U) - 1);
    return static_cast<std::uint32_t>(std::count_if(
        itsValues.begin(), itsValues.end(), [end](int value) { return value == end - 1 || value == -end; }));
}

/// Names the code blocks of each size and makes room for them.
void TransportSource::layOut(const std::vector<unsigned>& frames, std::array<CodeBlockBatch, 2>& batches) const
{
    const CodeBlocks& blocks = itsCode.blocks();
    batches[0].K = blocks.sizeMinus;
    batches[1].K = blocks.sizePlus;
    for (unsigned kind = 0; kind < batches.size(); ++kind) {
        CodeBlockBatch& batch = batches.at(kind);
        batch.places.clear();
        for (const unsigned frame : frames) {
            for (unsigned r = kind == 0 ? 0 : blocks.countMinus; r < (kind == 0 ? blocks.countMinus : blocks.count);
                 ++r) {
                batch.places.push_back({frame, r});
            }
        }
        for (auto& stream : batch.streams) {
            stream.resize(batch.places.size() * (batch.K + rules::tailPositions));
        }
    }
}

}  // namespace morvik::link
