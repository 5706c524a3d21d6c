// morvik ber: transport blocks, modulations and channels: what is printed and written, runs in parts, and what is
// refused.
#include <cmath>

#include "support/BerTest.h"

namespace morvik::support {
namespace {

/// Points of two sizes where some blocks fail, with retransmissions.
const Arguments twoSizes = words(
    "--transport-block-size 120,7000 --code-rate 0.6 --modulation 16qam --redundancy-versions 0,2 --esn0 4.5,9 "
    "--iterations 4 --seed 5");

class BerLink : public BerTest {
protected:
    void expectError(const std::string& arguments, const std::string& message) const
    {
        expectRefused(Arguments{"ber"} + words(arguments), "morvik ber: " + message);
    }

    void expectNotAllowed(const std::string& option, const std::string& value, const std::string& allowed) const
    {
        const Arguments others = option == "--transport-block-size" ? Arguments{} : words("--transport-block-size 40");
        expectRefused(
            Arguments{"ber", option, value} + others,
            "morvik ber: " + option + ": \"" + value + "\" is not allowed, " + allowed + "; see 'morvik ber --help'");
    }

    /// Merges files into another.
    void merge(const Arguments& files, const std::string& output) const
    {
        const CommandResult result = morvik.run(Arguments{"merge"} + files + Arguments{"--output", output});
        EXPECT_EQ(result.status, 0) << result.err;
    }

    /// The first line of the table.
    std::string headingOf(const std::string& arguments) const
    {
        const std::string table = ber(words(arguments + " --max-blocks 1"));
        return table.substr(0, table.find('\n'));
    }
};

}  // namespace

TEST_F(BerLink, NamesWhatIsSent)
{
    EXPECT_EQ(headingOf("--transport-block-size 1000 --coded-bits 1500 --esn0 4"),
              "A = 1000, G = 1500, qpsk, 2 units, scaled, scale auto, 8 iterations");
    EXPECT_EQ(
        headingOf("--mcs 17 --resource-blocks 2 --esn0 20 --redundancy-versions 0,2 --channel rayleigh --demapper "
                  "exact --early-stop crc"),
        "MCS 64qam 17, A = 600, G = 1440, 64qam, rayleigh, exact demapper, versions 0,2, early stop, 2 units, scaled, "
        "scale auto, 8 iterations");
    EXPECT_EQ(headingOf("--transport-block-size 40 --coded-bits 256 --modulation 256qam --soft-buffer-bits 6 "
                        "--soft-buffer-size 180 --redundancy-versions 1 --esn0 20 --scale 2"),
              "A = 40, G = 256, 256qam, version 1, soft buffer of 6 bits, N_IR = 180, 2 units, scaled, scale 2, 8 "
              "iterations");
    EXPECT_EQ(headingOf("--block-size 40 --modulation 64qam --channel block-rayleigh --ebn0 20"),
              "K = 40, 64qam, block-rayleigh, 2 units, scaled, scale auto, 8 iterations");
    EXPECT_EQ(headingOf("--block-size 40 --esn0 2"), "K = 40, 2 units, scaled, scale auto, 8 iterations");
}

TEST_F(BerLink, ShowsTheAxisAndTheThroughput)
{
    const std::string table = ber(words("--transport-block-size 1000 --coded-bits 1500 --esn0 20 --max-blocks 64"));
    EXPECT_NE(table.find("point  Es/N0    blocks failed     BLER     95 % bounds bit/symb blocks/s   time\n"),
              std::string::npos);
    EXPECT_NE(table.find("    0     20        64      0        0   below 4.6e-02   1.3333"), std::string::npos)
        << table;
    EXPECT_NE(ber(words("--block-size 40 --ebn0 9 --max-blocks 1")).find("  Eb/N0 "), std::string::npos);
}

TEST_F(BerLink, WritesWhatBelongsToTransportBlocks)
{
    for (const CsvRow& row : csvRows(berFile(twoSizes + words("--max-blocks 100")))) {
        const bool isSmall = row.at("transport_block_size") == "120";
        EXPECT_EQ(row.at("block_size"), isSmall ? "144" : "3584");
        EXPECT_EQ(row.at("code_blocks"), isSmall ? "1" : "2");
        EXPECT_EQ(row.at("coded_bits"), isSmall ? "200" : "11668");
        EXPECT_EQ(row.at("modulation"), "16qam");
        EXPECT_EQ(row.at("redundancy_versions"), "0 2");
        EXPECT_EQ(row.at("transmissions"), "2");
        EXPECT_EQ(row.at("channel"), "awgn");
        EXPECT_EQ(row.at("axis"), "esn0");
        const double codeBlocks = isSmall ? 1 : 2;
        const double sent = std::stod(row.at("sent_transmissions"));
        const double right = std::stod(row.at("blocks")) - std::stod(row.at("block_errors"));
        EXPECT_GT(sent, std::stod(row.at("blocks")));
        EXPECT_EQ(std::stod(row.at("run_iterations")), 4 * codeBlocks * sent);
        EXPECT_NEAR(std::stod(row.at("mean_transmissions")), sent / std::stod(row.at("blocks")), 1e-5);
        EXPECT_EQ(row.at("mean_iterations"), "4.000000e+00");
        EXPECT_NEAR(std::stod(row.at("throughput")), right / sent * (isSmall ? 120 / 50.0 : 7000 / 2917.0), 1e-5);
        const double perBit = isSmall ? 120 / 50.0 : 7000 / 2917.0;
        EXPECT_NEAR(std::stod(row.at("esn0_db")) - std::stod(row.at("ebn0_db")), 10 * std::log10(perBit), 6e-4);
    }
}

TEST_F(BerLink, BothAxesMeetTheSamePoint)
{
    const auto rowAt = [this](const std::string& axis) {
        return csvRows(berFile(words("--transport-block-size 100 --coded-bits 200 --max-blocks 40 " + axis))).at(0);
    };
    CsvRow a = rowAt("--esn0 1");  // one information bit for each symbol
    CsvRow b = rowAt("--ebn0 1");
    EXPECT_EQ(a["ebn0_db"], "1");
    EXPECT_EQ(b["axis"], "ebn0");
    a["axis"] = b["axis"];
    EXPECT_EQ(a, b);
    // BPSK sends a plain code block of 40 bits with 132 symbols.
    CsvRow plain = csvRows(berFile(words("--block-size 40 --ebn0 3 --max-blocks 200"))).at(0);
    CsvRow other = csvRows(berFile(words("--block-size 40 --esn0 -2.185 --max-blocks 200"))).at(0);
    EXPECT_EQ(other.at("esn0_db"), "-2.185");
    EXPECT_EQ(plain.count("esn0_db"), 0U);
    EXPECT_EQ(other.at("ebn0_db"), "3");
    EXPECT_EQ(other.at("bit_errors"), plain.at("bit_errors"));
}

TEST_F(BerLink, SendsPlainCodeBlocksOverAnyModulation)
{
    const std::vector<CsvRow> rows = csvRows(
        berFile(words("--block-size 104 --modulation qpsk,256qam --channel rayleigh --esn0 0,30 --max-blocks 100")));
    ASSERT_EQ(rows.size(), 4U);
    EXPECT_EQ(rows[0].at("modulation"), "qpsk");
    EXPECT_EQ(rows[3].at("modulation"), "256qam");
    EXPECT_EQ(rows[3].at("block_errors"), "0");
    EXPECT_EQ(rows[2].at("block_errors"), "100");
    EXPECT_EQ(rows[3].at("transport_block_size"), "0");
    EXPECT_EQ(rows[3].at("throughput"), "2.536585e+00") << "104 bits on 41 symbols";
}

TEST_F(BerLink, TakesSizesFromAnMcs)
{
    const std::vector<CsvRow> rows =
        csvRows(berFile(words("--mcs 0:1,28 --resource-blocks 3 --resource-elements 138 --esn0 30 --max-blocks 1")));
    ASSERT_EQ(rows.size(), 3U);
    EXPECT_EQ(rows[0].at("mcs"), "64qam 0");
    EXPECT_EQ(rows[1].at("transport_block_size"), "88");
    EXPECT_EQ(rows[1].at("coded_bits"), "828");
    EXPECT_EQ(rows[2].at("mcs"), "64qam 28");
    EXPECT_EQ(rows[2].at("modulation"), "64qam");
    EXPECT_EQ(rows[2].at("transport_block_size"), "2216");
    const CsvRow high =
        csvRows(
            berFile(words(
                "--mcs 27 --mcs-table 256qam --resource-blocks 1 --resource-elements 138 --esn0 40 --max-blocks 1")))
            .at(0);
    EXPECT_EQ(high.at("mcs"), "256qam 27");
    EXPECT_EQ(high.at("transport_block_size"), "968");
    EXPECT_EQ(high.at("coded_bits"), "1104");
}

TEST_F(BerLink, HoldsTheCommandThatRepeatsTheRun)
{
    const std::string arguments =
        "--transport-block-size 40,100 --coded-bits 160,240 --modulation bpsk,16qam --redundancy-versions 0,2,3,1 "
        "--soft-buffer-bits 7 --soft-buffer-size 300 --channel block-rayleigh --demapper exact --early-stop crc "
        "--num-pu "
        "4 --algorithm table --scale 3 --iterations 5 --esn0 10:1:12";
    const std::string json = berFile(words(arguments + " --max-blocks 2"), "results.json");
    EXPECT_NE(json.find("\"command\": \"morvik ber " + arguments), std::string::npos) << json.substr(0, 500);
    const std::string byMcs = "--mcs 3,4 --mcs-table 256qam --resource-blocks 2 --resource-elements 100 --num-pu 2";
    EXPECT_NE(berFile(words(byMcs + " --esn0 5 --max-blocks 1"), "results.json").find("morvik ber " + byMcs),
              std::string::npos);
}

TEST_F(BerLink, GivesTheSameForAnyNumberOfThreadsAndInParts)
{
    const std::string whole = berFile(twoSizes + words("--frames 0:150 --threads 1"), "whole.csv");
    EXPECT_EQ(berFile(twoSizes + words("--frames 0:150 --threads 3"), "other.csv"), whole);
    berFile(twoSizes + words("--frames 0:70"), "a.json");
    berFile(twoSizes + words("--frames 70:150"), "b.csv");
    merge({"b.csv", "a.json"}, "merged.csv");
    EXPECT_EQ(withoutTimes(morvik.read("merged.csv")), whole);
    merge({"merged.csv"}, "merged.json");
    merge({"merged.json"}, "again.csv");
    EXPECT_EQ(withoutTimes(morvik.read("again.csv")), whole);
}

TEST_F(BerLink, ResumesWithLargerLimits)
{
    const std::string whole = berFile(twoSizes + words("--max-blocks 130"), "whole.csv");
    berFile(twoSizes + words("--max-blocks 30"), "grown.csv");
    ber(twoSizes + words("--max-blocks 130 --output grown.csv --resume --quiet"));
    EXPECT_EQ(withoutTimes(morvik.read("grown.csv")), whole);
    ber(twoSizes + words("--max-blocks 130 --output grown.csv --resume --quiet"));
    EXPECT_EQ(withoutTimes(morvik.read("grown.csv")), whole);
    expectRefused(
        words("ber --output grown.csv --resume --max-blocks 130 --early-stop crc") + twoSizes,
        "morvik ber: grown.csv: holds other results, and there is no checkpoint to resume; --overwrite starts "
        "anew");
}

TEST_F(BerLink, ReplaysTransportBlocksAsCodeBlocks)
{
    const std::vector<CsvRow> rows = csvRows(berFile(twoSizes + words("--max-blocks 30")));
    const std::string failures = rows.at(0).at("failed_frames");
    ASSERT_FALSE(failures.empty());
    const std::string frame = failures.substr(0, failures.find(' '));
    const std::string out = ber(twoSizes + Arguments{"--replay", "0:" + frame});
    EXPECT_EQ(out.substr(out.find('\n') + 1),
              "morvik decode point0.frame" + frame + ".csv --reference point0.frame" + frame +
                  ".bits --num-pu 2 --algorithm scaled --iterations 4\n");
    EXPECT_NE(out.substr(0, 2), "0 ");
}

TEST_F(BerLink, RefusesWhatCannotBeSent)
{
    expectError("--transport-block-size 1000 --coded-bits 1501",
                "--coded-bits 1501 is no multiple of the 2 bits of --modulation qpsk, the nearest are 1500 and 1502");
    expectError("--transport-block-size 1000 --coded-bits 3 --modulation 16qam",
                "--coded-bits 3 is no multiple of the 4 bits of --modulation 16qam, the least is 4");
    expectError("--transport-block-size 20000 --coded-bits 12 --modulation 64qam",
                "--coded-bits 12 is too small for --transport-block-size 20000, whose 4 code blocks take 24 or more "
                "with --modulation 64qam");
    expectError("--transport-block-size 1000000 --code-rate 0.01",
                "--code-rate 0.01 is too low for --transport-block-size 1000000: a transmission has up to 67108864 "
                "coded bits, expected 0.015 or more");
    const std::string large = "--mcs 27 --mcs-table 256qam --resource-blocks 100 --resource-elements 130 ";
    expectError(large + "--soft-buffer-size 1",
                "--soft-buffer-size 1 is too small for --mcs 27, transport blocks of 97896 bits, the least that holds "
                "a bit of each of its 16 code blocks is 32");
    expectError("--transport-block-size 40 --coded-bits 100 --soft-buffer-size 1",
                "--soft-buffer-size 1 is too small for --transport-block-size 40, the least that holds a bit of it is "
                "2");
}

TEST_F(BerLink, RefusesCodeRatesAboveOne)
{
    expectError("--transport-block-size 1000 --coded-bits 1000",
                "--coded-bits 1000 is too small for --transport-block-size 1000: the code rate with CRCs is 1.024, "
                "above 1; expected 1024 or more");
    expectError("--transport-block-size 7000 --coded-bits 3500 --redundancy-versions 0,2",
                "--coded-bits 3500 is too small for --transport-block-size 7000: the code rate with CRCs is 1.010 "
                "after 2 transmissions, above 1; expected 3536 or more");
    expectError("--transport-block-size 40 --code-rate 0.9 --modulation bpsk",
                "--code-rate 0.9 is too high for --transport-block-size 40: the code rate with CRCs is 1.455, above 1; "
                "expected 0.625 or less");
    expectError("--mcs 28 --resource-blocks 6 --resource-elements 120",
                "--resource-elements 120 is too small for --mcs 28, transport blocks of 4392 bits: the code rate with "
                "CRCs is 1.022, above 1; expected 123 or more");
    for (const char* const fit : {"--transport-block-size 1000 --coded-bits 1024",
                                  "--transport-block-size 7000 --coded-bits 3536 --redundancy-versions 0,2",
                                  "--transport-block-size 40 --code-rate 0.625 --modulation bpsk",
                                  "--mcs 28 --resource-blocks 6 --resource-elements 123"}) {
        EXPECT_EQ(morvik.run(words("ber --esn0 0 --max-blocks 1 " + std::string(fit))).status, 0) << fit;
    }
}

TEST_F(BerLink, TellsOfCodeRatesThatATerminalMayLeaveOut)
{
    const auto told = [this](const std::string& arguments) {
        return morvik.run(words("ber " + arguments + " --max-blocks 1 --esn0 30")).err;
    };
    const std::string may = ": above 0.931, a terminal may leave out decoding (3GPP TS 36.213, 7.1.7)\n";
    EXPECT_EQ(told("--transport-block-size 976 --coded-bits 1076"), "") << "0.929";
    EXPECT_EQ(told("--transport-block-size 976 --coded-bits 1072,1000"),
              "morvik ber: the code rate with CRCs is 1.000 for A = 976, G = 1000, the highest of 2 above 0.931" + may);
    EXPECT_EQ(told("--mcs 27:28 --resource-blocks 6 --resource-elements 130"),
              "morvik ber: the code rate with CRCs is 0.944 for MCS 64qam 28" + may);
    EXPECT_EQ(told("--block-size 40"), "");
}

TEST_F(BerLink, TellsOfSoftBuffersThatTheAutomaticScaleFillsUp)
{
    const auto told = [this](const std::string& arguments) {
        return morvik.run(words("ber --transport-block-size 40 --coded-bits 120 --max-blocks 1 --esn0 9 " + arguments))
            .err;
    };
    EXPECT_EQ(told("--soft-buffer-bits 6"), "");
    EXPECT_EQ(told("--soft-buffer-bits 5 --scale 2"), "");
    EXPECT_EQ(told("--soft-buffer-bits 5"),
              "morvik ber: soft buffers of 5 bits saturate with the automatic scale, which suits 6 bits or more; "
              "a smaller scale, such as 2, may decode more blocks\n");
    EXPECT_EQ(told("--soft-buffer-bits 4 --scale auto,2"),
              "morvik ber: soft buffers of 4 bits saturate with the automatic scale, which suits 6 bits or more; "
              "a smaller scale, such as 2, may decode more blocks\n");
}

TEST_F(BerLink, TakesEitherNameOfRedundancyVersions)
{
    const std::string sizes = "--transport-block-size 40 --coded-bits 120 --esn0 4 --max-blocks 3 ";
    EXPECT_EQ(berFile(words(sizes + "--redundancy-version 0,2"), "a.csv"),
              berFile(words(sizes + "--redundancy-versions 0,2"), "b.csv"));
    morvik.write("bits", std::string(40, '1') + '\n');
    const std::string encode = "encode bits --transport-block --coded-bits 120 ";
    EXPECT_EQ(morvik.run(words(encode + "--redundancy-version 0,2")).out,
              morvik.run(words(encode + "--redundancy-versions 0,2")).out);
}

TEST_F(BerLink, GoesOnUntilTheErrorRateHasFallen)
{
    const std::string rules = " --block-errors 10 --max-blocks 300 --stop-bler 0.01 ";
    for (const char* const sent : {"--transport-block-size 1000 --code-rate 0.9 --modulation 256qam",
                                   "--transport-block-size 40 --code-rate 0.33 --modulation 256qam",
                                   "--transport-block-size 1000 --code-rate 0.9 --channel rayleigh",
                                   "--transport-block-size 40 --code-rate 0.33 --channel block-rayleigh",
                                   "--transport-block-size 1000 --code-rate 0.5 --redundancy-versions 0,2,3,1",
                                   "--block-size 40 --modulation 64qam --channel rayleigh"}) {
        SCOPED_TRACE(sent);
        const CommandResult result =
            morvik.run(words(std::string("ber ") + sent + rules + "--output r.csv --overwrite"));
        EXPECT_EQ(result.err, "");
        const std::vector<CsvRow> rows = csvRows(morvik.read("r.csv"));
        EXPECT_GT(std::stod(rows.front().at("bler")), 0.5) << "it begins before the fall";
        EXPECT_LE(std::stod(rows.back().at("bler")), 0.01);
    }
    const CommandResult weak =
        morvik.run(words("ber --block-size 6144 --iterations 1,8 --quiet --output weak.csv" + rules));
    EXPECT_EQ(weak.status, 0);
    EXPECT_EQ(weak.err,
              "morvik ber: a curve ends at a block error rate above 0.01: 1 at Eb/N0 1.5 dB, K = 6144, 2 units, "
              "scaled, scale auto, 1 iteration; --esn0 or --ebn0 sets the range\n");
    EXPECT_EQ(morvik.run(words("ber --block-size 6144 --ebn0 0 --max-blocks 1")).err, "");
}

TEST_F(BerLink, RefusesOptionsThatContradictEachOther)
{
    expectError(
        "--block-size 40 --transport-block-size 40 --coded-bits 120",
        "--block-size sends plain code blocks, --transport-block-size transport blocks: only one of them can be "
        "given");
    expectError("--block-size 40 --mcs 1",
                "--block-size sends plain code blocks, --mcs transport blocks: only one of them can be given");
    expectError("--transport-block-size 40 --mcs 1",
                "--mcs has the sizes of --transport-block-size: only one of them can be given");
    for (const char* option : {"--redundancy-versions 0,2",
                               "--soft-buffer-bits 6",
                               "--soft-buffer-size 100",
                               "--coded-bits 120",
                               "--code-rate 0.5",
                               "--early-stop crc"}) {
        expectError(std::string("--block-size 40 ") + option,
                    std::string(option) + " needs transport blocks, by --transport-block-size or --mcs");
    }
    const std::string either = "--transport-block-size needs either --coded-bits or --code-rate";
    expectError("--transport-block-size 40", either);
    expectError("--transport-block-size 40 --coded-bits 120 --code-rate 0.3", either);
    expectError("--transport-block-size 40 --coded-bits 120 --mcs-table 64qam",
                "--mcs-table, --resource-blocks and --resource-elements need --mcs");
    expectError("--mcs 1", "--mcs needs --resource-blocks, 1 to 110");
    expectError("--mcs 1 --resource-blocks 1 --modulation qpsk",
                "--mcs sets what --coded-bits, --code-rate and --modulation do: they cannot be given with it");
    expectError("--mcs 28 --mcs-table 256qam --resource-blocks 1",
                "--mcs 28 is not in --mcs-table 256qam, expected 0 to 27");
    expectError("--transport-block-size 40 --coded-bits 120 --each-iteration --redundancy-versions 0,1",
                "--each-iteration counts one transmission, --redundancy-versions 0,1 are 2");
    expectError("--transport-block-size 40 --coded-bits 120 --each-iteration --early-stop crc",
                "--each-iteration counts after every iteration, --early-stop crc keeps one: give one of them");
    expectError("--block-size 40 --ebn0 1 --esn0 1", "--ebn0 excludes --esn0; see 'morvik ber --help'");
}

TEST_F(BerLink, RefusesValues)
{
    expectNotAllowed("--transport-block-size", "0", "expected an integer from 1 to 16777216");
    expectNotAllowed("--coded-bits", "67108865", "expected an integer from 1 to 67108864");
    expectNotAllowed("--code-rate", "1.1", "expected a number above 0 and up to 1, with at most three decimals");
    expectNotAllowed("--mcs", "29", "expected 0 to 28, or FROM:TO");
    expectNotAllowed("--mcs", "5:4", "expected 0 to 28, or FROM:TO");
    expectNotAllowed("--mcs-table", "16qam", "expected 64qam or 256qam");
    expectNotAllowed("--resource-blocks", "111", "expected an integer from 1 to 110");
    expectNotAllowed("--resource-elements", "169", "expected an integer from 1 to 168");
    expectNotAllowed("--modulation", "8psk", "expected bpsk, qpsk, 16qam, 64qam or 256qam");
    expectNotAllowed("--redundancy-versions", "4", "expected an integer from 0 to 3");
    expectNotAllowed("--soft-buffer-bits", "1", "expected an integer from 2 to 16");
    expectNotAllowed("--channel", "rice", "expected awgn, rayleigh or block-rayleigh");
    expectNotAllowed("--demapper", "soft", "expected max-log or exact");
    expectNotAllowed("--early-stop", "always", "expected none or crc");
    expectNotAllowed("--esn0", "51", "expected -50 to 50 dB, with at most three decimals, or START:STEP:STOP");
    expectNotAllowed(
        "--redundancy-versions", "0,1,2,3,0,1,2,3,0,1,2,3,0,1,2,3,0", "there are 16 transmissions at most");
}

}  // namespace morvik::support
