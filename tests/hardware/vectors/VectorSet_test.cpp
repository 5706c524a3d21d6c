// A set of vectors in a folder: made, checked, and what the check finds when files are not as they were.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <map>
#include <nlohmann/json.hpp>
#include <regex>
#include <string>
#include <vector>

#include "VectorSet.h"

namespace morvik::support {
namespace {

TEST_F(VectorSet, IsAsTheModelDecodes)
{
    for (const int algorithm : {0, 1, 2}) {
        for (const int units : {2, 4, 8}) {
            settings.generics.C_ALGORITHM_TYPE = algorithm;
            settings.generics.C_NUM_PU = units;
            make();
            EXPECT_EQ(difference(), "none");
        }
    }
}

TEST_F(VectorSet, IsAsTheModelDecodesWithAllDirectedBlocks)
{
    settings.directed = true;
    settings.internal = false;
    settings.blockSizes = {40, 512};
    settings.width = 16;
    settings.separateStreams = true;
    for (const int algorithm : {0, 2}) {
        settings.generics.C_ALGORITHM_TYPE = algorithm;
        make();
        EXPECT_EQ(difference(), "none");
    }
}

/// Two formats, one with filler bits, several code blocks and retransmissions.
std::vector<morvik::simulation::Point> twoFormats()
{
    morvik::simulation::LinkFormat small;
    small.transportBlockSize = 16;
    small.codedBits = 90;
    small.modulation = morvik::link::Modulation::qpsk;
    small.versions = {0};
    morvik::simulation::LinkFormat large = small;
    large.transportBlockSize = 6121;
    large.codedBits = 9000;
    large.modulation = morvik::link::Modulation::qam16;
    large.fading = morvik::link::Fading::symbol;
    large.demapper = morvik::link::Demapper::exact;
    large.versions = {0, 2};
    large.softBufferBits = 6;
    large.softBufferSize = 12000;
    return {transportPoint(small, 3000), transportPoint(large, 9000)};
}

TEST_F(VectorSet, HasTheCodeBlocksOfTransportBlocksInEveryFormat)
{
    settings.blockSizes.clear();
    settings.transport = twoFormats();
    settings.internal = false;
    const Manifest made = make();
    ASSERT_EQ(made.blocks.size(), 2U + 2 * 2 * 2);
    EXPECT_EQ(difference(), "none");
    EXPECT_EQ(checkSet(path()).compared.crcs, 4U * 10);
    const auto json = nlohmann::json::parse(read("manifest.json"));
    EXPECT_EQ(
        json["parameters"]["transport_formats"][1].dump(),
        R"({"channel":"rayleigh","code_blocks":2,"coded_bits":9000,"demapper":"exact","esn0_db":9.0,"fillers":15,)"
        R"("modulation":"16qam","redundancy_versions":[0,2],"scales":[3.239,3.239],"soft_buffer_bits":6,)"
        R"("soft_buffer_size":12000,"transport_block_size":6121})");
    EXPECT_EQ(json["blocks"][5].dump(),
              R"({"block_size":3136,"code_block":1,"crc":true,"expected_tag":5,"format":1,"name":"rate_recovered",)"
              R"("tag":5,"transmissions":2,"transport_block":0})");
    EXPECT_FALSE(json["blocks"][2]["crc"].get<bool>()) << "after one transmission";
}

TEST_F(VectorSet, ChecksWhatTheManifestTellsOfTransportBlocks)
{
    settings.blockSizes.clear();
    settings.transport = twoFormats();
    settings.formats = {"csv"};
    settings.internal = false;
    make();
    const auto good = nlohmann::ordered_json::parse(read("manifest.json"));
    const auto differenceWith = [&](const auto& change) -> std::string {
        auto json = good;
        change(json);
        folder.write("set/manifest.json", json.dump());
        try {
            return difference();
        } catch (const morvik::base::Error& error) {
            const std::string text = error.what();
            return text.substr(text.find("manifest.json: ") + 15);
        }
    };
    EXPECT_EQ(differenceWith([](auto& json) { json["blocks"][5]["crc"] = false; }),
              "csv, block 5 (rate_recovered, transport block 0 of format 1, code block 1, 2 transmissions, K = 3136): "
              "the CRC fits, manifest.json says it fails");
    EXPECT_EQ(
        differenceWith([](auto& json) { json["blocks"][5]["transport_block"] = 7; }),
        "names block 5 as rate_recovered, transport block 7 of format 1, code block 1, 2 transmissions, K = 3136, "
        "its parameters make it rate_recovered, transport block 0 of format 1, code block 1, 2 transmissions, "
        "K = 3136");
    EXPECT_EQ(differenceWith([](auto& json) { json["parameters"]["blocks"] = 3; }),
              "names 10 rate_recovered blocks, its parameters make 15");
    EXPECT_EQ(differenceWith([](auto& json) { json["blocks"][5].erase("crc"); }), "block 5: lacks \"crc\"");
    const auto differenceWithFormat = [&](const std::string& name, const auto& value) {
        return differenceWith([&](auto& json) { json["parameters"]["transport_formats"][1][name] = value; });
    };
    const std::string place = "parameters: format 1: ";
    EXPECT_EQ(differenceWithFormat("coded_bits", 9001),
              place + "\"coded_bits\" is 9001, coded bits are a multiple of the 4 of a symbol, not 9001");
    EXPECT_EQ(differenceWithFormat("modulation", "8psk"),
              place + "\"modulation\" is \"8psk\", expected a name that 'morvik vectors --help' lists");
    EXPECT_EQ(differenceWithFormat("redundancy_versions", std::vector<int>{4}),
              place + "\"redundancy_versions\" is a list, expected a list of numbers from 0 to 3");
    EXPECT_EQ(differenceWithFormat("redundancy_versions", std::vector<int>{}),
              place + "\"redundancy_versions\" is a list, expected 1 to 16 transmissions");
    EXPECT_EQ(differenceWithFormat("soft_buffer_bits", 1),
              place + "\"soft_buffer_bits\" is 1, expected 2 to 16, or 0 for full width");
    EXPECT_EQ(differenceWith([](auto& json) { json["parameters"]["transport_formats"].clear(); }),
              "parameters: \"transport_formats\" is a list, expected 1 to 1000 formats");
}

TEST_F(VectorSet, IsTheSameEachTime)
{
    make();
    const std::string manifest = read("manifest.json");  // with the sha256 of all files
    make();
    EXPECT_EQ(read("manifest.json"), manifest);
}

TEST_F(VectorSet, TellsAllInItsManifest)
{
    make();
    const auto json = nlohmann::json::parse(read("manifest.json"));
    EXPECT_EQ(json["version"], "1.2.3");
    EXPECT_EQ(json["command"], "make");
    EXPECT_EQ(json["parameters"].dump(),
              R"({"algorithm":"scaled","block_sizes":[40],"blocks":2,"directed":false,"ebn0_db":1.0,"internal":true,)"
              R"("iterations":2,"num_pu":2,"seed":1,"separate_streams":false,"soft":true,"tag_width":8,"width":8})");
    EXPECT_EQ(json["blocks"][1].dump(), R"({"block_size":40,"expected_tag":1,"name":"random","tag":1})");
    ASSERT_EQ(json["formats"].size(), 4U);
    const auto& memh = json["formats"][2];
    EXPECT_EQ(memh["files"][1]["name"], "stimulus.memh");
    EXPECT_EQ(memh["files"][1]["sha256"], sha256(path() + "/stimulus.memh"));
    EXPECT_EQ(memh["tables"][1]["rows"], 88);
    EXPECT_EQ(memh["tables"][1]["columns"][0].dump(), R"({"bits":8,"name":"rsc1_sys","signed":true})");
    EXPECT_EQ(memh["tables"][4]["rows"], 2 * 4 * 43);
}

TEST_F(VectorSet, TellsWhereABlockBegins)
{
    settings.blockSizes = {40, 48};
    settings.formats = {"csv"};
    make();
    EXPECT_EQ(read("blocks.csv"),
              "block,block_size,iterations,tag,expected_tag,first_position,first_bit\n"
              "0,40,2,0,0,0,0\n1,40,2,1,1,44,40\n2,48,2,2,2,88,80\n3,48,2,3,3,140,128\n");
}

TEST_F(VectorSet, KeepsTheStreamsApartInMemhAlone)
{
    settings.separateStreams = true;
    settings.width = 16;
    make();
    EXPECT_EQ(read("stimulus_rsc2_par.memh").substr(0, 76),
              "// stimulus_rsc2_par: hexadecimal digits of a word, from the left: rsc2_par ");
    EXPECT_EQ(read("stimulus.csv").substr(0, 32), "block,rsc1_sys,rsc1_par,rsc2_par");
    EXPECT_FALSE(std::ifstream(path() + "/stimulus.memh").is_open());
}

// ---- What a check finds

TEST_F(VectorSet, FindsAnotherDecision)
{
    make();
    change("expected.csv", "\n1,1\n", "\n1,0\n");
    const std::string found = difference();
    EXPECT_TRUE(
        std::regex_match(found, std::regex(R"(csv, block 1 \(random, K = 40\): decision \d+ is 1, expected says 0)")))
        << found;
}

TEST_F(VectorSet, FindsAnotherTag)
{
    make();
    change("blocks.c", "1U, 1U", "1U, 3U");
    EXPECT_EQ(difference(), "c, block 1 (random, K = 40): the tag is 1, blocks says 3");
}

TEST_F(VectorSet, FindsAnotherRatio)
{
    make();
    change("ratios.csv", "ratio\n0,-?\\d+", "ratio\n0,1234");
    const std::string found = difference();
    EXPECT_TRUE(
        std::regex_match(found, std::regex(R"(csv, block 0 \(random, K = 40\): ratio 0 is -?\d+, ratios says 1234)")))
        << found;
}

TEST_F(VectorSet, FindsAnotherInternalValue)
{
    make();
    change("internal.csv", "\n0,1,5,-?\\d+,", "\n0,1,5,2000,");
    const std::string found = difference();
    EXPECT_TRUE(std::regex_match(
        found,
        std::regex(
            R"(csv, block 0 \(random, K = 40\): half-iteration 1, step 5, intrinsic is -?\d+, internal says 2000)")))
        << found;
}

TEST_F(VectorSet, FindsAnInternalRowInTheWrongPlace)
{
    make();
    change("internal.csv", "\n0,1,5,", "\n0,1,6,");
    EXPECT_EQ(
        difference(),
        "csv, block 0 (random, K = 40): half-iteration 1, step 5 stands where internal has half-iteration 1, step 6");
}

TEST_F(VectorSet, FindsAnotherStimulus)
{
    settings.formats = {"csv"};
    make();
    change("stimulus.csv", "\n0,-?\\d+,", "\n0,127,");
    EXPECT_NE(difference(), "none");
}

TEST_F(VectorSet, RefusesAFileThatIsNotTheOneWritten)
{
    make();
    folder.write("set/expected.npy", read("expected.npy") + "x");
    expectRefused(path() + "/expected.npy: has changed since it was written: its sha256 differs from the manifest");
    std::filesystem::remove(path() + "/expected.npy");
    expectRefused(path() + "/expected.npy: cannot be opened: No such file or directory");
}

TEST_F(VectorSet, RefusesWhatHasNoEnd)
{
    make();
    for (const char* const name : {"stimulus.c", "stimulus.csv", "stimulus.memh", "stimulus.npy", "manifest.json"}) {
        const std::string file = path() + '/' + name;
        std::filesystem::rename(file, folder.path("kept"));
        std::filesystem::create_symlink("/dev/zero", file);
        expectRefused(file + ": is not a regular file");
        std::filesystem::remove(file);
        std::filesystem::rename(folder.path("kept"), file);
    }
    EXPECT_EQ(difference(), "none");
}

TEST_F(VectorSet, RefusesTooFewAndTooManyRows)
{
    settings.formats = {"csv"};
    make();
    removeLine("stimulus.csv", 89);
    expectRefused(path() + "/stimulus.csv:88: the rows of stimulus end before the blocks do");
    make();
    removeLine("blocks.csv", 3);
    expectRefused(path() + "/stimulus.csv:46: has more rows of stimulus than the blocks need");
}

TEST_F(VectorSet, RefusesBlocksThatCannotBe)
{
    settings.formats = {"csv"};
    make();
    change("blocks.csv", "0,40,2", "0,41,2");
    expectRefused(path() + "/blocks.csv:2: block_size 41 is none of 3GPP TS 36.212");
    make();
    change("blocks.csv", "0,40,2", "0,40,3");
    expectRefused(path() + "/blocks.csv:2: iterations 3, the manifest says 2");
}

TEST_F(VectorSet, RefusesSoftValuesOfMoreThanEightBits)
{
    settings.formats = {"csv"};
    settings.width = 16;
    make();
    change("stimulus.csv", "\n0,-?\\d+,", "\n0,128,");
    expectRefused(path() + "/stimulus.csv:2: rsc1_sys 128 is not allowed, expected -128 to 127");
}

TEST_F(VectorSet, RefusesAManifestThatIsNone)
{
    settings.formats = {"csv"};
    make();
    const std::string good = read("manifest.json");
    const auto expectManifestRefused =
        [&](const std::string& match, const std::string& replacement, const std::string& what) {
            folder.write("set/manifest.json", std::regex_replace(good, std::regex(match), replacement));
            ASSERT_NE(read("manifest.json"), good) << match;
            expectRefused(path() + "/manifest.json: " + what);
        };
    expectManifestRefused("\"iterations\": 2",
                          "\"iterations\": 16",
                          "parameters: \"iterations\" is 16, expected an integer from 1 to 15");
    expectManifestRefused("\"iterations\": 2",
                          "\"iterations\": 2.5",
                          "parameters: \"iterations\" is 2.5, expected an integer from 1 to 15");
    expectManifestRefused("\"iterations\": 2",
                          "\"iterations\": 1e30",
                          "parameters: \"iterations\" is 1e+30, expected an integer from 1 to 15");
    expectManifestRefused(
        "\"tag\": 1", "\"tag\": -1", "block 1: \"tag\" is -1, expected an integer from 0 to 4294967295");
    expectManifestRefused("\"tag\": 1", "\"tag\": 3", "has another size or tag of block 1 than csv");
    expectManifestRefused("\"block_size\": 40", "\"block_size\": 48", "has another size or tag of block 0 than csv");
    expectManifestRefused("\"block_sizes\": \\[\\s*40\\s*\\]",
                          "\"block_sizes\": [41]",
                          "parameters: \"block_sizes\" is a list, expected a list of block sizes of 3GPP TS 36.212");
    expectManifestRefused("\"seed\": 1,", "", "parameters: lacks \"seed\"");
    expectManifestRefused("\"ebn0_db\": 1.0,", "", "parameters: lacks \"ebn0_db\"");
    expectManifestRefused("\"ebn0_db\": 1.0",
                          "\"ebn0_db\": 1.0001",
                          "parameters: \"ebn0_db\" is 1.0001, expected -50 to 50 dB, with at most three decimals");
    expectManifestRefused("\"width\": 8", "\"width\": 12", "parameters: \"width\" is 12, expected 8 or 16");
    expectManifestRefused(
        "\"scaled\"", "\"best\"", "parameters: \"algorithm\" is \"best\", expected max-log, scaled or table");
    expectManifestRefused("\"name\": \"csv\"", "\"name\": \"xls\"", "format \"xls\" is not known");
    expectManifestRefused("ratios.csv", "../ratios.csv", "format csv lacks the file ratios.csv");
    expectManifestRefused("\"soft\": true", "\"soft\": false", "format csv lacks the file internal.csv");
    expectManifestRefused("\"internal\": true", "\"internal\": false", "format csv has no file \"internal.csv\"");
    folder.write("set/manifest.json", "{}");
    expectRefused(path() + "/manifest.json: lacks \"version\"");
    folder.write("set/manifest.json", "{");
    expectRefused(path() + "/manifest.json:1: no JSON, character 2 is not expected there");
    folder.write("set/manifest.json", std::string(100000, '['));
    expectRefused(path() + "/manifest.json:1: character 33 opens more than 32 levels of lists and objects");
    std::filesystem::remove(path() + "/manifest.json");
    expectRefused(path() + "/manifest.json: cannot be opened: No such file or directory");
}

TEST_F(VectorSet, RefusesAnotherNumberOfBlocksThanTheManifestNames)
{
    settings.formats = {"csv"};
    const Manifest manifest = make();
    Manifest other = manifest;
    other.blocks.pop_back();
    folder.write("set/manifest.json", manifestText(other));
    expectRefused(path() + "/manifest.json: names fewer blocks than csv has");
    other = manifest;
    other.blocks.push_back(other.blocks.back());
    folder.write("set/manifest.json", manifestText(other));
    expectRefused(path() + "/manifest.json: names more blocks than csv has");
    other.formats.clear();
    folder.write("set/manifest.json", manifestText(other));
    expectRefused(path() + "/manifest.json: names no format");
}

TEST_F(VectorSet, CountsWhatIsCompared)
{
    make();
    const morvik::vectors::Compared compared = checkSet(path()).compared;
    EXPECT_EQ(compared.tags, 4U * 2);
    EXPECT_EQ(compared.decisions, 4U * 2 * 40);
    EXPECT_EQ(compared.ratios, 4U * 2 * 40);
    EXPECT_EQ(compared.internal, 4U * 2 * 4 * 43 * morvik::passSignals.size());
}

TEST_F(VectorSet, RefusesToCompareLessThanTheManifestTells)
{
    settings.formats = {"csv", "memh"};
    make();
    const auto good = nlohmann::ordered_json::parse(read("manifest.json"));
    const std::string manifest = path() + "/manifest.json: ";
    const auto expectChangedRefused = [&](const auto& change, const std::string& message) {
        auto json = good;
        change(json);
        folder.write("set/manifest.json", json.dump());
        expectRefused(message);
    };
    expectChangedRefused([](auto& json) { json["blocks"].clear(); }, manifest + "names no block");
    expectChangedRefused([](auto& json) { json["formats"][0]["tables"].clear(); },
                         manifest + "format csv lacks the table blocks as its parameters make it");
    expectChangedRefused([](auto& json) { json["formats"][0]["tables"][2]["columns"][0]["bits"] = 2; },
                         manifest + "format csv lacks the table expected as its parameters make it");
    expectChangedRefused(
        [](auto& json) {
            auto& tables = json["formats"][0]["tables"];
            tables.push_back(tables[0]);
        },
        manifest + "format csv has more tables than its parameters make");
    expectChangedRefused([](auto& json) { json["formats"][1]["tables"][3]["rows"] = 0; },
                         manifest + "tells 0 rows of ratios in memh, there are 80");
    expectChangedRefused([](auto& json) { json["formats"][1] = json["formats"][0]; },
                         manifest + "names the format csv twice");
    expectChangedRefused([](auto& json) { json["parameters"]["block_sizes"][0] = 48; },
                         manifest + "names random block 0 of 40 bits, its parameters make it 48");
    expectChangedRefused([](auto& json) { json["parameters"]["blocks"] = 3; },
                         manifest + "names 2 random blocks, its parameters make 3");
    expectChangedRefused([](auto& json) { json["parameters"]["directed"] = true; },
                         manifest + "names no directed block, its parameters make some");
    expectChangedRefused([](auto& json) { json["formats"].erase(1); },
                         path() + "/blocks.memh: is not a file that manifest.json names, and cannot be checked");
    expectChangedRefused(
        [](auto& json) {
            json["parameters"]["internal"] = false;
            for (auto& format : json["formats"]) {
                format["files"].erase(4);
                format["tables"].erase(4);
            }
        },
        path() + "/internal.csv: is not a file that manifest.json names, and cannot be checked");
}

TEST_F(VectorSet, RefusesRowsOfOtherBlocks)
{
    settings.formats = {"csv"};
    make();
    change("blocks.csv", "44,40\n", "43,40\n");
    expectRefused(path() + "/blocks.csv:3: first_position 43, the block begins at 44");
    make();
    change("blocks.csv", "44,40\n", "44,41\n");
    expectRefused(path() + "/blocks.csv:3: first_bit 41, the block begins at 40");
    make();
    change("expected.csv", "\n1,", "\n0,");
    expectRefused(path() + "/expected.csv:42: block 0, expected a row of block 1");
}

}  // namespace
}  // namespace morvik::support
