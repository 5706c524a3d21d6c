// Lockstep: a dump's values, handed to the checker one after the other as a simulation would.
#ifndef MORVIK_TESTS_APP_LOCKSTEP_H
#define MORVIK_TESTS_APP_LOCKSTEP_H

#include <array>
#include <iostream>
#include <sstream>
#include <string>
#include <vector>

#include "hardware/comparison/Dump.h"
#include "hardware/comparison/Model.h"
#include "support/Checkers.h"

namespace morvik::support {

/// What the checker says of the values of a dump.
struct Lockstep {
    std::vector<std::string> messages;
    int standing = 0;
    std::string report;
};

/// Hands over the values of a step: a row, or a value.
inline void observeStep(
    const Checker& checker, const comparison::Values& values, unsigned pass, Stage stage, unsigned step)
{
    const auto [first, count] = signalsOf(stage);
    std::array<std::int32_t, 8> row{};
    for (unsigned i = 0; i < count; ++i) {
        row[i] = values.at({pass, first + i, step});
    }
    const auto number = [](unsigned value) {
        return static_cast<std::int32_t>(value);
    };
    if (count > 1) {
        morvik_checker_observe_row(checker.get(), number(first), number(pass), number(step), row.data());
    } else {
        morvik_checker_observe(checker.get(), number(first), number(pass), number(step), row[0]);
    }
}

/// Observes a dump that has every value of the core, in the order in which the core computes them.
inline Lockstep observeInLockstep(
    const std::string& csv, const blocks::Block& block, int units, int algorithm, int iterations)
{
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = units;
    generics.C_ALGORITHM_TYPE = algorithm;
    const comparison::Model model = comparison::computeModel(
        {block.sys, block.par1, block.par2}, generics, static_cast<unsigned>(iterations), std::cerr);
    comparison::Dump dump(model.values.passes(), model.values.steps());
    std::istringstream input(csv);
    comparison::readCsv(input, "rtl.csv", {}, dump);

    const Checker checker = makeChecker(units, algorithm);
    start(checker, block, iterations);
    messagesOf(checker);  // warnings about soft values
    for (unsigned pass = 0; pass < dump.values.passes(); ++pass) {
        for (const Stage stage : stages) {
            for (const unsigned step : comparison::stepsInOrder(model.cut, stage)) {
                observeStep(checker, dump.values, pass, stage, step);
            }
        }
    }
    return {messagesOf(checker), morvik_checker_standing(checker.get()), morvik_checker_report(checker.get())};
}

}  // namespace morvik::support

#endif
