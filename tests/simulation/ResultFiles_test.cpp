// ResultFiles: what is written as CSV and JSON, and read back.
#include "simulation/ResultFiles.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <nlohmann/json.hpp>

#include "base/Error.h"
#include "support/ExampleResults.h"
#include "support/TemporaryFolder.h"

namespace morvik::simulation {
namespace {

using morvik::support::exampleRow;

const std::string header =
    "point,block_size,num_pu,algorithm,scale_option,iterations,ebn0_db,scale,frames,blocks,bit_errors,block_errors,"
    "bit_error_squares,ber,ber_low,ber_high,bler,bler_low,bler_high,clipped_values,clipped_fraction,failed_frames,"
    "seconds,seed,version\n";

Results exampleResults()
{
    ResultRow given = exampleRow(1, -500, {15, 19});
    given.point.scaleOption = 12000;
    given.point.milliScale = 12000;
    given.seed = UINT64_MAX;
    return {"1.2.3", "morvik ber --block-size 40 \"quoted\"", {exampleRow(0, 1250, {0, 40}), given}};
}

class ResultFiles : public testing::Test {
protected:
    /// Reads the text from a file of that name, and returns why it is refused.
    std::string refusal(const std::string& name, const std::string& text) const
    {
        folder.write(name, text);
        try {
            readResults(folder.path(name));
        } catch (const morvik::base::Error& error) {
            const std::string message = error.what();
            const std::string place = folder.path("");
            EXPECT_EQ(message.substr(0, place.size()), place);
            return message.substr(std::min(message.size(), place.size()));
        }
        return "none";
    }

    /// The CSV of one row with a field replaced.
    static std::string csvWith(const std::string& field, const std::string& replacement)
    {
        std::string text = csvText({"1.2.3", "", {exampleRow(0, 1250, {0, 40})}});
        const std::size_t place = text.find(field, header.size());
        EXPECT_NE(place, std::string::npos);
        return text.replace(place, field.size(), replacement);
    }

    const morvik::support::TemporaryFolder folder;
};

TEST_F(ResultFiles, HoldARowForEachPointAsCsv)
{
    EXPECT_EQ(csvText(exampleResults()),
              header +
                  "0,40,4,scaled,auto,8,1.25,8.125,0:40,40,28,4,196,1.750000e-02,4.785692e-03,4.420994e-02,"
                  "1.000000e-01,2.792542e-02,2.366374e-01,120,2.272727e-02,0 10 20 30,0.125,1,1.2.3\n"
                  "1,40,4,scaled,12,8,-0.5,12,15:19,4,0,0,0,0.000000e+00,0.000000e+00,5.271292e-01,0.000000e+00,"
                  "0.000000e+00,5.271292e-01,12,2.272727e-02,,0.125,18446744073709551615,1.2.3\n");
}

TEST_F(ResultFiles, HoldTheSameAsJson)
{
    const auto json = nlohmann::json::parse(jsonText(exampleResults()));
    EXPECT_EQ(json.at("version"), "1.2.3");
    EXPECT_EQ(json.at("command"), "morvik ber --block-size 40 \"quoted\"");
    ASSERT_EQ(json.at("rows").size(), 2U);
    const auto& row = json["rows"][0];
    EXPECT_EQ(row.size(), 25U);
    EXPECT_EQ(row.at("block_size"), 40);
    EXPECT_EQ(row.at("algorithm"), "scaled");
    EXPECT_EQ(row.at("scale_option"), "auto");
    EXPECT_EQ(row.at("ebn0_db"), 1.25);
    EXPECT_EQ(row.at("frames"), "0:40");
    EXPECT_EQ(row.at("bler"), 0.1);
    EXPECT_EQ(row.at("failed_frames"), (std::vector<int>{0, 10, 20, 30}));
    EXPECT_EQ(json["rows"][1].at("seed"), UINT64_MAX);
    EXPECT_TRUE(json["rows"][1].at("failed_frames").empty());
}

TEST_F(ResultFiles, AreReadAsTheyWereWritten)
{
    const Results results = exampleResults();
    writeResults(folder.path("a.csv"), results);
    writeResults(folder.path("a.json"), results);
    EXPECT_EQ(folder.read("a.csv"), csvText(results));
    EXPECT_EQ(folder.read("a.json"), jsonText(results));
    EXPECT_EQ(csvText(readResults(folder.path("a.csv"))), csvText(results));
    EXPECT_EQ(jsonText(readResults(folder.path("a.json"))), jsonText(results));
}

TEST_F(ResultFiles, AreRefusedByOtherNames)
{
    for (const char* name : {"a.txt", "a", "csv", ".csv", "a.csv.gz", "-"}) {
        EXPECT_THROW(formatOf(name), morvik::base::Error) << name;
    }
    EXPECT_EQ(formatOf("folder.json/a.csv"), ResultFormat::csv);
    EXPECT_EQ(formatOf("a.b.json"), ResultFormat::json);
}

TEST_F(ResultFiles, ThatAreNotThereAreRefused)
{
    EXPECT_THROW(readResults(folder.path("none.csv")), morvik::base::Error);
    EXPECT_THROW(readResults(folder.path("none.json")), morvik::base::Error);
}

TEST_F(ResultFiles, WithMistakesAreRefusedWithTheirPlaces)
{
    EXPECT_EQ(refusal("a.csv", "").substr(0, 45), "a.csv:1: no header of a result file, expected");
    EXPECT_EQ(refusal("a.csv", header + "1,2\n"), "a.csv:2: 2 fields, expected 25");
    EXPECT_EQ(refusal("a.csv", csvWith("0,40,4,", "0,41,4,")), "a.csv:2: block_size \"41\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",4,scaled,", ",3,scaled,")), "a.csv:2: num_pu \"3\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",auto,8,", ",auto,0,")), "a.csv:2: iterations \"0\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",auto,8,", ",auto,16,")), "a.csv:2: iterations \"16\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",scaled,", ",sealed,")), "a.csv:2: algorithm \"sealed\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",auto,", ",automatic,")), "a.csv:2: scale_option \"automatic\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",1.25,", ",1.25dB,")), "a.csv:2: ebn0_db \"1.25dB\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",0:40,", ",40:0,")), "a.csv:2: frames \"40:0\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",0:40,", ",,")), "a.csv:2: frames \"\" is not allowed");
    for (const char* const scale : {"-8.125", "0", "-0.001"}) {
        const std::string reason = std::string(" \"") + scale + "\" is not allowed";
        EXPECT_EQ(refusal("a.csv", csvWith(",8.125,", std::string(",") + scale + ',')), "a.csv:2: scale" + reason);
        EXPECT_EQ(refusal("a.csv", csvWith(",auto,", std::string(",") + scale + ',')),
                  "a.csv:2: scale_option" + reason);
    }
    EXPECT_EQ(refusal("a.csv", csvWith(",40,28,", ",41,28,")), "a.csv:2: blocks \"41\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",28,", ",-28,")), "a.csv:2: bit_errors \"-28\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith("0 10 20", "0 x 20")), "a.csv:2: failed_frames \"0 x 20 30\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",0.125,", ",soon,")), "a.csv:2: seconds \"soon\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",1.2.3", ",")), "a.csv:2: version \"\" is not allowed");
}

TEST_F(ResultFiles, CanHaveLinesThatEndInCarriageReturns)
{
    const std::string text = csvText(exampleResults());
    std::string windows;
    for (const char c : text) {
        windows += c == '\n' ? "\r\n" : std::string(1, c);
    }
    EXPECT_EQ(csvText(parseResults(windows, "a.csv")), text);
}

TEST_F(ResultFiles, AreShownInPrintableTextWhereTheyAreWrong)
{
    EXPECT_EQ(refusal("a.csv", csvWith(",scaled,", ",\x1b[31mscaled,")),
              "a.csv:2: algorithm \"\\x1b[31mscaled\" is not allowed");
    EXPECT_EQ(refusal("a.csv", csvWith(",0:40,", ',' + std::string(1000, '1') + ',')),
              "a.csv:2: frames \"" + std::string(40, '1') + "...\" is not allowed");
}

TEST_F(ResultFiles, WithImpossibleCountsAreRefused)
{
    const auto cannotBe = [](const std::string& what) {
        return "a.csv:2: " + what;
    };
    const std::string ofFour = ", of 4 wrong blocks of 40 bits";
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",28,41,196,")),
              cannotBe("block_errors 41 cannot be, of 40 blocks"));
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",3,4,196,")), cannotBe("bit_errors 3 cannot be" + ofFour));
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",161,4,1601,")), cannotBe("bit_errors 161 cannot be" + ofFour));
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",28,4,27,")),
              cannotBe("bit_error_squares 27 cannot be, of 28 wrong bits"));
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",28,3,196,")),
              cannotBe("failed_frames cannot be the first of 3 wrong blocks of 40 bits in these frames"));
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",28,4,1160,")),
              cannotBe("bit_error_squares 1160 cannot be, of 28 wrong bits"))
        << "more than all bits of as few blocks";
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",28,4,197,")),
              cannotBe("bit_error_squares 197 cannot be, of 28 wrong bits"))
        << "an odd sum of squares of an even sum";
    EXPECT_EQ(refusal("a.csv", csvWith(",120,2.27", ",5281,2.27")),
              cannotBe("clipped_values 5281 cannot be, of 40 blocks of 40 bits"))
        << "40 blocks have 5280 soft values";
    EXPECT_EQ(refusal("a.csv", csvWith(",0:40,40,", ",0:18446744073709551615,18446744073709551615,")),
              cannotBe("blocks 18446744073709551615 cannot be, of 281474976710656 at most"));
    EXPECT_EQ(refusal("a.csv", csvWith(",0:40,40,", ",0:281474976710657,281474976710657,")),
              cannotBe("blocks 281474976710657 cannot be, of 281474976710656 at most"));
    EXPECT_EQ(refusal("a.csv", csvWith(",0:40,40,", ",0:281474976710656,281474976710656,")), "none");
    const std::string failures = cannotBe("failed_frames cannot be the first" + ofFour.substr(1) + " in these frames");
    for (const char* const frames : {",0 10 20 40,", ",0 10 20,", ",0 10 10 20,", ",10 0 20 30,"}) {
        EXPECT_EQ(refusal("a.csv", csvWith(",0 10 20 30,", frames)), failures) << frames;
    }
    for (const char* const seconds : {",-1,", ",nan,", ",inf,", ",1e300,"}) {
        EXPECT_NE(refusal("a.csv", csvWith(",0.125,", seconds)), "none") << seconds;
    }
    EXPECT_EQ(refusal("a.csv", csvWith(",28,4,196,", ",28,4,28,")), "none");
}

TEST_F(ResultFiles, MayHaveAByteOrderMarkAndBlanks)
{
    std::string text = csvText(exampleResults());
    for (std::size_t comma = text.find(','); comma != std::string::npos; comma = text.find(',', comma + 2)) {
        text.replace(comma, 1, " ,\t");
    }
    folder.write("a.csv", "\xEF\xBB\xBF" + text);
    EXPECT_EQ(csvText(readResults(folder.path("a.csv"))), csvText(exampleResults()));
    folder.write("a.json", "\xEF\xBB\xBF" + jsonText(exampleResults()));
    EXPECT_EQ(jsonText(readResults(folder.path("a.json"))), jsonText(exampleResults()));
}

TEST_F(ResultFiles, ThatAreNoTextAreRefused)
{
    EXPECT_EQ(refusal("a.csv", "\x1f\x8b\x08..."), "a.csv: is compressed with gzip; unpack it by 'gunzip FILE'");
    std::filesystem::create_symlink("/dev/zero", folder.path("endless.csv"));
    try {
        readResults(folder.path("endless.csv"));
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), folder.path("endless.csv") + ": is not text, it has a null character");
    }
}

TEST_F(ResultFiles, OfBrokenJsonAreRefused)
{
    const std::string whole = jsonText(exampleResults());
    for (const std::string& text : {std::string(), std::string("[]"), std::string("{}"), whole.substr(0, 300)}) {
        EXPECT_NE(refusal("a.json", text), "none");
    }
    EXPECT_EQ(refusal("a.json", "[]"), "a.json: is a list, expected an object");
    EXPECT_EQ(refusal("a.json", "{}"), "a.json: lacks \"version\"");
    EXPECT_EQ(refusal("a.json", whole.substr(0, 40)), "a.json:3: no JSON, character 17 is not expected there");
    EXPECT_EQ(refusal("a.json", std::string(100000, '[')),
              "a.json:1: character 33 opens more than 32 levels of lists and objects");
    std::string wrong = whole;
    wrong.replace(wrong.find("\"ebn0_db\": 1.25"), 15, "\"ebn0_db\": \"1\"");
    EXPECT_EQ(refusal("a.json", wrong), "a.json: row 1: \"ebn0_db\" is \"1\", expected a number");
    wrong = whole;
    wrong.replace(wrong.find("\"bit_errors\""), 12, "\"bat_errors\"");
    EXPECT_EQ(refusal("a.json", wrong), "a.json: row 1: lacks \"bit_errors\"");
}

TEST_F(ResultFiles, OfJsonBringNoLinesIntoCsv)
{
    const std::string whole = jsonText(exampleResults());
    for (const char* const version : {"1\\n2", "1,2", "1 2", "1\\r", ""}) {
        std::string wrong = whole;
        const std::size_t place = wrong.rfind("1.2.3");
        wrong.replace(place, 5, version);
        EXPECT_EQ(refusal("a.json", wrong).substr(0, 23), "a.json: row 2: version ") << version;
        wrong = whole;
        wrong.replace(wrong.find("1.2.3"), 5, version);
        EXPECT_EQ(refusal("a.json", wrong).substr(0, 17), *version == '\0' ? "none" : "a.json: \"version\"") << version;
    }
}

/// A transport block of MCS 11 on three pairs of resource blocks.
ResultRow sentRow()
{
    ResultRow row = exampleRow(0, 0, {1, 5});
    row.point.blockSize = 528;
    row.point.link.mcs = {morvik::link::McsTable::qam64, 11};
    row.point.link.transportBlockSize = 504;
    row.point.link.codedBits = 3 * 120 * 4;
    row.point.link.modulation = morvik::link::Modulation::qam16;
    row.point.link.versions = {0};
    row.point.axis = Axis::esn0;
    setPlace(row.point, 3000);
    row.errors.reception = {0, 0, 4, 32};
    return row;
}

TEST_F(ResultFiles, RefuseTransportBlocksThatContradictThemselves)
{
    const std::string text = csvText({"1.2.3", "", {sentRow()}});
    EXPECT_EQ(refusal("a.csv", text), "none");
    const auto with = [&text](const std::string& field, const std::string& other) {
        std::string changed = text;
        const std::size_t place = changed.find(',' + field + ',', changed.find('\n'));
        EXPECT_NE(place, std::string::npos) << field;
        return changed.replace(place + 1, field.size(), other);
    };
    const std::string sizes =
        "a.csv:2: transport_block_size, coded_bits, modulation and redundancy_versions do not go together";
    const std::string axes = "a.csv:2: ebn0_db and esn0_db are not of one signal-to-noise ratio";
    const std::string mcs = "a.csv:2: mcs does not have this transport_block_size, coded_bits and modulation";
    EXPECT_EQ(refusal("a.csv", with("1440", "1442")), sizes);
    EXPECT_EQ(refusal("a.csv", with("1440", "0")), sizes);
    EXPECT_EQ(refusal("a.csv", with("1440", "1444")), mcs) << "no multiple of three symbols";
    EXPECT_EQ(refusal("a.csv", with("64qam 11", "64qam 9")), mcs) << "of QPSK";
    EXPECT_EQ(refusal("a.csv", with("64qam 11", "64qam 12")), mcs) << "of another size";
    EXPECT_EQ(refusal("a.csv", with("504,1", "504,2")), "a.csv:2: code_blocks \"2\" is not allowed");
    EXPECT_EQ(refusal("a.csv", with("0,1,0,0", "0,2,0,0")), "a.csv:2: transmissions \"2\" is not allowed");
    EXPECT_EQ(refusal("a.csv", with("esn0,3", "esn0,4")), axes);
    EXPECT_EQ(refusal("a.csv", with("esn0,3", "esn0,300")), axes);
    EXPECT_EQ(refusal("a.csv", with("528", "512")),
              "a.csv:2: block_size is not that of the code blocks of transport_block_size");
}

}  // namespace
}  // namespace morvik::simulation
