// Options: the command line options of both programs.
#ifndef MORVIK_BENCH_OPTIONS_H
#define MORVIK_BENCH_OPTIONS_H

#include <CLI/CLI.hpp>
#include <string>

namespace morvik::bench {

struct Options {
    std::string filter = ".*";
    unsigned repetitions = 5;
    double seconds = 0.2;
    bool list = false;
    std::string json;
};

inline void addOptions(CLI::App& app, Options& options)
{
    app.add_option("--filter", options.filter, "Only lines whose name matches this regular expression");
    app.add_option("--repetitions", options.repetitions, "Of each line; its figures are the medians")
        ->check(CLI::Range(1U, 1000U));
    app.add_option("--seconds", options.seconds, "That a repetition takes at least")->check(CLI::Range(0.0, 100.0));
    app.add_flag("--list", options.list, "Only print the names of the lines");
    app.add_option("--json", options.json, "Also write the figures of all repetitions to this file");
}

}  // namespace morvik::bench

#endif
