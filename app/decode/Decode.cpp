// Decode: the subcommand that turns a file of soft values into decisions.
#include "Decode.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <iostream>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "Arguments.h"
#include "BitLines.h"
#include "DecoderOptions.h"
#include "ReferenceBits.h"
#include "SoftValueReader.h"
#include "StimulusFile.h"
#include "TransportDecode.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Text.h"
#include "hardware/testbench/Decoder.h"

namespace morvik {

namespace {

struct DecodeOptions {
    std::string input = base::standardStream;
    std::string output = base::standardStream;
    std::optional<std::string> reference;
    DecoderOptions decoder;
    std::uint32_t firstTag = 0;
    std::uint32_t tracedPasses = 0;
    TransportDecodeOptions transport;  ///< bits is 0 for code blocks; files and decoder are those above
};

/// The figures of the closing line.
struct Summary {
    std::uint32_t blocks = 0;
    std::size_t smallest = 0;
    std::size_t largest = 0;
    std::uint64_t bits = 0;
    std::uint64_t bitErrors = 0;
    std::uint64_t blockErrors = 0;
    std::chrono::duration<double> decoding{0};

    void countBlock(std::size_t size)
    {
        smallest = blocks == 0 ? size : std::min(smallest, size);
        largest = std::max(largest, size);
        bits += size;
        ++blocks;
    }

    void countErrors(std::size_t errors)
    {
        bitErrors += errors;
        blockErrors += errors > 0 ? 1 : 0;
    }
};

void printSummary(const Summary& summary, bool withErrors)
{
    std::cerr << base::counted(summary.blocks, "block") << " of ";
    if (summary.smallest < summary.largest) {
        std::cerr << summary.smallest << " to ";
    }
    std::cerr << summary.largest << " bits";
    if (withErrors) {
        std::cerr << ", " << base::counted(summary.bitErrors, "bit error") << ", "
                  << base::counted(summary.blockErrors, "block error");
    }
    const double seconds = std::max(summary.decoding.count(), 1e-9);  // the clock may not have advanced
    std::cerr.precision(2);
    std::cerr << ", " << std::fixed << static_cast<double>(summary.bits) / seconds / 1e6 << " Mbit/s" << std::endl;
}

/// The tag of a block. Tags after the first wrap at the width that the core carries, so that only a tag that the user
/// gave can be truncated.
std::uint32_t tagOf(std::uint32_t block, const DecodeOptions& options)
{
    const auto width = static_cast<std::uint32_t>(options.decoder.generics.C_TAG_WIDTH);
    const std::uint32_t carried = (std::uint32_t{1} << (width % 32)) - 1;
    return block == 0 ? options.firstTag : (options.firstTag + block) & carried;
}

/// Decodes the block that starts at `place`; turns a refusal into an error there.
void decodeBlock(Decoder& decoder,
                 const SoftValueReader& place,
                 const SoftBlock& block,
                 std::uint32_t iterations,
                 std::uint32_t tag,
                 std::vector<std::uint8_t>& bits)
{
    std::string refusal;
    try {
        decoder.decode(block, iterations, tag, bits);
        if (bits.empty()) {
            refusal = "has no bits besides the tail";
        }
    } catch (const Refusal& error) {
        refusal = "was refused by the decoder (" + std::string(error.what()) + ")";
    }
    if (!refusal.empty()) {
        place.failBlock("block of " + base::counted(block.size(), "row") + ' ' + refusal + ", expected " + allowedRows);
    }
}

/// Runs an action that may find an error in an input. Keeps the decisions made before the error.
template <class Action>
auto keeping(base::OutputFile& output, Action action)
try {
    return action();
} catch (const base::Error&) {
    output.commit();
    throw;
}

void decodeBlocks(const DecodeOptions& options,
                  SoftValueReader& reader,
                  std::optional<ReferenceBits>& reference,
                  base::OutputFile& output,
                  Summary& summary)
{
    // Keep the decoder's messages out of the decisions.
    std::ostream& messages = output.isStandardOutput() ? std::cerr : std::cout;
    Decoder decoder(options.decoder.generics, messages);
    decoder.armTrace(options.tracedPasses);
    SoftBlock block;
    std::vector<std::uint8_t> bits;
    while (keeping(output, [&] { return reader.next(block); })) {
        const auto start = std::chrono::steady_clock::now();
        keeping(output, [&] {
            decodeBlock(decoder, reader, block, options.decoder.iterations, tagOf(summary.blocks, options), bits);
        });
        summary.decoding += std::chrono::steady_clock::now() - start;
        summary.countBlock(bits.size());
        output.write(lineOf(bits));
        output.flush();
        keeping(output, [&] {
            if (!messages) {
                throw base::Error(std::string(output.isStandardOutput() ? "<stderr>" : "<stdout>") +
                                  ": cannot be written with the decoder's messages");
            }
            if (reference) {
                summary.countErrors(reference->countErrors(bits));
            }
        });
    }
    output.commit();
}

int decode(const DecodeOptions& options)
{
    StimulusFile input(options.input);
    SoftValueReader reader(input.stream(), input.name());
    std::optional<base::InputFile> referenceFile;
    std::optional<ReferenceBits> reference;
    if (options.reference) {
        referenceFile.emplace(*options.reference);
        reference.emplace(referenceFile->stream(), referenceFile->name());
    }
    const std::vector<std::string> inputs = {options.input, options.reference.value_or(options.input)};
    base::expectOwnFile(options.output, inputs, "the decisions");
    base::expectOwnFile(base::standardStream, inputs, "the decoder's messages");
    base::OutputFile output(options.output);
    Summary summary;
    decodeBlocks(options, reader, reference, output, summary);
    if (reference) {
        reference->expectEnd();
    }
    std::cerr << coreLine(options.decoder.generics, options.decoder.iterations);
    printSummary(summary, reference.has_value());
    return summary.bitErrors > 0 ? differencesFound : success;
}

TransportDecodeOptions transportOptions(const DecodeOptions& options)
{
    TransportDecodeOptions transport = options.transport;
    transport.input = options.input;
    transport.output = options.output;
    transport.reference = options.reference;
    transport.decoder = options.decoder;
    return transport;
}

/// The end of the help text.
std::string decodeExplanation()
{
    return std::string("FILE starts with the line ") + softValueHeader + R"(
and has one row for each of the K + 4 positions of a block. A new number in the first
column starts a new block. Each block becomes a line of zeros and ones. The core keeps the low
24 bits of a soft value, then clips it to -128 ... 127.

With --transport-block-size, FILE starts with the line
block,soft_values
and has one row for each transmission of a transport block: its number, then a value for each
of the G coded bits; the second row of the same number has the second redundancy version.
Transmissions are added up until the CRC fits.

Warnings and traces go to the standard error stream, or to standard output when --output
names a file. Exit status: 0 all decoded, 1 the reference differs or a CRC fails, 2 bad input
or usage.

Example: decode with eight units, compare with what was sent, and keep the decisions
  morvik decode k40.csv --num-pu 8 --reference k40.bits --output decided.bits)";
}

/// Adds the options for transport blocks, which --tag and --trace have nothing to do with.
void addTransportDecodeOptions(CLI::App& command, TransportDecodeOptions& options)
{
    CLI::Option* const size =
        command
            .add_option(
                "--transport-block-size", options.bits, "FILE has transmissions of transport blocks of A bits, below")
            ->transform(integerFrom(1, link::mostTransportBits))
            ->type_name("A");
    command.add_flag("--transport-block", "Says the same, as for 'morvik encode'")->needs(size);
    for (const char* const other : {"--tag", "--tag-width", "--trace"}) {
        size->excludes(command.get_option(other));
    }
    addTransportOptions(command, *size, options.transport);
    addScaleOption(command, *size, options.scale);
    command
        .add_option("--soft-buffer-bits",
                    options.softBufferBits,
                    "Width of the soft buffer, whose sums saturate, 2 to 16; without it, sums have full width")
        ->transform(integerFrom(2, 16))
        ->type_name("W")
        ->needs(size);
    command
        .add_option(
            "--crc", options.crcFile, "Write the CRC results of transport blocks and code blocks to FILE, as CSV")
        ->type_name("FILE")
        ->needs(size);
}

}  // namespace

Command addDecode(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("decode", "Decode blocks of soft values into bits");
    const auto options = std::make_shared<DecodeOptions>();

    command->add_option("FILE", options->input, "Soft values, as CSV; - for standard input")
        ->type_name("")
        ->capture_default_str();
    command->add_option("--output", options->output, "File for the decisions; - for standard output")
        ->type_name("FILE")
        ->capture_default_str();
    command->add_option("--reference", options->reference, "Compare with the bits in FILE, one line for each block")
        ->type_name("FILE");
    addDecoderOptions(*command, options->decoder);
    command->add_option("--tag", options->firstTag, "Tag of the first block; later blocks count up from it")
        ->transform(integerFrom(0, UINT32_MAX))
        ->type_name("N")
        ->capture_default_str();
    command->add_option("--trace", options->tracedPasses, "Trace the first N half-iterations, counted across blocks")
        ->transform(integerFrom(0, UINT32_MAX))
        ->type_name("N")
        ->capture_default_str();
    addTransportDecodeOptions(*command, options->transport);
    command->footer(decodeExplanation());

    const auto run = [options] {
        return options->transport.bits > 0 ? decodeTransportBlocks(transportOptions(*options)) : decode(*options);
    };
    return {command, run};
}

}  // namespace morvik
