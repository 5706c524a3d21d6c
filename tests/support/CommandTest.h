// CommandTest: fixture and helpers for the tests of the command.
#ifndef MORVIK_TESTS_SUPPORT_COMMANDTEST_H
#define MORVIK_TESTS_SUPPORT_COMMANDTEST_H

#include <gtest/gtest.h>

#include <cstddef>
#include <string>
#include <vector>

#include "CommandRunner.h"

namespace morvik::support {

/// The first line of every file of soft values.
extern const std::string header;

/// The command's output line for a block of 40 zero bits.
extern const std::string zeroDecision;

/// The rows of a noiseless block of zero bits: the all-zero codeword, tail included.
std::string zeroRows(const std::string& label, std::size_t count);

/// A file of two blocks of 40 zero bits, with rows in lines 2 to 45 and 46 to 89.
std::string twoBlocks();

/// The text with one line, counted from 1, replaced.
std::string withLine(const std::string& text, std::size_t number, const std::string& line);

/// The path of a test data file, valid in any working directory.
std::string vectors(const std::string& file);

/// Whether the text consists of the line of the core and a summary that begins so and ends in the throughput.
testing::AssertionResult isSummary(const std::string& text, const std::string& beginning);

/// Runs the command in a directory of its own.
class CommandTest : public testing::Test {
protected:
    CommandTest();

    /// Decodes the text, as the file in.csv.
    CommandResult decode(const std::string& text, const std::vector<std::string>& options = {}) const;

    const CommandRunner morvik;
};

}  // namespace morvik::support

#endif
