// Received: the code blocks of a set's transport blocks, as they come out of rate recovery.
#include "Received.h"

#include <array>

#include "base/Text.h"
#include "link/TransportSource.h"
#include "rules/Tail.h"
#include "simulation/TransportSimulator.h"

namespace morvik::vectors {

namespace {

std::uint64_t countOf(const Settings& settings, const simulation::Point& point)
{
    return std::uint64_t{settings.blocks} * point.link.versions.size() * codeBlocksOf(point);
}

link::CodeBlocks blocksOf(const Settings& settings, const Origin& origin)
{
    return link::codeBlocksOf(settings.transport[origin.format].link.transportBlockSize);
}

/// Takes the streams of code block r from batches of a single transport block.
void takeStreams(const std::array<link::CodeBlockBatch, 2>& batches,
                 const link::CodeBlocks& blocks,
                 unsigned r,
                 Stimulus& stimulus)
{
    const bool isSmaller = r < blocks.countMinus;
    const link::CodeBlockBatch& batch = batches[isSmaller ? 0 : 1];
    const auto length = static_cast<std::ptrdiff_t>(std::size_t{batch.K} + rules::tailPositions);
    const std::ptrdiff_t first = length * static_cast<std::ptrdiff_t>(isSmaller ? r : r - blocks.countMinus);
    for (std::size_t stream = 0; stream < stimulus.streams.size(); ++stream) {
        const auto start = batch.streams[stream].begin() + first;
        stimulus.streams[stream].assign(start, start + length);
    }
}

}  // namespace

std::uint64_t countOfReceived(const Settings& settings)
{
    std::uint64_t count = 0;
    for (const simulation::Point& point : settings.transport) {
        count += countOf(settings, point);
    }
    return count;
}

Origin originOf(const Settings& settings, std::uint64_t number)
{
    Origin origin;
    for (; number >= countOf(settings, settings.transport[origin.format]); ++origin.format) {
        number -= countOf(settings, settings.transport[origin.format]);
    }
    const simulation::Point& point = settings.transport[origin.format];
    const std::uint64_t blocks = codeBlocksOf(point);
    const std::uint64_t transmissions = point.link.versions.size();
    origin.codeBlock = static_cast<std::uint32_t>(number % blocks);
    origin.transmissions = static_cast<std::uint32_t>(number / blocks % transmissions + 1);
    origin.transportBlock = static_cast<std::uint32_t>(number / blocks / transmissions);
    return origin;
}

std::string textOf(const Origin& origin)
{
    return "transport block " + std::to_string(origin.transportBlock) + " of format " + std::to_string(origin.format) +
           ", code block " + std::to_string(origin.codeBlock) + ", " +
           base::counted(origin.transmissions, "transmission");
}

unsigned sizeOf(const Settings& settings, const Origin& origin)
{
    return blocksOf(settings, origin).size(origin.codeBlock);
}

void forEachReceived(const Settings& settings, const std::function<void(Stimulus&)>& take)
{
    std::optional<link::TransportSource> source;
    std::array<link::CodeBlockBatch, 2> batches;
    std::uint32_t clipped = 0;
    for (std::uint64_t number = 0; number < countOfReceived(settings); ++number) {
        const Origin origin = originOf(settings, number);
        const bool isFirst = origin.codeBlock == 0 && origin.transmissions == 1;
        if (isFirst && origin.transportBlock == 0) {
            source.emplace(transportSettingOf(settings.transport[origin.format]), settings.seed);
        }
        if (isFirst) {
            source->begin(origin.transportBlock, 1);
        }
        if (origin.codeBlock == 0) {
            source->transmit({0}, origin.transmissions - 1, batches, &clipped);
        }
        Stimulus stimulus = {receivedName, origin, sizeOf(settings, origin), 0, {}};
        takeStreams(batches, source->code().blocks(), origin.codeBlock, stimulus);
        take(stimulus);
    }
}

CrcCheck::CrcCheck(const Settings& settings) : itsSettings(settings) {}

bool CrcCheck::fits(const Origin& origin, const std::vector<std::uint8_t>& bits)
{
    if (!itsCode || itsFormat != origin.format) {
        itsCode.emplace(formatOf(transportSettingOf(itsSettings.transport[origin.format])));
        itsFormat = origin.format;
    }
    std::vector<std::uint64_t> row(link::wordsOf(std::size_t{itsCode->blocks().bits} + link::crcBits));
    return itsCode->join(bits.data(), origin.codeBlock, row.data());
}

}  // namespace morvik::vectors
