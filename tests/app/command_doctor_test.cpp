// morvik doctor, run as a user runs it: verdicts, exit statuses, JSON, and what it says of bad input.
#include <nlohmann/json.hpp>

#include "support/Accidents.h"
#include "support/CommandTest.h"

namespace morvik::support {
namespace {

class Doctor : public CommandTest {
protected:
    /// Examines the frames with the options.
    CommandResult examine(const std::vector<SentFrame>& frames, const std::vector<std::string>& options = {}) const
    {
        return examine(softText(frames), bitText(frames), options);
    }

    CommandResult examine(const std::string& soft,
                          const std::string& bits,
                          const std::vector<std::string>& options = {}) const
    {
        morvik.write("in.csv", soft);
        morvik.write("in.bits", bits);
        std::vector<std::string> arguments = {"doctor", "in.csv", "--reference", "in.bits"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        return morvik.run(arguments);
    }

    void expectRefusal(const CommandResult& result, const std::string& line) const
    {
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik doctor: " + line + '\n');
    }
};

bool has(const std::string& text, const std::string& part)
{
    return text.find(part) != std::string::npos;
}

TEST_F(Doctor, FindsNothingWrongWithTheVectors)
{
    for (const char* name : {"k40", "k104", "k512", "k1024", "k2048", "k6144"}) {
        const CommandResult result = morvik.run(
            {"doctor", vectors(std::string(name) + ".csv"), "--reference", vectors(std::string(name) + ".bits")});
        EXPECT_EQ(result.status, 0) << result.out;
        EXPECT_TRUE(has(result.out, "Healthy: all blocks decode unchanged.")) << result.out;
        EXPECT_EQ(result.err, "");
    }
}

TEST_F(Doctor, TellsAMistakeAndWhatToChange)
{
    std::vector<SentFrame> frames = sentFrames(512, 1, 6, 1);
    multiply(frames.front(), -1);
    const CommandResult result = examine(frames, {"--num-pu", "8"});
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(
        has(result.out,
            "Found: the sign of all soft values is flipped.\n  Negate all three columns: a positive value favours "
            "bit 1.\nAll blocks decode once this is fixed.\n"))
        << result.out;
    EXPECT_EQ(result.err, "");
}

TEST_F(Doctor, TellsTwoMistakes)
{
    std::vector<SentFrame> frames = sentFrames(104, 3, 6, 1);
    for (SentFrame& frame : frames) {
        std::swap(frame.soft.par1, frame.soft.par2);
        multiply(frame, -1);
    }
    const CommandResult result = examine(frames);
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "Found: rsc1_par and rsc2_par are swapped.")) << result.out;
    EXPECT_TRUE(has(result.out, "Found: the sign of all soft values is flipped.")) << result.out;
    EXPECT_TRUE(has(result.out, "   3 of 3           0")) << result.out;
}

TEST_F(Doctor, TellsThatABlockIsTooNoisy)
{
    const CommandResult result = examine(sentFrames(512, 1, 13, 1));
    EXPECT_EQ(result.status, 3);
    EXPECT_TRUE(
        has(result.out, "Too noisy: 1 of 1 block fails, and no mistake explains it.\nThe noise is that of Eb/N0 ="))
        << result.out;
    EXPECT_TRUE(has(result.out, "400 of 400 simulated blocks of 512 bits fail.")) << result.out;
}

TEST_F(Doctor, TellsThatTheBitsAreNotThoseOfTheBlock)
{
    std::vector<SentFrame> frames = sentFrames(512, 2, 6, 1);
    std::swap(frames[0].bits, frames[1].bits);
    const CommandResult result = examine(frames);
    EXPECT_EQ(result.status, 3);
    EXPECT_TRUE(has(result.out, "Unrelated: ")) << result.out;
    EXPECT_FALSE(has(result.out, "Found: ")) << result.out;
}

TEST_F(Doctor, TellsThatNoValueIsNegative)
{
    const std::string hint =
        "No value is negative, though half should be: these are hard bits, or were read as unsigned.\n";
    std::vector<SentFrame> frames = sentFrames(512, 2, 6, 1);
    EXPECT_FALSE(has(examine(frames).out, hint));
    for (SentFrame& frame : frames) {
        for (auto* stream : {&frame.soft.sys, &frame.soft.par1, &frame.soft.par2}) {
            for (auto& value : *stream) {
                value = value < 0 ? 0 : 1;
            }
        }
    }
    const CommandResult result = examine(frames);
    EXPECT_TRUE(has(result.out, hint)) << result.out;
}

TEST_F(Doctor, WritesJson)
{
    std::vector<SentFrame> frames = sentFrames(104, 2, 6, 1);
    for (SentFrame& frame : frames) {
        multiply(frame, -1);
    }
    const CommandResult result = examine(frames, {"--json"});
    EXPECT_EQ(result.status, 1);
    const nlohmann::json object = nlohmann::json::parse(result.out);
    EXPECT_EQ(object.at("verdict"), "mistaken");
    EXPECT_EQ(object.at("blocks"), 2);
    EXPECT_EQ(object.at("decoded"), 2);
    ASSERT_EQ(object.at("mistakes").size(), 1U);
    EXPECT_EQ(object.at("mistakes")[0].at("name"), "sign");
    EXPECT_LT(object.at("wrong_signs").at("rsc2_par"), 0.2);
    EXPECT_NEAR(object.at("amplitude"), 8, 1);
    ASSERT_GT(object.at("attempts").size(), 20U);
    EXPECT_EQ(object.at("attempts")[0].at("undone").size(), 0U) << "as it is";
    EXPECT_EQ(object.at("attempts")[0].at("decoded"), 0);

    const nlohmann::json noisy = nlohmann::json::parse(examine(sentFrames(104, 2, 13, 1), {"--json"}).out);
    EXPECT_EQ(noisy.at("verdict"), "noisy");
    EXPECT_EQ(noisy.at("noise").at("simulated_blocks"), 400);
}

TEST_F(Doctor, LooksAtAsManyBlocksAsAskedFor)
{
    std::vector<SentFrame> frames = sentFrames(40, 20, 6, 1);
    EXPECT_TRUE(has(examine(frames).out, "16 of 16"));
    EXPECT_TRUE(has(examine(frames, {"--blocks", "3"}).out, " 3 of 3"));
    EXPECT_TRUE(has(examine(frames, {"--blocks", "1000"}).out, "20 of 20"));
}

TEST_F(Doctor, TellsOfBlocksThatItHasNotLookedAt)
{
    const std::vector<SentFrame> frames = sentFrames(40, 17, 6, 1);
    const std::string line = "Looked at the first 16 blocks only: the file has more; use --blocks N.\n";
    EXPECT_TRUE(has(examine(frames).out, line));
    EXPECT_FALSE(has(examine(frames, {"--blocks", "17"}).out, "Looked at"));
    EXPECT_TRUE(has(examine(frames, {"--blocks", "1"}).out, "Looked at the first block only: "));
    EXPECT_EQ(nlohmann::json::parse(examine(frames, {"--json"}).out).at("more_blocks"), true);
}

TEST_F(Doctor, RefusesBitsWithoutABlock)
{
    const std::string soft = softText(sentFrames(40, 2, 6, 1));
    const std::string bits = bitText(sentFrames(40, 3, 6, 1));
    expectRefusal(examine(soft, bits), "in.bits:3: more lines than blocks, expected 2");
    EXPECT_EQ(examine(soft, bits, {"--blocks", "1"}).status, 0);
}

TEST_F(Doctor, DoesNotTakeValuesThatSayNothingForHealthyOnes)
{
    std::string soft = "block,rsc1_sys,rsc1_par,rsc2_par\n";
    for (unsigned row = 0; row < 44; ++row) {
        soft += "0,0,0,0\n";
    }
    const CommandResult result = examine(soft, std::string(40, '1') + '\n');
    EXPECT_EQ(result.status, 3);
    EXPECT_TRUE(has(result.out, "   1 of 1           0       50.0 %  none: as it is")) << result.out;
    EXPECT_TRUE(has(result.out, "Unrelated: ")) << result.out;
}

TEST_F(Doctor, LooksAtBlocksOfSeveralSizes)
{
    std::vector<SentFrame> frames = sentFrames(40, 2, 6, 1);
    for (const SentFrame& frame : sentFrames(512, 2, 6, 1)) {
        frames.push_back(frame);
    }
    for (SentFrame& frame : frames) {
        std::swap(frame.soft.sys, frame.soft.par2);
    }
    const CommandResult result = examine(frames);
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "Found: rsc1_sys and rsc2_par are swapped.")) << result.out;
    EXPECT_TRUE(has(result.out, "4 of 4")) << result.out;
}

// ---- Transport blocks

TEST_F(Doctor, TellsMistakesOfTransportBlocks)
{
    std::string bits;
    for (unsigned i = 0; i < 1000; ++i) {
        bits += i % 7 % 2 != 0 ? '1' : '0';
    }
    morvik.write("sent.bits", bits + '\n' + std::string(bits.rbegin(), bits.rend()) + '\n');
    const auto encode = [this](const std::string& versions) {
        morvik.run({"encode",
                    "sent.bits",
                    "--transport-block",
                    "--coded-bits",
                    "2000",
                    "--redundancy-version",
                    versions,
                    "--amplitude",
                    "8",
                    "--output",
                    "coded.csv"});
    };
    const auto examineCoded = [this](const std::vector<std::string>& options) {
        std::vector<std::string> arguments = {
            "doctor", "coded.csv", "--transport-block-size", "1000", "--coded-bits", "2000"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        return morvik.run(arguments);
    };
    encode("0,2");
    const CommandResult right = examineCoded({"--reference", "sent.bits", "--redundancy-version", "0,2"});
    EXPECT_EQ(right.status, 0) << right.out;
    EXPECT_TRUE(has(right.out, "Healthy: all transport blocks decode unchanged.\n")) << right.out;
    const CommandResult first = examineCoded({"--redundancy-version", "0,2", "--blocks", "1"});
    EXPECT_EQ(first.status, 0) << first.out;
    EXPECT_TRUE(has(first.out, "Looked at the first transport block only: the file has more; use --blocks N.\n"));
    encode("2");
    for (const std::vector<std::string>& options : {std::vector<std::string>{"--reference", "sent.bits"}, {}}) {
        const CommandResult wrong = examineCoded(options);
        EXPECT_EQ(wrong.status, 1);
        EXPECT_TRUE(has(wrong.out,
                        "Found: transmission 1 has redundancy version 2, not 0.\n  Say so in --redundancy-versions, or "
                        "send version 0.\nAll transport blocks decode once this is fixed.\n"))
            << wrong.out;
    }
    const auto json = nlohmann::json::parse(examineCoded({"--json"}).out);
    EXPECT_EQ(json.at("verdict"), "mistaken");
    EXPECT_EQ(json.at("known_blocks"), 2);
    EXPECT_EQ(json.at("mistakes")[0].at("name"), "version");
    EXPECT_EQ(json.at("decoded"), 2);
}

TEST_F(Doctor, RefusesTransportBlocksThatCannotBe)
{
    morvik.write("coded.csv", "block,soft_values\n0,1,2,3,4\n0,1,2,3,4\n");
    morvik.write("sent.bits", "01\n");
    const auto refused = [this](const std::vector<std::string>& options, const std::string& line) {
        std::vector<std::string> arguments = {"doctor", "coded.csv", "--transport-block-size", "1"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        expectRefusal(morvik.run(arguments), line);
    };
    refused({"--coded-bits", "5"},
            "--coded-bits 5 is no multiple of the 2 bits of --modulation qpsk, the nearest are 4 and 6");
    refused({"--coded-bits", "6"}, "coded.csv:2: 4 values, expected the 6 of --coded-bits");
    refused({"--coded-bits", "4"}, "coded.csv:3: block 0 has more rows than --redundancy-versions has numbers, 1");
    refused({"--coded-bits", "4", "--redundancy-version", "0,1", "--reference", "sent.bits"},
            "sent.bits:1: 2 bits, expected the 1 of --transport-block-size");
    morvik.write("coded.csv", "block,soft_values\n");
    refused({"--coded-bits", "4"}, "coded.csv:1: no rows after the header, expected at least one transmission");
    const CommandResult alone = morvik.run({"doctor", "coded.csv", "--reference", "sent.bits", "--coded-bits", "4"});
    EXPECT_EQ(alone.err, "morvik doctor: --coded-bits requires --transport-block-size; see 'morvik doctor --help'\n");
}

TEST_F(Doctor, ReadsStandardInput)
{
    morvik.write("in.bits", bitText(sentFrames(40, 1, 6, 1)));
    morvik.write("in.csv", softText(sentFrames(40, 1, 6, 1)));
    EXPECT_EQ(morvik.run({"doctor", "-", "--reference", "in.bits"}, "in.csv").status, 0);
}

TEST_F(Doctor, RefusesBadInputInOneLineWithThePlace)
{
    const std::string soft = softText(sentFrames(40, 2, 6, 1));
    const std::string bits = bitText(sentFrames(40, 2, 6, 1));
    expectRefusal(examine(soft, bits.substr(0, 41)), "in.bits:2: no line for block 2, expected one for each block");
    expectRefusal(examine(soft, std::string(39, '0') + '\n'),
                  "in.bits:1: 39 bits, expected a block size of 3GPP TS 36.212 (40 to 6144)");
    expectRefusal(examine(soft, std::string(48, '0') + '\n'), "in.csv:2: block of 44 rows for 48 bits, expected 52");
    expectRefusal(examine(soft, std::string(39, '0') + "x\n"),
                  "in.bits:1: character \"x\" in column 40, expected 0 or 1");
    expectRefusal(examine("block,a\n", bits),
                  "in.csv:1: wrong header \"block,a\", expected \"block,rsc1_sys,rsc1_par,rsc2_par\"");
    const CommandResult none = morvik.run({"doctor", "none.csv", "--reference", "in.bits"});
    expectRefusal(none, "none.csv: cannot be opened: No such file or directory");
}

TEST_F(Doctor, RefusesBadUsage)
{
    const CommandResult result = morvik.run({"doctor", "in.csv"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik doctor: --reference is required; see 'morvik doctor --help'\n");
    EXPECT_EQ(examine(sentFrames(40, 1, 6, 1), {"--blocks", "0"}).status, 2);
}

}  // namespace
}  // namespace morvik::support
