// BerTest: fixture and helpers for the tests of `morvik ber`.
#ifndef MORVIK_TESTS_SUPPORT_BERTEST_H
#define MORVIK_TESTS_SUPPORT_BERTEST_H

#include <map>
#include <string>
#include <vector>

#include "CommandTest.h"

namespace morvik::support {

using Arguments = std::vector<std::string>;

/// The words of a text.
Arguments words(const std::string& text);

/// Both lists, one after the other.
Arguments operator+(Arguments first, const Arguments& second);

/// A result file or a printed table with all times and speeds replaced by T.
std::string withoutTimes(const std::string& text);

/// A row of a CSV file, by column name.
using CsvRow = std::map<std::string, std::string>;
std::vector<CsvRow> csvRows(const std::string& text);

/// Runs the command in a directory of its own.
class BerTest : public CommandTest {
protected:
    /// Runs `morvik ber`, expects success and returns its output.
    std::string ber(const Arguments& arguments) const;

    /// Runs `morvik ber` with an output file, overwriting it, and returns the file without times.
    std::string berFile(const Arguments& arguments, const std::string& output = "results.csv") const;

    /// Runs the command and expects a refusal with just this line.
    void expectRefused(const Arguments& arguments, const std::string& line) const;
};

}  // namespace morvik::support

#endif
