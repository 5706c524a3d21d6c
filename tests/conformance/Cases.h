// Cases: the noisy blocks of the conformance file, with what the components of the model decide.
#ifndef MORVIK_TESTS_CONFORMANCE_CASES_H
#define MORVIK_TESTS_CONFORMANCE_CASES_H

#include <cstdint>
#include <istream>
#include <string>
#include <vector>

#include "support/Blocks.h"

namespace morvik::conformance {

struct Case {
    unsigned K;
    int units;
    int algorithm;
    unsigned iterations;
    blocks::Block soft;
    std::vector<std::uint8_t> bits;  ///< K decisions, each 0 or 1
};

/// All cases, made anew: the same on every machine.
std::vector<Case> makeCases();

/// The conformance file: README.md beside it tells its format.
std::string textOf(const std::vector<Case>& cases);

/// Reads a conformance file, as a test of a binding does. Throws std::runtime_error when it is none.
std::vector<Case> readCases(std::istream& text);

}  // namespace morvik::conformance

#endif
