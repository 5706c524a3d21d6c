// TransportSimulator: what comes of transport blocks is what sending and decoding them one at a time gives.
#include "simulation/TransportSimulator.h"

#include <gtest/gtest.h>

#include "base/Thousandths.h"
#include "link/coding/Crc.h"
#include "simulation/FrameSimulator.h"
#include "simulation/Packing.h"
#include "simulation/Replay.h"

namespace morvik::simulation {
namespace {

namespace link = morvik::link;

/// 3 code blocks of two sizes, with filler bits, at an Es/N0 where some fail.
LinkFormat threeBlocks()
{
    LinkFormat format;
    format.transportBlockSize = 13001;
    format.codedBits = 20000;
    format.modulation = link::Modulation::qam16;
    format.versions = {0};
    return format;
}

Plan planOf(const LinkFormat& format, int milliEsn0, unsigned iterations = 6)
{
    Sweep sweep = {{}, {2}, {1}, {std::nullopt}, {iterations}, {milliEsn0}, {format}, Axis::esn0};
    Plan plan;
    plan.points = pointsOf(sweep);
    plan.seed = 3;
    return plan;
}

BatchResult resultOf(const Plan& plan, std::uint64_t first, std::uint32_t count)
{
    FrameSimulator simulator(plan, "");
    BatchResult result = simulator.begin({0, first, count});
    while (simulator.proceed(result)) {
    }
    return result;
}

/// A receiver of one transport block, written from its parts.
class PlainReceiver {
public:
    explicit PlainReceiver(const Plan& plan)
        : itsPoint(plan.points[0]),
          itsCore(itsPoint.numPu, itsPoint.algorithm, "generic"),
          itsSource(settingOf(itsPoint), plan.seed)
    {
    }

    struct Outcome {
        std::uint32_t wrongBits = 0;
        Reception reception;
    };

    Outcome receive(std::uint64_t frame)
    {
        Outcome outcome;
        itsSource.begin(frame, 1);
        for (unsigned t = 0; t < itsPoint.link.versions.size(); ++t) {
            std::uint32_t clipped = 0;
            itsSource.transmit({0}, t, itsBatches, &clipped);
            outcome.wrongBits = 0;
            outcome.reception.codeBlockErrors = 0;
            outcome.reception.transmissions += 1;
            bool fits = true;
            for (const link::CodeBlockBatch& batch : itsBatches) {
                for (std::size_t i = 0; i < batch.places.size(); ++i) {
                    fits = decode(batch, i, outcome) && fits;
                }
            }
            if (fits) {
                break;
            }
        }
        return outcome;
    }

private:
    static link::TransportSetting settingOf(const Point& point)
    {
        const LinkFormat& format = point.link;
        link::TransportSetting setting;
        setting.bits = format.transportBlockSize;
        setting.codedBits = format.codedBits;
        setting.symbols = {format.modulation, format.fading, format.demapper, point.milliEsn0};
        setting.versions = format.versions;
        setting.scales.assign(format.versions.size(), morvik::base::fromThousandths(point.milliScale));
        return setting;
    }

    /// Decodes a code block until its CRC fits, if that is asked for, and tells whether it does.
    bool decode(const link::CodeBlockBatch& batch, std::size_t i, Outcome& outcome)
    {
        Streams streams;
        for (unsigned s = 0; s < 3; ++s) {
            const auto first = batch.streams[s].begin() + static_cast<std::ptrdiff_t>(i * (batch.K + 4));
            streams[s].assign(first, first + static_cast<std::ptrdiff_t>(batch.K + 4));
        }
        const unsigned r = batch.places[i].block;
        const link::CodeBlocks& blocks = itsSource.code().blocks();
        std::vector<std::uint64_t> sent(link::wordsOf(batch.K));
        itsSource.sentBlock(0, r, sent.data());
        unsigned iterations = itsPoint.link.stopsEarly ? 1 : itsPoint.iterations;
        for (;; ++iterations) {
            std::vector<std::uint8_t> decided;
            itsCore.decode(streams, batch.K, 1, iterations, decided);
            std::uint32_t wrong = 0;
            std::vector<std::uint64_t> row(link::wordsOf(batch.K));
            for (unsigned k = blocks.fillersOf(r); k < batch.K; ++k) {
                wrong += decided[k] != (sent[k / 64] >> k % 64 & 1) ? 1U : 0U;
                row[k / 64] |= std::uint64_t{decided[k]} << k % 64;
            }
            const bool fits =
                (blocks.count > 1 ? link::crc24b(row.data(), 0, batch.K) : link::crc24a(row.data(), 0, batch.K)) == 0;
            if (fits || iterations == itsPoint.iterations) {
                outcome.wrongBits += wrong;
                outcome.reception.codeBlockErrors += wrong > 0 ? 1 : 0;
                outcome.reception.iterations += iterations;
                return fits;
            }
        }
    }

    const Point& itsPoint;
    Core itsCore;
    link::TransportSource itsSource;
    std::array<link::CodeBlockBatch, 2> itsBatches;
};

/// Compares frames with what the plain receiver gives; returns how many had errors and how many transmissions there
/// were.
std::pair<unsigned, std::uint64_t> expectAsOneByOne(const Plan& plan, std::uint64_t first, std::uint32_t count)
{
    const BatchResult result = resultOf(plan, first, count);
    EXPECT_EQ(result.wrongBits.size(), count);
    EXPECT_EQ(result.receptions.size(), count);
    PlainReceiver receiver(plan);
    unsigned failed = 0;
    std::uint64_t transmissions = 0;
    for (std::uint32_t i = 0; i < count; ++i) {
        const PlainReceiver::Outcome expected = receiver.receive(first + i);
        EXPECT_EQ(result.wrongBits[i], expected.wrongBits) << i;
        EXPECT_TRUE(result.receptions[i] == expected.reception) << i;
        failed += expected.wrongBits > 0 ? 1 : 0;
        transmissions += expected.reception.transmissions;
    }
    return {failed, transmissions};
}

TEST(TransportSimulator, GivesWhatDecodingOneByOneGives)
{
    const auto [failed, transmissions] =
        expectAsOneByOne(planOf(threeBlocks(), 9000), (std::uint64_t{1} << 40) + 5, 30);
    EXPECT_GT(failed, 0U);
    EXPECT_LT(failed, 30U);
    EXPECT_EQ(transmissions, 30U);
}

TEST(TransportSimulator, SendsAgainWhereACrcFailed)
{
    LinkFormat format = threeBlocks();
    format.versions = {0, 2};
    Plan plan = planOf(format, 9500, 4);
    plan.points[0].scaleOption = plan.points[0].milliScale;
    const auto [failed, transmissions] = expectAsOneByOne(plan, 0, 20);
    EXPECT_GT(transmissions, 20U);
    EXPECT_LT(transmissions, 40U);
    EXPECT_EQ(failed, 0U);
}

TEST(TransportSimulator, StopsWithTheFirstIterationWhoseCrcFits)
{
    LinkFormat format = threeBlocks();
    format.stopsEarly = true;
    const Plan plan = planOf(format, 9000);
    expectAsOneByOne(plan, 0, 20);
    std::uint64_t iterations = 0;
    for (const Reception& reception : resultOf(plan, 0, 20).receptions) {
        iterations += reception.iterations;
    }
    EXPECT_GT(iterations, 3 * 20U);
    EXPECT_LT(iterations, 3 * 20 * 6U);
}

TEST(TransportSimulator, FailsSmallBlocksUndetected)
{
    // A transport block of one bit behind hopeless noise: 24 bits of CRC fit by chance now and then.
    LinkFormat format;
    format.transportBlockSize = 1;
    format.codedBits = 40;
    format.modulation = link::Modulation::qpsk;
    format.versions = {0};
    const Plan plan = planOf(format, 0, 1);
    const BatchResult result = resultOf(plan, 0, 500);
    for (std::size_t i = 0; i < 500; ++i) {
        EXPECT_LE(result.wrongBits[i], 25U) << "filler bits are known";
        EXPECT_EQ(result.receptions[i].codeBlockErrors, result.wrongBits[i] > 0 ? 1U : 0U);
    }
}

/// Compares the counts after each iteration with those of runs with as many iterations.
void expectAsDecodingAnew(const LinkFormat& format, int milliEsn0, unsigned iterations)
{
    constexpr std::uint32_t frames = 70;
    Plan plan = planOf(format, milliEsn0, iterations);
    plan.eachIteration = true;
    const BatchResult all = resultOf(plan, 7, frames);
    ASSERT_EQ(all.wrongBits.size(), std::size_t{frames} * iterations);
    unsigned failed = 0;
    for (unsigned i = 1; i <= iterations; ++i) {
        const BatchResult one = resultOf(planOf(format, milliEsn0, i), 7, frames);
        EXPECT_EQ(one.clipped, all.clipped);
        for (std::size_t f = 0; f < frames; ++f) {
            ASSERT_EQ(all.wrongBits[iterations * f + i - 1], one.wrongBits[f]) << f << " after " << i;
            ASSERT_TRUE(all.receptions[iterations * f + i - 1] == one.receptions[f]) << f << " after " << i;
            failed += one.wrongBits[f] > 0 ? 1U : 0U;
        }
    }
    EXPECT_GT(failed, frames);
    EXPECT_LT(failed, frames * iterations);
}

TEST(TransportSimulator, CountsAfterEachIterationWhatDecodingAnewGives)
{
    LinkFormat format = threeBlocks();
    expectAsDecodingAnew(format, 9300, 4);
    format.stopsEarly = true;
    expectAsDecodingAnew(format, 9300, 4);
    format.transportBlockSize = 1000;  // alone, without filler bits
    format.codedBits = 2000;
    expectAsDecodingAnew(format, 7500, 4);
    format.stopsEarly = false;
    format.transportBlockSize = 999;  // and with them
    expectAsDecodingAnew(format, 7500, 4);
}

TEST(TransportSimulator, BatchesOfManyCodeBlocksHaveFewFrames)
{
    LinkFormat format = threeBlocks();
    EXPECT_EQ(smallestBatchOf(planOf(format, 9000).points[0]), 21U);
    format.transportBlockSize = 97896;
    format.codedBits = 200000;
    EXPECT_EQ(smallestBatchOf(planOf(format, 9000).points[0]), 4U);
    format.transportBlockSize = 1000000;
    EXPECT_EQ(smallestBatchOf(planOf(format, 9000).points[0]), 1U);
    EXPECT_EQ(smallestBatchOf(Point{}), 64U);
}

TEST(TransportSimulator, ResultsTravel)
{
    LinkFormat format = threeBlocks();
    format.versions = {0, 3};
    const BatchResult result = resultOf(planOf(format, 9500, 4), 0, 20);
    const BatchResult unpacked = unpackedResult(packed(result));
    EXPECT_EQ(unpacked.wrongBits, result.wrongBits);
    EXPECT_EQ(unpacked.clipped, result.clipped);
    EXPECT_TRUE(unpacked.receptions == result.receptions);
}

TEST(TransportSimulator, ReplaysTheLastTransmission)
{
    LinkFormat format = threeBlocks();
    const Plan plan = planOf(format, 8300);
    const ReplayedTexts texts = replay(plan, 0, 4, "");
    const link::CodeBlocks blocks = link::codeBlocksOf(format.transportBlockSize);
    std::size_t lines = 1;
    std::size_t bits = 0;
    for (unsigned r = 0; r < blocks.count; ++r) {
        lines += blocks.size(r) + 4;
        bits += blocks.size(r) + 1;
    }
    EXPECT_EQ(static_cast<std::size_t>(std::count(texts.softValues.begin(), texts.softValues.end(), '\n')), lines);
    EXPECT_EQ(texts.sentBits.size(), bits);
    EXPECT_NE(texts.softValues.find("\n2,"), std::string::npos) << "code blocks are numbered";
    EXPECT_EQ(texts.wrongBits, resultOf(plan, 4, 1).wrongBits[0]);
}

// The CRC's generator is the smallest error that it cannot see.
TEST(TransportCheck, KnowsErrorsThatACrcDoesNotSee)
{
    link::TransportSetting setting;
    setting.bits = 13001;
    setting.codedBits = 20000;
    setting.symbols = {link::Modulation::qam16, link::Fading::none, link::Demapper::maxLog, 0};
    setting.versions = {0};
    setting.scales = {4};
    const link::TransportSource made = [&] {
        link::TransportSource source(setting, 1);
        source.begin(0, 2);
        return source;
    }();
    TransportCheck check(made);
    check.begin(2);
    std::vector<std::uint8_t> bits = check.sentBits(1, 2);
    EXPECT_EQ(check.check(1, 2, bits.data()).wrongBits, 0U);
    EXPECT_TRUE(check.check(1, 2, bits.data()).fits);
    bits[5] ^= 1;
    EXPECT_EQ(check.check(1, 2, bits.data()).wrongBits, 1U);
    EXPECT_FALSE(check.check(1, 2, bits.data()).fits);
    bits[5] ^= 1;
    for (const unsigned power : {24U, 23U, 6U, 5U, 1U, 0U}) {  // CRC24B
        bits[1000 + 24 - power] ^= 1;
    }
    EXPECT_EQ(check.check(1, 2, bits.data()).wrongBits, 6U);
    EXPECT_TRUE(check.check(1, 2, bits.data()).fits);
    EXPECT_FALSE(check.fits(1, {{2, bits}})) << "but the transport block's CRC sees it";
    EXPECT_TRUE(check.fits(1, {{2, check.sentBits(1, 2)}}));

    std::vector<std::uint8_t> first = check.sentBits(0, 0);
    const unsigned fillers = link::codeBlocksOf(setting.bits).fillers;
    ASSERT_GT(fillers, 0U);
    first[fillers - 1] ^= 1;
    EXPECT_EQ(check.check(0, 0, first.data()).wrongBits, 0U) << "filler bits are known";
}

TEST(BlockSimulator, GivesTheSameHoweverBatchesAreCut)
{
    LinkFormat format;
    format.modulation = link::Modulation::qam64;
    format.fading = link::Fading::symbol;
    Sweep sweep = {{512}, {2}, {1}, {std::nullopt}, {4}, {10000}, {format}, Axis::esn0};
    Plan plan;
    plan.points = pointsOf(sweep);
    const BatchResult whole = resultOf(plan, 100, 300);
    EXPECT_TRUE(whole.receptions.empty());
    EXPECT_GT(std::count(whole.wrongBits.begin(), whole.wrongBits.end(), 0U), 0);
    EXPECT_LT(std::count(whole.wrongBits.begin(), whole.wrongBits.end(), 0U), 300);
    const BatchResult part = resultOf(plan, 250, 7);
    EXPECT_TRUE(std::equal(part.wrongBits.begin(), part.wrongBits.end(), whole.wrongBits.begin() + 150));
    plan.eachIteration = true;
    const BatchResult each = resultOf(plan, 100, 300);
    for (std::size_t i = 0; i < 300; ++i) {
        ASSERT_EQ(each.wrongBits[4 * i + 3], whole.wrongBits[i]);
    }
}

}  // namespace
}  // namespace morvik::simulation
