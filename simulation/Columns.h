// Columns: the columns of result files, and how a row is written into them and read back.
#ifndef MORVIK_SIMULATION_COLUMNS_H
#define MORVIK_SIMULATION_COLUMNS_H

#include <string>
#include <string_view>
#include <vector>

#include "Results.h"

namespace morvik::simulation {

/// A column. JSON distinguishes numbers, texts, and lists of integers, which have spaces between them here.
struct Column {
    enum class Kind { number, text, list };

    std::string_view name;
    Kind kind;
    std::string (*write)(const ResultRow& row);
    bool (*read)(std::string_view text, ResultRow& row);  // false if the text cannot stand here
};

/// Whether the text can be a version: short, printable, and a field of CSV as it is.
bool isVersion(std::string_view version);

/// All columns, in their order. Rates and bounds are written for the reader's sake; reading computes them anew.
const std::vector<Column>& columns();

}  // namespace morvik::simulation

#endif
