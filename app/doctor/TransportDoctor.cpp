// TransportDoctor: diagnoses why transport blocks decode badly.
#include "TransportDoctor.h"

#include <algorithm>
#include <optional>
#include <utility>
#include <vector>

#include "Command.h"
#include "DecoderOptions.h"
#include "Notice.h"
#include "ReferenceBits.h"
#include "base/InputFile.h"
#include "decode/CodedValueReader.h"
#include "hardware/diagnosis/chain/ChainDiagnosis.h"
#include "hardware/diagnosis/chain/ChainText.h"

namespace morvik {

namespace {

constexpr int noMistakeFound = 3;  // an exit status of this subcommand only

struct TransportCases {
    std::vector<diagnosis::ChainCase> cases;
    bool hasMore = false;  ///< the file has more transport blocks
};

/// Reads the first transport blocks: rows of one number stand together.
TransportCases readRows(const TransportDoctorOptions& options, CodedValueReader& rows)
{
    TransportCases read;
    std::string label;
    while (rows.next()) {
        if (read.cases.empty() || rows.label() != label) {
            if (read.cases.size() == options.blocks) {
                read.hasMore = true;
                return read;
            }
            label = rows.label();
            read.cases.emplace_back();
        }
        std::vector<std::vector<float>>& transmissions = read.cases.back().rows;
        if (transmissions.size() == options.transport.versions.size()) {
            rows.fail("block " + label + " has more rows than " + versionsOption + " has numbers, " +
                      std::to_string(transmissions.size()));
        }
        transmissions.push_back(rows.values());
    }
    if (read.cases.empty()) {
        rows.fail("no rows after the header, expected at least one transmission");
    }
    return read;
}

void readReference(const TransportDoctorOptions& options, TransportCases& read)
{
    base::InputFile file(options.reference);
    ReferenceBits reference(
        file.stream(), file.name(), std::max(std::size_t{options.bits}, base::LineReader::shortLines));
    for (diagnosis::ChainCase& each : read.cases) {
        each.sent = reference.next();
        if (each.sent.size() != options.bits) {
            reference.fail(std::to_string(each.sent.size()) + " bits, expected the " + std::to_string(options.bits) +
                           " of --transport-block-size");
        }
    }
    if (!read.hasMore) {
        reference.expectEnd();
    }
}

}  // namespace

int examineTransportBlocks(const TransportDoctorOptions& options)
{
    const link::TransportBlockCode code =
        transportBlockCode(options.bits, options.transport, "--transport-block-size " + std::to_string(options.bits));
    const std::string& reference = options.reference.empty() ? options.input : options.reference;
    base::expectOwnFile(base::standardStream, {options.input, reference}, "findings");
    base::InputFile input(options.input);
    CodedValueReader rows(input.stream(), input.name(), options.transport.codedBits);
    TransportCases read = readRows(options, rows);
    if (!options.reference.empty()) {
        readReference(options, read);
    }
    const diagnosis::ChainFormat format = {options.bits,
                                           options.transport.codedBits,
                                           options.transport.modulation,
                                           options.transport.versions,
                                           code.format().softBufferSize};
    diagnosis::ChainDiagnosis diagnosis =
        diagnosis::diagnose(std::move(read.cases), format, options.decoder, options.scale);
    diagnosis.hasMore = read.hasMore;
    const std::string core = coreLine(options.decoder.generics, options.decoder.iterations);
    print(options.json ? jsonOf(diagnosis) : core + textOf(diagnosis));
    return statusOf(diagnosis.verdict, diagnosis.best.mistakes.count(format));
}

int statusOf(diagnosis::Verdict verdict, unsigned mistakes)
{
    switch (verdict) {
    case diagnosis::Verdict::healthy:
        return success;
    case diagnosis::Verdict::mistaken:
    case diagnosis::Verdict::careless:
        return differencesFound;
    default:
        return verdict != diagnosis::Verdict::unrelated && mistakes > 0 ? differencesFound : noMistakeFound;
    }
}

}  // namespace morvik
