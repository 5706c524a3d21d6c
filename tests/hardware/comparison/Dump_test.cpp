// Dumps: CSV and VCD read, maps, and what is said of files that are none.
#include "hardware/comparison/Dump.h"

#include <gtest/gtest.h>

#include <sstream>
#include <streambuf>
#include <string>
#include <utility>

#include "base/Error.h"

namespace {

using namespace morvik::comparison;

NameMap mapOf(const std::string& json)
{
    std::istringstream input(json);
    return readNameMap(input, "map.json");
}

using Reader = void (*)(std::istream&, const std::string&, const NameMap&, Dump&);

/// Two passes of 43 steps.
Dump read(Reader reader, const std::string& text, const NameMap& map = {})
{
    std::istringstream input(text);
    Dump dump(2, 43);
    reader(input, "dump", map, dump);
    return dump;
}

void expectRefused(Reader reader, const std::string& text, const std::string& message, const NameMap& map = {})
{
    try {
        read(reader, text, map);
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), message);
    }
}

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
constexpr unsigned alpha3 = 8;
constexpr unsigned llr = 21;

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

/// Gives the text over and over.
class Endless : public std::streambuf {
public:
    explicit Endless(std::string text) : itsText(std::move(text)) {}

protected:
    int_type underflow() override
    {
        setg(itsText.data(), itsText.data(), itsText.data() + itsText.size());
        return traits_type::to_int_type(itsText.front());
    }

private:
    std::string itsText;
};

TEST(Dump, RefusesWhatHasNoEndOrIsNoText)
{
    for (const Reader reader : {readCsv, readVcd}) {
        using namespace std::string_literals;
        const auto expectEnd = [reader](const std::string& text, const std::string& message) {
            Endless content(text);
            std::istream input(&content);
            Dump dump(2, 43);
            try {
                reader(input, "dump", {}, dump);
                FAIL() << "accepted";
            } catch (const morvik::base::Error& error) {
                EXPECT_EQ(error.what(), message);
            }
        };
        expectEnd("\0"s, "dump:1: line is too long, allowed are 1048576 characters");
        expectEnd("$comment ", "dump:1: line is too long, allowed are 1048576 characters");
        expectRefused(reader, "\x1F\x8B\x08\n", "dump: is compressed by gzip; 'gunzip FILE' unpacks it");
        expectRefused(reader,
                      "\0\0\0\0\0\0\0\x01\x49\0"s,
                      "dump: is an FST waveform; 'fst2vcd FILE > FILE.vcd' of GTKWave makes a VCD of it");
    }
    Endless blank("\n");
    std::istream input(&blank);
    Dump dump(2, 43);
    EXPECT_THROW(readVcd(input, "dump", {}, dump), morvik::base::Error);
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
        "255.875; a map tells other forms";
    expectRefused(readCsv, "", "dump:1: no header, expected the columns half_iteration, step, signal, value");
    expectRefused(readCsv, "a,b\n", R"(dump:1: no column "half_iteration" in the header "a,b")");
    expectRefused(readCsv, "half_iteration,step,llr,g0,llr\n", R"(dump:1: two columns are llr, "llr" and "llr")");
    expectRefused(readCsv, header + "0,0,llr\n", "dump:2: 3 fields, expected the 4 of the header");
    expectRefused(readCsv,
                  header + "0,0,LLR,1\n",
                  R"(dump:2: signal "LLR" is not known; a map tells which it is, or that it does not count)");
    expectRefused(
        readCsv,
        header + "2,0,llr,1\n",
        R"(dump:2: half-iteration "2" is not allowed, allowed are the integers 0 to 1; a map tells when they count from 1)");
    expectRefused(readCsv,
                  header + "3,0,llr,1\n",
                  R"(dump:2: half-iteration "3" is not allowed, allowed are the integers 0 to 1)");
    expectRefused(
        readCsv,
        header + "0,43,llr,1\n",
        R"(dump:2: step "43" is not allowed, allowed are the integers 0 to 42; a map tells when they count from 1)");
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
                  "dump: is CSV, of which all rows count; \"valid\" in a map is for VCD",
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
    expectMapRefused(std::string((1U << 20) + 1, ' '), "map.json: is too large, allowed are 1048576 bytes");
    expectMapRefused(std::string(100000, '\0'), "map.json: is no text, it has a null character");
    expectMapRefused("\x1f\x8b{}", "map.json: is compressed by gzip; 'gunzip FILE' unpacks it");
    EXPECT_EQ(mapOf("\xEF\xBB\xBF{\"first_step\": 1}\r\n" + std::string(1000000, ' ')).firstStep, 1U);
}

TEST(NameMap, NamesWhatIsWrong)
{
    expectMapRefused("[]", "map.json: no map, expected a JSON object");
    expectMapRefused("{", "map.json:1: no JSON, character 2 is not expected there");
    expectMapRefused("{\"bits\": 16,\n \"valid\" \"on\"}", "map.json:2: no JSON, character 13 is not expected there");
    expectMapRefused(R"({"signals": )" + std::string(100000, '[') + '}',
                     "map.json:1: character 44 opens more than 32 levels of lists and objects");
    expectMapRefused(R"({"bits": 16, "bits": 17})", "map.json:1: \"bits\" is there twice");
    expectMapRefused(R"({"bits": [[1]]})", "map.json: \"bits\" is a list, allowed are the integers 8 to 32");
    expectMapRefused(R"({"signal": {}})",
                     "map.json: \"signal\" is no key of a map, allowed are columns, signals, numbers, bits, "
                     "first_half_iteration, first_step, valid");
    expectMapRefused(
        R"({"signals": {"a": "alpha8"}})",
        "map.json: signal \"a\" is \"alpha8\", allowed are intrinsic, g0 to g3, alpha0 to alpha7, beta0 to "
        "beta7, llr, extrinsic, and null");
    for (const char* const list :
         {"[]", R"(["g0"])", R"(["g0", "g1"])", R"(["llr", "llr"])", R"(["g0", "g3", "g3"])"}) {
        expectMapRefused(
            std::string(R"({"signals": {"bm": )") + list + "}}",
            "map.json: signal \"bm\" is a list, allowed are two signals that are always equal: g0 and g3, or "
            "g1 and g2");
    }
    expectMapRefused(R"({"signals": 1})", "map.json: \"signals\" is no object");
    expectMapRefused(R"({"columns": {"row": "x"}})",
                     "map.json: column \"row\", allowed are half_iteration, step, signal, value");
    expectMapRefused(R"({"columns": {"step": 1}})", "map.json: \"step\" is no text");
    expectMapRefused(R"({"numbers": "octal"})",
                     "map.json: \"numbers\" is \"octal\", allowed are auto, integer, unsigned, real, hex, binary");
    expectMapRefused(R"({"valid": ""})", "map.json: \"valid\" is empty");
    expectMapRefused(R"({"bits": 64})", "map.json: \"bits\" is 64, allowed are the integers 8 to 32");
    expectMapRefused(R"({"bits": {"g0": 7}})", "map.json: \"g0\" is 7, allowed are the integers 8 to 32");
    expectMapRefused(R"({"bits": {"g": 8}})",
                     "map.json: bits of \"g\", allowed are intrinsic, g0 to g3, alpha0 to alpha7, beta0 to beta7, llr, "
                     "extrinsic");
}

/// Two units, of which the second is idle at first; the counters are those of the core.
const std::string vcd = R"($date today $end
$timescale 1 ns $end
$scope module core $end
$var integer 32 h half_iteration $end
$scope module unit0 $end
$var wire 13 s step [12:0] $end
$var wire 12 l llr [11:0] $end
$var real 64 r extrinsic $end
$var wire 1 c clk $end
$upscope $end
$scope module unit1 $end
$var wire 13 t step [12:0] $end
$var wire 12 m llr [11:0] $end
$upscope $end
$upscope $end
$enddefinitions $end
#0
$dumpvars
b0 h
b0 s
b111111110100 l
r-0.5 r
0c
bx t
bx m
$end
#5
1c
b1 s
b101 l
#10
b1 h
b10 s
b101000 t
b1 m
)";

TEST(VcdDump, ReadsTheValuesOfEachScope)
{
    constexpr unsigned extrinsic = 22;
    const Dump dump = read(readVcd, vcd);
    EXPECT_EQ(dump.values.at({0, llr, 0}), -12);
    EXPECT_EQ(dump.values.at({0, extrinsic, 0}), -4);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 5);
    EXPECT_EQ(dump.values.at({1, llr, 2}), 5);
    EXPECT_EQ(dump.values.at({1, llr, 40}), 1);
    EXPECT_FALSE(dump.values.has({0, llr, 40}));
    EXPECT_FALSE(dump.values.has({1, llr, 0}));
    EXPECT_EQ(dump.lineOf({0, llr, 0}), 21U);
}

TEST(VcdDump, CountsOnlyWhatIsValid)
{
    const std::string last = "$var wire 12 m llr [11:0] $end\n";
    std::string text = vcd;
    text.insert(text.find(last) + last.size(), "$var wire 1 c clk $end\n");
    const Dump dump = read(readVcd, text, mapOf(R"({"valid": "clk"})"));
    EXPECT_FALSE(dump.values.has({0, llr, 0}));
    EXPECT_EQ(dump.values.at({0, llr, 1}), 5);
    const std::string path = "$var wire 1 c ok $end\n$scope module unit0 $end\n";
    text = vcd;
    text.replace(text.find("$scope module unit0 $end\n"), 25, path);
    EXPECT_FALSE(read(readVcd, text, mapOf(R"({"valid": "core.ok"})")).values.has({0, llr, 0}));
}

TEST(VcdDump, RefusesAMapOfWhatItLacks)
{
    const auto lacking = [](const std::string& name, const std::string& path) {
        return "dump:19: no variable \"" + name + "\" in the scope of \"" + path + "\" or around it";
    };
    expectRefused(readVcd, vcd, lacking("Clk", "core.unit0.llr"), mapOf(R"({"valid": "Clk"})"));
    expectRefused(readVcd, vcd, lacking("tb.clk", "core.unit0.llr"), mapOf(R"({"valid": "tb.clk"})"));
    expectRefused(readVcd, vcd, lacking("clk", "core.unit1.llr"), mapOf(R"({"valid": "clk"})"));
    expectRefused(readVcd,
                  vcd,
                  "dump: has no signal \"core.unit2.llr\", which the map calls llr",
                  mapOf(R"({"signals": {"core.unit2.llr": "llr", "clk": null, "data": null}})"));
    expectRefused(readVcd,
                  vcd,
                  "dump: is VCD; the columns \"signal\" and \"value\" in a map are for CSV",
                  mapOf(R"({"columns": {"signal": "llr"}})"));
    EXPECT_TRUE(
        read(readVcd, vcd, mapOf(R"({"signals": {"llr": "llr", "unit1.llr": "llr"}})")).values.has({1, llr, 40}));
}

TEST(VcdDump, RefusesTimesWithoutAnEnd)
{
    std::string times;
    for (unsigned i = 0; i < 4000000; ++i) {
        times += "#5\n";
    }
    expectRefused(readVcd, vcd + times, "dump:4000034: more than 4000000 words without a change of a value");
}

TEST(VcdDump, ComesBackToAScope)
{
    const Dump dump = read(readVcd,
                           "$scope module tb $end\n$scope module core $end\n$var wire 5 h half_iteration $end\n"
                           "$var wire 13 s step $end\n$upscope $end\n$upscope $end\n"
                           "$scope module tb $end\n$scope module core $end\n$scope module ratio $end\n"
                           "$var wire 12 l llr $end\n$upscope $end\n$upscope $end\n$upscope $end\n"
                           "$enddefinitions $end\n#0\nb1 h\nb10 s\nb101 l\n");
    EXPECT_EQ(dump.values.at({1, llr, 2}), 5);
}

TEST(VcdDump, ReadsTheNineStatesOfVhdl)
{
    const Dump dump = read(readVcd,
                           "$scope module core $end\n$var integer 32 h half_iteration $end\n"
                           "$var reg 13 s step[12:0] $end\n$var reg 12 l llr[11:0] $end\n$var reg 1 c clk $end\n"
                           "$var reg 12 a alpha3[11:0] $end\n$upscope $end\n$enddefinitions $end\n"
                           "#0\nUc\nb0 h\nbUUUUUUUUUUUUU s\nbZWX-UUUUUUUU l\nb0 a\n"
                           "#1\nHc\nb1 s\n#2\n-c\nb10 s\nbHHHHHHHHHHHL l\n");
    EXPECT_TRUE(dump.values.isUnknown({0, llr, 1}));
    EXPECT_EQ(dump.lineOf({0, llr, 1}), 18U);
    EXPECT_EQ(dump.values.at({0, alpha3, 1}), 0);
    EXPECT_EQ(dump.values.at({0, llr, 2}), -2);
}

/// What a simulator writes of a test bench and a core in it, with a port that is a net of its own.
std::string portOf(const std::string& declarations)
{
    return "$timescale 10 ps $end\n$scope module tb $end\n$var reg 5 h half_iteration $end\n$var reg 13 s step $end\n"
           "$var wire 12 l llr $end\n$scope module core $end\n" +
           declarations +
           "$upscope $end\n$upscope $end\n$enddefinitions $end\n"
           "#0\nb0 h\nb0 s\nb101 l\nb110 p\n#125\nb1 s\n#126\nb111 l\nb1000 p\n";
}

TEST(VcdDump, RefusesTwoVariablesForASignal)
{
    const std::string twice =
        "two variables are llr, tb.llr and tb.core.llr; a map chooses: "
        R"({"signals": {"tb.core.llr": "llr"}})";
    const std::string port = "$var wire 12 p llr [11:0] $end\n";
    expectRefused(readVcd, portOf(port), "dump:12: " + twice);
    expectRefused(readVcd, portOf(port + "$var wire 13 t step $end\n"), "dump:13: " + twice);
    expectRefused(readVcd,
                  portOf("$var wire 12 p data $end\n"),
                  "dump:12: two variables are llr, tb.llr and tb.core.data; a map chooses: "
                  R"({"signals": {"tb.core.data": "llr"}})",
                  mapOf(R"({"signals": {"data": "llr"}})"));
}

TEST(VcdDump, TakesTheVariableThatAMapNamesWithItsScopes)
{
    const std::string text = portOf("$var wire 12 p llr [11:0] $end\n");
    const Dump inner = read(readVcd, text, mapOf(R"({"signals": {"tb.core.llr": "llr"}})"));
    EXPECT_EQ(inner.values.at({0, llr, 0}), 6);
    EXPECT_EQ(inner.values.at({0, llr, 1}), 8);
    EXPECT_EQ(inner.waveform->notes, std::vector<std::string>{"llr is tb.core.llr, not tb.llr"});
    const Dump outer = read(readVcd, text, mapOf(R"({"signals": {"tb.llr": "llr"}})"));
    EXPECT_EQ(outer.values.at({0, llr, 1}), 7);
    EXPECT_EQ(outer.waveform->notes, std::vector<std::string>{"llr is tb.llr, not tb.core.llr"});
    const Dump without = read(readVcd, text, mapOf(R"({"signals": {"tb.llr": null}})"));
    EXPECT_EQ(without.values.at({0, llr, 1}), 8);
}

TEST(VcdDump, TakesANetOnceInHoweverManyScopes)
{
    const Dump dump = read(readVcd, portOf("$var wire 12 l llr $end\n$var wire 12 p data $end\n"));
    EXPECT_EQ(dump.values.at({0, llr, 0}), 5);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 7);
    EXPECT_EQ(dump.waveform->names, (std::map<unsigned, std::string>{{2, "tb.llr"}}));
    const Dump valid =
        read(readVcd,
             portOf("$var wire 12 l llr $end\n$var wire 1 v ok $end\n$var wire 12 p data $end\n") + "#127\n1v\n",
             mapOf(R"({"valid": "ok"})"));
    EXPECT_EQ(valid.values.at({0, llr, 0}), Values::missing);
    EXPECT_EQ(valid.values.at({0, llr, 1}), 7);
}

TEST(VcdDump, TellsVariableAndTimeOfAValue)
{
    const Dump dump = read(readVcd, portOf("$var wire 12 p data $end\n"));
    const std::size_t index = dump.values.index({0, llr, 1});
    EXPECT_EQ(dump.waveform->times[index], 1260U);
    EXPECT_EQ(dump.waveform->unit, "ps");
    EXPECT_EQ(dump.waveform->names.at(dump.waveform->variables[index]), "tb.llr");
}

TEST(VcdDump, RefusesTwoScopesWithTheSameRow)
{
    const auto scope = [](const std::string& name, const std::string& mark) {
        return "$scope module " + name + " $end\n$var wire 5 h" + mark + " half_iteration $end\n$var wire 13 s" + mark +
               " step $end\n$var wire 12 l" + mark + " llr $end\n$upscope $end\n";
    };
    const std::string start =
        "$scope module tb $end\n" + scope("dut", "1") + scope("ref", "2") +
        "$upscope $end\n$enddefinitions $end\n#0\nb0 h1\nb0 h2\nb0 s1\nb1 s2\nb101 l1\nb110 l2\n#1\n";
    EXPECT_EQ(read(readVcd, start + "b10 s1\nb11 s2\n").values.at({0, llr, 3}), 6);
    expectRefused(readVcd,
                  start + "b1 s1\nb10 s2\n",
                  "dump:23: tb.ref.llr and tb.dut.llr both have llr of half-iteration 0, step 1; a map chooses one, or "
                  "tells by \"valid\" when they count");
    EXPECT_EQ(read(readVcd, start + "b1 s1\nbx l1\n").values.at({0, llr, 1}), 6);
}

/// With the names of all scopes around each variable, this would take gigabytes.
TEST(VcdDump, ReadsScopesHoweverDeep)
{
    constexpr unsigned depth = 20000;
    std::string text = "$scope module tb $end\n$var wire 5 h half_iteration $end\n$var wire 13 s step $end\n";
    for (unsigned i = 0; i < depth; ++i) {
        text += "$scope module s" + std::to_string(i) + " $end\n$var wire 1 c clk $end\n";
    }
    const Dump dump = read(readVcd, text + "$var wire 12 l llr $end\n#7\nb0 h\nb1 s\nb11 l\n");
    EXPECT_EQ(dump.values.at({0, llr, 1}), 3);
    const std::string name = dump.waveform->names.begin()->second;
    EXPECT_EQ(name.substr(0, 3), "...");
    EXPECT_EQ(name.size(), 203U);
}

/// A ratio that is x but for two steps; in the second, without v.
const std::string pipeline = R"($scope module core $end
$var integer 32 h half_iteration $end
$var wire 13 s step $end
$var wire 1 v ok $end
$var wire 12 l llr $end
$var wire 12 a alpha3 $end
$upscope $end
$enddefinitions $end
#0
0v
#1
b0 h
b0 s
#2
b101 l
1v
#3
bx l
0v
#4
b1 s
#5
b110 l
#6
bx l
b10 s
1v
#7
0v
bx s
)";

TEST(VcdDump, TakesForUnknownWhatIsSoInAllOfARow)
{
    const Dump dump = read(readVcd, pipeline);
    EXPECT_EQ(dump.values.at({0, llr, 0}), 5);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 6);
    EXPECT_TRUE(dump.values.isUnknown({0, llr, 2}));
    EXPECT_EQ(dump.lineOf({0, llr, 2}), 28U);
    EXPECT_EQ(dump.values.at({0, llr, 3}), Values::missing);
    EXPECT_TRUE(dump.values.isUnknown({0, alpha3, 0}));
    EXPECT_TRUE(dump.given[alpha3]);
    EXPECT_FALSE(dump.given[0]);
}

TEST(VcdDump, LeavesOutWhatIsUnknownOutsideOfValid)
{
    const Dump dump = read(readVcd, pipeline, mapOf(R"({"valid": "ok"})"));
    EXPECT_EQ(dump.values.at({0, llr, 0}), 5);
    EXPECT_EQ(dump.values.at({0, llr, 1}), Values::missing);
    EXPECT_TRUE(dump.values.isUnknown({0, llr, 2}));
}

TEST(VcdDump, TellsElementsAndScopesApart)
{
    const NameMap map = mapOf(R"({"signals": {"a[3]": "alpha3", "ratio.data": "llr", "core.data": "beta0",
                                              "old.ratio.data": null}, "columns": {"step": "core.k"}})");
    const std::string data = "$scope module ratio $end\n$var wire 12 l data [11:0] $end\n$upscope $end\n";
    const Dump dump = read(readVcd,
                           "$scope module core $end\n$var wire 5 h half_iteration $end\n$var wire 13 k k $end\n"
                           "$var wire 12 a2 a[2] [11:0] $end\n$var wire 12 a3 \\a[3] [11:0] $end\n"
                           "$var wire 1 b3 alpha3 [3] $end\n$var wire 100000 w wide [99999:0] $end\n"
                           "$var wire 12 d data[11:0] $end\n" +
                               data + "$scope module old $end\n" + data +
                               "$upscope $end\n$upscope $end\n$enddefinitions $end\n"
                               "#0\nb0 h\nb1 k\nb10 a2\nb11 a3\n1b3\nb100 d\nb101 l\n",
                           map);
    constexpr unsigned beta0 = 13;
    EXPECT_EQ(dump.values.at({0, alpha3, 1}), 3);
    EXPECT_EQ(dump.values.at({0, beta0, 1}), 4);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 5);
    const NameMap none = mapOf(R"({"signals": {"ratio.data": "llr", "core.ratio.data": null}})");
    expectRefused(readVcd,
                  "$scope module core $end\n" + data + "$upscope $end\n$enddefinitions $end\n",
                  "dump:6: no variable of the dump is a signal that is known; a map tells which is which",
                  none);
}

TEST(VcdDump, NamesThePlaceOfAMistake)
{
    const std::string start = "$scope module core $end\n$var wire 13 s step $end\n";
    const std::string pass = "$var wire 5 h half_iteration $end\n";
    const std::string ratio = "$var wire 16 l llr $end\n";
    const std::string end = "$upscope $end\n$enddefinitions $end\n";
    expectRefused(readVcd,
                  start + pass + end,
                  "dump:5: no variable of the dump is a signal that is known; a map tells which is which");
    expectRefused(readVcd,
                  start + ratio + end + "#0\nb1 s\nb1 l\n",
                  R"(dump:7: no variable "half_iteration" in the scope of "core.llr" or around it)");
    expectRefused(readVcd,
                  "$timescale 1 hour $end\n",
                  R"(dump:1: timescale "1hour" is not allowed, expected 1, 10 or 100 and s, ms, us, ns, ps or fs)");
    expectRefused(readVcd, start + pass + ratio + end + "#1x\n", R"(dump:7: "#1x" is no time)");
    expectRefused(
        readVcd, start + pass + ratio + "#0\nb0 h\n" + ratio, R"(dump:7: variable "llr" behind the first values)");
    expectRefused(readVcd,
                  start + pass + ratio + "$var wire 5 k half_iteration $end\n",
                  R"(dump:5: two variables are "core.half_iteration")");
    expectRefused(readVcd, start + pass + ratio + end + "#0\nb1 q\n", R"(dump:8: no variable has the identifier "q")");
    expectRefused(readVcd, start + pass + ratio + end + "hello\n", R"(dump:7: "hello" is no change of a value)");
    expectRefused(readVcd, start + "$comment", "dump:3: a command without $end");
    expectRefused(readVcd, "$upscope $end\n", "dump:1: $upscope outside of all scopes");
    expectRefused(readVcd,
                  start + pass + ratio + end + "#0\nb0 h\nb1111111 s\nb1 l\n",
                  R"(dump:10: step "127" is not allowed, allowed are the integers 0 to 42)");
    expectRefused(readVcd,
                  start + pass + ratio + end + "#0\nb0 h\nb1 s\nb0111111111111111 l\n",
                  "dump:10: llr 32767 is not allowed, expected -2048 to 2047 eighths");
}

}  // namespace
