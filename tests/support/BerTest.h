// BerTest: what the tests of `morvik ber` share.
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

/// A result file or a printed table with all times, and speeds, as T.
std::string withoutTimes(const std::string& text);

/// A row of a CSV file, by the names of its columns.
using CsvRow = std::map<std::string, std::string>;
std::vector<CsvRow> csvRows(const std::string& text);

/// Has the command at hand, in a directory of its own.
class BerTest : public CommandTest {
protected:
    /// Runs `morvik ber`, and expects that it succeeds. Returns what it printed.
    std::string ber(const Arguments& arguments) const;

    /// Runs `morvik ber` with an output file, whatever it was before, and returns that without times.
    std::string berFile(const Arguments& arguments, const std::string& output = "results.csv") const;

    /// Runs the command, and expects that it is refused in this one line.
    void expectRefused(const Arguments& arguments, const std::string& line) const;
};

}  // namespace morvik::support

#endif
