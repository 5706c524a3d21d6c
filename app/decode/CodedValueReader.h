// CodedValueReader: reads the soft values of transmissions of transport blocks from CSV.
#ifndef MORVIK_APP_DECODE_CODEDVALUEREADER_H
#define MORVIK_APP_DECODE_CODEDVALUEREADER_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <string>
#include <vector>

#include "base/Csv.h"
#include "base/LineReader.h"

namespace morvik {

/// The header line.
constexpr char codedValueHeader[] = "block,soft_values";

/// Reads one transmission at a time.
///
/// After the header, each row has the label of its transport block, a non-negative integer of any length, and a number
/// for each coded bit, which need not be an integer. Blank lines are allowed only at the end. Throws base::Error,
/// naming the line and the column.
class CodedValueReader {
public:
    /// Reads the header. `input` must outlive the reader; messages call it `name`. Rows have `codedBits` values.
    CodedValueReader(std::istream& input, const std::string& name, std::uint32_t codedBits);

    /// Reads the next row; false at the end.
    bool next();

    const std::string& label() const
    {
        return itsLabel;
    }

    const std::vector<float>& values() const
    {
        return itsValues;
    }

    /// Throws an Error about this row.
    [[noreturn]] void fail(const std::string& what) const
    {
        itsLines.fail(what);
    }

private:
    void readRow();

    base::LineReader itsLines;
    base::CsvReader itsRow{itsLines};
    std::uint32_t itsCodedBits;
    std::string itsLabel;
    std::vector<float> itsValues;
};

}  // namespace morvik

#endif
