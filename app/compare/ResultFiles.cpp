// ResultFiles: the results of comparisons as text, JSON and JUnit.
#include "ResultFiles.h"

#include <algorithm>
#include <array>
#include <map>
#include <utility>

#include "base/Json.h"
#include "base/Printable.h"
#include "base/Text.h"
#include "coverage/CountsJson.h"

namespace morvik {

namespace {

using Json = nlohmann::ordered_json;

constexpr std::array<Verdict, 4> verdicts = {
    Verdict::equal, Verdict::different, Verdict::incomplete, Verdict::unreadable};

std::size_t countOf(const ComparedSet& set, Verdict verdict)
{
    return static_cast<std::size_t>(
        std::count_if(set.results.begin(), set.results.end(), [verdict](const CaseResult& result) {
            return result.verdict == verdict;
        }));
}

template <class Count>
std::size_t sumOver(const std::vector<ComparedSet>& sets, Count count)
{
    std::size_t sum = 0;
    for (const ComparedSet& set : sets) {
        sum += count(set);
    }
    return sum;
}

std::size_t countOf(const std::vector<ComparedSet>& sets, Verdict verdict)
{
    return sumOver(sets, [verdict](const ComparedSet& set) { return countOf(set, verdict); });
}

std::size_t blocksOf(const std::vector<ComparedSet>& sets)
{
    return sumOver(sets, [](const ComparedSet& set) { return set.results.size(); });
}

/// "40 blocks: 38 equal, 1 different, 1 unreadable".
template <class Sets>
std::string countsText(const Sets& sets, std::size_t blocks)
{
    std::string text;
    for (const Verdict verdict : verdicts) {
        if (const std::size_t count = countOf(sets, verdict); count > 0) {
            text += (text.empty() ? "" : ", ") + std::to_string(count) + ' ' + nameOf(verdict);
        }
    }
    return base::counted(blocks, "block") + ": " + text + '\n';
}

/// What all blocks have of a signal.
struct SignalSum {
    comparison::SignalCount count;
    std::uint64_t blocks = 0;  ///< with differences
};

std::array<SignalSum, signalCount> signalSums(const std::vector<ComparedSet>& sets)
{
    std::array<SignalSum, signalCount> sums;
    for (const ComparedSet& set : sets) {
        for (const CaseResult& result : set.results) {
            for (unsigned signal = 0; signal < signalCount; ++signal) {
                const comparison::SignalCount& one = result.comparison.signals[signal];
                comparison::SignalCount& all = sums[signal].count;
                all.compared += one.compared;
                all.different += one.different;
                all.unknown += one.unknown;
                all.missing += one.missing;
                all.faults += one.faults;
                sums[signal].blocks += one.different > 0 ? 1U : 0U;
            }
        }
    }
    return sums;
}

/// The findings, the most frequent first, with the number of blocks.
std::vector<std::pair<std::string, std::size_t>> mistakesOf(const std::vector<ComparedSet>& sets)
{
    std::map<std::string, std::size_t> counts;
    for (const ComparedSet& set : sets) {
        for (const CaseResult& result : set.results) {
            for (const std::string& finding : result.findings) {
                ++counts[finding];
            }
        }
    }
    std::vector<std::pair<std::string, std::size_t>> sorted(counts.begin(), counts.end());
    std::stable_sort(sorted.begin(), sorted.end(), [](const auto& a, const auto& b) { return a.second > b.second; });
    return sorted;
}

std::string signalTable(const std::vector<ComparedSet>& sets)
{
    const auto row = [](const std::string& name, const std::array<std::string, 6>& fields) {
        constexpr std::array<std::size_t, 6> widths = {14, 10, 10, 13, 10, 8};
        std::string text = name + std::string(10 - name.size(), ' ');
        for (std::size_t i = 0; i < fields.size(); ++i) {
            text += base::rightAligned(fields[i], widths[i]);
        }
        return text + '\n';
    };
    std::string text = row("signal", {"compared", "missing", "unknown", "differences", "faults", "blocks"});
    const auto sums = signalSums(sets);
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        const comparison::SignalCount& count = sums[signal].count;
        if (count.different > 0) {
            text += row(passSignals[signal].name,
                        {std::to_string(count.compared),
                         std::to_string(count.missing),
                         std::to_string(count.unknown),
                         std::to_string(count.different),
                         std::to_string(count.faults),
                         std::to_string(sums[signal].blocks)});
        }
    }
    return text;
}

Json placeJson(const comparison::Place& place)
{
    return {{"half_iteration", place.pass}, {"step", place.step}, {"signal", passSignals[place.signal].name}};
}

Json resultJson(const BlockCase& block, const CaseResult& result)
{
    Json json;
    json["block"] = block.run.number;
    if (!block.name.empty()) {
        json["name"] = base::asUtf8(block.name);
    }
    json["block_size"] = block.K();
    json["dump"] = base::asUtf8(result.dump);
    json["result"] = nameOf(result.verdict);
    json["compared"] = result.comparison.compared();
    json["unknown"] = result.comparison.unknown();
    json["differences"] = result.comparison.different();
    json["faults"] = result.comparison.allFaults();
    if (result.comparison.first) {
        json["first"] = placeJson(*result.comparison.first);
    }
    if (!result.findings.empty()) {
        json["mistakes"] = result.findings;
    }
    json["report"] = base::asUtf8(result.report);
    return json;
}

Json signalsJson(const std::vector<ComparedSet>& sets)
{
    Json json = Json::array();
    const auto sums = signalSums(sets);
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        const comparison::SignalCount& count = sums[signal].count;
        json.push_back({{"signal", passSignals[signal].name},
                        {"compared", count.compared},
                        {"missing", count.missing},
                        {"unknown", count.unknown},
                        {"differences", count.different},
                        {"faults", count.faults},
                        {"blocks", sums[signal].blocks}});
    }
    return json;
}

/// Text for XML: control characters and invalid UTF-8, which it cannot hold, become visible.
std::string xml(const std::string& text)
{
    std::string escaped;
    for (const char character : base::visibleLines(text)) {
        escaped += character == '&'   ? "&amp;"
                   : character == '<' ? "&lt;"
                   : character == '>' ? "&gt;"
                   : character == '"' ? "&quot;"
                                      : std::string(1, character);
    }
    return escaped;
}

/// ' NAME="VALUE"'
std::string attribute(const std::string& name, const std::string& value)
{
    return ' ' + name + "=\"" + xml(value) + '"';
}

std::string caseXml(const BlockCase& block, const std::string& className, const CaseResult& result)
{
    const std::string opening = "    <testcase" + attribute("classname", className) + attribute("name", block.title());
    if (result.verdict == Verdict::equal) {
        return opening + "/>\n";
    }
    const std::string element = result.verdict == Verdict::unreadable ? "error" : "failure";
    return opening + ">\n      <" + element + attribute("type", nameOf(result.verdict)) +
           attribute("message", result.summary) + '>' + xml(result.report) + "</" + element + ">\n    </testcase>\n";
}

std::string countsXml(std::size_t tests, std::size_t failures, std::size_t errors)
{
    return attribute("tests", std::to_string(tests)) + attribute("failures", std::to_string(failures)) +
           attribute("errors", std::to_string(errors)) + attribute("skipped", "0");
}

template <class Sets>
std::string countsXml(const Sets& sets, std::size_t tests)
{
    return countsXml(tests,
                     countOf(sets, Verdict::different) + countOf(sets, Verdict::incomplete),
                     countOf(sets, Verdict::unreadable));
}

std::string suiteXml(const ComparedSet& set)
{
    std::string text = "  <testsuite" + attribute("name", set.folder) + countsXml(set, set.results.size()) +
                       ">\n    <properties>\n      <property" + attribute("name", "core") +
                       attribute("value", set.core) + "/>\n    </properties>\n";
    for (std::size_t i = 0; i < set.results.size(); ++i) {
        text += caseXml(set.cases[i], set.folder, set.results[i]);
    }
    return text + "  </testsuite>\n";
}

}  // namespace

std::string summaryText(const std::vector<ComparedSet>& sets)
{
    std::string text;
    for (const ComparedSet& set : sets) {
        text += set.folder + " (" + set.core + "), " + countsText(set, set.results.size());
        for (std::size_t i = 0; i < set.results.size(); ++i) {
            if (set.results[i].verdict != Verdict::equal) {
                text += "  " + set.cases[i].title() + ", " + set.results[i].dump + ": " +
                        nameOf(set.results[i].verdict) + ": " + set.results[i].summary + '\n';
            }
        }
    }
    if (countOf(sets, Verdict::different) > 0) {
        text += '\n' + signalTable(sets) + '\n';
    }
    if (countOf(sets, Verdict::incomplete) > 0) {
        text += "Incomplete: values of their signals are missing. Use --partial if that is intended.\n";
    }
    for (const auto& [mistake, blocks] : mistakesOf(sets)) {
        text += "in " + base::counted(blocks, "block") + ": " + mistake + '\n';
    }
    if (sets.size() > 1) {
        text += countsText(sets, blocksOf(sets));
    }
    return text;
}

std::string jsonText(const std::vector<ComparedSet>& sets)
{
    Json json;
    json["version"] = MORVIK_VERSION;
    json["sets"] = Json::array();
    for (const ComparedSet& set : sets) {
        Json blocks = Json::array();
        for (std::size_t i = 0; i < set.results.size(); ++i) {
            blocks.push_back(resultJson(set.cases[i], set.results[i]));
        }
        json["sets"].push_back({{"set", base::asUtf8(set.folder)}, {"core", set.core}, {"blocks", blocks}});
    }
    Json& summary = json["summary"];
    summary["blocks"] = blocksOf(sets);
    for (const Verdict verdict : verdicts) {
        summary[nameOf(verdict)] = countOf(sets, verdict);
    }
    summary["signals"] = signalsJson(sets);
    summary["mistakes"] = Json::array();
    for (const auto& [mistake, blocks] : mistakesOf(sets)) {
        summary["mistakes"].push_back({{"mistake", mistake}, {"blocks", blocks}});
    }
    summary["coverage"] = countsJson(situationsOf(sets));
    constexpr int indentation = 2;
    return json.dump(indentation, ' ', false, Json::error_handler_t::replace) + '\n';
}

std::string junitText(const std::vector<ComparedSet>& sets)
{
    std::string text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<testsuites" + attribute("name", "morvik compare") +
                       countsXml(sets, blocksOf(sets)) + ">\n";
    for (const ComparedSet& set : sets) {
        text += suiteXml(set);
    }
    return text + "</testsuites>\n";
}

}  // namespace morvik
