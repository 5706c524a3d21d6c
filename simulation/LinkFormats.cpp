// LinkFormats: what the options of `morvik ber` that describe the link send.
#include "LinkFormats.h"

#include <algorithm>
#include <charconv>

#include "Point.h"
#include "TransportFit.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Thousandths.h"
#include "link/coding/CodeBlocks.h"

namespace morvik::simulation {

namespace {

std::string codeRateText(double rate)
{
    return base::numberText(rate, std::chars_format::fixed, 3);
}

/// An option that only transport blocks have, as given, or empty.
std::string transportOption(const LinkOptions& options)
{
    if (!options.versions.empty()) {
        return "--redundancy-versions " + versionsText(options.versions, ',');
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
                   std::string(nameOf(table)) + ", expected 0 to " + std::to_string(last));
    }
}

/// The fewest coded bits of each transmission whose sum is no less than what they are to tell.
std::uint64_t leastCodedBits(const LinkFormat& format)
{
    const std::uint64_t perSymbol = bitsPerSymbol(format.modulation);
    const std::uint64_t together = perSymbol * format.versions.size();
    return (countedBitsOf(format, 0) + together - 1) / together * perSymbol;
}

/// Throws base::Error where nothing could be decoded, since all transmissions together have fewer bits than they are
/// to tell. `what` is wrong then, and `least` what would fit.
void checkRate(const LinkFormat& format, const std::string& what, const std::string& least)
{
    if (format.codedBits >= leastCodedBits(format)) {
        return;
    }
    const auto transmissions = format.versions.size();
    throw base::Error(what + ": the code rate with CRCs is " +
                      codeRateText(effectiveRate(format) / static_cast<double>(transmissions)) +
                      (transmissions > 1 ? " after " + std::to_string(transmissions) + " transmissions" : "") +
                      ", above 1; " + least);
}

/// Throws base::Error if a transport block cannot be sent like this.
void checkFormat(const LinkFormat& format, const std::string& block)
{
    checkFit({format.transportBlockSize, format.codedBits, format.modulation, format.softBufferSize}, block);
}

/// Whole symbols that meet a rate in thousandths most closely; at least one for each code block.
std::uint64_t codedBitsAt(unsigned size, int rate, unsigned perSymbol)
{
    const std::uint64_t thousandths = std::uint64_t{static_cast<unsigned>(rate)} * perSymbol;
    const std::uint64_t symbols = (std::uint64_t{size} * 2000 / thousandths + 1) / 2;
    return std::max<std::uint64_t>(symbols, link::codeBlocksOf(size).count) * perSymbol;
}

LinkFormat formatOfCodedBits(LinkFormat format, unsigned codedBits, const std::string& block)
{
    format.codedBits = codedBits;
    checkFit({format.transportBlockSize, codedBits, format.modulation, 0}, block);
    checkRate(format,
              "--coded-bits " + std::to_string(codedBits) + " is too small for " + block,
              "expected " + std::to_string(leastCodedBits(format)) + " or more");
    return format;
}

LinkFormat formatOfRate(LinkFormat format, int rate, const std::string& block)
{
    const unsigned A = format.transportBlockSize;
    const std::string given = "--code-rate " + base::thousandthsText(rate);
    const auto thousandths = [A](std::uint64_t codedBits) {
        return std::uint64_t{A} * 1000 / codedBits;
    };
    const std::uint64_t codedBits = codedBitsAt(A, rate, bitsPerSymbol(format.modulation));
    if (codedBits > mostCodedBits) {
        throw base::Error(given + " is too low for " + block + ": a transmission has up to " +
                          std::to_string(mostCodedBits) + " coded bits, expected " +
                          base::thousandthsText(static_cast<int>(thousandths(mostCodedBits)) + 1) + " or more");
    }
    format.codedBits = static_cast<unsigned>(codedBits);
    const std::uint64_t highest = std::min<std::uint64_t>(thousandths(leastCodedBits(format)), 1000);
    checkRate(format,
              given + " is too high for " + block,
              "expected " + base::thousandthsText(static_cast<int>(highest)) + " or less");
    return format;
}

/// Appends the formats of transport blocks of A bits, of which `format` has the rest.
void appendSizes(const LinkOptions& options, unsigned A, LinkFormat format, std::vector<LinkFormat>& formats)
{
    const std::string block = "--transport-block-size " + std::to_string(A);
    format.transportBlockSize = A;
    for (const unsigned codedBits : options.codedBits) {
        formats.push_back(formatOfCodedBits(format, codedBits, block));
        checkFormat(formats.back(), block);
    }
    for (const int rate : options.codeRates) {
        formats.push_back(formatOfRate(format, rate, block));
        checkFormat(formats.back(), block);
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
    const unsigned elements = options.resourceElements.value_or(usualResourceElements);
    format.mcs = {table, index};
    format.modulation = modulationOf(mcs);
    format.transportBlockSize = link::transportBlockSize(mcs.sizeIndex, pairs);
    format.codedBits = pairs * elements * mcs.bitsPerSymbol;
    const std::string block = "--mcs " + std::to_string(index) + ", transport blocks of " +
                              std::to_string(format.transportBlockSize) + " bits";
    const unsigned ofPairs = pairs * mcs.bitsPerSymbol;
    checkRate(format,
              "--resource-elements " + std::to_string(elements) + " is too small for " + block,
              "expected " + std::to_string((leastCodedBits(format) + ofPairs - 1) / ofPairs) + " or more");
    checkFormat(format, block);
    return format;
}

}  // namespace

double effectiveRate(const LinkFormat& format)
{
    return static_cast<double>(countedBitsOf(format, 0)) / format.codedBits;
}

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

}  // namespace morvik::simulation
