// morvik_bench: measures and prints the tables.
#include <exception>
#include <iostream>
#include <optional>
#include <regex>

#include "JsonFile.h"
#include "Options.h"
#include "Report.h"

namespace {

using morvik::bench::Figures;
using morvik::bench::Work;

std::vector<Work> chosenWork(const std::string& filter)
{
    const std::regex wanted(filter, std::regex::extended);
    std::vector<Work> chosen;
    for (const Work& work : morvik::bench::allWork()) {
        if (std::regex_search(work.name(), wanted)) {
            chosen.push_back(work);
        }
    }
    if (chosen.empty()) {
        throw std::invalid_argument("no line's name matches '" + filter + "'");
    }
    return chosen;
}

morvik::bench::Sample sample(morvik::bench::Decoding& decoding, unsigned runs)
{
    const morvik::bench::Stopwatch stopwatch;
    for (unsigned i = 0; i < runs; ++i) {
        decoding.run();
    }
    return stopwatch.stop(runs);
}

/// The figures of each repetition.
std::vector<Figures> measure(const Work& work, const morvik::bench::Options& options, double limit)
{
    const auto decoding = morvik::bench::makeDecoding(work);
    decoding->check();
    const double once = sample(*decoding, 1).seconds;
    const auto runs = static_cast<unsigned>(options.seconds / once) + 1;
    std::vector<Figures> all;
    for (unsigned i = 0; i < options.repetitions; ++i) {
        all.push_back(morvik::bench::figures(work, *decoding, sample(*decoding, runs), limit));
    }
    return all;
}

void measureAll(const morvik::bench::Options& options)
{
    const std::vector<Work> chosen = chosenWork(options.filter);
    std::optional<morvik::bench::JsonFile> json;
    if (!options.json.empty()) {
        json.emplace(options.json);
    }
    const morvik::bench::Limits limits;
    morvik::bench::Report report(std::cout, limits);
    for (const Work& work : chosen) {
        const std::vector<Figures> repetitions = measure(work, options, limits.cyclesPerStep(work));
        report.add(work, morvik::bench::medians(repetitions));
        if (json) {
            json->add(work, repetitions);
        }
    }
    report.finish();
    if (json) {
        json->finish();
    }
}

void list(const morvik::bench::Options& options)
{
    for (const Work& work : chosenWork(options.filter)) {
        std::cout << work.name() << '\n';
    }
}

}  // namespace

int main(int argc, char** argv)
{
    CLI::App app("Measures how fast morvik decodes.", "morvik_bench");
    morvik::bench::Options options;
    morvik::bench::addOptions(app, options);
    CLI11_PARSE(app, argc, argv);
    try {
        (options.list ? list : measureAll)(options);
    } catch (const std::exception& error) {
        std::cerr << "morvik_bench: " << error.what() << '\n';
        return 1;
    }
    return 0;
}
