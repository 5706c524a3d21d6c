// Doctor: the subcommand that diagnoses why blocks decode badly.
#include "Doctor.h"

#include <cstdint>
#include <iostream>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "Arguments.h"
#include "DecoderOptions.h"
#include "Notice.h"
#include "ReferenceBits.h"
#include "SoftValueReader.h"
#include "TransportDoctor.h"
#include "base/InputFile.h"
#include "hardware/diagnosis/Diagnosis.h"
#include "hardware/diagnosis/DiagnosisText.h"
#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace morvik {

namespace {

struct DoctorOptions {
    std::string input = base::standardStream;
    std::string reference;
    std::uint32_t blocks = 16;
    bool json = false;
    DecoderOptions decoder;
    TransportDoctorOptions transport;  ///< bits is 0 for code blocks; what it shares with code blocks is above
};

void check(const diagnosis::Case& read, const SoftValueReader& blocks, const ReferenceBits& reference)
{
    const std::size_t K = read.sent.size();
    if (rules::findBlockSize(static_cast<std::uint32_t>(K)) == nullptr) {
        reference.fail(std::to_string(K) + " bits, expected a block size of 3GPP TS 36.212 (40 to 6144)");
    }
    if (read.received.size() < K) {
        blocks.failBlock("block of " + std::to_string(read.received.size()) + " rows for " + std::to_string(K) +
                         " bits, expected " + std::to_string(K + rules::tailPositions));
    }
}

struct BlockCases {
    std::vector<diagnosis::Case> cases;
    bool hasMore = false;  ///< the file has more blocks
};

BlockCases readCases(const DoctorOptions& options)
{
    base::InputFile input(options.input);
    base::InputFile referenceFile(options.reference);
    SoftValueReader blocks(input.stream(), input.name());
    ReferenceBits reference(referenceFile.stream(), referenceFile.name());
    std::vector<diagnosis::Case> cases;
    SoftBlock received;
    while (cases.size() < options.blocks && blocks.next(received)) {
        diagnosis::Case read{received, {}};
        read.sent = reference.next();
        check(read, blocks, reference);
        cases.push_back(std::move(read));
    }
    if (!blocks.hasMore()) {
        reference.expectEnd();
    }
    return {std::move(cases), blocks.hasMore()};
}

int examine(const DoctorOptions& options)
{
    base::expectOwnFile(base::standardStream, {options.input, options.reference}, "findings");
    const BlockCases read = readCases(options);
    diagnosis::Diagnosis diagnosis = diagnosis::diagnose(read.cases, options.decoder);
    diagnosis.hasMore = read.hasMore;
    const std::string core = coreLine(options.decoder.generics, options.decoder.iterations);
    print(options.json ? jsonOf(diagnosis) : core + textOf(diagnosis));
    return statusOf(diagnosis.verdict, diagnosis.best.mistakes.count());
}

int examineTransport(const DoctorOptions& options)
{
    TransportDoctorOptions transport = options.transport;
    transport.input = options.input;
    transport.reference = options.reference;
    transport.blocks = options.blocks;
    transport.json = options.json;
    transport.decoder = options.decoder;
    return examineTransportBlocks(transport);
}

void addTransportDoctorOptions(CLI::App& command, TransportDoctorOptions& options)
{
    CLI::Option* const size =
        command
            .add_option("--transport-block-size", options.bits, "FILE has transmissions of transport blocks of A bits")
            ->transform(integerFrom(1, link::mostTransportBits))
            ->type_name("A");
    addTransportOptions(command, *size, options.transport);
    addScaleOption(command, *size, options.scale);
}

}  // namespace

Command addDoctor(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("doctor", "Find out why blocks of soft values decode badly");
    const auto options = std::make_shared<DoctorOptions>();

    command->add_option("FILE", options->input, "Soft values, as 'morvik decode' takes them; - for standard input")
        ->type_name("")
        ->capture_default_str();
    command->add_option("--reference", options->reference, "Bits that were sent, one line for each block")
        ->type_name("FILE");
    command->add_option("--blocks", options->blocks, "Look at the first N blocks")
        ->transform(integerFrom(1, 1000))
        ->type_name("N")
        ->capture_default_str();
    command->add_flag("--json", options->json, "Print a JSON object instead of text");
    addDecoderOptions(*command, options->decoder);
    addTransportDoctorOptions(*command, options->transport);
    command->footer(R"(Looks for flipped signs, swapped columns, a wrong tail order, reversed rows or bits, a missing or
doubled scale, missing or extra rows, and combinations of these.

With --transport-block-size and the other options of 'morvik decode' for transport blocks, looks for
mistakes of the LTE chain: another redundancy version or soft buffer, filler bits taken as data, a
wrong interleaver, circular buffer or division over code blocks, the order and signs of a symbol's
bits, a scale that does not fit. Without --reference, CRCs tell which bits are right.

Exit status: 0 all blocks decode and nothing is wrong, 1 a mistake was found, 2 bad input or usage,
3 blocks fail but no mistake was found: too much noise, or bits of other blocks.

Example:
  morvik doctor received.csv --reference sent.bits)");

    command->callback([options] {
        if (options->reference.empty() && options->transport.bits == 0) {
            throw CLI::RequiredError("--reference");
        }
    });
    const auto run = [options] {
        return options->transport.bits > 0 ? examineTransport(*options) : examine(*options);
    };
    return {command, run};
}

}  // namespace morvik
