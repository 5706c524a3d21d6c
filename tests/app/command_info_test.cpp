// morvik info, run as a user runs it: figures, table, JSON, pictures, and what it refuses.
#include <nlohmann/json.hpp>
#include <regex>

#include "support/CommandTest.h"

namespace morvik::support {
namespace {

class Info : public CommandTest {
protected:
    void expectRefusal(const std::vector<std::string>& arguments, const std::string& line) const
    {
        const CommandResult result = morvik.run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik info: " + line + '\n');
    }
};

bool has(const std::string& text, const std::string& part)
{
    return text.find(part) != std::string::npos;
}

TEST_F(Info, TellsTheFiguresOfASize)
{
    const CommandResult result = morvik.run({"info", "1280"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    for (const char* line :
         {"K = 1280: 1284 rows of three soft values, 1283 trellis steps\n",
          "Interleaver: f1 = 199, f2 = 240; the second encoder's bit i is bit (199 i + 240 i^2) mod 1280\n",
          "    2        8         8            160     3  64, 2 x 48\n",
          "    4       16        16             80     2  2 x 40\n",
          "    8       32        16             80     2  2 x 40\n",
          "soft inputs               Fix_8_3      8         3  -16 to 15.875\n",
          "state metrics and ratios  Fix_12_3    12         3  -256 to 255.875\n"}) {
        EXPECT_TRUE(has(result.out, line)) << line << result.out;
    }
}

TEST_F(Info, TellsAllSizesWithoutOne)
{
    const CommandResult result = morvik.run({"info"});
    EXPECT_EQ(result.status, 0);
    for (const char* line : {"188 block sizes (3GPP TS 36.212, Table 5.1.3-3):\n",
                             "  40 to 512 in steps of 8\n",
                             "  512 to 1024 in steps of 16\n",
                             "  1024 to 2048 in steps of 32\n",
                             "  2048 to 6144 in steps of 64\n",
                             "branch metrics            Fix_8_3"}) {
        EXPECT_TRUE(has(result.out, line)) << line << result.out;
    }
    const nlohmann::json object = nlohmann::json::parse(morvik.run({"info", "--json"}).out);
    EXPECT_EQ(object.at("block_sizes").size(), 188U);
    EXPECT_EQ(object.at("block_sizes")[187], (nlohmann::json{{"block_size", 6144}, {"f1", 263}, {"f2", 480}}));
}

TEST_F(Info, WritesTheInterleaver)
{
    const CommandResult result = morvik.run({"info", "40", "--table"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out.substr(0, 26), "i,pi\n0,0\n1,13\n2,6\n3,19\n4,1");
    EXPECT_EQ(std::count(result.out.begin(), result.out.end(), '\n'), 41);
}

TEST_F(Info, WritesJson)
{
    const nlohmann::json object = nlohmann::json::parse(morvik.run({"info", "6144", "--json", "--table"}).out);
    EXPECT_EQ(object.at("block_size"), 6144);
    EXPECT_EQ(object.at("trellis_steps"), 6147);
    EXPECT_EQ(object.at("interleaver").size(), 6144U);
    const nlohmann::json& eight = object.at("divisions")[2];
    EXPECT_EQ(eight.at("num_pu"), 8);
    EXPECT_EQ(eight.at("rows"), 3);
    EXPECT_EQ(eight.at("window_lengths"), (nlohmann::json{64, 64, 64}));
    EXPECT_EQ(eight.at("windows")[33], (nlohmann::json{{"segment", 1}, {"row", 1}, {"first", 256}, {"last", 319}}));
    EXPECT_FALSE(nlohmann::json::parse(morvik.run({"info", "40", "--json"}).out).contains("interleaver"));
}

TEST_F(Info, DrawsEverySegmentAndWindowInOrder)
{
    ASSERT_EQ(morvik.run({"info", "1280", "--plot", "a.svg"}).status, 0);
    const std::string picture = morvik.read("a.svg");
    EXPECT_TRUE(has(picture, "<title>K = 1280: segments and windows</title>"));
    EXPECT_TRUE(has(picture, "2 units: 8 segments of 160 trellis steps, 3 rows of windows."));
    EXPECT_TRUE(has(picture, "4 and 8 units: 16 segments of 80 trellis steps, 2 rows of windows."));
    EXPECT_TRUE(has(picture, "segment 7: steps 1120 to 1279"));
    EXPECT_TRUE(has(picture, "segment 15: steps 1200 to 1279"));
    std::vector<unsigned> seen(32);  // numbers that stand by themselves: those of windows
    const std::regex number(">([0-9]+)</");
    for (std::sregex_iterator it(picture.begin(), picture.end(), number), end; it != end; ++it) {
        ++seen.at(std::stoul((*it)[1]));
    }
    for (unsigned window = 0; window < 32; ++window) {
        EXPECT_EQ(seen[window], window < 24 ? 2U : 1U) << window;
    }
}

TEST_F(Info, DrawsAllFormats)
{
    for (const char* K : {"40", "512", "6144"}) {
        for (const auto& [file, start] : {std::pair<std::string, std::string>{"a.svg", "<?xml"},
                                          {"a.png", "\x89PNG\r\n\x1a\n"},
                                          {"a.pdf", "%PDF-"}}) {
            const CommandResult result = morvik.run({"info", K, "--plot", file});
            EXPECT_EQ(result.status, 0) << result.err;
            EXPECT_EQ(morvik.read(file).substr(0, start.size()), start);
            EXPECT_EQ(result.out, morvik.run({"info", K}).out);
        }
    }
}

TEST_F(Info, RefusesWhatItCannotTell)
{
    expectRefusal({"info", "41"}, "41 is not a block size, the nearest block sizes of 3GPP TS 36.212 are 40 and 48");
    expectRefusal({"info", "0"}, "0 is not a block size, expected a block size of 3GPP TS 36.212, 40 to 6144");
    expectRefusal({"info", "6145"}, "6145 is not a block size, expected a block size of 3GPP TS 36.212, 40 to 6144");
    expectRefusal({"info", "--table"}, "--table needs a block size K");
    expectRefusal({"info", "--plot", "a.svg"}, "--plot needs a block size K");
    expectRefusal({"info", "40", "--plot", "a.jpg"},
                  "a.jpg: a plot's format follows from its suffix, expected .svg, .png or .pdf");
    EXPECT_EQ(morvik.run({"info", "forty"}).status, 2);
    EXPECT_EQ(morvik.run({"info", "-40"}).status, 2);
}

}  // namespace
}  // namespace morvik::support
