// Encode: the subcommand that turns bits into code words, or into coded bits of transport blocks.
#include "Encode.h"

#include <iostream>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Arguments.h"
#include "BitLines.h"
#include "SoftValueReader.h"
#include "TransportOptions.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Text.h"
#include "decode/CodedValueReader.h"
#include "link/coding/TurboEncoder.h"
#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace morvik {

namespace {

struct EncodeOptions {
    std::string input = base::standardStream;
    std::string output = base::standardStream;
    bool transportBlocks = false;
    TransportOptions transport;
    unsigned amplitude = 0;  ///< of soft values; 0: bits
};

/// Bits, or soft values of the amplitude, between commas.
class Symbols {
public:
    explicit Symbols(unsigned amplitude)
        : itsZero(amplitude == 0 ? "0" : "-" + std::to_string(amplitude)),
          itsOne(amplitude == 0 ? "1" : std::to_string(amplitude))
    {
    }

    const std::string& of(const std::uint64_t* row, std::size_t position) const
    {
        return (row[position / 64] >> position % 64 & 1) != 0 ? itsOne : itsZero;
    }

private:
    std::string itsZero;
    std::string itsOne;
};

link::PackedBlocks packed(const std::vector<std::uint8_t>& bits, std::size_t words)
{
    link::PackedBlocks row{words, std::vector<std::uint64_t>(words)};
    link::packBits(bits.data(), bits.size(), row.block(0));
    return row;
}

/// Writes the three streams of each block, a row for each position.
void encodeCodeBlocks(const EncodeOptions& options, BitLines& lines, base::OutputFile& output)
{
    const Symbols symbols(options.amplitude);
    std::map<unsigned, link::TurboEncoder> encoders;
    link::TurboEncoder::Streams streams;
    output.write(std::string(softValueHeader) + '\n');
    for (unsigned block = 0; lines.next(); ++block) {
        const auto K = static_cast<unsigned>(lines.text().size());
        if (rules::findBlockSize(K) == nullptr) {
            lines.fail(base::counted(K, "bit") +
                       ", expected a block size of 3GPP TS 36.212, 40 to 6144; --transport-block takes others");
        }
        link::TurboEncoder& encoder = encoders.try_emplace(K, K).first->second;
        encoder.encode(packed(bitsOf(lines.text()), encoder.words()), 1, streams);
        std::string rows;
        for (unsigned k = 0; k < K + rules::tailPositions; ++k) {
            rows += std::to_string(block);
            for (const link::PackedBlocks& stream : streams) {
                rows += ',' + symbols.of(stream.block(0), k);
            }
            rows += '\n';
        }
        output.write(rows);
        output.flush();
    }
}

/// A line of coded bits; with an amplitude, a row of soft values.
std::string codedLine(const EncodeOptions& options, unsigned block, const std::uint64_t* coded)
{
    const Symbols symbols(options.amplitude);
    std::string line = options.amplitude == 0 ? "" : std::to_string(block);
    for (std::size_t i = 0; i < options.transport.codedBits; ++i) {
        if (options.amplitude != 0) {
            line += ',';
        }
        line += symbols.of(coded, i);
    }
    return line + '\n';
}

/// The code of transport blocks of a size, kept in `codes` from the first of them on.
link::TransportBlockCode& codeFor(unsigned size,
                                  const EncodeOptions& options,
                                  const BitLines& lines,
                                  std::map<unsigned, link::TransportBlockCode>& codes)
{
    const auto known = codes.find(size);
    if (known != codes.end()) {
        return known->second;
    }
    try {
        return codes
            .emplace(
                size,
                transportBlockCode(size, options.transport, "the transport block of " + base::counted(size, "bit")))
            .first->second;
    } catch (const base::Error& error) {
        lines.fail(error.what());
    }
}

/// Writes the coded bits of each transport block, a line for each transmission.
void encodeTransportBlocks(const EncodeOptions& options, BitLines& lines, base::OutputFile& output)
{
    std::map<unsigned, link::TransportBlockCode> codes;
    link::PackedBlocks buffers;
    link::PackedBlocks coded;
    if (options.amplitude != 0) {
        output.write(std::string(codedValueHeader) + '\n');
    }
    for (unsigned block = 0; lines.next(); ++block) {
        const auto size = static_cast<unsigned>(lines.text().size());
        link::TransportBlockCode& code = codeFor(size, options, lines, codes);
        code.encode(packed(bitsOf(lines.text()), link::wordsOf(size)), 1, buffers);
        for (const unsigned version : options.transport.versions) {
            code.select(buffers, 1, version, coded);
            output.write(codedLine(options, block, coded.block(0)));
        }
        output.flush();
    }
}

int encode(const EncodeOptions& options)
{
    base::InputFile input(options.input);
    // Every transport block that can be sent fits into a line.
    BitLines lines(input.stream(),
                   input.name(),
                   options.transportBlocks ? std::size_t{link::mostTransportBits} : base::LineReader::shortLines);
    base::expectOwnFile(options.output, {options.input}, "the code words");
    base::OutputFile output(options.output);
    if (options.transportBlocks) {
        encodeTransportBlocks(options, lines, output);
    } else {
        encodeCodeBlocks(options, lines, output);
    }
    if (lines.number() == 0) {
        lines.failAt(1, "no blocks, expected a line of 0 and 1 for each");
    }
    output.commit();
    return success;
}

/// The end of the help text.
std::string encodeExplanation()
{
    return std::string("FILE has a line of 0 and 1 for each block. Of code blocks, the output opens with the line\n") +
           softValueHeader + R"(
and has one row for each of the K + 4 positions of a block: a bit of each stream, tail last.
With --transport-block, lines are transport blocks (3GPP TS 36.212, 5.1.1 to 5.1.5), and the
output is a line of G coded bits for each, or for each of its redundancy versions.

Example: 8 kbit in 9600 bits of 64QAM, as soft values that 'morvik decode' reads
  morvik encode blocks.txt --transport-block --coded-bits 9600 --modulation 64qam --amplitude 16)";
}

}  // namespace

Command addEncode(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("encode", "Encode blocks of bits, or transport blocks");
    const auto options = std::make_shared<EncodeOptions>();

    command->add_option("FILE", options->input, "Bits, a line for each block; - for standard input")
        ->type_name("")
        ->capture_default_str();
    command->add_option("--output", options->output, "File for the code words; - for standard output")
        ->type_name("FILE")
        ->capture_default_str();
    CLI::Option* const transport = command->add_flag(
        "--transport-block", options->transportBlocks, "Lines are transport blocks: CRC, turbo code, rate matching");
    addTransportOptions(*command, *transport, options->transport);
    command
        ->add_option("--amplitude", options->amplitude, "Write soft values of this amplitude instead of bits, 1 to 127")
        ->transform(integerFrom(1, 127))
        ->type_name("N");
    command->footer(encodeExplanation());

    const auto run = [options] {
        return encode(*options);
    };
    return {command, run};
}

}  // namespace morvik
