// morvik encode, and morvik decode of what it makes of transport blocks.
#include <fstream>
#include <sstream>

#include "support/Blocks.h"
#include "support/CommandTest.h"
#include "support/LinkVectors.h"

namespace {

using morvik::blocks::LinkVector;
using morvik::blocks::Random;
using morvik::support::CommandResult;

std::string textOf(const std::vector<std::uint8_t>& bits)
{
    std::string text;
    for (const std::uint8_t bit : bits) {
        text += bit != 0 ? '1' : '0';
    }
    return text;
}

std::string randomLine(Random& random, unsigned count)
{
    std::string line;
    for (unsigned i = 0; i < count; ++i) {
        line += morvik::blocks::below(random, 2) != 0 ? '1' : '0';
    }
    return line + '\n';
}

std::vector<std::string> operator+(std::vector<std::string> words, const std::vector<std::string>& more)
{
    words.insert(words.end(), more.begin(), more.end());
    return words;
}

class EncodeTest : public morvik::support::CommandTest {
protected:
    void expectRefused(const std::vector<std::string>& arguments, const std::string& message) const
    {
        const CommandResult result = morvik.run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err.substr(0, message.size()), message);
        EXPECT_EQ(result.err.find('\n'), result.err.size() - 1);
    }
};

/// Two transport blocks of 700 bits in 1600 bits of 16QAM.
const std::vector<std::string> format = {"--coded-bits", "1600", "--modulation", "16qam"};
const std::vector<std::string> encodeFormat = std::vector<std::string>{"--transport-block"} + format;
const std::vector<std::string> decodeFormat = std::vector<std::string>{"--transport-block-size", "700"} + format;

class TransportBlocksTest : public EncodeTest {
protected:
    TransportBlocksTest()
    {
        Random random(1);
        itsBits = randomLine(random, 700) + randomLine(random, 700);
        morvik.write("bits", itsBits);
    }

    /// Writes coded.csv: the transmissions as soft values, each turned over where the pattern has a 1.
    void send(const std::string& versions, unsigned wrongOnes) const
    {
        const CommandResult result =
            morvik.run(std::vector<std::string>{"encode", "bits"} + encodeFormat +
                       std::vector<std::string>{"--redundancy-versions", versions, "--amplitude", "8"});
        ASSERT_EQ(result.status, 0) << result.err;
        std::istringstream rows(result.out);
        std::string text;
        Random random(2);
        for (std::string row; std::getline(rows, row);) {
            std::istringstream cells(row);
            std::string cell;
            std::getline(cells, cell, ',');
            text += cell;
            while (std::getline(cells, cell, ',')) {
                const bool wrong = cell != "soft_values" && morvik::blocks::below(random, 100) < wrongOnes;
                text += ',' + (wrong ? std::to_string(-std::stoi(cell)) : cell);
            }
            text += '\n';
        }
        morvik.write("coded.csv", text);
    }

    CommandResult receive(const std::vector<std::string>& more = {}) const
    {
        return morvik.run(std::vector<std::string>{"decode", "coded.csv", "--reference", "bits", "--crc", "crc.csv"} +
                          decodeFormat + more);
    }

    std::string itsBits;
};

}  // namespace

TEST_F(EncodeTest, WritesTheThreeStreamsOfEachBlock)
{
    Random random(1);
    const std::vector<int> bits = morvik::blocks::randomBits(random, 48);
    const morvik::blocks::Block block = morvik::blocks::encode(bits, 1);
    std::string line;
    for (const int bit : bits) {
        line += bit != 0 ? '1' : '0';
    }
    std::string expected = morvik::support::header + '\n';
    for (unsigned k = 0; k < 52; ++k) {
        expected += '1';
        for (const morvik::blocks::Stream* const stream : {&block.sys, &block.par1, &block.par2}) {
            expected += (*stream)[k] > 0 ? ",1" : ",0";
        }
        expected += '\n';
    }
    morvik.write("bits", std::string(40, '0') + '\n' + line + '\n');
    const CommandResult result = morvik.run({"encode", "bits"});
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out.substr(0, 33 + 8), morvik::support::header + "\n0,0,0,0\n");
    EXPECT_EQ(morvik::support::header + '\n' + result.out.substr(result.out.find("\n1,") + 1), expected);
}

TEST_F(EncodeTest, WritesSoftValuesThatDecodeReads)
{
    Random random(2);
    const std::string bits = randomLine(random, 40) + randomLine(random, 6144);
    morvik.write("bits", bits);
    ASSERT_EQ(morvik.run({"encode", "-", "--amplitude", "16", "--output", "coded.csv"}, "bits").status, 0);
    EXPECT_EQ(morvik.run({"decode", "coded.csv"}).out, bits);
}

TEST_F(EncodeTest, AgreesWithAnotherEncoderOfTransportBlocks)
{
    const std::vector<std::string> modulations = {"", "bpsk", "qpsk", "", "16qam", "", "64qam", "", "256qam"};
    for (const LinkVector& vector : morvik::blocks::linkVectors()) {
        morvik.write("bits", textOf(vector.bits) + "\n\n");
        const CommandResult result = morvik.run({"encode",
                                                 "bits",
                                                 "--transport-block",
                                                 "--coded-bits",
                                                 std::to_string(vector.G),
                                                 "--modulation",
                                                 modulations[vector.Qm],
                                                 "--redundancy-versions",
                                                 std::to_string(vector.rv)});
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_TRUE(result.out == textOf(vector.coded) + '\n') << vector.A << ' ' << vector.G;
    }
}

TEST_F(EncodeTest, RefusesWhatCannotBeEncoded)
{
    morvik.write("bits", std::string(41, '1') + '\n');
    expectRefused({"encode", "bits"}, "morvik encode: bits:1: 41 bits, expected a block size of 3GPP TS 36.212");
    expectRefused({"encode", "bits", "--transport-block"}, "morvik encode: --transport-block requires --coded-bits");
    expectRefused({"encode", "bits", "--coded-bits", "100"}, "morvik encode: --coded-bits requires --transport-block");
    const auto expectNoFit = [this](const std::vector<std::string>& options, const std::string& message) {
        expectRefused(std::vector<std::string>{"encode", "bits", "--transport-block", "--coded-bits"} + options,
                      "morvik encode: bits:1: " + message + '\n');
    };
    expectNoFit({"102", "--modulation", "16qam"},
                "--coded-bits 102 is no multiple of the 4 bits of --modulation 16qam, the nearest are 100 and 104");
    expectNoFit({"1"}, "--coded-bits 1 is no multiple of the 2 bits of --modulation qpsk, the least is 2");
    expectNoFit({"100", "--soft-buffer-size", "1"},
                "--soft-buffer-size 1 is too small for the transport block of 41 bits, the least that holds a bit of "
                "it is 2");
    expectRefused({"encode", "bits", "--transport-block", "--coded-bits", "100", "--redundancy-versions", "0,4"},
                  "morvik encode: --redundancy-versions: \"0,4\" is not allowed, expected 0 to 3");
    expectRefused({"encode", "bits", "--output", "bits"}, "morvik encode: bits: ");
    morvik.write("other", "01a\n");
    expectRefused({"encode", "other", "--transport-block", "--coded-bits", "100"},
                  "morvik encode: other:1: character \"a\" in column 3, expected 0 or 1\n");
    morvik.write("empty", "");
    expectRefused({"encode", "empty", "--transport-block", "--coded-bits", "100"},
                  "morvik encode: empty:1: no blocks, expected a line of 0 and 1 for each\n");
    morvik.write("large", std::string(20000, '1') + '\n');
    expectRefused(
        {"encode", "large", "--transport-block", "--coded-bits", "6"},
        "morvik encode: large:1: --coded-bits 6 is too small for the transport block of 20000 bits, whose 4 code "
        "blocks take 8 or more with --modulation qpsk\n");
}

TEST_F(TransportBlocksTest, AreReceived)
{
    send("2", 0);
    const CommandResult result = receive({"--redundancy-versions", "2"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, itsBits);
    EXPECT_TRUE(morvik::support::isSummary(result.err,
                                           "2 transport blocks of 700 bits in 2 transmissions, CRC fits in 2, 0 bit "
                                           "errors, 0 undetected errors"));
    EXPECT_EQ(morvik.read("crc.csv"), "block,transmissions,crc,code_blocks\n0,1,1,1\n1,1,1,1\n");
}

TEST_F(TransportBlocksTest, ThatAreWrongFailTheirCrc)
{
    send("0", 17);
    const CommandResult result = receive();
    EXPECT_EQ(result.status, 1);
    EXPECT_NE(result.out, itsBits);
    EXPECT_EQ(result.err.substr(0, result.err.find("core")),
              "block 0: CRC fails after 1 transmission\nblock 1: CRC fails after 1 transmission\n");
    EXPECT_EQ(morvik.read("crc.csv"), "block,transmissions,crc,code_blocks\n0,1,0,0\n1,1,0,0\n");
}

TEST_F(TransportBlocksTest, AreRetransmittedUntilTheirCrcFits)
{
    send("0,2,3,1", 17);
    for (const std::vector<std::string>& more :
         {std::vector<std::string>{}, {"--scale", "0.5"}, {"--soft-buffer-bits", "5"}, {"--soft-buffer-bits", "16"}}) {
        const CommandResult result = receive(more + std::vector<std::string>{"--redundancy-versions", "0,2,3,1"});
        EXPECT_EQ(result.status, 0);
        EXPECT_EQ(result.out, itsBits);
        EXPECT_EQ(morvik.read("crc.csv"), "block,transmissions,crc,code_blocks\n0,2,1,1\n1,2,1,1\n");
    }
}

TEST_F(TransportBlocksTest, OfAnotherSoftBufferAreNotUnderstood)
{
    // The redundancy version 1 starts elsewhere in a smaller buffer.
    send("1", 0);
    EXPECT_EQ(receive({"--redundancy-versions", "1", "--soft-buffer-size", "1500"}).status, 1);
    EXPECT_EQ(receive({"--redundancy-versions", "1"}).status, 0);
}

TEST_F(TransportBlocksTest, OfWrongFormAreRefused)
{
    send("0", 0);
    const std::string start = "morvik decode: ";
    const std::vector<std::string> decode = std::vector<std::string>{"decode", "in.csv"} + decodeFormat;
    const std::string zeros = [] {
        std::string values;
        for (unsigned i = 0; i < 1600; ++i) {
            values += ",1";
        }
        return values + '\n';
    }();
    const std::string top = "block,soft_values\n";
    const auto expectText = [&](const std::string& text, const std::string& message) {
        morvik.write("in.csv", text);
        expectRefused(decode, start + message);
    };
    expectText("", "in.csv:1: no header, expected \"block,soft_values\"\n");
    expectText(morvik::support::header + '\n', "in.csv:1: wrong header");
    expectText(top, "in.csv:1: no rows after the header");
    expectText(top + "x" + zeros, "in.csv:2: block \"x\" is not a label");
    expectText(top + "0,1,2\n", "in.csv:2: 2 values, expected the 1600 of --coded-bits\n");
    for (const char* const value : {"nan", "inf", "-inf", "1e99", "", "1x", "+4", "0x10"}) {
        expectText(
            top + "0,1," + value + zeros.substr(4),
            "in.csv:2: column 3: \"" + std::string(value) +
                "\" is not allowed, expected a decimal number in the range of a float, such as 4, -0.5 or 1e-3\n");
    }
    expectText(top + "\n0" + zeros, "in.csv:2: blank line before the end\n");
    morvik.write("in.csv", top + "0,1e-60" + zeros.substr(2));
    EXPECT_EQ(morvik.run(decode).status, 1) << "a number too small for a float is 0, and the CRC fails";
    morvik.write("in.csv", top + "0" + zeros + "0" + zeros);
    EXPECT_EQ(morvik.run(decode).err,
              start + "in.csv:3: block 0 has more rows than --redundancy-versions has numbers, 1\n");
}

TEST_F(TransportBlocksTest, NeedOptionsThatGoTogether)
{
    const std::string start = "morvik decode: ";
    expectRefused({"decode", "coded.csv", "--transport-block"}, start + "--transport-block requires");
    expectRefused({"decode", "coded.csv", "--transport-block-size", "700"},
                  start + "--transport-block-size requires --coded-bits");
    expectRefused({"decode", "coded.csv", "--scale", "2"}, start + "--scale requires --transport-block-size");
    const std::vector<std::string> decode = std::vector<std::string>{"decode", "bits"} + decodeFormat;
    expectRefused(decode + std::vector<std::string>{"--trace", "2"}, start + "--trace excludes");
    expectRefused(decode + std::vector<std::string>{"--scale", "-1"}, start + "--scale: \"-1\" is not allowed");
    expectRefused(decode + std::vector<std::string>{"--soft-buffer-bits", "1"}, start + "--soft-buffer-bits: \"1\"");
    expectRefused(decode + std::vector<std::string>{"--crc", "-"}, start + "--crc -: the decisions go there");
    expectRefused(decode + std::vector<std::string>{"--crc", "a", "--output", "a"}, start + "--crc a: the decisions");
    expectRefused(decode + std::vector<std::string>{"--crc", "bits"}, start + "bits: ");
    expectRefused(decode + std::vector<std::string>{"--crc", "/dev/null", "--output", "/dev/null"},
                  start + "bits:1: wrong header");
    expectRefused({"decode", "bits", "--transport-block-size", "700", "--coded-bits", "801"},
                  start +
                      "--coded-bits 801 is no multiple of the 2 bits of --modulation qpsk, the nearest are 800 and "
                      "802\n");
}
