// Columns: the columns of result files, with their readers and writers.
#ifndef MORVIK_SIMULATION_COLUMNS_H
#define MORVIK_SIMULATION_COLUMNS_H

#include <string>
#include <string_view>
#include <vector>

#include "Results.h"

namespace morvik::simulation {

/// A column. Its kind is its type in JSON; lists of integers are separated by spaces here.
struct Column {
    enum class Kind { number, text, list };

    std::string_view name;
    Kind kind;
    std::string (*write)(const ResultRow& row);
    bool (*read)(std::string_view text, ResultRow& row);  // false if the text is not valid here
    bool isWide = false;                                  // left out where all points are not wide
};

/// Whether the text is a valid version: short, printable, and a CSV field without quotes.
bool isVersion(std::string_view version);

/// The columns of a file, in order: of one with a wide point, or of any other. Rates and bounds are written for the
/// reader; reading recomputes them.
const std::vector<Column>& columns(bool isWide);

/// Completes a row that has been read: what follows from its columns. Returns what in it contradicts the rest; nothing
/// if all goes together.
std::string contradictionIn(ResultRow& row);

}  // namespace morvik::simulation

#endif
