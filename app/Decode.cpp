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
#include "DecoderOptions.h"
#include "ReferenceBits.h"
#include "SoftValueReader.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Text.h"
#include "hardware/testbench/Decoder.h"

namespace morvik {

namespace {

struct Options {
    std::string input = base::standardStream;
    std::string output = base::standardStream;
    std::optional<std::string> reference;
    DecoderOptions decoder;
    std::uint32_t firstTag = 0;
    std::uint32_t tracedPasses = 0;
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

void print(const Summary& summary, bool withErrors)
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
std::uint32_t tagOf(std::uint32_t block, const Options& options)
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
            refusal = "holds no bit but those of the tail";
        }
    } catch (const Refusal& error) {
        refusal = "was refused by the decoder (" + std::string(error.what()) + ")";
    }
    if (!refusal.empty()) {
        place.failBlock("block of " + base::counted(block.size(), "row") + ' ' + refusal + ", allowed are " +
                        allowedRows);
    }
}

/// A block's decisions as a line of output.
std::string decisionLine(const std::vector<std::uint8_t>& bits)
{
    std::string line;
    line.reserve(bits.size() + 1);
    for (const std::uint8_t bit : bits) {
        line += bit != 0 ? '1' : '0';
    }
    return line + '\n';
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

void decodeBlocks(const Options& options,
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
        output.write(decisionLine(bits));
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

int decode(const Options& options)
{
    base::InputFile input(options.input);
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
    print(summary, reference.has_value());
    return summary.bitErrors > 0 ? differencesFound : success;
}

/// The end of the help text.
std::string explanation()
{
    return std::string("FILE opens with the line ") + softValueHeader + R"(
and has one row for each of the K + 4 positions of a block. A new number in the first
column starts a new block. Each block gives one line of 0 and 1. Soft values are clipped to
-128 ... 127, after the core has cut them to their low 24 bits.

Warnings and traces go to the standard error stream, or to standard output when --output
names a file. Exit status: 0 all decoded, 1 the reference differs, 2 bad input or usage.

Example: decode with eight units, compare with what was sent, and keep the decisions
  morvik decode k40.csv --num-pu 8 --reference k40.bits --output decided.bits)";
}

}  // namespace

Command addDecode(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("decode", "Decode blocks of soft values into bits");
    const auto options = std::make_shared<Options>();

    command->add_option("FILE", options->input, "Soft values, as CSV; - for standard input")
        ->type_name("")
        ->capture_default_str();
    command->add_option("--output", options->output, "File for the decisions; - for standard output")
        ->type_name("FILE")
        ->capture_default_str();
    command->add_option("--reference", options->reference, "Compare with the bits in FILE, one line for each block")
        ->type_name("FILE");
    addDecoderOptions(*command, options->decoder);
    command->add_option("--tag", options->firstTag, "Tag of the first block; the others count up from it")
        ->transform(integerFrom(0, UINT32_MAX))
        ->type_name("N")
        ->capture_default_str();
    command->add_option("--trace", options->tracedPasses, "Trace the first N half-iterations, counted across blocks")
        ->transform(integerFrom(0, UINT32_MAX))
        ->type_name("N")
        ->capture_default_str();
    command->footer(explanation());

    const auto run = [options] {
        return decode(*options);
    };
    return {command, run};
}

}  // namespace morvik
