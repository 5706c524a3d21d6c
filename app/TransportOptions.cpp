// TransportOptions: the options of subcommands that encode and decode transport blocks.
#include "TransportOptions.h"

#include <stdexcept>

#include "Arguments.h"
#include "Lists.h"
#include "base/Error.h"
#include "base/Numbers.h"

namespace morvik {

namespace {

/// Far more than any transmission has, and few enough for a row of them.
constexpr std::uint32_t mostCodedBits = 1U << 26;

CLI::Validator modulationNames()
{
    std::vector<std::pair<std::string, std::string>> names;
    names.reserve(link::modulations.size());
    for (const link::Modulation modulation : link::modulations) {
        names.emplace_back(nameOf(modulation), nameOf(modulation));
    }
    return oneOf(names);
}

std::vector<unsigned> versionsOf(const std::string& text)
{
    std::vector<unsigned> versions;
    for (const std::string& part : splitAt(',', text)) {
        const auto version = base::parseNumber<unsigned>(part);
        if (!version || *version >= link::redundancyVersions) {
            refuse("--redundancy-version", text, "expected 0 to 3, or several with commas between them");
        }
        versions.push_back(*version);
    }
    return versions;
}

}  // namespace

void addTransportOptions(CLI::App& command, CLI::Option& transport, TransportOptions& options)
{
    CLI::Option* const codedBits =
        command.add_option("--coded-bits", options.codedBits, "Bits of one transmission of a transport block (G)")
            ->transform(integerFrom(1, mostCodedBits))
            ->type_name("G")
            ->needs(&transport);
    transport.needs(codedBits);
    command
        .add_option_function<std::string>(
            "--modulation",
            [&options](const std::string& name) { options.modulation = *link::modulationOf(name); },
            "bpsk, qpsk, 16qam, 64qam or 256qam: code blocks are sent in whole symbols")
        ->transform(modulationNames())
        ->type_name("M")
        ->default_str(std::string(nameOf(options.modulation)))
        ->needs(&transport);
    command
        .add_option_function<std::string>(
            "--redundancy-version",
            [&options](const std::string& text) { options.versions = versionsOf(text); },
            "Redundancy version, 0 to 3; several are those of a transport block's transmissions")
        ->type_name("V[,V...]")
        ->default_str("0")
        ->needs(&transport);
    command
        .add_option("--soft-buffer-size",
                    options.softBufferSize,
                    "Positions of a transport block's soft buffer (N_IR); without it, all")
        ->transform(integerFrom(1, UINT32_MAX))
        ->type_name("N")
        ->needs(&transport);
}

link::TransportBlockCode transportBlockCode(std::uint32_t bits, const TransportOptions& options)
{
    try {
        return link::TransportBlockCode({bits,
                                         options.codedBits,
                                         bitsPerSymbol(options.modulation),
                                         1,
                                         options.softBufferSize == 0 ? link::unlimitedBuffer : options.softBufferSize});
    } catch (const std::invalid_argument& error) {
        throw base::Error("transport block of " + std::to_string(bits) + " bits, --coded-bits " +
                          std::to_string(options.codedBits) + ", --modulation " +
                          std::string(nameOf(options.modulation)) + ": " + error.what());
    }
}

}  // namespace morvik
