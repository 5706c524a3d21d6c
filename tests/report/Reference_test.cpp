// Reference: which files of error rates are read, how, and in what words others are refused.
#include "report/Reference.h"

#include <gtest/gtest.h>

#include <cmath>
#include <filesystem>

#include "support/CommaLocale.h"
#include "support/TemporaryFolder.h"

namespace morvik::report {
namespace {

class Reference : public testing::Test {
protected:
    std::vector<Curve> read(const std::string& text,
                            morvik::simulation::Axis axis = morvik::simulation::Axis::ebn0) const
    {
        itsFiles.write("rates.csv", text);
        return readReference(path(), axis);
    }

    /// Expects a refusal in these words, after the file's name.
    void expectRefused(const std::string& text, const std::string& words) const
    {
        try {
            read(text);
            ADD_FAILURE() << "was not refused: " << text;
        } catch (const std::runtime_error& error) {
            EXPECT_EQ(error.what(), path() + words);
        }
    }

    std::string path(const std::string& name = "rates.csv") const
    {
        return itsFiles.path(name);
    }

    const morvik::support::TemporaryFolder itsFiles;
};

Curve readOnly(const std::string& name)
{
    const auto curves =
        readReference(MORVIK_ERROR_RATES "/" + name + ".csv",
                      name.rfind("link_", 0) == 0 ? morvik::simulation::Axis::esn0 : morvik::simulation::Axis::ebn0);
    EXPECT_EQ(curves.size(), 1U);
    return curves.at(0);
}

TEST_F(Reference, MayHaveAByteOrderMark)
{
    const std::vector<Curve> curves = read(
        "\xEF\xBB\xBF"
        "ebn0_db, ber\n1, 0.5\n");
    ASSERT_EQ(curves.size(), 1U);
    EXPECT_EQ(curves[0].samples.at(0).ber, 0.5);
}

TEST_F(Reference, ReadsPublishedErrorRates)
{
    const Curve curve = readOnly("aff3ct_lte_k6144_i6_float32");
    EXPECT_EQ(curve.title, "Turbo (18444,6144) BCJR 32-bit 6 ite. LTE");
    EXPECT_TRUE(curve.reference);
    ASSERT_EQ(curve.samples.size(), 11U);
    const Sample& last = curve.samples.back();
    EXPECT_EQ(last.ebn0, 1.0);
    EXPECT_EQ(last.ber, 1.30e-8);
    EXPECT_EQ(last.bler, 3.26e-5);
    EXPECT_EQ(last.blocks, 15333312U);
    EXPECT_EQ(last.bitErrors, 1228U);
    EXPECT_EQ(last.blockErrors, 500U);
    EXPECT_TRUE(std::isnan(last.berLow) && std::isnan(last.berHigh) && std::isnan(last.blerLow) &&
                std::isnan(last.blerHigh));
    EXPECT_TRUE(std::isnan(last.clipped));
    EXPECT_FALSE(last.berBelow || last.blerBelow);
}

TEST_F(Reference, EveryFileOfErrorRatesHasATitle)
{
    int files = 0;
    for (const auto& entry : std::filesystem::directory_iterator(MORVIK_ERROR_RATES)) {
        if (entry.path().extension() == ".csv") {
            const std::string name = entry.path().stem().string();
            const Curve curve = readOnly(name);
            EXPECT_NE(curve.title, name);
            EXPECT_GE(curve.samples.size(), 9U);
            ++files;
        }
    }
    EXPECT_EQ(files, 8);
}

TEST_F(Reference, ReadsResultsOfARun)
{
    const auto curves = read(
        "point,block_size,num_pu,algorithm,scale_option,iterations,ebn0_db,scale,frames,blocks,bit_errors,block_errors,"
        "ber,ber_low,ber_high,bler,bler_low,bler_high,clipped_fraction,failed_frames,seconds\n"
        "0,512,8,scaled,auto,6,1,8.5,0:1000,1000,600,20,1.2e-3,1.0e-3,1.4e-3,2.0e-2,1.2e-2,3.1e-2,4.5e-4,3 17,0.1\n"
        "1,512,8,scaled,auto,6,2,9.5,0:1000,1000,0,0,0,0,5.9e-6,0,0,3.0e-3,9e-4,,0.1\n"
        "2,512,4,table,8,6,1,8,0:1000,1000,500,10,1.0e-3,0,0.1,1e-2,0,0.1,4e-4,5,0.1\n");
    ASSERT_EQ(curves.size(), 2U);
    EXPECT_EQ(curves[0].title, "rates: K = 512, 8 units, scaled, 6 iterations");
    EXPECT_EQ(curves[1].title, "rates: K = 512, 4 units, table, 6 iterations, scale 8");
    EXPECT_TRUE(curves[0].reference && curves[1].reference);
    ASSERT_EQ(curves[0].samples.size(), 2U);
    const Sample& first = curves[0].samples[0];
    EXPECT_EQ(first.blocks, 1000U);
    EXPECT_EQ(first.berLow, 1.0e-3);
    EXPECT_EQ(first.berHigh, 1.4e-3);
    EXPECT_EQ(first.blerLow, 1.2e-2);
    EXPECT_EQ(first.blerHigh, 3.1e-2);
    EXPECT_EQ(first.clipped, 4.5e-4);
    EXPECT_FALSE(first.berBelow || first.blerBelow);
    const Sample& withoutErrors = curves[0].samples[1];
    EXPECT_TRUE(withoutErrors.berBelow && withoutErrors.blerBelow);
    EXPECT_EQ(withoutErrors.berHigh, 5.9e-6);
    EXPECT_EQ(withoutErrors.blerHigh, 3.0e-3);
}

TEST_F(Reference, ColumnsMayComeInAnyOrderAndOneRateIsEnough)
{
    const auto curves = read("fer , ebn0_db\n 1e-1, 0.5 \n");
    ASSERT_EQ(curves.size(), 1U);
    EXPECT_EQ(curves[0].title, "rates");
    EXPECT_EQ(curves[0].samples.at(0).ebn0, 0.5);
    EXPECT_EQ(curves[0].samples.at(0).bler, 0.1);
    EXPECT_TRUE(std::isnan(curves[0].samples.at(0).ber));
    EXPECT_EQ(curves[0].samples.at(0).blocks, 0U);
    EXPECT_EQ(read("ebn0_db,ber\n0,1e-5").at(0).samples.at(0).ber, 1e-5);
}

TEST_F(Reference, ZeroWithoutABoundIsNoBound)
{
    const Sample sample = read("ebn0_db,ber,fer\n0.8,0.0000e+00,0\n").at(0).samples.at(0);
    EXPECT_EQ(sample.ber, 0);
    EXPECT_FALSE(sample.berBelow || sample.blerBelow);
}

TEST_F(Reference, AcceptsCarriageReturnsBlankLinesCommentsAndEmptyFields)
{
    const auto curves = read("# note\r\n#title:  Mine \r\n\r\nebn0_db,ber,bler\r\n1,,0.5\r\n# note\r\n2,0.1,\r\n\r\n");
    ASSERT_EQ(curves.size(), 1U);
    EXPECT_EQ(curves[0].title, "Mine");
    ASSERT_EQ(curves[0].samples.size(), 2U);
    EXPECT_TRUE(std::isnan(curves[0].samples[0].ber));
    EXPECT_TRUE(std::isnan(curves[0].samples[1].bler));
}

TEST_F(Reference, LocalesHaveNoSay)
{
    const CommaLocale locale;
    EXPECT_EQ(read("ebn0_db,ber,block_size\n1.5,1.5e-3,6144\n").at(0).title, "rates: K = 6144");
    expectRefused("ebn0_db,ber\n0,2.5\n",
                  ":2: \"2.5\" in the column ber is not allowed, expected a number from 0 to 1");
}

TEST_F(Reference, TakesTransportBlocksOverEsN0)
{
    constexpr auto esn0 = morvik::simulation::Axis::esn0;
    const auto curves = read(
        "transport_block_size,coded_bits,esn0_db,blocks,block_errors,bit_errors,bler\n"
        "1000,1500,3.1,158,100,5655,0.6329\n1000,1500,2.5,100,100,9650,1\n",
        esn0);
    ASSERT_EQ(curves.size(), 1U);
    EXPECT_EQ(curves[0].title, "rates: A = 1000, G = 1500");
    EXPECT_EQ(curves[0].samples.at(0).esn0, 2.5);
    EXPECT_EQ(curves[0].samples.at(1).bler, 0.6329);
    EXPECT_EQ(read("mcs,esn0_db,ebn0_db,throughput,bler\n64qam 3,1,2,0.5,0\n").at(0).title, "rates: MCS 64qam 3");
    EXPECT_EQ(read("block_size,modulation,ebn0_db,bler\n40,16qam,2,0.5\n").at(0).title, "rates: K = 40, 16qam");
    expectRefused("esn0_db,ber\n,0.5\n", ":2: row without a value in the column esn0_db");
}

TEST_F(Reference, GoesToTheAxisOfThePictures)
{
    constexpr auto esn0 = morvik::simulation::Axis::esn0;
    const auto sampleOf = [this](const std::string& text, morvik::simulation::Axis axis) {
        return read(text, axis).at(0).samples.at(0);
    };
    // Two thirds of a bit for each symbol of QPSK are 1.761 dB.
    const std::string sizes = "transport_block_size,coded_bits,modulation,";
    EXPECT_NEAR(sampleOf(sizes + "ebn0_db,ber\n1000,3000,qpsk,1,0.5\n", esn0).esn0, -0.761, 1e-3);
    EXPECT_NEAR(
        sampleOf(sizes + "esn0_db,ber\n1000,3000,qpsk,1,0.5\n", morvik::simulation::Axis::ebn0).ebn0, 2.761, 1e-3);
    // 40 bits of 132 of BPSK are -5.185 dB.
    const morvik::report::Sample plain = sampleOf("block_size,ebn0_db,ber\n40,5.185,0.5\n", esn0);
    EXPECT_NEAR(plain.esn0, 0, 1e-3);
    EXPECT_EQ(plain.ebn0, 5.185);
    EXPECT_TRUE(std::isnan(sampleOf("esn0_db,ebn0_db,ber\n1,2,0.5\n", morvik::simulation::Axis::ebn0).esn0))
        << "as of the other curves there";
    EXPECT_EQ(sampleOf("esn0_db,ebn0_db,ber\n1,2,0.5\n", esn0).esn0, 1);
    const std::string refused =
        ":2: row without Eb/N0, over which curves are drawn here; it could be computed with block_size, or with "
        "transport_block_size, coded_bits and modulation";
    expectRefused("esn0_db,ber\n1,0.5\n", refused);
    for (const char* const row : {"0,100,qpsk,1,0.5", "100,0,qpsk,1,0.5", "100,400,8psk,1,0.5", "100,400,,1,0.5"}) {
        expectRefused(sizes + "esn0_db,ber\n" + row + '\n', refused);
    }
}

TEST_F(Reference, RefusesFilesThatCannotBeRead)
{
    for (const auto& [name, reason] : {std::pair("missing.csv", ": cannot be opened: No such file or directory"),
                                       std::pair("", ": cannot be read: Is a directory")}) {
        try {
            readReference(path(name));
            ADD_FAILURE() << name;
        } catch (const std::runtime_error& error) {
            EXPECT_EQ(error.what(), path(name) + reason);
        }
    }
}

TEST_F(Reference, RefusesFilesWithoutRates)
{
    expectRefused("", ": has no header line");
    expectRefused("# title: nothing\n\n", ": has no header line");
    expectRefused("ebn0_db,ber\n", ": has no row of error rates");
}

TEST_F(Reference, RefusesOtherColumns)
{
    const std::string words =
        "this line must name the columns, ebn0_db or esn0_db and one of ber, bler and fer among them";
    expectRefused("0.0,1e-1,1e-2\n", ":1: " + words);
    expectRefused("# a\nebn0_db,rate\n", ":2: " + words);
    expectRefused("ber,fer\n", ":1: " + words);
    expectRefused("ebn0_db,ber,ber\n", ":1: column \"ber\" appears twice");
}

TEST_F(Reference, RefusesRowsThatDoNotFit)
{
    const std::string header = "ebn0_db,ber,frames\n";
    expectRefused(header + "0,0.5\n", ":2: row of 2 fields, there are 3 columns");
    expectRefused(header + "0,0.5,1\n1,0.5,1,2\n", ":3: row of 4 fields, there are 3 columns");
    expectRefused(header + ",0.5,1\n", ":2: row without a value in the column ebn0_db");
}

TEST_F(Reference, RefusesValuesThatCannotBe)
{
    const std::string header = "ebn0_db,ber,ber_low,ber_high,blocks,bit_errors,block_errors,block_size\n";
    expectRefused(header + "0,0.1,,,10,,11,40\n", ":2: block_errors 11 cannot be, of 10 blocks");
    expectRefused(header + "0,0.1,,,10,401,10,40\n", ":2: bit_errors 401 cannot be, of 10 blocks of 40 bits");
    const std::string bounds = ":2: the bounds ber_low and ber_high are not around ber";
    expectRefused(header + "0,0.1,0.2,,,,,\n", bounds);
    expectRefused(header + "0,0.1,,0.05,,,,\n", bounds);
    expectRefused(header + "0,,0.3,0.2,,,,\n", bounds);
    expectRefused("ebn0_db,ber" + std::string(999, ',') + '\n', ":1: names 1001 columns, there may be 1000");
    EXPECT_EQ(read(header + "0,0.1,0.1,0.1,10,400,10,40\n0,0.1,,,,401,11,\n").size(), 2U);
}

TEST_F(Reference, RefusesRunsThatCannotBe)
{
    const auto expectNone = [this](const std::string& column, const std::string& field, const std::string& allowed) {
        expectRefused("ebn0_db,ber,blocks," + column + "\n0,0.1,10," + field + '\n',
                      ":2: \"" + field + "\" in the column " + column + " is not allowed, expected " + allowed);
    };
    for (const char* const size : {"41", "0", "6145"}) {
        expectNone("block_size", size, "a block size of 3GPP TS 36.212, 40 to 6144");
    }
    for (const char* const units : {"0", "3", "16"}) {
        expectNone("num_pu", units, "2, 4 and 8");
    }
    for (const char* const seconds : {"nan", "-0.1", "inf", "1e13", "soon"}) {
        expectNone("seconds", seconds, "a number from 0 to 1e+12");
    }
    for (const char* const seed : {"-1", "1.5", "18446744073709551616"}) {
        expectNone("seed", seed, "an integer from 0 to 18446744073709551615");
    }
    for (const char* const frames : {"all", "9:0", "0:9", "0:5 4:9"}) {
        expectNone("frames", frames, "a number, or ranges FROM:TO with as many frames as there are blocks");
    }
    const std::string header = "ebn0_db,ber,blocks,block_size,num_pu,seconds,seed,frames\n";
    EXPECT_EQ(read(header + "0,0.1,10,40,2,0,1,0:10\n1,0.1,10,40,2,1.5,1,0:4 6:12\n2,0.1,10,,,,,10\n").size(), 2U);
}

TEST_F(Reference, RefusesValuesThatAreNone)
{
    const std::string header = "ebn0_db,ber,frames\n";
    const std::string rates = " in the column ber is not allowed, expected a number from 0 to 1";
    const std::string counts =
        " in the column blocks is not allowed, expected an integer from 0 to 18446744073709551615";
    const std::string places = " in the column ebn0_db is not allowed, expected a number from -1000 to 1000";
    expectRefused(header + "0,high,1\n", ":2: \"high\"" + rates);
    expectRefused(header + "0,1.01,1\n", ":2: \"1.01\"" + rates);
    expectRefused(header + "0,-0.1,1\n", ":2: \"-0.1\"" + rates);
    expectRefused(header + "0,nan,1\n", ":2: \"nan\"" + rates);
    expectRefused(header + "0,0.1x,1\n", ":2: \"0.1x\"" + rates);
    expectRefused(header + "0,\x1b[31m\xff,1\n", ":2: \"\\x1b[31m\\xff\"" + rates);
    expectRefused(header + "0," + std::string(50, '9') + ",1\n", ":2: \"" + std::string(40, '9') + "...\"" + rates);
    expectRefused(header + "0,0.1,-1\n", ":2: \"-1\"" + counts);
    expectRefused(header + "0,0.1,1.5\n", ":2: \"1.5\"" + counts);
    expectRefused(header + "0,0.1,18446744073709551616\n", ":2: \"18446744073709551616\"" + counts);
    expectRefused(header + "inf,0.1,1\n", ":2: \"inf\"" + places);
    expectRefused(header + "1e4,0.1,1\n", ":2: \"1e4\"" + places);
    expectRefused(
        "ebn0_db,ber,block_size\n0,0.1,4294967296\n",
        ":2: \"4294967296\" in the column block_size is not allowed, expected an integer from 0 to 4294967295");
}

}  // namespace
}  // namespace morvik::report
