// Regression: compares the dumps of all blocks of sets of vectors.
#include "Regression.h"

#include <algorithm>
#include <map>
#include <memory>
#include <set>
#include <thread>
#include <utility>

#include "DumpFiles.h"
#include "Tasks.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Text.h"
#include "hardware/vectors/Manifest.h"
#include "hardware/vectors/SetFolder.h"

namespace morvik {

namespace {

constexpr char blockWord[] = "{block}";
constexpr char setWord[] = "{set}";

bool has(const std::string& text, const std::string& word)
{
    return text.find(word) != std::string::npos;
}

std::string replaced(std::string text, const std::string& word, const std::string& by)
{
    for (std::size_t at = text.find(word); at != std::string::npos; at = text.find(word, at + by.size())) {
        text.replace(at, word.size(), by);
    }
    return text;
}

SoftBlock softBlockOf(const vectors::Stimulus& stimulus)
{
    const auto wide = [](const std::vector<std::int8_t>& stream) {
        return std::vector<std::int32_t>(stream.begin(), stream.end());
    };
    return {wide(stimulus.streams[0]), wide(stimulus.streams[1]), wide(stimulus.streams[2])};
}

/// The file of the set that other blocks are looked for in; empty without CSV.
std::string blockFileOf(const std::string& folder, const vectors::Manifest& manifest)
{
    const bool hasCsv = std::any_of(
        manifest.formats.begin(), manifest.formats.end(), [](const auto& format) { return format.name == "csv"; });
    return hasCsv ? folder + "/stimulus.csv" : "";
}

/// Reads the blocks of a set from its first format, without internal values: those may be what is compared.
ComparedSet readSet(const std::string& folder)
{
    vectors::expectPlaced(folder);
    const vectors::Manifest manifest = vectors::readManifest(folder + '/' + vectors::manifestName);
    const vectors::Settings settings = vectors::blocksAlone(manifest);
    vectors::BlockReader reader(folder, *tables::findFormat(manifest.formats.front().name), settings);
    ComparedSet set;
    set.folder = folder;
    set.files = vectors::filesOf(folder, manifest);
    set.core = coreText(settings.generics, settings.iterations);
    vectors::Stimulus stimulus;
    vectors::Expected expected;
    for (std::uint32_t number = 0; reader.next(stimulus, expected); ++number) {
        if (number == manifest.blocks.size()) {
            throw base::Error(folder + ": has more blocks than its manifest names");
        }
        set.cases.push_back({folder,
                             manifest.blocks[number].name,
                             {blockFileOf(folder, manifest), number, softBlockOf(stimulus), settings.generics},
                             settings.iterations});
    }
    set.results.resize(set.cases.size());
    return set;
}

bool isSelected(const CompareOptions& options, std::uint64_t block)
{
    return !options.number || *options.number == block;
}

CaseResult unreadable(const std::string& dump, const std::string& reason)
{
    CaseResult result;
    result.dump = dump;
    result.summary = reason;
    result.report = reason + '\n';
    return result;
}

/// Calls compare(), and makes its errors a result.
template <class Compare>
CaseResult attempt(const std::string& dump, Compare compare)
try {
    return compare();
} catch (const std::exception& error) {
    return unreadable(dump, error.what());
}

/// Gives the dumps of a file with many blocks to threads. As the values of a block may be mixed with those of the next
/// one, two dumps are open at a time.
class DumpQueue : public comparison::DumpSink {
public:
    DumpQueue(ComparedSet& set,
              std::string file,
              const CompareOptions& options,
              const comparison::NameMap& map,
              std::size_t threads)
        : itsSet(set), itsFile(std::move(file)), itsOptions(options), itsMap(map), itsTasks(threads)
    {
    }

    comparison::Dump& dumpOf(std::uint64_t number) override
    {
        if (number >= itsSet.cases.size()) {
            throw base::Error("is not in " + itsSet.folder);
        }
        const auto block = static_cast<std::size_t>(number);
        if (const auto open = itsOpen.find(block); open != itsOpen.end()) {
            return *open->second;
        }
        if (!itsBegun.insert(block).second) {
            throw base::Error("comes back after the next but one has begun");
        }
        constexpr std::size_t mostOpen = 2;
        if (itsOrder.size() == mostOpen) {
            compareFirst();
        }
        itsOrder.push_back(block);
        return *(itsOpen[block] = std::make_shared<comparison::Dump>(emptyDump(itsSet.cases[block])));
    }

    /// The file ends; with a reason, too early for the blocks that are open.
    void end(const std::string& reason)
    {
        while (reason.empty() && !itsOrder.empty()) {
            compareFirst();
        }
        for (std::size_t block = 0; block < itsSet.cases.size(); ++block) {
            if (itsBegun.count(block) == 0 || itsOpen.count(block) > 0) {
                const std::string text = shownName(itsFile) + ": has no value of the block";
                itsSet.results[block] = unreadable(itsFile, reason.empty() ? text : reason);
            }
        }
    }

private:
    void compareFirst()
    {
        const std::size_t block = itsOrder.front();
        itsOrder.pop_front();
        const std::shared_ptr<comparison::Dump> dump = itsOpen.at(block);
        itsOpen.erase(block);
        if (!isSelected(itsOptions, block)) {
            return;
        }
        itsTasks.add([this, block, dump] {
            itsSet.results[block] = attempt(itsFile, [&] {
                comparison::completeTwins(shownName(itsFile), itsMap, *dump);
                return compareCase(itsSet.cases[block], shownName(itsFile), *dump, itsOptions);
            });
        });
    }

    ComparedSet& itsSet;
    std::string itsFile;
    const CompareOptions& itsOptions;
    const comparison::NameMap& itsMap;
    std::map<std::size_t, std::shared_ptr<comparison::Dump>> itsOpen;
    std::deque<std::size_t> itsOrder;  // of the open ones
    std::set<std::size_t> itsBegun;
    Tasks itsTasks;  // the last member: they use the others
};

/// The dumps of all blocks are in one file.
void compareTogether(ComparedSet& set,
                     const std::string& file,
                     const CompareOptions& options,
                     const comparison::NameMap& map,
                     std::size_t threads)
{
    DumpQueue queue(set, file, options, map, threads);
    std::string reason;
    try {
        readDumps(file, options.form, map, set.cases.size(), queue);
    } catch (const base::Error& error) {
        reason = error.what();
    }
    queue.end(reason);
}

/// Each block has a dump of its own.
void compareEach(ComparedSet& set,
                 const std::string& files,
                 const CompareOptions& options,
                 const comparison::NameMap& map,
                 std::size_t threads)
{
    Tasks tasks(threads);
    for (std::size_t block = 0; block < set.cases.size(); ++block) {
        if (!isSelected(options, block)) {
            continue;
        }
        tasks.add([&set, &options, &map, block, file = replaced(files, blockWord, std::to_string(block))] {
            set.results[block] = attempt(file, [&] {
                comparison::Dump dump = emptyDump(set.cases[block]);
                readDump(file, options.form, map, dump);
                return compareCase(set.cases[block], file, dump, options);
            });
        });
    }
}

/// Where the dumps of the set's blocks are.
std::vector<std::string> dumpsOf(const ComparedSet& set, const CompareOptions& options)
{
    const std::string files = replaced(options.dump, setWord, set.folder);
    std::vector<std::string> dumps = {files};
    for (std::size_t block = 0; has(files, blockWord) && block < set.cases.size(); ++block) {
        dumps.push_back(replaced(files, blockWord, std::to_string(block)));
    }
    return dumps;
}

/// Reads all sets before the first dump: an error in one is told at once, and results may replace nothing that is read.
std::vector<ComparedSet> readSets(const CompareOptions& options)
{
    std::vector<ComparedSet> sets;
    for (const std::string& folder : options.sets) {
        const ComparedSet& set = sets.emplace_back(readSet(folder));
        for (const std::string& output : options.outputs()) {
            base::expectOwnFile(output, set.files, "results");
            base::expectOwnFile(output, dumpsOf(set, options), "results");
        }
    }
    return sets;
}

void keepSelected(ComparedSet& set, const CompareOptions& options)
{
    if (!options.number) {
        return;
    }
    if (*options.number >= set.cases.size()) {
        throw base::Error(set.folder + ": has " + base::counted(set.cases.size(), "block") + ", there is no block " +
                          std::to_string(*options.number));
    }
    set.cases = {set.cases[*options.number]};
    set.results = {set.results[*options.number]};
}

}  // namespace

coverage::Counts situationsOf(const std::vector<ComparedSet>& sets)
{
    coverage::Counts counts;
    for (const ComparedSet& set : sets) {
        for (const CaseResult& result : set.results) {
            if (result.situations) {
                counts.add(*result.situations);
            }
        }
    }
    return counts;
}

std::vector<ComparedSet> compareSets(const CompareOptions& options, const comparison::NameMap& map)
{
    if (options.sets.size() > 1 && !has(options.dump, setWord)) {
        throw base::Error("--dump needs {set} in its name, as there are several sets");
    }
    const std::size_t threads =
        options.threads > 0 ? options.threads : std::max(std::thread::hardware_concurrency(), 1U);
    std::vector<ComparedSet> sets = readSets(options);
    for (ComparedSet& set : sets) {
        const std::string dump = replaced(options.dump, setWord, set.folder);
        (has(options.dump, blockWord) ? compareEach : compareTogether)(set, dump, options, map, threads);
        keepSelected(set, options);
    }
    return sets;
}

}  // namespace morvik
