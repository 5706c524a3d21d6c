// CoverOptions: what 'morvik vectors' does about situations of the arithmetic.
#include "CoverOptions.h"

#include <algorithm>
#include <vector>

#include "Arguments.h"
#include "Lists.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Text.h"
#include "hardware/vectors/Cover.h"

namespace morvik {

namespace {

/// What --cover takes: "all", families by the first word of their names, and each situation.
std::vector<std::string> coverWords()
{
    std::vector<std::string> words = {"all"};
    for (const coverage::Situation& each : coverage::situations()) {
        const std::string family = each.name.substr(0, each.name.find('.'));
        if (std::find(words.begin(), words.end(), family) == words.end()) {
            words.push_back(family);
        }
    }
    for (const coverage::Situation& each : coverage::situations()) {
        words.push_back(each.name);
    }
    return words;
}

/// Refuses names of situations of which the core can meet none.
void expectPossible(const vectors::Settings& settings)
{
    const coverage::Core core = coverage::coreOf(settings.generics);
    for (const std::string& name : settings.cover) {
        const std::vector<unsigned> named = coverage::situationsNamed(name);
        const bool isPossible = std::any_of(
            named.begin(), named.end(), [&core](unsigned number) { return !coverage::whyImpossible(number, core); });
        if (!isPossible) {
            throw base::Error("--cover: \"" + base::visible(name) + "\" cannot occur, as " +
                              *coverage::whyImpossible(named.front(), core));
        }
    }
}

}  // namespace

void addCoverOptions(CLI::App& command, CoverOptions& options, vectors::Settings& settings)
{
    const auto append = [](const std::string& text, std::vector<std::string>& names) {
        if (coverage::situationsNamed(text).empty()) {
            refuse("--cover", text, "expected all, or names of situations that 'morvik coverage --list' prints");
        }
        names.push_back(text);
    };
    addListOption(command,
                  "--cover",
                  settings.cover,
                  append,
                  "Add random blocks until the set meets these situations of the arithmetic: all, or names or "
                  "beginnings of names such as tie")
        ->check(offer(coverWords()))
        ->type_name("NAME[,NAME...]");
    command.add_option("--cover-limit", settings.coverLimit, "Blocks to draw at most for --cover")
        ->transform(integerFrom(1, 1000000))
        ->type_name("N")
        ->capture_default_str();
    command
        .add_option("--coverage", options.counts, "Write how often the set meets each situation to this file, as CSV")
        ->type_name("FILE");
    command.add_flag_callback(
        "--no-situations",
        [&options] { options.isCounted = false; },
        "Do not count situations, which takes about as long as --internal");
}

std::string coverText(const vectors::Settings& settings)
{
    if (settings.cover.empty()) {
        return "";
    }
    const auto itself = [](const std::string& text) {
        return text;
    };
    return " --cover " + listed(settings.cover, itself) + " --cover-limit " + std::to_string(settings.coverLimit);
}

void checkCoverOptions(const CoverOptions& options, const vectors::Settings& settings)
{
    if (!options.isCounted && (!options.counts.empty() || !settings.cover.empty())) {
        throw base::Error("--no-situations cannot be combined with --coverage and --cover, which count them");
    }
    expectPossible(settings);
    if (!options.counts.empty() && options.counts != base::standardStream) {
        base::checkWritable(options.counts);
    }
}

std::string tellSituations(const CoverOptions& options,
                           const vectors::Settings& settings,
                           const coverage::Counts& counts,
                           bool& isCovered)
{
    const std::vector<unsigned> uncovered = vectors::uncovered(settings, counts);
    isCovered = uncovered.empty();
    if (!options.counts.empty()) {
        base::writeFile(options.counts, coverage::textOf(counts));
    }
    if (!options.isCounted) {
        return "";
    }
    std::string text = "situations: " + coverage::summary(counts) + '\n';
    if (!isCovered) {
        text += "not covered after " + base::counted(settings.coverLimit, "drawn block") + ": " +
                listed(uncovered, [](unsigned number) { return coverage::situations()[number].name; }) + '\n';
    }
    return text;
}

}  // namespace morvik
