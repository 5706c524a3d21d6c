// TransportDecode: decodes transport blocks from the soft values of their coded bits.
#include "TransportDecode.h"

#include <algorithm>
#include <chrono>
#include <iostream>
#include <sstream>

#include "BitLines.h"
#include "CodedValueReader.h"
#include "Command.h"
#include "DecoderOptions.h"
#include "ReferenceBits.h"
#include "TransportReceiver.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Text.h"

namespace morvik {

namespace {

/// The figures of the closing line.
struct TransportSummary {
    std::uint64_t blocks = 0;
    std::uint64_t transmissions = 0;
    std::uint64_t failures = 0;    ///< CRC
    std::uint64_t undetected = 0;  ///< CRC fits, bits are wrong
    std::uint64_t bitErrors = 0;
    std::chrono::duration<double> receiving{0};
};

/// Receives the rows of a file, and writes a line for each transport block.
class Reception {
public:
    Reception(const TransportDecodeOptions& options, base::OutputFile& output)
        : itsOptions(options),
          itsOutput(output),
          itsReceiver(transportBlockCode(
                          options.bits, options.transport, "--transport-block-size " + std::to_string(options.bits)),
                      options.decoder,
                      {options.scale, options.softBufferBits},
                      output.isStandardOutput() ? std::cerr : std::cout)
    {
        if (options.crcFile) {
            itsCrcFile.emplace(*options.crcFile);
            itsCrcFile->write("block,transmissions,crc,code_blocks\n");
        }
        if (options.reference) {
            itsReferenceFile.emplace(*options.reference);
            itsReference.emplace(
                itsReferenceFile->stream(), itsReferenceFile->name(), std::max(std::size_t{options.bits}, longestLine));
        }
    }

    /// Takes the reader's row.
    void take(const CodedValueReader& row)
    {
        if (itsTransmissions == 0 || row.label() != itsLabel) {
            finishBlock();
            itsLabel = row.label();
        }
        const std::vector<unsigned>& versions = itsOptions.transport.versions;
        if (itsTransmissions == versions.size()) {
            row.fail("block " + itsLabel + " has more rows than " + versionsOption + " has numbers, " +
                     std::to_string(versions.size()));
        }
        // A receiver whose CRC fits has no use for another transmission.
        if (!itsReceiver.fits()) {
            const auto start = std::chrono::steady_clock::now();
            itsReceiver.receive(row.values(), versions[itsTransmissions]);
            itsSummary.receiving += std::chrono::steady_clock::now() - start;
            ++itsUsed;
        }
        ++itsTransmissions;
    }

    /// Tells of the transport block that the last rows belong to.
    void finishBlock()
    {
        if (itsTransmissions == 0) {
            return;
        }
        const std::vector<std::uint8_t> bits = itsReceiver.bits();
        itsOutput.write(lineOf(bits));
        itsOutput.flush();
        if (itsCrcFile) {
            itsCrcFile->write(itsLabel + ',' + std::to_string(itsUsed) + ',' + (itsReceiver.fits() ? "1," : "0,") +
                              itsReceiver.codeBlocks() + '\n');
            itsCrcFile->flush();
        }
        if (!itsReceiver.fits()) {
            std::cerr << "block " << itsLabel << ": CRC fails after " << base::counted(itsUsed, "transmission") << '\n';
        }
        count(itsReference ? itsReference->countErrors(bits) : 0);
        itsReceiver.clear();
        itsTransmissions = 0;
        itsUsed = 0;
    }

    /// Completes the files that are written, whatever was read.
    void commit()
    {
        itsOutput.commit();
        if (itsCrcFile) {
            itsCrcFile->commit();
        }
    }

    /// After the last block.
    const TransportSummary& finish()
    {
        finishBlock();
        if (itsReference) {
            itsReference->expectEnd();
        }
        return itsSummary;
    }

private:
    static constexpr std::size_t longestLine = base::LineReader::shortLines;

    void count(std::size_t errors)
    {
        ++itsSummary.blocks;
        itsSummary.transmissions += itsUsed;
        itsSummary.failures += itsReceiver.fits() ? 0U : 1U;
        itsSummary.undetected += itsReceiver.fits() && errors > 0 ? 1U : 0U;
        itsSummary.bitErrors += errors;
    }

    const TransportDecodeOptions& itsOptions;
    base::OutputFile& itsOutput;
    TransportReceiver itsReceiver;
    std::optional<base::OutputFile> itsCrcFile;
    std::optional<base::InputFile> itsReferenceFile;
    std::optional<ReferenceBits> itsReference;
    std::string itsLabel;
    std::size_t itsTransmissions = 0;  // rows of this block
    std::size_t itsUsed = 0;           // those until its CRC fitted
    TransportSummary itsSummary;
};

std::string transportSummaryText(const TransportSummary& summary, const TransportDecodeOptions& options)
{
    std::ostringstream line;
    line << base::counted(summary.blocks, "transport block") << " of " << options.bits << " bits in "
         << base::counted(summary.transmissions, "transmission") << ", CRC fits in "
         << summary.blocks - summary.failures;
    if (options.reference) {
        line << ", " << base::counted(summary.bitErrors, "bit error") << ", "
             << base::counted(summary.undetected, "undetected error");
    }
    const double seconds = std::max(summary.receiving.count(), 1e-9);  // the clock may not have advanced
    const double sent = static_cast<double>(summary.blocks) * options.bits;
    line.precision(2);
    line << ", " << std::fixed << sent / seconds / 1e6 << " Mbit/s\n";
    return line.str();
}

/// Throws unless CRC results and decisions go to different places.
void expectTwoFiles(const std::string& crcFile, const std::string& output)
{
    const bool standard = crcFile == base::standardStream || output == base::standardStream;
    if (standard ? crcFile == output : !crcFile.empty() && base::isSamePlace(crcFile, output)) {
        throw base::Error("--crc " + crcFile + ": the decisions go there, --output names another place for them");
    }
}

}  // namespace

int decodeTransportBlocks(const TransportDecodeOptions& options)
{
    base::InputFile input(options.input);
    const std::vector<std::string> inputs = {options.input, options.reference.value_or(options.input)};
    base::expectOwnFile(options.output, inputs, "the decisions");
    base::expectOwnFile(options.crcFile.value_or(""), inputs, "the CRC results");
    expectTwoFiles(options.crcFile.value_or(""), options.output);
    base::OutputFile output(options.output);
    Reception reception(options, output);
    CodedValueReader rows(input.stream(), input.name(), options.transport.codedBits);
    try {
        while (rows.next()) {
            reception.take(rows);
        }
    } catch (const base::Error&) {
        reception.commit();  // what was decided before the error
        throw;
    }
    const TransportSummary& summary = reception.finish();
    reception.commit();
    if (summary.blocks == 0) {
        rows.fail("no rows after the header, expected at least one transmission");
    }
    std::cerr << coreLine(options.decoder.generics, options.decoder.iterations)
              << transportSummaryText(summary, options);
    return summary.failures > 0 || summary.bitErrors > 0 ? differencesFound : success;
}

}  // namespace morvik
