// Dumps as CSV, maps, and what is said of files that are no dumps.
#include <gtest/gtest.h>

#include <string>

#include "DumpText.h"

namespace morvik::comparison {
namespace {

void expectMapRefused(const std::string& json, const std::string& message)
{
    try {
        mapOf(json);
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), message);
    }
}

const std::string header = "half_iteration,step,signal,value\n";

TEST(CsvDump, ReadsValuesInAnyOrderOfRowsAndColumns)
{
    const Dump dump =
        read(readCsv, "window,value,signal,step,half_iteration\r\n0,-5,llr,7,1\r\n\r\n0,2047,alpha3,0,0\r\n");
    EXPECT_EQ(dump.values.at({1, llr, 7}), -5);
    EXPECT_EQ(dump.lineOf({1, llr, 7}), 2U);
    EXPECT_EQ(dump.values.at({0, alpha3, 0}), 2047);
    EXPECT_EQ(dump.lineOf({0, alpha3, 0}), 4U);
    EXPECT_FALSE(dump.values.has({0, llr, 7}));
}

TEST(CsvDump, ReadsWhatASpreadsheetWrites)
{
    const Dump dump = read(readCsv, "\xEF\xBB\xBFhalf_iteration,step,signal,value\r\n0,0,llr,5\r\n");
    EXPECT_EQ(dump.values.at({0, llr, 0}), 5);
}

TEST(CsvDump, ReadsBlanksAroundFieldsAndInEmptyLines)
{
    const Dump dump =
        read(readCsv, "half_iteration, step,\tsignal , value\r\n0, 1,\tllr ,\t 5 \r\n \t\r\n 0,2,llr,x \r\n");
    EXPECT_EQ(dump.values.at({0, llr, 1}), 5);
    EXPECT_TRUE(dump.values.isUnknown({0, llr, 2}));
}

TEST(Dump, RefusesWhatHasNoEndOrIsNoText)
{
    for (const Reader reader : {readCsv, readVcd}) {
        using namespace std::string_literals;
        const std::string tooLong = "dump:1: line is longer than 1048576 characters";
        expectEndlessRefused(reader, "\0"s, tooLong);
        expectEndlessRefused(reader, "$comment ", tooLong);
        expectRefused(reader, "\x1F\x8B\x08\n", "dump: is compressed with gzip; unpack it by 'gunzip FILE'");
        expectRefused(reader,
                      "\0\0\0\0\0\0\0\x01\x49\0"s,
                      "dump: is an FST waveform; convert it by GTKWave's 'fst2vcd FILE > FILE.vcd'");
    }
    expectEndlessRefused(readVcd, "\n", "dump:1000001: more than 1000000 blank lines");
}

TEST(CsvDump, ReadsAColumnForEachSignal)
{
    const Dump dump = read(readCsv, "block,half_iteration,step,unit,alpha3,llr\n0,1,7,0,-5,x\n0,0,0,0,,6\n");
    EXPECT_EQ(dump.values.at({1, alpha3, 7}), -5);
    EXPECT_TRUE(dump.values.isUnknown({1, llr, 7}));
    EXPECT_EQ(dump.values.at({0, alpha3, 0}), Values::missing);
    EXPECT_EQ(dump.values.at({0, llr, 0}), 6);
}

TEST(CsvDump, ReadsEachFormOfNumbers)
{
    const auto value = [](const std::string& form, const std::string& text) {
        return read(readCsv, header + "0,0,llr," + text + '\n', mapOf("{" + form + "}")).values.at({0, llr, 0});
    };
    EXPECT_EQ(value("", "-12"), -12);
    EXPECT_EQ(value("", "+12"), 12);
    EXPECT_EQ(value("", "-12.375"), -99);
    EXPECT_EQ(value("", "-12.375000"), -99);
    EXPECT_EQ(value("", "0xfff"), -1);
    EXPECT_EQ(value(R"("numbers": "integer")", "-12"), -12);
    EXPECT_EQ(value(R"("numbers": "unsigned")", "4095"), -1);
    EXPECT_EQ(value(R"("numbers": "real")", "-12"), -96);
    EXPECT_EQ(value(R"("numbers": "hex")", "800"), -2048);
    EXPECT_EQ(value(R"("numbers": "hex", "bits": 16)", "ffff"), -1);
    EXPECT_EQ(value(R"("numbers": "binary")", "100000000000"), -2048);
    EXPECT_EQ(value(R"("numbers": "hex", "bits": 8)", "f7"), -9);
    EXPECT_EQ(value(R"("numbers": "hex", "bits": {"llr": 8})", "f7"), -9);
    EXPECT_EQ(value(R"("numbers": "hex", "bits": {"extrinsic": 8})", "0f7"), 247);
}

TEST(CsvDump, TellsUnknownValuesFromMissingOnes)
{
    for (const char* const text :
         {"x", "X", "xxx", "zzzzzzzz", "0xxxx", "0x7x", "0Z1", "fX", "U", "uuuu", "W1", "--"}) {
        const Dump dump = read(readCsv, header + "0,0,llr," + text + "\n0,0,alpha3,1\n");
        EXPECT_TRUE(dump.values.isUnknown({0, llr, 0})) << text;
        EXPECT_FALSE(dump.values.has({0, llr, 0})) << text;
        EXPECT_EQ(dump.lineOf({0, llr, 0}), 2U);
        EXPECT_TRUE(dump.values.has({0, alpha3, 0})) << text;
    }
    const Dump binary = read(readCsv, header + "0,0,llr,0x0000000000\n", mapOf(R"({"numbers": "binary"})"));
    EXPECT_TRUE(binary.values.isUnknown({0, llr, 0}));
    for (const char* const text : {"", " "}) {
        const Dump dump = read(readCsv, header + "0,0,llr," + text + "\n");
        EXPECT_EQ(dump.values.at({0, llr, 0}), Values::missing);
        EXPECT_TRUE(dump.given[llr]);
        EXPECT_FALSE(dump.given[alpha3]);
    }
    const Dump before = read(readCsv, header + "x,x,llr,x\nX,0,llr,x\n0,0,llr,1\n");
    EXPECT_EQ(before.values.at({0, llr, 0}), 1);
}

TEST(CsvDump, TakesTheNamesOfAMap)
{
    const NameMap map = mapOf(R"({"columns": {"half_iteration": "pass", "step": "k", "signal": "net", "value": "v"},
        "signals": {"u.am3": "alpha3", "clk": null}, "first_half_iteration": 1, "first_step": 1})");
    const Dump dump = read(readCsv, "pass,k,net,v\n2,8,u.am3,5\n0,0,clk,1\n", map);
    EXPECT_EQ(dump.values.at({1, alpha3, 7}), 5);
}

TEST(CsvDump, NamesThePlaceOfAMistake)
{
    const std::string numbers =
        " is not allowed, expected an integer from -2048 to 2047, or a multiple of 1/8 with a point from -256.0 to "
        "255.875; use a map for other forms";
    expectRefused(readCsv, "", "dump:1: no header, expected the columns half_iteration, step, signal, value");
    expectRefused(readCsv, "a,b\n", R"(dump:1: no column "half_iteration" in the header "a,b")");
    expectRefused(readCsv, "half_iteration,step,llr,g0,llr\n", R"(dump:1: two columns are llr, "llr" and "llr")");
    expectRefused(readCsv, header + "0,0,llr\n", "dump:2: 3 fields, expected the 4 of the header");
    expectRefused(
        readCsv, header + "0,0,LLR,1\n", R"(dump:2: signal "LLR" is not known; use a map to name it, or to ignore it)");
    expectRefused(
        readCsv,
        header + "2,0,llr,1\n",
        R"(dump:2: half-iteration "2" is not allowed, expected an integer from 0 to 1; use a map if they count from 1)");
    expectRefused(readCsv,
                  header + "3,0,llr,1\n",
                  R"(dump:2: half-iteration "3" is not allowed, expected an integer from 0 to 1)");
    expectRefused(
        readCsv,
        header + "0,43,llr,1\n",
        R"(dump:2: step "43" is not allowed, expected an integer from 0 to 42; use a map if they count from 1)");
    expectRefused(readCsv, header + "0,0,llr,2048\n", R"(dump:2: llr "2048")" + numbers);
    expectRefused(readCsv, header + "0,0,llr,0.1\n", R"(dump:2: llr "0.1")" + numbers);
    expectRefused(readCsv, header + "0,0,llr,q\n", R"(dump:2: llr "q")" + numbers);
    expectRefused(readCsv, header + "0,0,llr,+-1\n", R"(dump:2: llr "+-1")" + numbers);
    expectRefused(readCsv, header + "0,0,llr,max\n", R"(dump:2: llr "max")" + numbers);
    expectRefused(readCsv, header + "0,0,llr,0x\n", R"(dump:2: llr "0x")" + numbers);
    expectRefused(readCsv,
                  header + "0,0,llr,1\n0,0,llr,1\n",
                  "dump:3: llr of this half-iteration and step stands in line 2, too");
    expectRefused(readCsv,
                  header + "0,0,llr,x\n0,0,llr,1\n",
                  "dump:3: llr of this half-iteration and step stands in line 2, too");
    expectRefused(readCsv,
                  header + "0,0,llr,1000\n",
                  R"(dump:2: llr "1000" is not allowed, expected a hexadecimal number of 12 bits)",
                  mapOf(R"({"numbers": "hex"})"));
}

TEST(CsvDump, HasABranchMetricStandForItsTwin)
{
    constexpr unsigned g0 = 1;
    constexpr unsigned g3 = 4;
    const std::string text = header + "0,0,g0,5\n0,1,g0,x\n1,7,g0,-6\n";
    const Dump dump = read(readCsv, text);
    EXPECT_EQ(dump.values.at({0, g3, 0}), 5);
    EXPECT_TRUE(dump.values.isUnknown({0, g3, 1}));
    EXPECT_EQ(dump.values.at({1, g3, 7}), -6);
    EXPECT_TRUE(dump.values.isCopy(g3));
    EXPECT_FALSE(dump.given[g3]);
    EXPECT_FALSE(dump.values.isCopy(g0));
    EXPECT_FALSE(read(readCsv, text + "0,0,g3,5\n").values.isCopy(g3));
    for (const char* const list : {R"(["g0", "g3"])", R"(["g3", "g0"])"}) {
        const std::string json = std::string(R"({"signals": {"bm": )") + list + "}}";
        const Dump mapped = read(readCsv, header + "0,0,bm,5\n", mapOf(json));
        EXPECT_EQ(mapped.values.at({0, g0, 0}), 5);
        EXPECT_EQ(mapped.values.at({0, g3, 0}), 5);
    }
    expectRefused(readCsv,
                  header + "0,0,bm,5\n0,0,g3,5\n",
                  R"(dump: has g3, for which "bm" stands in the map)",
                  mapOf(R"({"signals": {"bm": ["g0", "g3"]}})"));
}

TEST(CsvDump, RefusesAMapOfWhatItLacks)
{
    const std::string text = header + "0,0,llr,5\n";
    expectRefused(readCsv,
                  text,
                  "dump:1: no column \"ok\" in the header \"half_iteration,step,signal,value\"",
                  mapOf(R"({"valid": "ok"})"));
    const std::string columns = "half_iteration,step,llr,ratio\n";
    const std::string lacking = "dump: has no signal \"ratios\", which the map calls extrinsic";
    const NameMap misspelt = mapOf(R"({"signals": {"ratios": "extrinsic", "clk": null}})");
    expectRefused(readCsv, text, lacking, misspelt);
    expectRefused(readCsv, columns + "0,0,5,6\n", lacking, misspelt);
    expectRefused(readCsv,
                  columns + "0,0,5,6\n",
                  "dump:1: no column \"net\" in the header \"half_iteration,step,llr,ratio\"",
                  mapOf(R"({"columns": {"signal": "net"}})"));
    EXPECT_TRUE(
        read(readCsv, columns + "0,0,5,6\n", mapOf(R"({"signals": {"ratio": "extrinsic"}})")).values.has({0, llr, 0}));
}

TEST(NameMap, HasAnEndAndIsText)
{
    expectMapRefused(std::string((1U << 20) + 1, ' '), "map.json: is larger than 1048576 bytes");
    expectMapRefused(std::string(100000, '\0'), "map.json: is not text, it has a null character");
    expectMapRefused("\x1f\x8b{}", "map.json: is compressed with gzip; unpack it by 'gunzip FILE'");
    EXPECT_EQ(mapOf("\xEF\xBB\xBF{\"first_step\": 1}\r\n" + std::string(1000000, ' ')).firstStep, 1U);
}

TEST(NameMap, NamesWhatIsWrong)
{
    expectMapRefused("[]", "map.json: not a map, expected a JSON object");
    expectMapRefused("{", "map.json:1: no JSON, character 2 is not expected there");
    expectMapRefused("{\"bits\": 16,\n \"valid\" \"on\"}", "map.json:2: no JSON, character 13 is not expected there");
    expectMapRefused(R"({"signals": )" + std::string(100000, '[') + '}',
                     "map.json:1: character 44 opens more than 32 levels of lists and objects");
    expectMapRefused(R"({"bits": 16, "bits": 17})", "map.json:1: \"bits\" appears twice");
    expectMapRefused(R"({"bits": [[1]]})", "map.json: \"bits\" is a list, expected an integer from 8 to 32");
    expectMapRefused(R"({"signal": {}})",
                     "map.json: \"signal\" is not a key of a map, expected columns, signals, numbers, bits, "
                     "first_half_iteration, first_step, first_block, valid, clock or start");
    expectMapRefused(R"({"signals": {"a": "alpha8"}})",
                     "map.json: signal \"a\" is \"alpha8\", expected intrinsic, g0 to g3, alpha0 to alpha7, beta0 to "
                     "beta7, llr, extrinsic, and null");
    for (const char* const list :
         {"[]", R"(["g0"])", R"(["g0", "g1"])", R"(["llr", "llr"])", R"(["g0", "g3", "g3"])"}) {
        expectMapRefused(std::string(R"({"signals": {"bm": )") + list + "}}",
                         "map.json: signal \"bm\" is a list, expected two signals that are always equal: g0 and g3, or "
                         "g1 and g2");
    }
    expectMapRefused(R"({"signals": 1})", "map.json: \"signals\" is not an object");
    expectMapRefused(R"({"columns": {"row": "x"}})",
                     "map.json: column \"row\", expected half_iteration, step, signal, value or block");
    expectMapRefused(R"({"columns": {"step": 1}})", "map.json: \"step\" is no text");
    expectMapRefused(R"({"numbers": "octal"})",
                     "map.json: \"numbers\" is \"octal\", expected auto, integer, unsigned, real, hex or binary");
    expectMapRefused(R"({"valid": ""})", "map.json: \"valid\" is empty");
    expectMapRefused(R"({"bits": 64})", "map.json: \"bits\" is 64, expected an integer from 8 to 32");
    expectMapRefused(R"({"bits": {"g0": 7}})", "map.json: \"g0\" is 7, expected an integer from 8 to 32");
    expectMapRefused(R"({"bits": {"g": 8}})",
                     "map.json: bits of \"g\", expected intrinsic, g0 to g3, alpha0 to alpha7, beta0 to beta7, llr, "
                     "extrinsic");
}

}  // namespace
}  // namespace morvik::comparison
