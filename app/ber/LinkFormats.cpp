// LinkFormats: what the options of `morvik ber` that describe the link send.
#include "LinkFormats.h"

#include <algorithm>
#include <stdexcept>

#include "base/Error.h"
#include "base/Thousandths.h"
#include "link/coding/CodeBlocks.h"
#include "link/coding/TransportBlock.h"

namespace morvik {

namespace {

using simulation::LinkFormat;

/// An option that only transport blocks have, as given, or empty.
std::string transportOption(const LinkOptions& options)
{
    if (!options.versions.empty()) {
        return "--redundancy-versions " + simulation::versionsText(options.versions, ',');
    }
    if (options.softBufferBits) {
        return "--soft-buffer-bits " + std::to_string(*options.softBufferBits);
    }
    if (options.softBufferSize) {
        return "--soft-buffer-size " + std::to_string(*options.softBufferSize);
    }
    if (!options.codedBits.empty()) {
        return "--coded-bits " + std::to_string(options.codedBits.front());
    }
    if (!options.codeRates.empty()) {
        return "--code-rate " + base::thousandthsText(options.codeRates.front());
    }
    return options.stopsEarly.value_or(false) ? "--early-stop crc" : "";
}

/// Throws base::Error for options that contradict each other.
void checkTogether(const LinkOptions& options, bool hasBlockSize)
{
    const auto expect = [](bool isGood, const std::string& message) {
        if (!isGood) {
            throw base::Error(message);
        }
    };
    const bool hasSizes = !options.transportBlockSizes.empty();
    const bool hasMcs = !options.mcsIndices.empty();
    expect(!(hasBlockSize && options.hasTransportBlocks()),
           std::string("--block-size sends plain code blocks, ") + (hasMcs ? "--mcs" : "--transport-block-size") +
               " transport blocks: only one of them can be given");
    expect(!(hasSizes && hasMcs), "--mcs has the sizes of --transport-block-size: only one of them can be given");
    expect(options.hasTransportBlocks() || transportOption(options).empty(),
           transportOption(options) + " needs transport blocks, by --transport-block-size or --mcs");
    expect(hasMcs || (!options.resourceBlocks && !options.resourceElements && !options.mcsTable),
           "--mcs-table, --resource-blocks and --resource-elements need --mcs");
    if (hasSizes) {
        expect(options.codedBits.empty() != options.codeRates.empty(),
               "--transport-block-size needs either --coded-bits or --code-rate");
    }
    if (hasMcs) {
        expect(options.codedBits.empty() && options.codeRates.empty() && options.modulations.empty(),
               "--mcs sets what --coded-bits, --code-rate and --modulation do: they cannot be given with it");
        expect(options.resourceBlocks.has_value(),
               "--mcs needs --resource-blocks, 1 to " + std::to_string(link::mostResourceBlocks));
        const link::McsTable table = options.mcsTable.value_or(link::McsTable::qam64);
        const unsigned last = countOf(table) - 1;
        expect(options.mcsIndices.back() <= last,
               "--mcs " + std::to_string(options.mcsIndices.back()) + " is not in --mcs-table " +
                   std::string(simulation::nameOf(table)) + ", expected 0 to " + std::to_string(last));
    }
}

/// Whether a soft buffer has room for a bit of each code block.
bool fitsBuffer(const LinkFormat& format, unsigned softBufferSize)
{
    try {
        const link::TransportBlockCode code(
            {format.transportBlockSize, format.codedBits, bitsPerSymbol(format.modulation), 1, softBufferSize});
        return code.softSize() > 0;
    } catch (const std::invalid_argument&) {
        return false;
    }
}

/// Throws base::Error if a transport block cannot be sent like this.
void checkFormat(const LinkFormat& format, const std::string& size)
{
    const unsigned perSymbol = bitsPerSymbol(format.modulation);
    const unsigned blocks = link::codeBlocksOf(format.transportBlockSize).count;
    const unsigned G = format.codedBits;
    if (G % perSymbol != 0) {
        const unsigned below = G / perSymbol * perSymbol;
        throw base::Error("--coded-bits " + std::to_string(G) + " is no multiple of the " + std::to_string(perSymbol) +
                          " bits of --modulation " + std::string(nameOf(format.modulation)) + ", the nearest are " +
                          (below > 0 ? std::to_string(below) + " and " : "") + std::to_string(below + perSymbol));
    }
    if (G < blocks * perSymbol || G > mostCodedBits) {
        throw base::Error(size + ": " + std::to_string(G) + " coded bits cannot be, its " + std::to_string(blocks) +
                          " code blocks take " + std::to_string(blocks * perSymbol) + " to " +
                          std::to_string(mostCodedBits) + " with --modulation " +
                          std::string(nameOf(format.modulation)));
    }
    if (format.softBufferSize > 0 && !fitsBuffer(format, format.softBufferSize)) {
        unsigned tooSmall = format.softBufferSize;
        unsigned large = UINT32_MAX - 1;
        while (tooSmall + 1 < large) {
            const unsigned middle = tooSmall + (large - tooSmall) / 2;
            (fitsBuffer(format, middle) ? large : tooSmall) = middle;
        }
        throw base::Error("--soft-buffer-size " + std::to_string(format.softBufferSize) + " is too small for " + size +
                          ", the least that holds a bit of each of its " + std::to_string(blocks) + " code blocks is " +
                          std::to_string(large));
    }
}

/// Whole symbols that meet a rate in thousandths most closely; at least one for each code block.
unsigned codedBitsAt(unsigned size, int rate, unsigned perSymbol)
{
    const std::uint64_t thousandths = std::uint64_t{static_cast<unsigned>(rate)} * perSymbol;
    const std::uint64_t symbols = (std::uint64_t{size} * 2000 / thousandths + 1) / 2;
    const std::uint64_t least = link::codeBlocksOf(size).count;
    return static_cast<unsigned>(std::min<std::uint64_t>(std::max(symbols, least) * perSymbol, UINT32_MAX));
}

/// Appends the formats of transport blocks of A bits, of which `format` has the rest.
void appendSizes(const LinkOptions& options, unsigned A, LinkFormat format, std::vector<LinkFormat>& formats)
{
    const std::string size = "--transport-block-size " + std::to_string(A);
    format.transportBlockSize = A;
    for (const unsigned codedBits : options.codedBits) {
        format.codedBits = codedBits;
        checkFormat(format, size);
        formats.push_back(format);
    }
    for (const int rate : options.codeRates) {
        format.codedBits = codedBitsAt(A, rate, bitsPerSymbol(format.modulation));
        checkFormat(format, size + " --code-rate " + base::thousandthsText(rate));
        formats.push_back(format);
    }
}

link::Modulation modulationOf(const link::Mcs& mcs)
{
    return *std::find_if(link::modulations.begin(), link::modulations.end(), [&mcs](link::Modulation modulation) {
        return bitsPerSymbol(modulation) == mcs.bitsPerSymbol;
    });
}

LinkFormat formatOf(const LinkOptions& options, unsigned index, LinkFormat format)
{
    const link::McsTable table = options.mcsTable.value_or(link::McsTable::qam64);
    const link::Mcs mcs = mcsOf(table, index);
    const unsigned pairs = *options.resourceBlocks;
    format.mcs = {table, index};
    format.modulation = modulationOf(mcs);
    format.transportBlockSize = link::transportBlockSize(mcs.sizeIndex, pairs);
    format.codedBits = pairs * options.resourceElements.value_or(usualResourceElements) * mcs.bitsPerSymbol;
    checkFormat(format,
                "--mcs " + std::to_string(index) + ", transport blocks of " +
                    std::to_string(format.transportBlockSize) + " bits");
    return format;
}

}  // namespace

std::vector<LinkFormat> formatsOf(const LinkOptions& options, bool hasBlockSize)
{
    checkTogether(options, hasBlockSize);
    LinkFormat format;
    format.fading = options.fading.value_or(link::Fading::none);
    format.demapper = options.demapper.value_or(link::Demapper::maxLog);
    format.softBufferBits = options.softBufferBits.value_or(0);
    format.softBufferSize = options.softBufferSize.value_or(0);
    format.stopsEarly = options.stopsEarly.value_or(false);
    std::vector<LinkFormat> formats;
    if (options.hasTransportBlocks()) {
        format.versions = options.versions.empty() ? std::vector{0U} : options.versions;
    }
    for (const unsigned index : options.mcsIndices) {
        formats.push_back(formatOf(options, index, format));
    }
    const bool isPlain = !options.hasTransportBlocks();
    const auto usual = isPlain ? link::Modulation::bpsk : link::Modulation::qpsk;
    for (const link::Modulation modulation : options.modulations.empty() ? std::vector{usual} : options.modulations) {
        format.modulation = modulation;
        for (const unsigned A : options.transportBlockSizes) {
            appendSizes(options, A, format, formats);
        }
        if (isPlain) {
            formats.push_back(format);
        }
    }
    return formats;
}

}  // namespace morvik
