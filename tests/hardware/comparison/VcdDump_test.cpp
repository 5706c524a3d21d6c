// Dumps as value change dumps.
#include <gtest/gtest.h>

#include <string>
#include <utility>

#include "DumpText.h"

namespace morvik::comparison {
namespace {

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
    constexpr unsigned extrinsic = morvik::signalsOf(morvik::Stage::extrinsic).first;
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

TEST(VcdDump, RefusesTimesAndChangesWithoutAnEnd)
{
    const std::string message = ": more than 4000028 words without a change at a new time";
    expectEndlessRefused(readVcd, "#5\n", "dump:4000056" + message, vcd);
    expectEndlessRefused(readVcd, "r0.5 r\n", "dump:2000046" + message, vcd);
}

TEST(VcdDump, RefusesTimesThatBringNothingForEver)
{
    Endless content("#11\n1c\n#12\n0c\n", vcd);
    std::istream input(&content);
    Dump dump(2, 43);
    try {
        readVcdWithin({1000}, input, "dump", {}, dump);
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_STREQ(error.what(), "dump:2036: more than 1000 times without a further value");
    }
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

// GHDL's FST has the top level's variables outside of all scopes.
TEST(VcdDump, ReadsVariablesOutsideOfScopes)
{
    const Dump dump = read(readVcd,
                           "$var integer 1 h half_iteration $end\n$var integer 1 s step $end\n"
                           "$scope module core $end\n$var wire 12 l llr[11:0] $end\n$upscope $end\n"
                           "$var wire 12 a alpha3[11:0] $end\n$enddefinitions $end\n#0\n1h\nb10 s\nb101 l\nb11 a\n");
    EXPECT_EQ(dump.values.at({1, llr, 2}), 5);
    EXPECT_EQ(dump.values.at({1, alpha3, 2}), 3);
    EXPECT_EQ(dump.waveform->names.begin()->second, "core.llr");
    EXPECT_EQ(dump.waveform->names.rbegin()->second, "alpha3");
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
                  "dump:23: tb.ref.llr and tb.dut.llr both have llr of half-iteration 0, step 1; use a map to choose "
                  "one, or \"valid\" to tell when they count");
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
                  "dump:6: no variable of the dump is a known signal; use a map to name them",
                  none);
}

TEST(VcdDump, NamesThePlaceOfAMistake)
{
    const std::string start = "$scope module core $end\n$var wire 13 s step $end\n";
    const std::string pass = "$var wire 5 h half_iteration $end\n";
    const std::string ratio = "$var wire 16 l llr $end\n";
    const std::string end = "$upscope $end\n$enddefinitions $end\n";
    expectRefused(
        readVcd, start + pass + end, "dump:5: no variable of the dump is a known signal; use a map to name them");
    expectRefused(readVcd,
                  start + ratio + end + "#0\nb1 s\nb1 l\n",
                  R"(dump:7: no variable "half_iteration" in the scope of "core.llr" or around it)");
    expectRefused(readVcd,
                  "$timescale 1 hour $end\n",
                  R"(dump:1: timescale "1hour" is not allowed, expected 1, 10 or 100 and s, ms, us, ns, ps or fs)");
    expectRefused(readVcd, start + pass + ratio + end + "#1x\n", R"(dump:7: "#1x" is not a time)");
    expectRefused(
        readVcd, start + pass + ratio + "#0\nb0 h\n" + ratio, R"(dump:7: variable "llr" after the first values)");
    expectRefused(readVcd,
                  start + pass + ratio + "$var wire 5 k half_iteration $end\n",
                  R"(dump:5: two variables are "core.half_iteration")");
    expectRefused(readVcd, start + pass + ratio + end + "#0\nb1 q\n", R"(dump:8: no variable has the identifier "q")");
    expectRefused(readVcd, start + pass + ratio + end + "hello\n", R"(dump:7: "hello" is not a value change)");
    expectRefused(readVcd, start + "$comment", "dump:3: a command without $end");
    expectRefused(readVcd, "$upscope $end\n", "dump:1: $upscope outside of all scopes");
    expectRefused(readVcd,
                  start + pass + ratio + end + "#0\nb0 h\nb1111111 s\nb1 l\n",
                  R"(dump:10: step "127" of core.llr is not allowed, expected an integer from 0 to 42)");
    expectRefused(readVcd,
                  start + pass + ratio + end + "#0\nb0 h\nb1 s\nb0111111111111111 l\n",
                  "dump:10: llr 32767 is not allowed, expected -2048 to 2047 eighths");
}

}  // namespace
}  // namespace morvik::comparison
