// Set: makes and checks a folder of vectors.
#include "Set.h"

#include <algorithm>
#include <filesystem>
#include <set>

#include "Blocks.h"
#include "Core.h"
#include "Cover.h"
#include "Received.h"
#include "SetFolder.h"
#include "base/Checksum.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Path.h"

namespace morvik::vectors {

namespace {

std::string manifestIn(const std::string& folder)
{
    return pathIn(folder, manifestName);
}

/// "decision 3 is 1, expected says 0"
template <class Value>
std::string wrong(const std::string& what, const Value& got, const Value& wanted, const std::string& table)
{
    return what + " is " + std::to_string(got) + ", " + table + " says " + std::to_string(wanted);
}

template <class Value>
std::optional<std::string> differenceOf(const std::string& what,
                                        const std::vector<Value>& got,
                                        const std::vector<Value>& wanted,
                                        const std::string& table)
{
    const auto [one, other] = std::mismatch(got.begin(), got.end(), wanted.begin(), wanted.end());
    if (one == got.end() || other == wanted.end()) {
        return std::nullopt;
    }
    return wrong(what + ' ' + std::to_string(one - got.begin()), *one, *other, table);
}

std::optional<std::string> differenceOf(const std::vector<InternalStep>& got, const std::vector<InternalStep>& wanted)
{
    for (std::size_t i = 0; i < std::min(got.size(), wanted.size()); ++i) {
        const std::string place =
            "half-iteration " + std::to_string(got[i].halfIteration) + ", step " + std::to_string(got[i].step);
        if (got[i].halfIteration != wanted[i].halfIteration || got[i].step != wanted[i].step) {
            return place + " stands where internal has half-iteration " + std::to_string(wanted[i].halfIteration) +
                   ", step " + std::to_string(wanted[i].step);
        }
        for (std::size_t signal = 0; signal < passSignals.size(); ++signal) {
            if (got[i].values[signal] != wanted[i].values[signal]) {
                return wrong(place + ", " + passSignals[signal].name,
                             got[i].values[signal],
                             wanted[i].values[signal],
                             "internal");
            }
        }
    }
    return std::nullopt;
}

/// The first difference between the model and a file.
std::optional<std::string> differenceOf(const Expected& got, const Expected& wanted)
{
    if (got.tag != wanted.tag) {
        return wrong("the tag", got.tag, wanted.tag, "blocks");
    }
    if (auto difference = differenceOf("decision", got.bits, wanted.bits, "expected")) {
        return difference;
    }
    if (auto difference = differenceOf("ratio", got.ratios, wanted.ratios, "ratios")) {
        return difference;
    }
    return differenceOf(got.internal, wanted.internal);
}

bool isNamed(const Stimulus& stimulus, const Expected& expected, const ManifestBlock& named)
{
    return stimulus.K == named.K && stimulus.tag == named.tag && expected.tag == named.expectedTag;
}

/// Compares the blocks of a format with the model, and counts what is compared.
class BlockCheck {
public:
    BlockCheck(const Manifest& manifest, Compared& compared)
        : itsManifest(manifest),
          itsCompared(compared),
          itsReceived(countOfReceived(manifest.settings)),
          itsCore(manifest.settings),
          itsCrc(manifest.settings)
    {
    }

    /// The first difference of the block of a number.
    std::optional<std::string> differenceOf(std::size_t number, const Stimulus& stimulus, const Expected& expected)
    {
        if (auto difference = vectors::differenceOf(itsCore.expect(stimulus), expected)) {
            return difference;
        }
        ++itsCompared.tags;
        itsCompared.decisions += expected.bits.size();
        itsCompared.ratios += expected.ratios.size();
        itsCompared.internal += std::uint64_t{expected.internal.size()} * passSignals.size();
        return number < itsReceived ? crcDifference(number, expected.bits) : std::nullopt;
    }

private:
    std::optional<std::string> crcDifference(std::size_t number, const std::vector<std::uint8_t>& bits)
    {
        const Origin origin = originOf(itsManifest.settings, number);
        if (bits.size() != sizeOf(itsManifest.settings, origin)) {
            return std::nullopt;  // expectBlocks() tells
        }
        const bool fits = itsCrc.fits(origin, bits);
        ++itsCompared.crcs;
        if (fits == itsManifest.blocks[number].crcFits) {
            return std::nullopt;
        }
        return std::string("the CRC ") + (fits ? "fits" : "fails") + ", " + manifestName + " says it " +
               (fits ? "fails" : "fits");
    }

    const Manifest& itsManifest;
    Compared& itsCompared;
    std::uint64_t itsReceived;
    Core itsCore;
    CrcCheck itsCrc;
};

void expectRows(const std::string& folder, const ManifestFormat& format, const std::vector<std::uint64_t>& rows)
{
    for (std::size_t i = 0; i < rows.size(); ++i) {
        if (format.tables[i].rows != rows[i]) {
            throw base::Error(manifestIn(folder) + ": tells " + std::to_string(format.tables[i].rows) + " rows of " +
                              format.tables[i].table.name + " in " + format.name + ", there are " +
                              std::to_string(rows[i]));
        }
    }
}

/// What the block is, of a size as the manifest or a file tells it.
std::string placeOf(const ManifestBlock& block, std::uint32_t K)
{
    return block.name + (block.origin ? ", " + textOf(*block.origin) : "") + ", K = " + std::to_string(K);
}

/// Checks that the blocks of a name are those that the parameters give: `expected` of them, in their order.
template <class IsRight>
void expectBlocks(const std::string& folder,
                  const Manifest& manifest,
                  const std::string& name,
                  std::uint64_t expected,
                  IsRight expectRight)
{
    std::uint64_t found = 0;
    for (const ManifestBlock& block : manifest.blocks) {
        found += block.name == name ? 1U : 0U;
    }
    if (found != expected) {
        throw base::Error(manifestIn(folder) + ": names " + std::to_string(found) + ' ' + name +
                          " blocks, its parameters make " + std::to_string(expected));
    }
    std::uint64_t number = 0;
    for (const ManifestBlock& block : manifest.blocks) {
        if (block.name == name) {
            expectRight(block, number++);
        }
    }
}

/// Checks that the blocks are those that the parameters give.
void expectBlocks(const std::string& folder, const Manifest& manifest)
{
    const Settings& settings = manifest.settings;
    const std::uint64_t random = std::uint64_t{settings.blocks} * settings.blockSizes.size();
    const std::uint64_t received = countOfReceived(settings);
    expectBlocks(folder, manifest, randomName, random, [&](const ManifestBlock& block, std::uint64_t number) {
        const unsigned size = settings.blockSizes[static_cast<std::size_t>(number / settings.blocks)];
        if (block.K != size) {
            throw base::Error(manifestIn(folder) + ": names random block " + std::to_string(number) + " of " +
                              std::to_string(block.K) + " bits, its parameters make it " + std::to_string(size));
        }
    });
    expectBlocks(folder, manifest, receivedName, received, [&](const ManifestBlock& block, std::uint64_t number) {
        const Origin origin = originOf(settings, number);
        const ManifestBlock right = {receivedName, sizeOf(settings, origin), 0, 0, origin, false};
        const std::string named = placeOf(block, block.K);
        const std::string wanted = placeOf(right, right.K);
        if (named != wanted) {
            throw base::Error(manifestIn(folder) + ": names block " + std::to_string(number) + " as " + named +
                              ", its parameters make it " + wanted);
        }
    });
    const auto covering = static_cast<std::uint64_t>(std::count_if(
        manifest.blocks.begin(), manifest.blocks.end(), [](const auto& block) { return block.name == coverName; }));
    if (covering > 0 && settings.cover.empty()) {
        throw base::Error(manifestIn(folder) + ": names " + coverName + " blocks, its parameters make none");
    }
    if (settings.directed != (random + received + covering < manifest.blocks.size())) {
        throw base::Error(manifestIn(folder) + ": names " +
                          (settings.directed ? "no directed block" : "directed blocks") + ", its parameters make " +
                          (settings.directed ? "some" : "none"));
    }
}

/// Refuses files of tables that the manifest does not name: they would be taken for checked.
void expectNoOtherTable(const std::string& folder, const Manifest& manifest)
{
    std::set<std::string> others = filesOfAllTables();
    for (const ManifestFormat& format : manifest.formats) {
        for (const ManifestFile& file : format.files) {
            others.erase(file.name);
        }
    }
    for (const std::string& name : others) {
        if (std::filesystem::exists(base::pathOf(pathIn(folder, name)))) {
            throw base::Error(pathIn(folder, name) + ": is not a file that " + manifestName +
                              " names, and cannot be checked");
        }
    }
}

/// Checks one format; returns the first difference.
std::optional<std::string> checkFormat(const std::string& folder,
                                       const Manifest& manifest,
                                       const ManifestFormat& format,
                                       Compared& compared)
{
    for (const ManifestFile& file : format.files) {
        const std::string path = pathIn(folder, file.name);
        if (base::sha256(path) != file.sha256) {
            throw base::Error(path + ": has changed since it was written: its sha256 differs from the manifest");
        }
    }
    BlockCheck check(manifest, compared);
    BlockReader reader(folder, *tables::findFormat(format.name), manifest.settings);
    Stimulus stimulus;
    Expected expected;
    std::size_t number = 0;
    for (; reader.next(stimulus, expected); ++number) {
        if (number == manifest.blocks.size()) {
            throw base::Error(manifestIn(folder) + ": names fewer blocks than " + format.name + " has");
        }
        if (const auto difference = check.differenceOf(number, stimulus, expected)) {
            return format.name + ", block " + std::to_string(number) + " (" +
                   placeOf(manifest.blocks[number], stimulus.K) + "): " + *difference;
        }
        if (!isNamed(stimulus, expected, manifest.blocks[number])) {
            throw base::Error(manifestIn(folder) + ": has another size or tag of block " + std::to_string(number) +
                              " than " + format.name);
        }
    }
    if (number < manifest.blocks.size()) {
        throw base::Error(manifestIn(folder) + ": names more blocks than " + format.name + " has");
    }
    expectRows(folder, format, reader.rows());
    return std::nullopt;
}

}  // namespace

Manifest makeSet(const std::string& folder, Manifest manifest, coverage::Counts* counts)
{
    SetFolder set(folder);
    std::vector<BlockWriter> writers;
    for (const std::string& name : manifest.settings.formats) {
        writers.emplace_back(set.aside(), *tables::findFormat(name), manifest.settings);
    }
    Core core(manifest.settings);
    CrcCheck crc(manifest.settings);
    const bool isCounted = counts != nullptr || !manifest.settings.cover.empty();
    coverage::Counts found;
    const auto write = [&](const Stimulus& stimulus) {
        const Expected expected = core.expect(stimulus);
        for (BlockWriter& writer : writers) {
            writer.add(stimulus, expected);
        }
        const bool crcFits = stimulus.origin && crc.fits(*stimulus.origin, expected.bits);
        manifest.blocks.push_back({stimulus.name, stimulus.K, stimulus.tag, expected.tag, stimulus.origin, crcFits});
    };
    forEachStimulus(manifest.settings, [&](const Stimulus& stimulus) {
        write(stimulus);
        if (isCounted) {
            found.add(core.situations(stimulus));
        }
    });
    cover(manifest.settings, core, found, write);
    if (manifest.blocks.empty()) {
        throw base::Error("no block has been drawn that meets what --cover names");
    }
    if (counts != nullptr) {
        counts->add(found);
    }
    for (std::size_t i = 0; i < writers.size(); ++i) {
        writers[i].finish();
        ManifestFormat format = {manifest.settings.formats[i], writers[i].tables(), {}};
        for (const KeptTable& kept : format.tables) {
            for (const std::string& name : tables::findFormat(format.name)->files(kept.table)) {
                format.files.push_back({name, base::sha256(pathIn(set.aside(), name))});
            }
        }
        manifest.formats.push_back(format);
    }
    base::writeFile(manifestIn(set.aside()), manifestText(manifest));
    set.place();
    return manifest;
}

CheckedSet checkSet(const std::string& folder)
{
    CheckedSet checked;
    expectPlaced(folder);
    checked.manifest = readManifest(manifestIn(folder));
    for (const ManifestFormat& format : checked.manifest.formats) {
        checked.difference = checkFormat(folder, checked.manifest, format, checked.compared);
        if (checked.difference) {
            return checked;
        }
    }
    expectBlocks(folder, checked.manifest);
    expectNoOtherTable(folder, checked.manifest);
    return checked;
}

coverage::Counts situationsOf(const std::string& folder)
{
    expectPlaced(folder);
    const Manifest manifest = readManifest(manifestIn(folder));
    const Settings settings = blocksAlone(manifest);
    BlockReader reader(folder, *tables::findFormat(manifest.formats.front().name), settings);
    Core core(settings);
    coverage::Counts counts;
    Stimulus stimulus;
    Expected expected;
    while (reader.next(stimulus, expected)) {
        counts.add(core.situations(stimulus));
    }
    return counts;
}

}  // namespace morvik::vectors
