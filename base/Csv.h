// Csv: comma-separated values, from whatever program they come.
#ifndef MORVIK_BASE_CSV_H
#define MORVIK_BASE_CSV_H

#include <cstddef>
#include <optional>
#include <string_view>
#include <vector>

#include "LineReader.h"

namespace morvik::base {

/// The texts between the commas, at least one, without the blanks around them.
std::vector<std::string_view> fieldsOf(std::string_view line);

/// The lines of a text as rows of fields. No field has a comma: quotation marks are characters like others.
class CsvReader {
public:
    /// `lines` outlive the reader.
    explicit CsvReader(LineReader& lines) : itsLines(lines) {}

    /// Goes to the next line; false at the end.
    bool next();

    /// Takes the line that `lines` have come to by themselves.
    void takeLine();

    /// The fields of the row, at least one, without the blanks around them. Valid until the next line.
    const std::vector<std::string_view>& fields() const
    {
        return itsFields;
    }

    /// Whether the row has the fields of this line, as a header has to.
    bool is(std::string_view line) const;

    /// The first field of the row that is this text.
    std::optional<std::size_t> find(std::string_view text) const;

private:
    LineReader& itsLines;
    std::vector<std::string_view> itsFields;
};

}  // namespace morvik::base

#endif
