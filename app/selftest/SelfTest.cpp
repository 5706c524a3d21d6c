// SelfTest: the subcommand that checks that library and processor produce the promised bits.
#include "SelfTest.h"

#include <cstdio>
#include <memory>
#include <nlohmann/json.hpp>
#include <string>

#include "Notice.h"
#include "SelfCheck.h"
#include "simulation/Point.h"

namespace morvik {

namespace {

struct SelfTestOptions {
    bool json = false;
};

std::string outcomeText(const selftest::Outcome& outcome, bool isNeeded)
{
    const std::size_t all = selftest::promise.configurations.size();
    char line[120];
    if (!outcome.available) {
        std::snprintf(line,
                      sizeof line,
                      "  %-10s  %s\n",
                      outcome.instructionSet.c_str(),
                      isNeeded ? "MISSING, was not checked" : "not on this machine");
        return line;
    }
    std::snprintf(line,
                  sizeof line,
                  "  %-10s  %s  %zu of %zu configurations  %6.2f s\n",
                  outcome.instructionSet.c_str(),
                  outcome.differences.empty() && outcome.configurations == all ? "right" : "WRONG",
                  outcome.configurations - outcome.differences.size(),
                  all,
                  outcome.seconds);
    std::string text = line;
    for (const selftest::Difference& each : outcome.differences) {
        text += "    " + std::to_string(each.numPu) + " units, " +
                simulation::algorithmName(static_cast<unsigned>(each.algorithm)) + ": digest " +
                selftest::hexadecimal(each.found) + ", expected " + selftest::hexadecimal(each.expected) + '\n';
    }
    return text;
}

std::string findingsText(const selftest::Findings& findings)
{
    std::string text = std::to_string(findings.blocks) + " blocks of " + std::to_string(findings.bits) +
                       " bits, all 188 sizes: " + (findings.blocksRight ? "right" : "WRONG") + " (digest " +
                       selftest::hexadecimal(findings.blockDigest) + ")\nIn use: " + findings.inUse + '\n';
    for (const selftest::Outcome& outcome : findings.outcomes) {
        text += outcomeText(outcome, findings.needs(outcome));
    }
    const std::string decided = std::to_string(findings.bits * findings.configurations());
    text += "Checked: " + decided + " decisions and " + decided + " ratios in " +
            std::to_string(findings.configurations()) + " configurations\n";
    return text + (findings.right() ? "Passed: this machine gives the promised bits.\n"
                                    : "FAILED: this machine does not give the promised bits.\n");
}

nlohmann::ordered_json jsonOf(const selftest::Outcome& outcome)
{
    nlohmann::ordered_json differences = nlohmann::ordered_json::array();
    for (const selftest::Difference& each : outcome.differences) {
        differences.push_back({{"num_pu", each.numPu},
                               {"algorithm", simulation::algorithmName(static_cast<unsigned>(each.algorithm))},
                               {"expected", selftest::hexadecimal(each.expected)},
                               {"found", selftest::hexadecimal(each.found)}});
    }
    return {{"instruction_set", outcome.instructionSet},
            {"available", outcome.available},
            {"configurations", outcome.configurations},
            {"differences", differences},
            {"seconds", outcome.seconds}};
}

std::string jsonOf(const selftest::Findings& findings)
{
    nlohmann::ordered_json object = {{"version", MORVIK_VERSION},
                                     {"passed", findings.right()},
                                     {"in_use", findings.inUse},
                                     {"blocks", findings.blocks},
                                     {"bits", findings.bits},
                                     {"block_digest", selftest::hexadecimal(findings.blockDigest)},
                                     {"blocks_right", findings.blocksRight},
                                     {"instruction_sets", nlohmann::ordered_json::array()}};
    for (const selftest::Outcome& outcome : findings.outcomes) {
        object["instruction_sets"].push_back(jsonOf(outcome));
    }
    return object.dump(2) + '\n';
}

int test(const SelfTestOptions& options)
{
    const selftest::Findings findings = selftest::check();
    print(options.json ? jsonOf(findings) : findingsText(findings));
    return findings.right() ? success : differencesFound;
}

}  // namespace

Command addSelfTest(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("selftest", "Check that this machine computes the promised bits");
    const auto options = std::make_shared<SelfTestOptions>();
    command->add_flag("--json", options->json, "Print a JSON object instead of text");
    command->footer(R"(Decodes blocks of all sizes in every configuration, with each instruction set that the machine
has and with the components of the model, and compares digests of the decisions and log-likelihood
ratios with the promised ones.

Exit status: 0 all match, 1 some differ, 2 bad usage.)");

    const auto run = [options] {
        return test(*options);
    };
    return {command, run};
}

}  // namespace morvik
