// morvik_bench: the same lines through Google Benchmark, which also writes them as JSON.
#include <benchmark/benchmark.h>

#include <iostream>
#include <map>

#include "Options.h"
#include "Report.h"

namespace {

using morvik::bench::Figures;
using morvik::bench::Work;

/// The figures as Google Benchmark counters.
constexpr struct {
    const char* name;
    double Figures::*figure;
} counters[] = {{"Mbit/s", &Figures::megabitsPerSecond},
                {"cycles/bit/iteration", &Figures::cyclesPerBitAndIteration},
                {"latency_us", &Figures::latency},
                {"ratio_to_probe", &Figures::ratio},
                {"bit_error_rate", &Figures::bitErrorRate}};

void measure(benchmark::State& state, const Work& work, double limit)
{
    try {
        const auto decoding = morvik::bench::makeDecoding(work);
        decoding->run();
        morvik::bench::checkDecisions(work, decoding->bitErrorRate());
        const morvik::bench::Stopwatch stopwatch;
        for ([[maybe_unused]] const auto& run : state) {
            decoding->run();
        }
        const morvik::bench::Sample sample = stopwatch.stop(static_cast<double>(state.iterations()));
        const Figures figures = morvik::bench::figures(work, *decoding, sample, limit);
        for (const auto& counter : counters) {
            state.counters[counter.name] = figures.*counter.figure;
        }
    } catch (const std::exception& error) {
        state.SkipWithError(error.what());
    }
}

/// Passes the medians of each line to the report.
class Reporter : public benchmark::BenchmarkReporter {
public:
    Reporter(morvik::bench::Report& report, const std::vector<Work>& all) : itsReport(report)
    {
        for (const Work& work : all) {
            itsWork.emplace(work.name(), work);
        }
    }

    bool ReportContext(const Context&) override
    {
        return true;
    }

    void ReportRuns(const std::vector<Run>& runs) override
    {
        for (const Run& run : runs) {
            if (run.error_occurred) {
                std::cerr << "morvik_bench: " << run.error_message << '\n';
                itsFailed = true;
            } else if (run.aggregate_name == "median" || run.repetitions == 1) {
                Figures figures = {};
                for (const auto& counter : counters) {
                    figures.*counter.figure = run.counters.at(counter.name);
                }
                itsReport.add(itsWork.at(run.run_name.function_name), figures);
            }
        }
    }

    bool failed() const
    {
        return itsFailed;
    }

private:
    morvik::bench::Report& itsReport;
    std::map<std::string, Work> itsWork;
    bool itsFailed = false;
};

int runBenchmarks(const std::vector<Work>& all)
{
    const morvik::bench::Limits limits;
    for (const Work& work : all) {
        benchmark::RegisterBenchmark(work.name().c_str(), measure, work, limits.cyclesPerStep(work))
            ->Unit(benchmark::kMicrosecond);
    }
    morvik::bench::Report report(std::cout, limits);
    Reporter reporter(report, all);
    const bool none = benchmark::RunSpecifiedBenchmarks(&reporter) == 0;
    if (!none) {
        report.finish();
    }
    return none || reporter.failed() ? 1 : 0;
}

/// Our options translated to those of Google Benchmark, followed by its own.
std::vector<std::string> benchmarkArguments(const morvik::bench::Options& options,
                                            const std::string& json,
                                            const std::vector<std::string>& others)
{
    std::vector<std::string> arguments = {"morvik_bench",
                                          "--benchmark_filter=" + options.filter,
                                          "--benchmark_repetitions=" + std::to_string(options.repetitions),
                                          "--benchmark_min_time=" + std::to_string(options.seconds)};
    if (options.list) {
        arguments.emplace_back("--benchmark_list_tests");
    }
    if (!json.empty()) {
        arguments.push_back("--benchmark_out=" + json);
        arguments.emplace_back("--benchmark_out_format=json");
    }
    arguments.insert(arguments.end(), others.begin(), others.end());
    return arguments;
}

/// Google Benchmark keeps pointers to the arguments. Returns false after error messages about unknown ones.
bool initialise(std::vector<std::string>& arguments)
{
    std::vector<char*> argv;
    argv.reserve(arguments.size() + 1);
    for (std::string& argument : arguments) {
        argv.push_back(argument.data());
    }
    auto argc = static_cast<int>(argv.size());
    argv.push_back(nullptr);
    benchmark::Initialize(&argc, argv.data());
    return !benchmark::ReportUnrecognizedArguments(argc, argv.data());
}

}  // namespace

int main(int argc, char** argv)
{
    CLI::App app("Measures how fast morvik decodes. Takes the options of Google Benchmark, too.", "morvik_bench");
    app.allow_extras();
    morvik::bench::Options options;
    std::string json;
    morvik::bench::addOptions(app, options);
    app.add_option("--json", json, "Also write all figures to this file");
    CLI11_PARSE(app, argc, argv);
    std::vector<std::string> arguments = benchmarkArguments(options, json, app.remaining());
    if (!initialise(arguments)) {
        return 1;
    }
    try {
        return runBenchmarks(morvik::bench::allWork());
    } catch (const std::exception& error) {
        std::cerr << "morvik_bench: " << error.what() << '\n';
        return 1;
    }
}
