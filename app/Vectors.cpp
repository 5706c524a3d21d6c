// Vectors: the subcommand that generates stimulus and expected values for a test bench.
#include "Vectors.h"

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "Arguments.h"
#include "DecoderOptions.h"
#include "Lists.h"
#include "Notice.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Numbers.h"
#include "base/Printable.h"
#include "base/Shown.h"
#include "base/Text.h"
#include "base/Thousandths.h"
#include "hardware/vectors/Set.h"
#include "simulation/Point.h"

namespace morvik {

namespace {

struct Options {
    std::string output;
    std::string checked;
    DecoderOptions decoder;
    vectors::Settings settings;
};

template <class Value, class Text>
std::string listed(const std::vector<Value>& values, Text textOf)
{
    std::string list;
    for (const Value& value : values) {
        list += (list.empty() ? "" : ",") + textOf(value);
    }
    return list;
}

/// The command that makes the set again, without the folder.
std::string commandOf(const vectors::Settings& settings)
{
    const auto itself = [](const std::string& text) {
        return text;
    };
    const auto number = [](auto value) {
        return std::to_string(value);
    };
    const auto algorithm = static_cast<unsigned>(settings.generics.C_ALGORITHM_TYPE);
    std::string command = "morvik vectors --block-size " + listed(settings.blockSizes, number);
    command += " --num-pu " + number(settings.generics.C_NUM_PU);
    command += " --algorithm " + simulation::algorithmName(algorithm);
    command += " --iterations " + number(settings.iterations);
    command += " --tag-width " + number(settings.generics.C_TAG_WIDTH);
    command += " --blocks " + number(settings.blocks);
    command += " --ebn0 " + base::thousandthsText(settings.milliDecibels);
    command += " --seed " + number(settings.seed);
    command += settings.directed ? "" : " --no-directed";
    command += " --format " + listed(settings.formats, itself);
    command += " --width " + number(settings.width);
    command += settings.separateStreams ? " --streams separate" : "";
    command += settings.ratios ? " --soft" : "";
    command += settings.internal ? " --internal" : "";
    return command;
}

std::string blocksAndFormats(const vectors::Manifest& manifest)
{
    const auto name = [](const vectors::ManifestFormat& format) {
        return format.name;
    };
    const std::size_t count = manifest.blocks.size();
    return base::counted(count, "block") + " in " + listed(manifest.formats, name);
}

std::string comparedText(const vectors::Compared& compared)
{
    return std::to_string(compared.tags) + " tags, " + std::to_string(compared.decisions) + " decisions, " +
           std::to_string(compared.ratios) + " ratios, " + std::to_string(compared.internal) + " internal values";
}

int make(const Options& options)
{
    vectors::Manifest manifest;
    manifest.version = MORVIK_VERSION;
    manifest.settings = options.settings;
    manifest.settings.generics = options.decoder.generics;
    manifest.settings.iterations = options.decoder.iterations;
    if (manifest.settings.blocks == 0 && !manifest.settings.directed) {
        throw base::Error("--blocks 0 and --no-directed together leave no block");
    }
    manifest.command = commandOf(manifest.settings);
    const vectors::Manifest made = vectors::makeSet(options.output, manifest);
    print(coreLine(made.settings.generics, made.settings.iterations) + base::visible(options.output) + ": " +
          blocksAndFormats(made) + '\n');
    return success;
}

/// All files that checking the set reads.
std::vector<std::string> filesOf(const std::string& path, const vectors::Manifest& manifest)
{
    const std::filesystem::path folder = path;
    std::vector<std::string> files = {folder / vectors::manifestName};
    for (const vectors::ManifestFormat& format : manifest.formats) {
        for (const vectors::ManifestFile& file : format.files) {
            files.push_back(folder / file.name);
        }
    }
    return files;
}

int check(const std::string& path)
{
    const vectors::CheckedSet set = vectors::checkSet(path);
    base::expectOwnFile(base::standardStream, filesOf(path, set.manifest), "findings");
    const std::string opening =
        coreLine(set.manifest.settings.generics, set.manifest.settings.iterations) + base::visible(path) + ": ";
    if (set.difference) {
        print(opening + *set.difference + '\n');
        return differencesFound;
    }
    print(opening + blocksAndFormats(set.manifest) + ", all as the model decodes them: " + comparedText(set.compared) +
          '\n');
    return success;
}

/// Refuses other options beside --check: the set records how it was made.
void expectNoOtherThanCheck(const CLI::App& command)
{
    for (const CLI::Option* const option : command.get_options()) {
        if (option->count() > 0 && option->get_name() != "--check") {
            throw base::Error(option->get_name() +
                              " cannot be combined with --check, which takes it from the manifest");
        }
    }
}

int run(const CLI::App& command, const Options& options)
{
    if (!options.checked.empty()) {
        expectNoOtherThanCheck(command);
        return check(options.checked);
    }
    if (options.output.empty() || options.settings.blockSizes.empty()) {
        throw base::Error("--out and --block-size, or --check, are required; see 'morvik vectors --help'");
    }
    return make(options);
}

void addBlockOptions(CLI::App& command, vectors::Settings& settings)
{
    addListOption(command, "--block-size", settings.blockSizes, appendBlockSize, "Block size K in bits")
        ->check(offer(blockSizeWords()))
        ->type_name("K[,K...]");
    command.add_option("--blocks", settings.blocks, "Random blocks of each size")
        ->transform(integerFrom(0, 1000000))
        ->type_name("N")
        ->capture_default_str();
    command
        .add_option_function<std::string>(
            "--ebn0",
            [&settings](const std::string& text) { settings.milliDecibels = readMilliDecibels("--ebn0", text); },
            "Eb/N0 of the random blocks in dB")
        ->type_name("X")
        ->default_str("1");
    command
        .add_option_function<std::string>(
            "--seed",
            [&settings](const std::string& text) {
                const auto seed = base::parseNumber<std::uint64_t>(text);
                if (!seed) {
                    refuse("--seed", text, "expected an integer from 0 to 18446744073709551615");
                }
                settings.seed = *seed;
            },
            "Seed of random bits and noise")
        ->type_name("N")
        ->default_str("1");
    command.add_flag_callback(
        "--no-directed", [&settings] { settings.directed = false; }, "Leave out the directed blocks");
}

void addFileOptions(CLI::App& command, vectors::Settings& settings)
{
    settings.formats = {"memh"};
    const auto append = [](const std::string& text, std::vector<std::string>& formats) {
        if (tables::findFormat(text) == nullptr) {
            refuse("--format", text, "expected memh, csv, npy or c");
        }
        formats.push_back(text);
    };
    addListOption(command, "--format", settings.formats, append, "Formats of the files: memh, csv, npy, c")
        ->check(offer({"memh", "csv", "npy", "c"}))
        ->type_name("FORMAT[,FORMAT...]")
        ->default_str("memh");
    command.add_option("--width", settings.width, "Bits of a soft value in the files: 8, or 16 with sign extension")
        ->transform(oneOf({{"8", "8"}, {"16", "16"}}))
        ->type_name("BITS")
        ->capture_default_str();
    command
        .add_option(
            "--streams", settings.separateStreams, "packed: one memh file for all streams; separate: one for each")
        ->transform(oneOf({{"packed", "false"}, {"separate", "true"}}))
        ->type_name("HOW")
        ->default_str("packed");
    command.add_flag("--soft", settings.ratios, "Add log-likelihood ratios to the expected values");
    command.add_flag("--internal", settings.internal, "Add every value of each pass to the expected values");
}

constexpr char explanation[] =
    R"(The folder gets the tables 'blocks', 'stimulus' and 'expected', one file for each format, and
manifest.json with all parameters and the SHA-256 of each file. Random blocks come first, then
directed ones: extreme values, ties, sizes at which the division into segments and windows
changes, extreme tags. docs/vectors.md describes the layout.

Exit status: 0 written, or no difference, 1 a difference was found, 2 bad input or usage.

Example: words for $readmemh, and a check of them
  morvik vectors --out k40 --block-size 40 --num-pu 8 --format memh,csv
  morvik vectors --check k40)";

}  // namespace

Command addVectors(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("vectors", "Make stimulus and expected values for a test bench");
    const auto options = std::make_shared<Options>();
    auto* output =
        command
            ->add_option("--out", options->output, "Write a new set of vectors to this folder; replaces an earlier one")
            ->type_name("DIR");
    command->add_option("--check", options->checked, "Decode the vectors in this folder again, and compare")
        ->type_name("DIR")
        ->excludes(output);
    addBlockOptions(*command, options->settings);
    addDecoderOptions(*command, options->decoder);
    addFileOptions(*command, options->settings);
    command->footer(explanation);
    const auto work = [options, command] {
        return run(*command, *options);
    };
    return {command, work};
}

}  // namespace morvik
