// Vectors: the subcommand that generates stimulus and expected values for a test bench.
#include "Vectors.h"

#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <system_error>
#include <vector>

#include "Arguments.h"
#include "DecoderOptions.h"
#include "Lists.h"
#include "Notice.h"
#include "UnitVectors.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Numbers.h"
#include "base/Printable.h"
#include "base/Shown.h"
#include "base/Text.h"
#include "base/Thousandths.h"
#include "ber/LinkOptions.h"
#include "coverage/CoverOptions.h"
#include "hardware/units/Check.h"
#include "hardware/vectors/Set.h"
#include "link/coding/CodeBlocks.h"
#include "simulation/Plan.h"

namespace morvik {

namespace {

struct VectorsOptions {
    std::string output;
    std::string checked;
    DecoderOptions decoder;
    simulation::LinkOptions link;  ///< of transport blocks
    std::optional<int> milliEbn0;  ///< as given, like
    std::optional<int> milliEsn0;  ///< this one
    CoverOptions situations;
    vectors::Settings settings;
    UnitVectors units;
};

/// What the random blocks are, as options that each follow a blank.
std::string blockText(const VectorsOptions& options)
{
    const vectors::Settings& settings = options.settings;
    if (settings.transport.empty()) {
        return settings.blockSizes.empty()
                   ? ""
                   : " --block-size " + listed(settings.blockSizes, [](unsigned K) { return std::to_string(K); });
    }
    return commandOf(options.link);
}

std::string noiseText(const VectorsOptions& options)
{
    if (options.milliEsn0) {
        return " --esn0 " + base::thousandthsText(*options.milliEsn0);
    }
    const bool isTold = options.milliEbn0 || options.settings.transport.empty();
    return isTold ? " --ebn0 " + base::thousandthsText(options.settings.milliDecibels) : "";
}

/// The command that makes the set again, without the folder.
std::string commandOfSet(const VectorsOptions& options, const vectors::Settings& settings)
{
    const auto itself = [](const std::string& text) {
        return text;
    };
    const auto number = [](auto value) {
        return std::to_string(value);
    };
    const auto algorithm = static_cast<unsigned>(settings.generics.C_ALGORITHM_TYPE);
    std::string command = "morvik vectors" + blockText(options);
    command += " --num-pu " + number(settings.generics.C_NUM_PU);
    command += " --algorithm " + simulation::algorithmName(algorithm);
    command += " --iterations " + number(settings.iterations);
    command += " --tag-width " + number(settings.generics.C_TAG_WIDTH);
    command += " --blocks " + number(settings.blocks);
    command += noiseText(options);
    command += " --seed " + number(settings.seed);
    command += settings.directed ? "" : " --no-directed";
    command += coverText(settings);
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
           std::to_string(compared.ratios) + " ratios, " + std::to_string(compared.internal) + " internal values" +
           (compared.crcs > 0 ? ", " + std::to_string(compared.crcs) + " CRC results" : "");
}

/// How transport blocks are sent, and in which noise. Throws base::Error for options that cannot be met.
std::vector<simulation::Point> transportOf(const VectorsOptions& options)
{
    const bool hasTransportBlocks = options.link.hasTransportBlocks();
    if (!hasTransportBlocks &&
        (options.milliEsn0 || !options.link.modulations.empty() || options.link.fading || options.link.demapper)) {
        throw base::Error(
            "--modulation, --channel, --demapper and --esn0 need transport blocks, by --transport-block-size or "
            "--mcs: plain code blocks are sent over BPSK and Gaussian noise");
    }
    std::vector<simulation::LinkFormat> formats =
        simulation::formatsOf(options.link, !options.settings.blockSizes.empty());
    if (!hasTransportBlocks) {
        return {};
    }
    if (formats.size() > vectors::mostFormats) {
        throw base::Error("the lists combine to " + std::to_string(formats.size()) + " formats, a set has " +
                          std::to_string(vectors::mostFormats) + " at most");
    }
    const veltra_ip_morvik_v1_0_generics& generics = options.decoder.generics;
    std::vector<simulation::Point> points;
    for (simulation::LinkFormat& format : formats) {
        format.mcs.reset();  // its sizes say the same
        simulation::Sweep sweep;
        sweep.formats = {format};
        sweep.numPus = {static_cast<unsigned>(generics.C_NUM_PU)};
        sweep.algorithms = {static_cast<unsigned>(generics.C_ALGORITHM_TYPE)};
        sweep.scaleOptions = {std::nullopt};
        sweep.iterations = {options.decoder.iterations};
        sweep.axis = options.milliEbn0 ? simulation::Axis::ebn0 : simulation::Axis::esn0;
        const int amid = milliEsn0Amid(format, link::codeBlocksOf(format.transportBlockSize).sizePlus);
        sweep.milliDecibels = {options.milliEbn0.value_or(options.milliEsn0.value_or(amid))};
        points.push_back(pointsOf(sweep).front());
    }
    return points;
}

int make(VectorsOptions options)
{
    options.settings.transport = transportOf(options);
    options.settings.milliDecibels = options.milliEbn0.value_or(options.settings.milliDecibels);
    vectors::Manifest manifest;
    manifest.version = MORVIK_VERSION;
    manifest.settings = options.settings;
    manifest.settings.generics = options.decoder.generics;
    manifest.settings.iterations = options.decoder.iterations;
    if (manifest.settings.blocks == 0 && !manifest.settings.directed && manifest.settings.cover.empty()) {
        throw base::Error("--blocks 0 and --no-directed together leave no block");
    }
    checkCoverOptions(options.situations, manifest.settings);
    manifest.command = commandOfSet(options, manifest.settings);
    coverage::Counts counts;
    const vectors::Manifest made =
        vectors::makeSet(options.output, manifest, options.situations.isCounted ? &counts : nullptr);
    for (const std::string& file : vectors::filesOf(options.output, made)) {
        base::expectDistinct(options.situations.counts, file);
    }
    bool isCovered = true;
    const std::string situations = tellSituations(options.situations, made.settings, counts, isCovered);
    print(coreLine(made.settings.generics, made.settings.iterations) + base::visible(options.output) + ": " +
          blocksAndFormats(made) + '\n' + situations);
    return isCovered ? success : differencesFound;
}

int checkSet(const std::string& path)
{
    const vectors::CheckedSet set = vectors::checkSet(path);
    base::expectOwnFile(base::standardStream, vectors::filesOf(path, set.manifest), "findings");
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

/// Checks the set of a folder, its tables of units, or both.
int checkFolder(const std::string& path)
{
    const bool hasUnits = !units::unitsIn(path).empty();
    std::error_code ignored;  // checkSet() tells what is wrong
    const bool hasSet = std::filesystem::exists(std::filesystem::path(path) / vectors::manifestName, ignored);
    const int ofSet = hasSet || !hasUnits ? checkSet(path) : success;
    return hasUnits ? std::max(ofSet, checkUnitVectors(path)) : ofSet;
}

int makeUnits(const CLI::App& command, const VectorsOptions& options)
{
    UnitVectors units = options.units;
    units.folder = options.output;
    units.algorithm = options.decoder.generics.C_ALGORITHM_TYPE;
    units.seed = options.settings.seed;
    units.formats = options.settings.formats;
    units.blockSizes = options.settings.blockSizes;
    return makeUnitVectors(command, units);
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

int runVectors(const CLI::App& command, const VectorsOptions& options)
{
    if (!options.checked.empty()) {
        expectNoOtherThanCheck(command);
        return checkFolder(options.checked);
    }
    if (!options.units.units.empty()) {
        return makeUnits(command, options);
    }
    const bool hasBlocks =
        !options.settings.blockSizes.empty() || options.link.hasTransportBlocks() || !options.settings.cover.empty();
    if (options.output.empty() || !hasBlocks) {
        throw base::Error(
            "--out and --block-size, --transport-block-size, --mcs, --cover or --unit, or --check, are required; see "
            "'morvik vectors --help'");
    }
    return make(options);
}

/// Adds Eb/N0 or Es/N0.
CLI::Option* addNoise(CLI::App& command,
                      const std::string& name,
                      std::optional<int>& value,
                      const std::string& description)
{
    return command
        .add_option_function<std::string>(
            name, [name, &value](const std::string& text) { value = readMilliDecibels(name, text); }, description)
        ->type_name("X");
}

void addVectorsBlockOptions(CLI::App& command, VectorsOptions& options)
{
    vectors::Settings& settings = options.settings;
    addListOption(command, "--block-size", settings.blockSizes, appendBlockSize, "Block size K in bits")
        ->check(offer(blockSizeWords()))
        ->type_name("K[,K...]");
    addLinkOptions(command, options.link);
    command.add_option("--blocks", settings.blocks, "Random blocks of each size, or transport blocks")
        ->transform(integerFrom(0, 1000000))
        ->type_name("N")
        ->capture_default_str();
    CLI::Option* const ebn0 = addNoise(command,
                                       "--ebn0",
                                       options.milliEbn0,
                                       "Eb/N0 of the random blocks in dB: 1 for plain code blocks, for transport "
                                       "blocks where their error rates fall");
    addNoise(command, "--esn0", options.milliEsn0, "Instead of --ebn0: Es/N0 of transport blocks")->excludes(ebn0);
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

constexpr char vectorsExplanation[] =
    R"(The folder gets the tables 'blocks', 'stimulus' and 'expected', one file for each format, and
manifest.json with all parameters and the SHA-256 of each file. Random blocks come first, then
directed ones: extreme values, ties, sizes at which the division into segments and windows
changes, extreme tags. With transport blocks, random blocks are their code blocks as they come out
of rate recovery after each transmission: punctured, repeated, combined, saturated, with filler
bits. docs/vectors.md describes the layout.

After a set is made, a line tells how many situations of the arithmetic its blocks meet, such as clips,
wraps and ties; docs/coverage.md describes them.

With --unit, the folder gets a table for each unit, with its inputs and expected outputs, and a file
NAME.json that counts what the cases meet: clips, wraps, ties, corrections. docs/units.md tells more.

Exit status: 0 written, or no difference, 1 a difference was found, or --cover is not met, 2 bad input or
usage.

Example: words for $readmemh, and a check of them
  morvik vectors --out k40 --block-size 40 --num-pu 8 --format memh,csv
  morvik vectors --check k40)";

}  // namespace

Command addVectors(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("vectors", "Make stimulus and expected values for a test bench");
    const auto options = std::make_shared<VectorsOptions>();
    auto* output =
        command
            ->add_option("--out", options->output, "Write a new set of vectors to this folder; replaces an earlier one")
            ->type_name("DIR");
    command->add_option("--check", options->checked, "Decode or compute what is in this folder again, and compare")
        ->type_name("DIR")
        ->excludes(output);
    addVectorsBlockOptions(*command, *options);
    addCoverOptions(*command, options->situations, options->settings);
    addDecoderOptions(*command, options->decoder);
    addFileOptions(*command, options->settings);
    addUnitOptions(*command, options->units);
    command->footer(vectorsExplanation);
    const auto work = [options, command] {
        return runVectors(*command, *options);
    };
    return {command, work};
}

}  // namespace morvik
