// Kernel trace tables: what dumpGamma, dumpAlphaBeta and dumpExtrinsic print.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "TCalculationEngineModBase.h"
#include "support/CommaLocale.h"

namespace {

const std::string gammaHeader =
    "n    intrinsic   parity0     parity1        g1[0]        g1[1]        g1[2]        g1[3]          g2[0]        "
    "g2[1]        g2[2]        g2[3]\n";
const std::string alphaBetaHeader =
    "n    g4          g5          g6          g7             ab1[0]       ab1[1]       ab1[2]       ab1[3]       "
    "ab1[4]       ab1[5]       ab1[6]       ab1[7]         ab2[0]       ab2[1]       ab2[2]       ab2[3]       "
    "ab2[4]       ab2[5]       ab2[6]       ab2[7]\n";
const std::string extrinsicHeader =
    "n    a[0]        a[1]        a[2]        a[3]        a[4]        a[5]        a[6]        a[7]          "
    "b[0]        b[1]        b[2]        b[3]        b[4]        b[5]        b[6]        b[7]          "
    "g[4]        g[5]        g[6]        g[7]           e1           e2\n";

const TNumberFormat stateFormat(12, 3);

/// The columns of three steps: different values, negative ones and one that uses bits below a step.
const T8 columns[3] = {{{0, 16, -16, 128, -128, 2032, -2048, 24}},
                       {{1600, 1616, 1632, 1648, 1664, 1680, 1696, 1712}},
                       {{-32768, 32752, 8, -8, 15, -15, 1, -1}}};
const short values[3] = {-32768, 100, 16};

/// Where the columns of numbers begin in the header: each label stands above the first character of
/// its values, so the header itself tells whether the spacing is right.
std::vector<std::size_t> labelPlaces(const std::string& header)
{
    std::vector<std::size_t> places;
    for (std::size_t i = 0; i < header.size(); ++i) {
        if (header[i] != ' ' && header[i] != '\n' && (i == 0 || header[i - 1] == ' ')) {
            places.push_back(i);
        }
    }
    return places;
}

std::vector<std::string> lines(const std::string& text)
{
    std::vector<std::string> all;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) {
        all.push_back(line);
    }
    return all;
}

/// Each value of a row, read where the header says that it begins; the mark before it is kept.
std::vector<std::string> fields(const std::string& header, const std::string& row)
{
    std::vector<std::string> all;
    for (const std::size_t place : labelPlaces(header)) {
        const std::string field = row.substr(place, row.find(' ', place) - place);
        all.push_back((place > 0 && row[place - 1] == '*' ? "*" : "") + field);
    }
    return all;
}

}  // namespace

TEST(KernelTraceTables, PrintTheHeaderAloneForNoSteps)
{
    std::ostringstream gamma;
    dumpGamma(gamma, 0, values, values, values, columns, columns, stateFormat);
    EXPECT_EQ(gamma.str(), gammaHeader);
    std::ostringstream alphaBeta;
    dumpAlphaBeta(alphaBeta, 0, columns, columns, columns, stateFormat);
    EXPECT_EQ(alphaBeta.str(), alphaBetaHeader);
    std::ostringstream extrinsic;
    dumpExtrinsic(extrinsic, 0, columns, columns, columns, values, values, stateFormat);
    EXPECT_EQ(extrinsic.str(), extrinsicHeader);
}

TEST(KernelTraceTables, PrintBranchMetricsSideBySide)
{
    T8 other = columns[0];
    other[1] = 32;
    other[7] = 0;  // not a branch metric
    const short intrinsic = 0;
    const short parity0 = -24;
    const short parity1 = 2032;
    std::ostringstream table;
    dumpGamma(table, 1, &intrinsic, &parity0, &parity1, columns, &other, stateFormat);
    EXPECT_EQ(table.str(),
              gammaHeader +
                  "0    +0.000000   -0.250000   +15.875000     +0.000000   *+0.125000    -0.125000    +1.000000   "
                  "   +0.000000   *+0.250000    -0.125000    +1.000000   \n");
}

TEST(KernelTraceTables, PrintStateMetricsUnderTheirLabels)
{
    T8 other[3] = {columns[0], columns[1], columns[2]};
    other[1][0] = 0;
    other[1][7] = 0;
    std::ostringstream table;
    dumpAlphaBeta(table, 3, columns, columns, other, stateFormat);
    const std::vector<std::string> rows = lines(table.str());
    ASSERT_EQ(rows.size(), 4U);
    using Fields = std::vector<std::string>;
    EXPECT_EQ(
        fields(alphaBetaHeader, rows[2]),
        (Fields{"1",          "+13.000000", "+13.125000", "+13.250000", "+13.375000", "*+12.500000", "+12.625000",
                "+12.750000", "+12.875000", "+13.000000", "+13.125000", "+13.250000", "*+13.375000", "*+0.000000",
                "+12.625000", "+12.750000", "+12.875000", "+13.000000", "+13.125000", "+13.250000",  "*+0.000000"}));
    EXPECT_EQ(rows[1].size(), 5 + 4 * 12 + 2 + 8 * 13 + 2 + 8 * 13U);
}

TEST(KernelTraceTables, PrintExtrinsicValuesUnderTheirLabels)
{
    const short others[3] = {-32768, 99, 15};
    std::ostringstream table;
    dumpExtrinsic(table, 3, columns, columns, columns, values, others, stateFormat);
    const std::vector<std::string> rows = lines(table.str());
    ASSERT_EQ(rows.size(), 4U);
    using Fields = std::vector<std::string>;
    EXPECT_EQ(fields(extrinsicHeader, rows[3]),
              (Fields{"2",         "-256.000000", "+255.875000", "+0.000000",   "-0.125000",   "+0.000000",
                      "-0.125000", "+0.000000",   "-0.125000",   "-256.000000", "+255.875000", "+0.000000",
                      "-0.125000", "+0.000000",   "-0.125000",   "+0.000000",   "-0.125000",   "+0.000000",
                      "-0.125000", "+0.000000",   "-0.125000",   "*+0.125000",  "*+0.000000"}));
    EXPECT_EQ(fields(extrinsicHeader, rows[1]).back(), "-256.000000");
    EXPECT_EQ(rows[1].size(), 5 + 8 * 12 + 2 + 8 * 12 + 2 + 4 * 12 + 2 + 2 * 13U);
}

TEST(KernelTraceTables, MarkNothingInEqualArrays)
{
    std::ostringstream table;
    dumpGamma(table, 3, values, values, values, columns, columns, stateFormat);
    dumpAlphaBeta(table, 3, columns, columns, columns, stateFormat);
    dumpExtrinsic(table, 3, columns, columns, columns, values, values, stateFormat);
    EXPECT_EQ(table.str().find('*'), std::string::npos);
}

TEST(KernelTraceTables, DoNotDependOnTheStreamsFlags)
{
    std::ostringstream plain;
    dumpGamma(plain, 3, values, values, values, columns, columns, stateFormat);
    std::ostringstream odd;
    odd << std::hex << std::showpoint << std::uppercase;
    odd.width(40);
    dumpGamma(odd, 3, values, values, values, columns, columns, stateFormat);
    EXPECT_EQ(odd.str(), plain.str());
}

TEST(KernelTraceTables, DoNotDependOnTheGlobalLocale)
{
    std::ostringstream plain;
    dumpGamma(plain, 3, values, values, values, columns, columns, stateFormat);
    const CommaLocale locale;
    std::ostringstream foreign;
    dumpGamma(foreign, 3, values, values, values, columns, columns, stateFormat);
    EXPECT_EQ(foreign.str(), plain.str());
}
