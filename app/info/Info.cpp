// Info: the subcommand that shows how the core handles a block size.
#include "Info.h"

#include <cinttypes>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <stdexcept>
#include <string>

#include "Arguments.h"
#include "BlockLayout.h"
#include "DecoderOptions.h"
#include "LayoutPicture.h"
#include "Notice.h"
#include "report/Plot.h"
#include "rules/BlockSizes.h"
#include "rules/Tail.h"
#include "simulation/Point.h"

namespace morvik {

namespace {

struct InfoOptions {
    std::optional<std::uint32_t> K;
    bool table = false;
    bool json = false;
    std::string plot;
};

std::string lengthsText(const rules::Cut& cut)
{
    std::string text;
    for (unsigned row = 0; row < cut.rows();) {
        unsigned end = row;
        while (end < cut.rows() && cut.windowLength(end) == cut.windowLength(row)) {
            ++end;
        }
        text += (row == 0 ? "" : ", ") + (end - row > 1 ? std::to_string(end - row) + " x " : "") +
                std::to_string(cut.windowLength(row));
        row = end;
    }
    return text;
}

std::string layoutText(const BlockLayout& layout)
{
    const std::string K = std::to_string(layout.K);
    std::string text = "K = " + K + ": " + std::to_string(layout.K + rules::tailPositions) +
                       " rows of three soft values, " + std::to_string(layout.K + rules::tailSteps) +
                       " trellis steps\nInterleaver: f1 = " + std::to_string(layout.f1) +
                       ", f2 = " + std::to_string(layout.f2) + "; the second encoder's bit i is bit (" +
                       std::to_string(layout.f1) + " i + " + std::to_string(layout.f2) + " i^2) mod " + K +
                       "\n\nunits  threads  segments  steps of each  rows  steps of the windows\n";
    for (const rules::Cut& cut : layout.cuts) {
        char line[80];
        std::snprintf(line,
                      sizeof line,
                      "%5u %8" PRIu64 " %9u %14u %5u  ",
                      cut.units(),
                      cut.threads(),
                      cut.segments(),
                      cut.segmentLength(),
                      cut.rows());
        text += line + lengthsText(cut) + '\n';
    }
    return text;
}

std::string formatsText(const std::vector<NumberFormat>& formats)
{
    std::string text = "numbers                   format    bits  fraction  range\n";
    for (const NumberFormat& format : formats) {
        char line[120];
        std::snprintf(line,
                      sizeof line,
                      "%-25s %-8s %5u %9u  %g to %g\n",
                      format.what.c_str(),
                      format.text.c_str(),
                      format.bits,
                      format.fraction,
                      format.smallest,
                      format.largest);
        text += line;
    }
    return text;
}

/// All block sizes, as ranges with steps.
std::string sizesText()
{
    std::string text = std::to_string(rules::blockSizes.size()) + " block sizes (3GPP TS 36.212, Table 5.1.3-3):";
    std::size_t first = 0;
    while (first + 1 < rules::blockSizes.size()) {
        const std::uint32_t step = rules::blockSizes[first + 1].K - rules::blockSizes[first].K;
        std::size_t last = first + 1;
        while (last + 1 < rules::blockSizes.size() &&
               rules::blockSizes[last + 1].K - rules::blockSizes[last].K == step) {
            ++last;
        }
        text += "\n  " + std::to_string(rules::blockSizes[first].K) + " to " +
                std::to_string(rules::blockSizes[last].K) + " in steps of " + std::to_string(step);
        first = last;
    }
    return text + '\n';
}

std::string tableText(const BlockLayout& layout)
{
    std::string text = "i,pi\n";
    for (std::size_t i = 0; i < layout.interleaver.size(); ++i) {
        text += std::to_string(i) + ',' + std::to_string(layout.interleaver[i]) + '\n';
    }
    return text;
}

using Json = nlohmann::ordered_json;

Json cutJson(const rules::Cut& cut)
{
    Json lengths = Json::array();
    for (unsigned row = 0; row < cut.rows(); ++row) {
        lengths.push_back(cut.windowLength(row));
    }
    Json windows = Json::array();
    for (unsigned number = 0; number < cut.windows(); ++number) {
        const rules::Window window = cut.window(number);
        windows.push_back(
            {{"segment", window.segment}, {"row", window.row}, {"first", window.first}, {"last", window.last}});
    }
    return {{"num_pu", cut.units()},
            {"threads", cut.threads()},
            {"segments", cut.segments()},
            {"segment_length", cut.segmentLength()},
            {"rows", cut.rows()},
            {"window_lengths", lengths},
            {"windows", windows}};
}

Json formatsJson(const std::vector<NumberFormat>& formats)
{
    Json list = Json::array();
    for (const NumberFormat& format : formats) {
        list.push_back({{"what", format.what},
                        {"format", format.text},
                        {"bits", format.bits},
                        {"fraction_bits", format.fraction},
                        {"smallest", format.smallest},
                        {"largest", format.largest}});
    }
    return list;
}

Json layoutJson(const BlockLayout& layout, bool table)
{
    Json object = {{"block_size", layout.K},
                   {"f1", layout.f1},
                   {"f2", layout.f2},
                   {"soft_value_rows", layout.K + rules::tailPositions},
                   {"trellis_steps", layout.K + rules::tailSteps},
                   {"divisions", Json::array()}};
    for (const rules::Cut& cut : layout.cuts) {
        object["divisions"].push_back(cutJson(cut));
    }
    if (table) {
        object["interleaver"] = layout.interleaver;
    }
    object["formats"] = formatsJson(numberFormats());
    return object;
}

Json coreJson(const DecoderOptions& core)
{
    return {{"num_pu", core.generics.C_NUM_PU},
            {"algorithm", simulation::algorithmName(static_cast<unsigned>(core.generics.C_ALGORITHM_TYPE))},
            {"tag_width", core.generics.C_TAG_WIDTH},
            {"iterations", core.iterations}};
}

std::string generalInformation(const InfoOptions& options)
{
    const DecoderOptions usual;
    if (!options.json) {
        return "Core by default: " + coreText(usual.generics, usual.iterations) + "\n\n" + sizesText() + '\n' +
               formatsText(numberFormats());
    }
    Json object = {{"default_core", coreJson(usual)}, {"block_sizes", Json::array()}};
    for (const rules::BlockSize& size : rules::blockSizes) {
        object["block_sizes"].push_back({{"block_size", size.K}, {"f1", size.f1}, {"f2", size.f2}});
    }
    object["formats"] = formatsJson(numberFormats());
    return object.dump(2) + '\n';
}

std::string information(const InfoOptions& options)
{
    if (!options.K) {
        if (options.table || !options.plot.empty()) {
            throw std::invalid_argument(std::string(options.table ? "--table" : "--plot") + " needs a block size K");
        }
        return generalInformation(options);
    }
    if (rules::findBlockSize(*options.K) == nullptr) {
        throw std::invalid_argument(std::to_string(*options.K) + " is not a block size, " + blockSizesNear(*options.K));
    }
    const BlockLayout layout = layoutOf(*options.K);
    if (!options.plot.empty()) {
        report::writeDrawing(options.plot, pictureOf(layout));
    }
    if (options.json) {
        return layoutJson(layout, options.table).dump(2) + '\n';
    }
    return options.table ? tableText(layout) : layoutText(layout) + '\n' + formatsText(numberFormats());
}

int inform(const InfoOptions& options)
{
    print(information(options));
    return success;
}

}  // namespace

Command addInfo(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("info", "Show how the core handles a block size");
    const auto options = std::make_shared<InfoOptions>();

    command->add_option("K", options->K, "Block size in bits; without it, all block sizes")
        ->transform(integerFrom(0, UINT32_MAX))
        ->check(offer(blockSizeWords()))
        ->type_name("");
    command->add_flag("--table", options->table, "Print the interleaver as CSV instead; with --json, add it");
    command->add_flag("--json", options->json, "Print a JSON object instead of text, with all windows in order");
    command
        ->add_option(
            "--plot", options->plot, "Draw segments and windows in the order of computation, as .svg, .png or .pdf")
        ->type_name("FILE");
    command->footer(R"(Exit status: 0 done, 2 bad usage or a file that cannot be written.

Example:
  morvik info 1280 --plot windows.svg)");

    const auto run = [options] {
        return inform(*options);
    };
    return {command, run};
}

}  // namespace morvik
