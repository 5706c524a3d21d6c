// CommandTest: what the tests of the command share.
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

/// The decision of a block of 40 zero bits, as the command prints it.
extern const std::string zeroDecision;

/// Rows of a block of zero bits, sent without noise: the all-zero codeword, tail included.
std::string zeroRows(const std::string& label, std::size_t count);

/// A file of two blocks of 40 zero bits; the rows are in the lines 2 to 45 and 46 to 89.
std::string twoBlocks();

/// The text with one of its lines, counted from 1, replaced.
std::string withLine(const std::string& text, std::size_t number, const std::string& line);

/// The path of a file of the test data, whatever the directory of the run.
std::string vectors(const std::string& file);

/// Whether the text is the line of the core and the summary that begins so and ends in the throughput, and nothing
/// else.
testing::AssertionResult isSummary(const std::string& text, const std::string& beginning);

/// Has the command at hand, in a directory of its own.
class CommandTest : public testing::Test {
protected:
    CommandTest();

    /// Decodes the text, as the file in.csv.
    CommandResult decode(const std::string& text, const std::vector<std::string>& options = {}) const;

    const CommandRunner morvik;
};

}  // namespace morvik::support

#endif
