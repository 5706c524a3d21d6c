// Csv: reads comma-separated values of any origin.
#ifndef MORVIK_BASE_CSV_H
#define MORVIK_BASE_CSV_H

#include <cstddef>
#include <optional>
#include <string_view>
#include <vector>

#include "LineReader.h"

namespace morvik::base {

/// Splits a line at its commas into at least one field, without surrounding blanks.
std::vector<std::string_view> fieldsOf(std::string_view line);

/// Reads lines as rows of fields. Knows no quoting: quotation marks are ordinary characters, and no field has a comma.
class CsvReader {
public:
    /// `lines` must outlive the reader.
    explicit CsvReader(LineReader& lines) : itsLines(lines) {}

    /// Goes to the next line; false at the end.
    bool next();

    /// Splits the line that `lines` already stands at.
    void takeLine();

    /// The fields of the row, at least one, without surrounding blanks. Valid until the next line.
    const std::vector<std::string_view>& fields() const
    {
        return itsFields;
    }

    /// Whether the row has exactly the fields of `line`; for checking headers.
    bool is(std::string_view line) const;

    /// Goes to the next line, which has to be `header`. Throws Error, naming the line, if it is not.
    void expectHeader(std::string_view header);

    /// The index of the first field that equals `text`.
    std::optional<std::size_t> find(std::string_view text) const;

private:
    LineReader& itsLines;
    std::vector<std::string_view> itsFields;
};

}  // namespace morvik::base

#endif
