// Dumps whose maps tell when and where the values of single names belong.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "DumpText.h"
#include "hardware/comparison/DumpNames.h"
#include "hardware/comparison/NamePattern.h"

namespace morvik::comparison {
namespace {

constexpr unsigned alpha0 = alpha3 - 3;
constexpr unsigned beta0 = morvik::signalsOf(morvik::Stage::backward).first;

/// A VCD with half_iteration (h) and the variables `declared`, then `changes`.
std::string vcdOf(const std::string& declared, const std::string& changes)
{
    return "$scope module siso[0] $end\n$var wire 5 h half_iteration $end\n" + declared +
           "$upscope $end\n$enddefinitions $end\n" + changes;
}

TEST(NamePattern, MatchesNumbersAndAnythingBetweenPoints)
{
    const NamePattern pattern("siso[*].am_{state}");
    EXPECT_EQ(pattern.match("siso[12].am_7").value().at("state"), "7");
    EXPECT_EQ(pattern.match("siso[].am_007").value().at("state"), "7");
    EXPECT_EQ(pattern.match("siso[1].am_0").value().at("state"), "0");
    for (const char* const other : {"siso[1].am_",
                                    "siso[1].am_x",
                                    "siso[1].am_1x",
                                    "siso.am_1",
                                    "a.siso[1].am_1",
                                    "siso[1].x.am_1",
                                    "am_1",
                                    ""}) {
        EXPECT_FALSE(pattern.match(other)) << other;
    }
    EXPECT_TRUE(NamePattern("*a*b{n}").match("xaxbab12"));
    EXPECT_TRUE(NamePattern("{n}_{n}").match("3_3"));
    EXPECT_FALSE(NamePattern("{n}_{n}").match("3_4"));
    EXPECT_EQ(NamePattern::filled("alpha{state}{x}", {{"state", "3"}}), "alpha3{x}");
    EXPECT_TRUE(NamePattern::isPattern("a{b}"));
    EXPECT_FALSE(NamePattern::isPattern("a{}[1]"));
}

TEST(MappedDump, TakesTheNamesOfAPattern)
{
    const std::string text = vcdOf(
        "$var wire 13 s step $end\n$var wire 12 a am_3 [11:0] $end\n"
        "$var wire 12 b am_9 [11:0] $end\n",
        "#0\nb0 h\nb1 s\nb101 a\nb111 b\n");
    const Dump dump = read(readVcd, text, mapOf(R"({"signals": {"siso[*].am_{state}": "alpha{state}"}})"));
    EXPECT_EQ(dump.values.at({0, alpha3, 1}), 5);
    expectRefused(readVcd,
                  text,
                  "dump: has no signal \"siso[*].bm_{state}\", which the map calls beta{state}",
                  mapOf(R"({"signals": {"siso[*].bm_{state}": "beta{state}"}})"));
    const Dump rows = read(readCsv,
                           "half_iteration,step,signal,value\n1,2,am[3],7\n1,2,am[4],8\n",
                           mapOf(R"({"signals": {"am[{i}]": "alpha{i}"}})"));
    EXPECT_EQ(rows.values.at({1, alpha3, 2}), 7);
    EXPECT_EQ(rows.values.at({1, alpha3 + 1, 2}), 8);
}

TEST(MappedDump, TakesStepAndValidOfASignal)
{
    const char* const map = R"({"signals": {"a": {"signal": "alpha0", "step": "fwd", "valid": "ok"},
                                           "b": {"signal": "beta0", "step": "bwd"}}})";
    const Dump dump = read(readVcd,
                           vcdOf("$var wire 13 s fwd $end\n$var wire 13 t bwd $end\n$var wire 1 o ok $end\n"
                                 "$var wire 12 a a $end\n$var wire 12 b b $end\n",
                                 "#0\nb0 h\nb0 s\nb101000 t\n0o\nb1 a\nb10 b\n#1\n1o\nb11 a\n"
                                 "#2\nb1 s\nb100111 t\nb100 a\nb101 b\n"),
                           mapOf(map));
    EXPECT_EQ(dump.values.at({0, alpha0, 0}), 3);
    EXPECT_EQ(dump.values.at({0, alpha0, 1}), 4);
    EXPECT_EQ(dump.values.at({0, beta0, 40}), 2);
    EXPECT_EQ(dump.values.at({0, beta0, 39}), 5);
    const Dump table = read(readCsv, "half_iteration,fwd,bwd,ok,a,b\n0,0,40,0,1,2\n0,1,39,1,3,4\n", mapOf(map));
    EXPECT_FALSE(table.values.has({0, alpha0, 0}));
    EXPECT_EQ(table.values.at({0, alpha0, 1}), 3);
    EXPECT_EQ(table.values.at({0, beta0, 40}), 2);
    expectRefused(readCsv,
                  "half_iteration,fwd,ok,a,b\n",
                  "dump:1: no column \"bwd\" in the header \"half_iteration,fwd,ok,a,b\"",
                  mapOf(map));
}

// Counters of a core at rest may hold anything, such as a half-iteration of all ones.
TEST(MappedDump, LooksAtPlacesOnlyWhereValuesAreValid)
{
    const NameMap map =
        mapOf(R"({"valid": "ok", "signals": {"l": {"signal": "llr", "delay_steps": 1}, "a": "alpha0"}})");
    const std::string variables =
        "$var wire 13 s step $end\n$var wire 1 o ok $end\n$var wire 12 l l $end\n"
        "$var wire 12 a a $end\n";
    const Dump dump = read(readVcd,
                           vcdOf(variables,
                                 "#0\nb11111 h\nb11111111 s\n0o\nb0 l\nb0 a\n#1\n1o\nb0 h\nb0 s\nb1 a\n0o\n"
                                 "#2\nb1 s\nb10 l\n1o\n#3\n0o\nb1111111111 s\n"),
                           map);
    EXPECT_EQ(dump.values.at({0, llr, 0}), 2);
    EXPECT_EQ(dump.values.at({0, alpha0, 1}), 1);
    const Dump rows =
        read(readCsv, "half_iteration,step,ok,l,a\n31,255,0,9,9\n0,0,0,9,9\n0,1,1,2,1\n31,255,0,9,9\n", map);
    EXPECT_EQ(rows.values.at({0, llr, 0}), 2);
    EXPECT_EQ(rows.values.at({0, alpha0, 1}), 1);
    expectRefused(readCsv,
                  "half_iteration,step,ok,l,a\n0,255,0,9,9\n0,1,1,2,1\n",
                  R"(dump:3: step "255" is not allowed, expected an integer from 0 to 42)",
                  map);
    expectRefused(readCsv,
                  "half_iteration,step,ok,l,a\nx0,one,1,2,1\n",
                  R"(dump:2: half-iteration "x0" is not allowed, expected an integer)",
                  map);
}

// The equal branch metrics are one register.
TEST(MappedDump, TakesANameForTwinsWithAPlaceOfItsOwn)
{
    constexpr unsigned g0 = morvik::signalsOf(morvik::Stage::branch).first;
    const Dump dump =
        read(readCsv, "half_iteration,k,n,plus,both\n0,0,9,5,0fd\n", mapOf(R"({"columns": {"step": "k"}, "signals": {
                               "plus": {"signal": ["g0", "g3"], "step": "n"},
                               "both": {"packed": [["g1", "g2"], "alpha0"], "bits": 4}},
                               "numbers": "hex"})"));
    EXPECT_EQ(dump.values.at({0, g0, 9}), 5);
    EXPECT_EQ(dump.values.at({0, g0 + 3, 9}), 5);
    EXPECT_EQ(dump.values.at({0, g0 + 1, 0}), -3);
    EXPECT_EQ(dump.values.at({0, g0 + 2, 0}), -3);
    EXPECT_EQ(dump.values.at({0, alpha0, 0}), -1);
}

// A memory port carries forward metrics, then backward ones.
TEST(MappedDump, TakesANameForSeveralSignals)
{
    const Dump dump = read(readVcd,
                           vcdOf("$var wire 13 s step $end\n$var wire 1 f fwd $end\n$var wire 1 b bwd $end\n"
                                 "$var wire 12 d data $end\n",
                                 "#0\nb0 h\nb0 s\n1f\n0b\nb1 d\n#1\nb1 s\n0f\n1b\nb10 d\n"),
                           mapOf(R"({"signals": {"data": [{"signal": "alpha0", "valid": "fwd"},
                                                          {"signal": "beta0", "valid": "bwd"}]}})"));
    EXPECT_EQ(dump.values.at({0, alpha0, 0}), 1);
    EXPECT_FALSE(dump.values.has({0, alpha0, 1}));
    EXPECT_EQ(dump.values.at({0, beta0, 1}), 2);
    EXPECT_FALSE(dump.values.has({0, beta0, 0}));
}

TEST(MappedDump, CountsDelaysInSteps)
{
    const NameMap map = mapOf(R"({"signals": {"l": {"signal": "llr", "delay_steps": 2}}})");
    const Dump dump = read(readVcd,
                           vcdOf("$var wire 13 s step $end\n$var wire 12 l l $end\n",
                                 "#0\nb0 h\nb0 s\nbx l\n#5\nb11 s\n#6\nbx s\n#7\nb110 s\nb1 l\n#8\nb111 s\nb10 l\n"
                                 "#9\nb1 h\nb0 s\nb11 l\n"),
                           map);
    EXPECT_EQ(dump.values.at({0, llr, 0}), 1);
    EXPECT_EQ(dump.values.at({0, llr, 3}), 2);
    EXPECT_EQ(dump.values.at({0, llr, 6}), 3);
    EXPECT_FALSE(dump.values.has({0, llr, 7}));
    const Dump rows = read(readCsv, "half_iteration,step,l\n0,0,\n0,3,\n0,6,1\n0,7,2\n1,0,3\n", map);
    EXPECT_EQ(rows.values.at({0, llr, 0}), 1);
    EXPECT_EQ(rows.values.at({0, llr, 3}), 2);
    EXPECT_EQ(rows.values.at({0, llr, 6}), 3);
}

TEST(MappedDump, CountsDelaysInClocks)
{
    const NameMap map = mapOf(R"({"clock": "clk", "signals": {"l": {"signal": "llr", "delay_clocks": 1}}})");
    const std::string variables = "$var wire 13 s step $end\n$var wire 12 l l $end\n";
    // The core waits for a clock at step 1; registers settle after the edge.
    const std::string changes =
        "#0\nb0 h\n0c\n#5\n1c\nb0 s\n#10\n0c\n#15\n1c\n#16\nb1 s\nb101 l\n#20\n0c\n#25\n1c\n"
        "b110 l\n#30\n0c\n#35\n1c\nb10 s\n#40\n0c\n#45\n1c\nb11 s\nb111 l\n";
    const Dump dump = read(readVcd, vcdOf(variables + "$var wire 1 c clk $end\n", changes), map);
    EXPECT_EQ(dump.values.at({0, llr, 0}), 5);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 6);
    EXPECT_EQ(dump.values.at({0, llr, 2}), 7);
    expectRefused(readVcd,
                  vcdOf(variables, "#0\nb0 h\n"),
                  "dump:8: no variable \"clk\" in the scope of \"siso[0].l\" or around it",
                  map);
    expectRefused(readVcd,
                  vcdOf(variables, "#0\nb0 h\n"),
                  "dump:8: a delay in clocks needs \"clock\" in the map",
                  mapOf(R"({"signals": {"l": {"signal": "llr", "delay_clocks": 1}}})"));
    const Dump rows = read(readCsv,
                           "half_iteration,step,l\n0,0,\n0,1,5\n0,1,6\n0,2,\n0,3,7\n",
                           mapOf(R"({"signals": {"l": {"signal": "llr", "delay_clocks": 1}}})"));
    EXPECT_EQ(rows.values.at({0, llr, 0}), 5);
    EXPECT_EQ(rows.values.at({0, llr, 1}), 6);
    EXPECT_EQ(rows.values.at({0, llr, 2}), 7);
}

TEST(MappedDump, UnpacksColumnsOfMetrics)
{
    const NameMap map = mapOf(R"({"signals": {"am": {"packed": "alpha"}, "bm": {"packed": ["beta1", "beta0"],
                                              "bits": 9, "first": "high"}}, "numbers": "hex"})");
    const Dump dump = read(readVcd,
                           vcdOf("$var wire 13 s step $end\n$var wire 96 a am [95:0] $end\n"
                                 "$var wire 18 b bm [17:0] $end\n",
                                 "#0\nb0 h\nb0 s\nb11000000000010 a\nb111111111000000111 b\n"
                                 "#1\nb1 s\nb" +
                                     std::string(12, '1') + std::string(72, 'x') + std::string(12, '0') + " a\nbx b\n"),
                           map);
    EXPECT_EQ(dump.values.at({0, alpha0, 0}), 2);
    EXPECT_EQ(dump.values.at({0, alpha0 + 1, 0}), 3);
    EXPECT_EQ(dump.values.at({0, alpha0 + 7, 0}), 0);
    EXPECT_EQ(dump.values.at({0, beta0 + 1, 0}), -1);
    EXPECT_EQ(dump.values.at({0, beta0, 0}), 7);
    EXPECT_EQ(dump.values.at({0, alpha0, 1}), 0);
    EXPECT_EQ(dump.values.at({0, alpha0 + 7, 1}), -1);
    EXPECT_TRUE(dump.values.isUnknown({0, alpha3, 1}));
    EXPECT_TRUE(dump.values.isUnknown({0, beta0, 1}));
    const Dump rows = read(readCsv, "half_iteration,step,am,bm\n0,0,3002,3fe07\n0,1,fffx00,\n", map);
    EXPECT_EQ(rows.values.at({0, alpha0 + 1, 0}), 3);
    EXPECT_EQ(rows.values.at({0, beta0 + 1, 0}), -1);
    EXPECT_EQ(rows.values.at({0, beta0, 0}), 7);
    EXPECT_TRUE(rows.values.isUnknown({0, alpha0, 1}));
    EXPECT_EQ(rows.values.at({0, alpha0 + 1, 1}), -1);
    expectRefused(readCsv,
                  "half_iteration,step,am,bm\n0,0,30q2,0\n",
                  "dump:2: am \"30q2\" is not allowed, expected a packed value in hexadecimal digits, after 0x or with "
                  "\"numbers\": \"hex\" in the map, or in binary ones",
                  map);
    expectRefused(readVcd,
                  vcdOf("$var wire 13 s step $end\n$var wire 64 a am $end\n", ""),
                  "dump:4: am has 64 bits, the map packs 72 or more in it",
                  map);
}

// A row of units writes its ratios as one vector; each unit has two segments of 10 steps.
TEST(MappedDump, UnpacksARowOfUnits)
{
    const NameMap map = mapOf(R"({"signals": {"l": {"packed": "llr", "units": 3}}})");
    std::istringstream text(vcdOf("$var wire 13 s step $end\n$var wire 36 l l [35:0] $end\n",
                                  "#0\nb0 h\nb1 s\nb000000000011000000000010000000000001 l\n"));
    Dump dump(2, 43, {10, 20});
    readVcd(text, "dump", map, dump);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 1);
    EXPECT_EQ(dump.values.at({0, llr, 21}), 2);
    EXPECT_EQ(dump.values.at({0, llr, 41}), 3);
}

/// Takes the dumps of blocks 0 and 1.
class TwoBlocks : public DumpSink {
public:
    Dump& dumpOf(std::uint64_t block) override
    {
        if (block > 1) {
            throw morvik::base::Error("is one too many");
        }
        return block == 0 ? first : second;
    }

    Dump first{2, 43};
    Dump second{2, 67};
};

void expectTwoBlocks(void (*readBlocks)(std::istream&, const std::string&, const NameMap&, DumpSink&),
                     const std::string& text,
                     const NameMap& map = {})
{
    TwoBlocks blocks;
    std::istringstream input(text);
    readBlocks(input, "dump", map, blocks);
    EXPECT_EQ(blocks.first.values.at({0, llr, 0}), 1);
    EXPECT_EQ(blocks.first.values.at({0, llr, 1}), 2);
    EXPECT_EQ(blocks.second.values.at({0, llr, 0}), 3);
    EXPECT_EQ(blocks.second.values.at({0, llr, 50}), 4);
    EXPECT_TRUE(blocks.first.given[llr]);
    EXPECT_TRUE(blocks.second.given[llr]);
}

TEST(MappedDump, TellsBlocksApart)
{
    expectTwoBlocks(readCsvBlocks, "block,half_iteration,step,llr\n0,0,0,1\n1,0,0,3\n0,0,1,2\n1,0,50,4\n");
    expectTwoBlocks(readCsvBlocks,
                    "n,half_iteration,step,llr\n1,0,0,1\n1,0,1,2\n2,0,0,3\n2,0,50,4\n",
                    mapOf(R"({"columns": {"block": "n"}, "first_block": 1})"));
    const std::string variables = "$var wire 13 s step $end\n$var wire 12 l llr $end\n";
    expectTwoBlocks(readVcdBlocks,
                    vcdOf(variables + "$var wire 8 b block $end\n",
                          "#0\nb0 h\nb0 s\nb0 b\nb1 l\n#1\nb1 s\nb10 l\n#2\nb0 s\nb1 b\nb11 l\n#3\nb110010 s\n"
                          "b100 l\n"));
    // What the registers hold before the first start belongs to no block.
    expectTwoBlocks(readVcdBlocks,
                    vcdOf(variables + "$var wire 1 b go $end\n",
                          "#0\nb0 h\nb0 s\n0b\nb1111 l\n#1\n1b\nb1 l\n#2\n0b\nb1 s\nb10 l\n#3\nb0 s\n1b\nb11 l\n"
                          "#4\n0b\nb110010 s\nb100 l\n"),
                    mapOf(R"({"start": "go"})"));
}

TEST(MappedDump, NamesABlockThatThereIsNot)
{
    TwoBlocks blocks;
    std::istringstream input("block,half_iteration,step,llr\n0,0,0,1\n2,0,0,3\n");
    try {
        readCsvBlocks(input, "dump", {}, blocks);
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_STREQ(error.what(), "dump:3: block 2 is one too many");
    }
}

TEST(SuggestedMap, PlacesTheUsualNamesOfAWaveform)
{
    const std::string text = vcdOf(
        "$var wire 13 s trellis_step_q $end\n$var wire 96 a alpha_vec [95:0] $end\n"
        "$var wire 12 b bwd_metric_3_q [11:0] $end\n$var wire 9 d bwd_metric_7_q $end\n"
        "$var wire 12 g bm[1] $end\n$var wire 12 e leOut $end\n$var wire 1 c clk $end\n"
        "$var wire 12 l llr $end\n$var wire 200 x extrinsic_mem $end\n$var wire 8 y apriori $end\n",
        "#0\nb0 h\nb1 s\nb11000000000010 a\nb101 b\nb111 g\nb1 e\nb10 l\nb1 d\n");
    std::istringstream input(text);
    const SuggestedMap map = suggestMap(namesOfVcd(input, "dump"));
    EXPECT_EQ(map.notes,
              (std::vector<std::string>{"not placed: apriori", "not placed: clk", "not placed: extrinsic_mem"}));
    const Dump dump = read(readVcd, text, mapOf(map.json));
    EXPECT_EQ(dump.values.at({0, alpha0, 1}), 2);
    EXPECT_EQ(dump.values.at({0, alpha0 + 1, 1}), 3);
    EXPECT_EQ(dump.values.at({0, beta0 + 3, 1}), 5);
    EXPECT_EQ(dump.values.at({0, beta0 + 7, 1}), 1);
    EXPECT_EQ(dump.values.at({0, morvik::signalsOf(morvik::Stage::branch).first + 1, 1}), 7);
    EXPECT_EQ(dump.values.at({0, morvik::signalsOf(morvik::Stage::extrinsic).first, 1}), 1);
    EXPECT_EQ(dump.values.at({0, llr, 1}), 2);
}

// Beside the test bench, a waveform has the constants of the model's package, which are called as the signals are, and
// those of the core.
TEST(SuggestedMap, LeavesConstantsOut)
{
    const std::string text = vcdOf(
        "$scope module morvik_pkg $end\n$scope module inner $end\n$var wire 32 0 SIGNAL_BETA $end\n$upscope $end\n"
        "$var wire 32 1 SIGNAL_LLR $end\n$upscope $end\n$var parameter 32 2 LLR_BITS $end\n"
        "$var wire 13 3 K $end\n$var wire 13 k k $end\n$var wire 96 b bm [95:0] $end\n$var wire 12 l app_q $end\n",
        "");
    std::istringstream input(text);
    EXPECT_EQ(suggestMap(namesOfVcd(input, "dump")).json,
              "{\n  \"columns\": {\n    \"step\": \"k\"\n  },\n  \"signals\": {\n"
              "    \"app_q\": \"llr\",\n    \"bm\": {\n      \"packed\": \"beta\"\n    }\n  }\n}\n");
}

TEST(SuggestedMap, PlacesTheNamesOfRows)
{
    const std::string text = "half_iteration,step,signal,value\n0,0,fwd[0],00a\n0,0,fwd[3],fff\n0,0,busy,1\n";
    std::istringstream input(text);
    const SuggestedMap map = suggestMap(namesOfCsv(input, "dump"));
    EXPECT_EQ(map.notes, std::vector<std::string>{"not placed: busy"});
    const Dump dump = read(readCsv, text, mapOf(map.json));
    EXPECT_EQ(dump.values.at({0, alpha0, 0}), 10);
    EXPECT_EQ(dump.values.at({0, alpha3, 0}), -1);
    std::istringstream wide("pass,k,gamma_0,gamma_4,foo\n");
    const SuggestedMap columns = suggestMap(namesOfCsv(wide, "dump"));
    EXPECT_EQ(columns.json, "{\n  \"columns\": {\n    \"half_iteration\": \"pass\",\n    \"step\": \"k\"\n  }\n}\n");
    EXPECT_EQ(columns.notes,
              (std::vector<std::string>{"not placed: foo", "not placed: gamma_0", "not placed: gamma_4"}));
    std::istringstream none("a,llr\n");
    EXPECT_EQ(suggestMap(namesOfCsv(none, "dump")).notes.front(), "no name looks like that of the half-iteration");
}

TEST(MappedDump, NamesWhatIsWrongInAMap)
{
    const auto expectMapRefused = [](const std::string& meaning, const std::string& message) {
        try {
            mapOf(R"({"signals": {"a": )" + meaning + "}}");
            FAIL() << "accepted";
        } catch (const morvik::base::Error& error) {
            EXPECT_EQ(error.what(), "map.json: " + message);
        }
    };
    const std::string signals =
        ", expected intrinsic, g0 to g3, alpha0 to alpha7, beta0 to beta7, llr, extrinsic, and "
        "null";
    expectMapRefused(R"("alpha{state}")", "signal \"a\" is \"alpha{state}\"" + signals);
    expectMapRefused(R"({"step": "k"})", "signal \"a\" needs either \"signal\" or \"packed\"");
    expectMapRefused(R"({"signal": "llr", "late": 1})",
                     "signal \"a\" has the key \"late\", expected signal or packed, half_iteration, step, valid, "
                     "delay_steps, delay_clocks, first, bits, segments or units");
    expectMapRefused(R"({"signal": "llr", "delay_steps": 1, "delay_clocks": 1})",
                     "signal \"a\" has delays in steps and in clocks");
    expectMapRefused(R"({"signal": "llr", "delay_steps": 4097})",
                     "\"delay_steps\" is 4097, expected an integer from 0 to 4096");
    expectMapRefused(R"({"packed": "gamma"})", "signal \"a\" is \"gamma\"" + signals);
    expectMapRefused(R"({"packed": "alpha", "first": "left"})", "\"first\" is \"left\", expected low or high");
    expectMapRefused(R"({"packed": "alpha", "units": 8, "segments": 8})", "signal \"a\" packs more than 256 values");
    expectMapRefused(R"([{"signal": "llr"}, "llr"])", "signal \"a\" is \"llr\"" + signals);
}

}  // namespace
}  // namespace morvik::comparison
