// LinkOptions: the arguments of `morvik ber` and `morvik vectors` that say what is sent, and how.
#include "LinkOptions.h"

#include <algorithm>
#include <stdexcept>

#include "Arguments.h"
#include "Lists.h"
#include "TransportOptions.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Thousandths.h"
#include "link/coding/CodeBlocks.h"
#include "link/coding/TransportBlock.h"
#include "simulation/TransportFit.h"

namespace morvik {

namespace {

constexpr unsigned mostResourceElements = 168;

// ---- Elements of the lists

/// Appends an integer from `least` to `most`.
auto integersOf(const std::string& option, unsigned least, unsigned most)
{
    return [=](const std::string& text, std::vector<unsigned>& values) {
        const auto value = base::parseNumber<std::uint32_t>(text);
        if (!value || *value < least || *value > most) {
            refuse(option, text, "expected an integer from " + std::to_string(least) + " to " + std::to_string(most));
        }
        values.push_back(*value);
    };
}

void appendCodeRate(const std::string& text, std::vector<int>& values)
{
    const auto rate = base::parseThousandths(text);
    if (!rate || *rate <= 0 || *rate > 1000) {
        refuse("--code-rate", text, "expected a number above 0 and up to 1, with at most three decimals");
    }
    values.push_back(*rate);
}

void appendMcs(const std::string& text, std::vector<unsigned>& values)
{
    const std::vector<std::string> ends = splitAt(':', text);
    const auto from = base::parseNumber<std::uint32_t>(ends.front());
    const auto to = base::parseNumber<std::uint32_t>(ends.back());
    const unsigned last = countOf(link::McsTable::qam64) - 1;
    if (!from || !to || ends.size() > 2 || *from > *to || *to > last) {
        refuse("--mcs", text, "expected 0 to " + std::to_string(last) + ", or FROM:TO");
    }
    for (unsigned index = *from; index <= *to; ++index) {
        values.push_back(index);
    }
}

void appendModulation(const std::string& text, std::vector<link::Modulation>& values)
{
    const auto modulation = link::modulationOf(text);
    if (!modulation) {
        refuse("--modulation", text, "expected bpsk, qpsk, 16qam, 64qam or 256qam");
    }
    values.push_back(*modulation);
}

std::vector<unsigned> parseVersions(const std::string& text)
{
    std::vector<unsigned> versions;
    for (const std::string& part : splitAt(',', text)) {
        integersOf(versionsOption, 0, link::redundancyVersions - 1)(part, versions);
    }
    if (versions.size() > simulation::mostTransmissions) {
        refuse(versionsOption,
               text,
               "there are " + std::to_string(simulation::mostTransmissions) + " transmissions at most");
    }
    return versions;
}

// ---- Single values

/// Adds an option that takes one of the words, each of which stands for a value.
template <class Value, class Values, class NameOf>
void addChoice(CLI::App& command,
               const std::string& name,
               std::optional<Value>& value,
               const Values& values,
               NameOf textOf,
               const std::string& description)
{
    std::vector<std::string> words(std::size(values));
    std::transform(std::begin(values), std::end(values), words.begin(), [&textOf](Value each) {
        return std::string(textOf(each));
    });
    const auto take = [=, &value](const std::string& text) {
        const auto found = std::find(words.begin(), words.end(), text);
        if (found == words.end()) {
            refuse(name, text, "expected " + alternatives(words));
        }
        value = *(std::begin(values) + (found - words.begin()));
    };
    command.add_option_function<std::string>(name, take, description)
        ->check(offer(words))
        ->type_name("NAME")
        ->default_str(words.front());
}

CLI::Option* addInteger(CLI::App& command,
                        const std::string& name,
                        std::optional<unsigned>& value,
                        unsigned least,
                        unsigned most,
                        const std::string& description)
{
    const auto take = [=, &value](const std::string& text) {
        std::vector<unsigned> values;
        integersOf(name, least, most)(text, values);
        value = values.front();
    };
    return command.add_option_function<std::string>(name, take, description)->type_name("N");
}

std::string_view stopName(bool stopsEarly)
{
    return stopsEarly ? "crc" : "none";
}

// ---- The options in groups

void addSizes(CLI::App& command, simulation::LinkOptions& options)
{
    addListOption(command,
                  "--transport-block-size",
                  options.transportBlockSizes,
                  integersOf("--transport-block-size", 1, link::mostTransportBits),
                  "Send transport blocks of A bits, with CRC, segmentation and rate matching")
        ->type_name("A[,A...]");
    addListOption(command,
                  "--coded-bits",
                  options.codedBits,
                  integersOf("--coded-bits", 1, simulation::mostCodedBits),
                  "Bits of one transmission of a transport block, G")
        ->type_name("G[,G...]");
    addListOption(command,
                  "--code-rate",
                  options.codeRates,
                  appendCodeRate,
                  "Instead of --coded-bits: A / G, met as closely as whole symbols allow")
        ->type_name("R[,R...]");
    addListOption(command, "--mcs", options.mcsIndices, appendMcs, "Sizes and modulation of an MCS of 3GPP TS 36.213")
        ->type_name("I[,I...]|FROM:TO");
    addChoice(
        command,
        "--mcs-table",
        options.mcsTable,
        std::vector{link::McsTable::qam64, link::McsTable::qam256},
        [](link::McsTable table) { return simulation::nameOf(table); },
        "The table of --mcs, by its highest modulation: 64qam or 256qam");
    addInteger(command,
               "--resource-blocks",
               options.resourceBlocks,
               1,
               link::mostResourceBlocks,
               "Pairs of resource blocks of a transport block with --mcs");
    addInteger(command,
               "--resource-elements",
               options.resourceElements,
               1,
               mostResourceElements,
               "Symbols of a pair of resource blocks")
        ->default_str(std::to_string(simulation::usualResourceElements));
}

}  // namespace

void addLinkOptions(CLI::App& command, simulation::LinkOptions& options)
{
    addSizes(command, options);
    addListOption(command,
                  "--modulation",
                  options.modulations,
                  appendModulation,
                  "bpsk, qpsk, 16qam, 64qam or 256qam; by default qpsk for transport blocks, bpsk for code blocks")
        ->check(offer({"bpsk", "qpsk", "16qam", "64qam", "256qam"}))
        ->type_name("NAME[,NAME...]");
    addVersionsOption(
        command,
        [&options](const std::string& text) { options.versions = parseVersions(text); },
        "Of each transmission, in this order; the next one is sent only where a CRC failed");
    addInteger(command,
               "--soft-buffer-bits",
               options.softBufferBits,
               2,
               16,
               "Add up received values as integers of this many bits, saturating; by default in full width");
    addInteger(command,
               "--soft-buffer-size",
               options.softBufferSize,
               1,
               UINT32_MAX - 1,
               "Soft buffer for a transport block, N_IR; by default unlimited");
    addChoice(
        command,
        "--channel",
        options.fading,
        link::fadings,
        [](link::Fading fading) { return nameOf(fading); },
        "Gaussian noise: awgn; with Rayleigh fading of each symbol: rayleigh; of a transmission: block-rayleigh");
    addChoice(
        command,
        "--demapper",
        options.demapper,
        link::demappers,
        [](link::Demapper demapper) { return nameOf(demapper); },
        "max-log: by the nearest points; exact: by all");
}

void addEarlyStop(CLI::App& command, simulation::LinkOptions& options)
{
    addChoice(command,
              "--early-stop",
              options.stopsEarly,
              std::vector<bool>{false, true},
              stopName,
              "crc: each code block with the first iteration whose CRC fits; none: all --iterations");
}

std::string commandOf(const simulation::LinkOptions& options)
{
    std::string command;
    const auto add = [&command](bool isGiven, const std::string& option, auto textOf) {
        command += isGiven ? ' ' + option + ' ' + textOf() : "";
    };
    const auto numbers = [](const auto& values) {
        return [&values] {
            return listed(values, [](auto value) { return std::to_string(value); });
        };
    };
    const auto number = [](const std::optional<unsigned>& value) {
        return [&value] {
            return std::to_string(*value);
        };
    };
    const auto name = [](const auto& value) {
        return [&value] {
            return std::string(nameOf(*value));
        };
    };
    add(!options.transportBlockSizes.empty(), "--transport-block-size", numbers(options.transportBlockSizes));
    add(!options.codedBits.empty(), "--coded-bits", numbers(options.codedBits));
    add(!options.codeRates.empty(), "--code-rate", [&] { return listed(options.codeRates, base::thousandthsText); });
    add(!options.mcsIndices.empty(), "--mcs", numbers(options.mcsIndices));
    add(!options.mcsIndices.empty(), "--mcs-table", [&] {
        return std::string(simulation::nameOf(options.mcsTable.value_or(link::McsTable::qam64)));
    });
    add(options.resourceBlocks.has_value(), "--resource-blocks", number(options.resourceBlocks));
    add(options.resourceElements.has_value(), "--resource-elements", number(options.resourceElements));
    add(!options.modulations.empty(), "--modulation", [&] {
        return listed(options.modulations, [](link::Modulation modulation) { return std::string(nameOf(modulation)); });
    });
    add(!options.versions.empty(), "--redundancy-versions", [&] {
        return simulation::versionsText(options.versions, ',');
    });
    add(options.softBufferBits.has_value(), "--soft-buffer-bits", number(options.softBufferBits));
    add(options.softBufferSize.has_value(), "--soft-buffer-size", number(options.softBufferSize));
    add(options.fading.has_value(), "--channel", name(options.fading));
    add(options.demapper.has_value(), "--demapper", name(options.demapper));
    add(options.stopsEarly.has_value(), "--early-stop", [&] { return std::string(stopName(*options.stopsEarly)); });
    return command;
}

}  // namespace morvik
