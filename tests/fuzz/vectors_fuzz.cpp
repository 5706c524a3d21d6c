// vectors_fuzz: the readers of sets of vectors take any files: the manifest, the tables in every format, counts of
// situations, and descriptions of units.
#include <filesystem>
#include <sstream>

#include "FuzzInput.h"
#include "TemporaryFiles.h"
#include "base/Error.h"
#include "hardware/coverage/Counts.h"
#include "hardware/units/Description.h"
#include "hardware/vectors/BlockFiles.h"
#include "hardware/vectors/Manifest.h"

namespace {

using namespace morvik::vectors;

void readManifestText(const std::string& text)
{
    try {
        const Manifest manifest = parseManifest(text, "in");
        const Manifest again = parseManifest(manifestText(manifest), "in");
        require(manifestText(again) == manifestText(manifest), "what was read is written, and read again");
        for (const ManifestFormat& format : manifest.formats) {
            for (const ManifestFile& file : format.files) {
                require(file.name == std::filesystem::path(file.name).filename(), "a file lies in the folder");
            }
        }
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in");
    }
}

/// As that of each unit.
void readDescription(const std::string& text)
{
    using namespace morvik::units;
    for (std::size_t number = 0; number < allUnits().size(); ++number) {
        const auto unit = static_cast<Number>(number);
        try {
            const std::string read = textOf(parseDescription(text, "in", unit));
            require(textOf(parseDescription(read, "in", unit)) == read, "what was read is written, and read again");
        } catch (const morvik::base::Error& error) {
            requireOneLine(error, "in");
        }
    }
}

void readSituations(const std::string& text)
{
    std::istringstream file(text);
    try {
        const std::string read = textOf(morvik::coverage::readCounts(file, "in"));
        std::istringstream again(read);
        require(textOf(morvik::coverage::readCounts(again, "in")) == read, "what was read is written, and read again");
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in");
    }
}

Settings takeSettings(FuzzInput& input)
{
    const unsigned choice = input.byte();
    Settings settings;
    settings.iterations = 1;
    settings.width = (choice & 1U) != 0 ? 16 : 8;
    settings.separateStreams = (choice & 2U) != 0;
    settings.ratios = (choice & 4U) != 0;
    settings.internal = (choice & 8U) != 0;
    return settings;
}

/// The files of a format, in their order, are the parts of the input.
void readBlocks(FuzzInput& input)
{
    const morvik::tables::Format& format =
        morvik::tables::formats()[input.below(static_cast<unsigned>(morvik::tables::formats().size()))];
    const Settings settings = takeSettings(input);
    TemporaryFiles files;
    for (const morvik::tables::Table& table : Layout(format, settings).tables) {
        files.write(format.files(table).front(), input.part());
    }
    try {
        BlockReader reader(files.folder(), format, settings);
        Stimulus stimulus;
        Expected expected;
        while (reader.next(stimulus, expected)) {
            require(stimulus.streams[2].size() == stimulus.K + 4, "a block has K + 4 positions");
            require(expected.bits.size() == stimulus.K, "a block has K decisions");
        }
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, files.folder() + '/');
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    FuzzInput input(data, size);
    switch (input.below(3)) {
    case 0: {
        const std::string text = input.text();
        readManifestText(text);
        readDescription(text);
        break;
    }
    case 1:
        readBlocks(input);
        break;
    default:
        readSituations(input.text());
    }
    return 0;
}
