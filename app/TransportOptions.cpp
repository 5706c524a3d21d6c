// TransportOptions: the options of subcommands that encode and decode transport blocks.
#include "TransportOptions.h"

#include <cmath>

#include "Arguments.h"
#include "Lists.h"
#include "base/Numbers.h"
#include "simulation/TransportFit.h"

namespace morvik {

namespace {

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
            refuse(versionsOption, text, "expected 0 to 3, or several with commas between them");
        }
        versions.push_back(*version);
    }
    return versions;
}

float readScale(const std::string& text)
{
    const auto scale = base::parseNumber<float>(text);
    if (!scale || !std::isfinite(*scale) || *scale <= 0) {
        refuse("--scale", text, "expected a number above 0");
    }
    return *scale;
}

}  // namespace

CLI::Option* addVersionsOption(CLI::App& command,
                               const std::function<void(const std::string&)>& take,
                               const std::string& description)
{
    const std::string names = std::string(versionsOption) + ",--redundancy-version";
    return command.add_option_function<std::string>(names, take, description)->type_name("V[,V...]")->default_str("0");
}

void addScaleOption(CLI::App& command, CLI::Option& transport, float& scale)
{
    command
        .add_option_function<std::string>(
            "--scale",
            [&scale](const std::string& text) { scale = readScale(text); },
            "Soft value for an input of 1: 1 for soft values, more for log-likelihood ratios")
        ->type_name("S")
        ->default_str("1")
        ->needs(&transport);
}

void addTransportOptions(CLI::App& command, CLI::Option& transport, TransportOptions& options)
{
    CLI::Option* const codedBits =
        command.add_option("--coded-bits", options.codedBits, "Bits of one transmission of a transport block (G)")
            ->transform(integerFrom(1, simulation::mostCodedBits))
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
    addVersionsOption(
        command,
        [&options](const std::string& text) { options.versions = versionsOf(text); },
        "Redundancy version, 0 to 3; several are those of a transport block's transmissions")
        ->needs(&transport);
    command
        .add_option("--soft-buffer-size",
                    options.softBufferSize,
                    "Positions of a transport block's soft buffer (N_IR); without it, all")
        ->transform(integerFrom(1, UINT32_MAX))
        ->type_name("N")
        ->needs(&transport);
}

link::TransportBlockCode transportBlockCode(std::uint32_t bits,
                                            const TransportOptions& options,
                                            const std::string& block)
{
    simulation::checkFit({bits, options.codedBits, options.modulation, options.softBufferSize}, block);
    return link::TransportBlockCode({bits,
                                     options.codedBits,
                                     bitsPerSymbol(options.modulation),
                                     1,
                                     options.softBufferSize == 0 ? link::unlimitedBuffer : options.softBufferSize});
}

}  // namespace morvik
