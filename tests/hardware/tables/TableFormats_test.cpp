// The formats of tables: what they write, that they read it again, and what they refuse.
#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "base/Error.h"
#include "hardware/tables/Formats.h"
#include "support/TemporaryFolder.h"

namespace {

using morvik::tables::Column;
using morvik::tables::findFormat;
using morvik::tables::Format;
using morvik::tables::formats;
using morvik::tables::Row;
using morvik::tables::storageOf;
using morvik::tables::Table;

const Table pairs = {"pairs", {{"left", 8, true}, {"right", 4, false}}};
const Table bits = {"bits", {{"bit", 1, false}}};

void write(const Format& format, const std::string& folder, const Table& table, const std::vector<Row>& rows)
{
    const auto writer = format.writer(folder, table);
    for (std::size_t i = 0; i < rows.size(); ++i) {
        writer->add(static_cast<std::uint32_t>(i / 2), rows[i]);
    }
    writer->finish();
}

std::vector<Row> read(const Format& format, const std::string& folder, const Table& table)
{
    const auto reader = format.reader(folder, table);
    std::vector<Row> rows;
    for (Row row; reader->next(row);) {
        rows.push_back(row);
    }
    return rows;
}

/// What the rows of a table become in a file.
std::string written(const std::string& format,
                    const Table& table,
                    const std::vector<Row>& rows,
                    const std::string& file)
{
    const morvik::support::TemporaryFolder folder;
    write(*findFormat(format), folder.path(), table, rows);
    return folder.read(file);
}

/// Expects that a file is refused with this message, in which FOLDER/ stands before the name of the file.
void expectRefused(const std::string& format,
                   const std::string& file,
                   const std::string& text,
                   const std::string& message)
{
    const morvik::support::TemporaryFolder folder;
    folder.write(file, text);
    try {
        read(*findFormat(format), folder.path(), file[0] == 'b' ? bits : pairs);
        FAIL() << "accepted: " << text;
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), folder.path() + '/' + message);
    }
}

TEST(TableFormats, ReadWhatTheyWrite)
{
    const std::vector<Table> tables = {
        pairs,
        bits,
        {"wide", {{"unsigned", 32, false}, {"small", 1, false}}},
        {"mixed", {{"tag", 13, false}, {"metric", 12, true}, {"byte", 8, true}, {"word", 16, true}}},
        {"full", {{"signed", 32, true}}},
    };
    for (const Format& format : formats()) {
        for (const Table& table : tables) {
            // The smallest, the largest and some values between.
            std::vector<Row> rows(5);
            for (const Column& column : table.columns) {
                const std::int64_t range = std::int64_t{1} << column.bits;
                const std::int64_t lowest = column.isSigned ? -range / 2 : 0;
                const std::vector<std::int64_t> values = {
                    lowest, lowest + range - 1, lowest + range / 3, 0, lowest + 1};
                for (std::size_t i = 0; i < rows.size(); ++i) {
                    rows[i].push_back(values[i]);
                }
            }
            const morvik::support::TemporaryFolder folder;
            write(format, folder.path(), table, rows);
            EXPECT_EQ(read(format, folder.path(), table), rows) << format.name << ' ' << table.name;
            EXPECT_EQ(folder.names(), format.files(table));
        }
    }
}

TEST(TableFormats, StoreInTheSmallestIntegers)
{
    EXPECT_EQ(storageOf(pairs).bits, 8U);
    EXPECT_TRUE(storageOf(pairs).isSigned);
    EXPECT_FALSE(storageOf(bits).isSigned);
    EXPECT_EQ(storageOf({"t", {{"sign", 8, true}, {"none", 8, false}}}).bits, 16U);
    EXPECT_EQ(storageOf({"t", {{"sign", 12, true}, {"none", 13, false}}}).bits, 16U);
    EXPECT_EQ(storageOf({"t", {{"none", 16, false}}}).bits, 16U);
    EXPECT_EQ(storageOf({"t", {{"none", 17, false}}}).bits, 32U);
}

// ---- What they write

TEST(TableFormats, MemhPutsTheFirstColumnIntoTheLowestDigits)
{
    EXPECT_EQ(written("memh", pairs, {{-128, 15}, {127, 1}, {-1, 0}}, "pairs.memh"),
              "// pairs: hexadecimal digits of a word, from the left: right 1, left 2\n"
              "f80\n17f\n0ff\n");
    EXPECT_EQ(written("memh", bits, {{1}, {0}}, "bits.memh"),
              "// bits: hexadecimal digits of a word, from the left: bit 1\n1\n0\n");
}

TEST(TableFormats, CsvOpensWithTheBlock)
{
    EXPECT_EQ(written("csv", pairs, {{-128, 15}, {127, 1}, {-1, 0}}, "pairs.csv"),
              "block,left,right\n0,-128,15\n0,127,1\n1,-1,0\n");
}

TEST(TableFormats, CHasASourceAndAHeader)
{
    EXPECT_EQ(written("c", pairs, {{-128, 15}, {127, 1}}, "pairs.c"),
              "#include \"pairs.h\"\n\nconst int8_t morvik_pairs[MORVIK_PAIRS_ROWS][2] = {\n"
              "    {-128, 15},\n    {127, 1},\n};\n");
    EXPECT_EQ(
        written("c", pairs, {{-128, 15}, {127, 1}}, "pairs.h"),
        "/* Columns: left, right */\n#ifndef MORVIK_PAIRS_ROWS\n#define MORVIK_PAIRS_ROWS 2\n\n#include <stdint.h>\n\n"
        "extern const int8_t morvik_pairs[MORVIK_PAIRS_ROWS][2];\n\n#endif\n");
    EXPECT_EQ(written("c", bits, {{1}, {0}}, "bits.c"),
              "#include \"bits.h\"\n\nconst uint8_t morvik_bits[MORVIK_BITS_ROWS] = {\n    1U,\n    0U,\n};\n");
}

TEST(TableFormats, NpyIsOfVersionOne)
{
    const std::string wide = written("npy", {"wide", {{"one", 13, false}, {"two", 12, true}}}, {{258, -2}}, "wide.npy");
    const std::string header = "{'descr': '<i2', 'fortran_order': False, 'shape': (1, 2), }";
    ASSERT_EQ(wide.size(), 128U + 4);
    EXPECT_EQ(wide.substr(0, 10), std::string("\x93NUMPY\x01\x00\x76\x00", 10));
    EXPECT_EQ(wide.substr(10, header.size()), header);
    EXPECT_EQ(wide.substr(10 + header.size(), 118 - header.size() - 1), std::string(118 - header.size() - 1, ' '));
    EXPECT_EQ(wide.substr(127), std::string("\n\x02\x01\xfe\xff", 5));
    EXPECT_EQ(written("npy", bits, {{1}, {0}, {1}}, "bits.npy").substr(10, 61),
              "{'descr': '|u1', 'fortran_order': False, 'shape': (3,), }    ");
}

TEST(TableFormats, CsvMayHaveAByteOrderMarkAndBlanks)
{
    const morvik::support::TemporaryFolder folder;
    folder.write("bits.csv",
                 "\xEF\xBB\xBF"
                 "block , bit\r\n 0 ,\t1 \r\n0,0\n");
    EXPECT_EQ(read(*findFormat("csv"), folder.path(), bits), (std::vector<Row>{{1}, {0}}));
}

// ---- What they refuse

TEST(TableFormats, MemhNamesThePlace)
{
    expectRefused(
        "memh", "pairs.memh", "// x\n\n17f\n17\n", "pairs.memh:4: word \"17\", expected 3 hexadecimal digits");
    expectRefused("memh", "pairs.memh", "1xf\n", "pairs.memh:1: word \"1xf\", expected 3 hexadecimal digits");
    expectRefused("memh", "bits.memh", "0\n2\n", "bits.memh:2: bit 2 is not allowed, expected 0 to 1");
}

TEST(TableFormats, CsvNamesThePlace)
{
    const std::string header = "block,left,right\n";
    const std::string expected = ", expected 3 decimal integers with commas between them";
    expectRefused("csv", "pairs.csv", "block,left\n", "pairs.csv:1: expected \"block,left,right\"");
    expectRefused("csv", "pairs.csv", header + "0,1\n", "pairs.csv:2: row \"0,1\"" + expected);
    expectRefused("csv", "pairs.csv", header + "0,1,2\n0,1,x\n", "pairs.csv:3: row \"0,1,x\"" + expected);
    expectRefused("csv", "pairs.csv", header + "0,1,2,3\n", "pairs.csv:2: row \"0,1,2,3\"" + expected);
    expectRefused(
        "csv", "pairs.csv", header + "0,128,2\n", "pairs.csv:2: left 128 is not allowed, expected -128 to 127");
}

TEST(TableFormats, CNamesThePlace)
{
    const std::string beginning = "const int8_t morvik_pairs[MORVIK_PAIRS_ROWS][2] = {";
    expectRefused("c", "pairs.c", "int x;\n", "pairs.c:1: no line \"" + beginning + '"');
    expectRefused("c", "pairs.c", beginning + "\n    {1, 2},\n", "pairs.c:2: no line \"};\"");
    expectRefused("c",
                  "pairs.c",
                  beginning + "\n    {1, 2, 3},\n};\n",
                  "pairs.c:2: row \"    {1, 2, 3},\", expected 2 decimal integers as they were written");
    expectRefused(
        "c", "pairs.c", beginning + "\n    {1, 16},\n};\n", "pairs.c:2: right 16 is not allowed, expected 0 to 15");
}

TEST(TableFormats, NpyNamesThePlace)
{
    const std::string good = written("npy", pairs, {{-128, 15}, {127, 1}}, "pairs.npy");
    expectRefused("npy", "pairs.npy", "", "pairs.npy: is not the NumPy array that was written");
    expectRefused("npy",
                  "pairs.npy",
                  written("npy", bits, {{1}}, "bits.npy"),
                  "pairs.npy: is not the NumPy array that was written");
    expectRefused("npy", "pairs.npy", good.substr(0, good.size() - 1), "pairs.npy: ends before row 1");
    expectRefused("npy", "pairs.npy", good + "x", "pairs.npy: has more numbers than its shape says");
    std::string wrong = good;
    wrong[131] = 16;
    expectRefused("npy", "pairs.npy", wrong, "pairs.npy: row 1: right 16 is not allowed, expected 0 to 15");
}

TEST(TableFormats, ReportAMissingFile)
{
    for (const Format& format : formats()) {
        const morvik::support::TemporaryFolder folder;
        try {
            read(format, folder.path(), pairs);
            FAIL() << format.name;
        } catch (const morvik::base::Error& error) {
            EXPECT_EQ(error.what(),
                      folder.path() + '/' + format.files(pairs)[0] + ": cannot be opened: No such file or directory");
        }
    }
}

TEST(TableFormats, ReportAFileThatCannotBeWritten)
{
    for (const Format& format : formats()) {
        EXPECT_THROW(write(format, "/dev/null", pairs, {{1, 1}}), morvik::base::Error) << format.name;
    }
}

TEST(TableFormats, KnowNoOtherName)
{
    EXPECT_EQ(findFormat("vhdl"), nullptr);
}

}  // namespace
