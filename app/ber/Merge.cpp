// Merge: the subcommand that merges the results of several runs.
#include "Merge.h"

#include <iostream>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "Pictures.h"
#include "base/Error.h"
#include "simulation/Merge.h"
#include "simulation/ResultFiles.h"

namespace morvik {

namespace {

struct MergeOptions {
    std::vector<std::string> inputs;
    std::string output;
    PictureOptions pictures;
};

/// Writes the results to a file or, if no other output is requested, as CSV to standard output.
void write(const MergeOptions& options, const simulation::Results& results)
{
    if (!options.output.empty()) {
        simulation::writeResults(options.output, results);
    } else if (!options.pictures.isAskedFor() && !(std::cout << simulation::csvText(results) << std::flush)) {
        throw base::Error("<stdout>: cannot be written");
    }
}

std::string countOfPoints(const simulation::Results& results)
{
    std::set<std::size_t> numbers;
    for (const simulation::ResultRow& row : results.rows) {
        numbers.insert(row.pointNumber);
    }
    return std::to_string(numbers.size());
}

std::vector<simulation::Point> pointsOf(const simulation::Results& results)
{
    std::vector<simulation::Point> points;
    points.reserve(results.rows.size());
    for (const simulation::ResultRow& row : results.rows) {
        points.push_back(row.point);
    }
    return points;
}

int merge(const MergeOptions& options)
{
    Pictures pictures(options.pictures, options.output, options.inputs);
    std::vector<simulation::Part> parts;
    for (const std::string& input : options.inputs) {
        parts.push_back({input, simulation::readResults(input)});
    }
    const simulation::Results results = simulation::merge(parts);
    pictures.takeAxis(axisOf(pointsOf(results)));
    if (options.pictures.isAskedFor() && results.rows.empty()) {
        throw base::Error("there are no points to draw");
    }
    write(options, results);
    if (!results.rows.empty()) {
        pictures.draw(results, countOfPoints(results));
    }
    return success;
}

/// The end of the help text.
constexpr char mergeExplanation[] =
    R"(The runs have the same seed and were made by the same version. Rows of the same parameters
become one, if they have no frames in common: 'morvik ber --frames' divides them. One
file alone is drawn as it is.

Exit status: 0 joined, 2 bad input or usage.

Example: two halves of a simulation, made anywhere
  morvik ber --block-size 512 --ebn0 1.4 --frames 0:500000 --output a.csv
  morvik ber --block-size 512 --ebn0 1.4 --frames 500000:1000000 --output b.csv
  morvik merge a.csv b.csv --output k512.csv --plot k512.svg)";

}  // namespace

Command addMerge(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("merge", "Join the results of 'morvik ber' for different frames");
    const auto options = std::make_shared<MergeOptions>();
    command->add_option("FILE", options->inputs, "Results, as CSV or JSON")->required()->type_name("");
    command
        ->add_option("--output",
                     options->output,
                     "File for all of them, .csv or .json; CSV goes to standard output if nothing is named")
        ->type_name("FILE");
    addPictureOptions(*command, options->pictures);
    command->footer(mergeExplanation);
    const auto run = [options] {
        return merge(*options);
    };
    return {command, run};
}

}  // namespace morvik
