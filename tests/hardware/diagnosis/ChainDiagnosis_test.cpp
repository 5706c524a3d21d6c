// ChainDiagnosis: each mistake of the LTE chain is found, and neither noise nor a right chain is taken for one.
#include "hardware/diagnosis/chain/ChainDiagnosis.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <iterator>
#include <set>

#include "hardware/diagnosis/chain/ChainText.h"
#include "link/SymbolLink.h"
#include "link/coding/PackedBits.h"
#include "link/coding/RateMatching.h"
#include "support/ChainSender.h"

namespace morvik::diagnosis {
namespace {

using morvik::support::ChainAccident;
using morvik::support::ChainSender;

constexpr double moderate = 0.75;  // deviation of the noise for amplitude 1: 9 % of the signs are wrong

ChainSender senderOf(unsigned A, unsigned G, unsigned Qm, std::vector<unsigned> versions, unsigned NIR = 0)
{
    ChainSender sender;
    sender.format = {A, G, Qm, 1, NIR};
    sender.versions = std::move(versions);
    return sender;
}

/// One code block and several, with and without filler bits, punctured and repeated.
std::vector<ChainSender> senders()
{
    return {senderOf(2001, 6000, 6, {0}),         // 23 filler bits
            senderOf(6121, 17004, 4, {0}),        // two code blocks, one symbol more in the last
            senderOf(416, 760, 2, {0, 2}),        // two transmissions
            senderOf(1000, 3200, 4, {1}, 3000)};  // a limited soft buffer
}

ChainFormat formatOf(const ChainSender& sender)
{
    ChainFormat format;
    format.bits = sender.format.A;
    format.codedBits = sender.format.G;
    format.modulation = static_cast<link::Modulation>(sender.format.Qm / 2);
    format.versions = sender.versions;
    format.softBufferSize = sender.format.NIR == 0 ? link::unlimitedBuffer : sender.format.NIR;
    return format;
}

std::vector<ChainCase> casesOf(
    const ChainSender& sender, unsigned count, double deviation, unsigned seed, bool isKnown = true)
{
    blocks::Random random(seed);
    std::vector<ChainCase> cases;
    for (unsigned i = 0; i < count; ++i) {
        const plain::Bits bits = blocks::randomBits(random, sender.format.A);
        cases.push_back({sender.send(bits, deviation, random), {}});
        if (isKnown) {
            cases.back().sent.assign(bits.begin(), bits.end());
        }
    }
    return cases;
}

using Names = std::set<std::string>;

Names namesOf(const ChainMistakes& mistakes, const ChainFormat& format)
{
    Names names;
    for (const Explanation& each : explain(mistakes, format)) {
        names.insert(each.what);
    }
    return names;
}

/// What is found, or may be instead.
std::set<Names> found(const ChainDiagnosis& diagnosis)
{
    std::set<Names> all = {namesOf(diagnosis.best.mistakes, diagnosis.format)};
    for (const ChainMistakes& equal : diagnosis.equals) {
        all.insert(namesOf(equal, diagnosis.format));
    }
    return all;
}

constexpr double steps = 5;  // for a ratio of 1

ChainDiagnosis examined(const std::vector<ChainCase>& cases, const ChainFormat& format)
{
    return diagnose(cases, format, {}, steps);
}

TEST(ChainDiagnosis, BuffersWithoutMistakesAreThoseOfTheEncoder)
{
    for (const unsigned K : {40U, 72U, 512U, 2048U, 6144U}) {
        for (const unsigned fillers : {0U, 7U}) {
            for (const unsigned size : {K, 2 * K + 5, 3 * K + 12}) {
                const link::RateMatching right(K, fillers, size);
                const CircularBuffer buffer = WholeBuffer(K, fillers, {}).limited(size);
                EXPECT_EQ(buffer.places, right.positions()) << K;
                for (unsigned version = 0; version < 4; ++version) {
                    EXPECT_EQ(buffer.starts[version], right.start(version)) << K << ' ' << size;
                }
            }
        }
    }
}

TEST(ChainDiagnosis, FindsNothingInTransportBlocksThatDecode)
{
    for (const ChainSender& sender : senders()) {
        for (unsigned seed = 0; seed < 6; ++seed) {
            const ChainDiagnosis diagnosis = examined(casesOf(sender, 1 + seed % 3, moderate, seed), formatOf(sender));
            EXPECT_EQ(diagnosis.verdict, Verdict::healthy) << textOf(diagnosis);
            EXPECT_EQ(found(diagnosis), std::set<Names>{Names{}});
        }
    }
}

TEST(ChainDiagnosis, BlamesNoiseAloneForTransportBlocksThatAreTooNoisy)
{
    for (const ChainSender& sender : senders()) {
        for (unsigned seed = 0; seed < 6; ++seed) {
            const ChainDiagnosis diagnosis = examined(casesOf(sender, 2, 2, seed), formatOf(sender));
            EXPECT_EQ(diagnosis.verdict, Verdict::noisy) << textOf(diagnosis);
            EXPECT_EQ(found(diagnosis), std::set<Names>{Names{}});
            ASSERT_TRUE(diagnosis.noise);
            EXPECT_GT(diagnosis.noise->failed, 50U);
        }
    }
}

/// Where about half of the blocks fail, other ways to read them decode now and then by chance.
TEST(ChainDiagnosis, TakesNoChanceForAMistake)
{
    const ChainSender sender = senderOf(41, 130, 2, {0});
    for (unsigned seed = 0; seed < 150; ++seed) {
        const ChainDiagnosis diagnosis = examined(casesOf(sender, 1, 1.1, seed), formatOf(sender));
        EXPECT_EQ(found(diagnosis), std::set<Names>{Names{}}) << seed << '\n' << textOf(diagnosis);
    }
}

TEST(ChainDiagnosis, FindsEachMistake)
{
    for (const ChainSender& right : senders()) {
        for (const ChainAccident& accident : accidentsOf(right)) {
            SCOPED_TRACE(accident.what + ", A = " + std::to_string(right.format.A));
            ChainSender wrong = right;
            accident.happen(wrong);
            const ChainDiagnosis diagnosis = examined(casesOf(wrong, 2, moderate, 1), formatOf(right));
            EXPECT_EQ(found(diagnosis), std::set<Names>{Names{accident.what}}) << textOf(diagnosis);
            // Without interleaver, bits that are punctured stand together, more than the code can bridge.
            const bool isBridged = accident.what.find("left out") == std::string::npos;
            EXPECT_TRUE(diagnosis.best.decoded == 2 || !isBridged) << textOf(diagnosis);
        }
    }
}

TEST(ChainDiagnosis, FindsTheSoftBufferOfTheSender)
{
    for (const auto& [said, sent] : {std::pair(0U, 9000U), std::pair(9000U, 12345U), std::pair(12345U, 0U)}) {
        ChainSender sender = senderOf(6121, 17004, 4, {0, 2}, sent);
        const std::vector<ChainCase> cases = casesOf(sender, 1, moderate, 3);
        ChainFormat format = formatOf(sender);
        format.softBufferSize = said == 0 ? link::unlimitedBuffer : said;
        const ChainDiagnosis diagnosis = examined(cases, format);
        const unsigned right = sent == 0 ? 96 * 97 : sent / 2;  // R = 97 rows of K = 3072
        EXPECT_LE(diagnosis.best.mistakes.bufferSize.from, right) << textOf(diagnosis);
        EXPECT_GE(diagnosis.best.mistakes.bufferSize.to, right);
        EXPECT_LE(diagnosis.best.mistakes.bufferSize.to, diagnosis.best.mistakes.bufferSize.from + 100) << "dummy bits";
        EXPECT_EQ(diagnosis.best.mistakes.count(format), 1U);
    }
}

TEST(ChainDiagnosis, FindsPairsOfMistakes)
{
    const ChainSender right = senders()[1];
    const std::vector<ChainAccident> all = accidentsOf(right);
    for (std::size_t a = 0; a < all.size(); a += 2) {
        const std::size_t b = (a + 7) % all.size();
        if (all[a].kind == all[b].kind) {
            continue;
        }
        ChainSender wrong = right;
        all[a].happen(wrong);
        all[b].happen(wrong);
        const ChainDiagnosis diagnosis = examined(casesOf(wrong, 2, moderate, 1), formatOf(right));
        EXPECT_EQ(found(diagnosis).count(Names{all[a].what, all[b].what}), 1U)
            << all[a].what << ", " << all[b].what << '\n'
            << textOf(diagnosis);
    }
}

TEST(ChainDiagnosis, FindsScalesThatKeepBlocksFromDecoding)
{
    for (const ChainSender& right : senders()) {
        ChainSender wrong = right;
        wrong.factor = 1.0 / 64;
        const ChainDiagnosis diagnosis = examined(casesOf(wrong, 2, moderate, 1), formatOf(right));
        EXPECT_LT(diagnosis.best.mistakes.doublings, -4) << textOf(diagnosis);
        EXPECT_EQ(diagnosis.best.mistakes.count(formatOf(right)), 1U);
        EXPECT_EQ(diagnosis.best.decoded, 2U);
        EXPECT_NEAR(diagnosis.strength.unit, 1.0 / 64, 0.002);
    }
    // Hard decisions lose too much at a high rate.
    ChainSender large = senderOf(2001, 3000, 2, {0});
    large.factor = 64;
    const ChainDiagnosis diagnosis = examined(casesOf(large, 4, 0.55, 1), formatOf(large));
    EXPECT_GT(diagnosis.best.mistakes.doublings, 4) << textOf(diagnosis);
    EXPECT_EQ(diagnosis.best.decoded, 4U);
}

TEST(ChainDiagnosis, FindsMistakesByCrcsAlone)
{
    const ChainSender right = senders()[0];
    EXPECT_EQ(examined(casesOf(right, 2, moderate, 1, false), formatOf(right)).verdict, Verdict::healthy);
    for (const ChainAccident& accident : accidentsOf(right)) {
        ChainSender wrong = right;
        accident.happen(wrong);
        const ChainDiagnosis diagnosis = examined(casesOf(wrong, 2, moderate, 1, false), formatOf(right));
        EXPECT_EQ(found(diagnosis), std::set<Names>{Names{accident.what}}) << textOf(diagnosis);
        EXPECT_EQ(diagnosis.known, 2U);
    }
    ChainSender wrong = right;
    wrong.versions = {2};
    wrong.flips = [](unsigned) {
        return true;
    };
    EXPECT_EQ(
        found(examined(casesOf(wrong, 1, moderate, 1, false), formatOf(right))),
        (std::set<Names>{{"transmission 1 has redundancy version 2, not 0", "the sign of all values is flipped"}}));
    const ChainDiagnosis none = examined(casesOf(right, 2, 3, 1, false), formatOf(right));
    EXPECT_EQ(none.verdict, Verdict::unrelated);
    EXPECT_EQ(textOf(none).rfind("No CRC fits, whatever mistake is undone.", 0), 0U) << textOf(none);
}

/// Version 1 of a whole buffer starts where version 2 of half a buffer does.
TEST(ChainDiagnosis, NamesWhatTheValuesCannotTellApart)
{
    const ChainSender right = senderOf(1000, 700, 2, {2});
    ChainSender wrong = right;
    wrong.versions = {1};
    const ChainDiagnosis diagnosis = examined(casesOf(wrong, 1, moderate, 1), formatOf(right));
    EXPECT_EQ(namesOf(diagnosis.best.mistakes, diagnosis.format),
              Names{"transmission 1 has redundancy version 1, not 2"});
    ASSERT_EQ(diagnosis.equals.size(), 1U) << textOf(diagnosis);
    EXPECT_EQ(diagnosis.equals[0].bufferSize.to, 48U * 33);
    EXPECT_NE(textOf(diagnosis).find("Or: the circular buffer has N_cb = "), std::string::npos) << textOf(diagnosis);
}

/// Over symbols, values are of different strength, so that wrong ones stand out.
TEST(ChainDiagnosis, DoesNotBlameNoiseForAnOrderThatItDoesNotKnow)
{
    const ChainSender sender = senderOf(2001, 6000, 6, {0});
    const std::vector<unsigned> order = {2, 0, 1, 3, 4, 5};
    std::vector<ChainCase> cases = casesOf(sender, 2, 0.01, 1);
    link::SymbolLink channel({link::Modulation::qam64, link::Fading::none, link::Demapper::maxLog, 17000},
                             link::randomKey(1),
                             link::samplerForms().front());
    for (std::size_t i = 0; i < cases.size(); ++i) {
        std::vector<float>& row = cases[i].rows.front();
        const std::vector<std::uint8_t> bits = [&row] {
            std::vector<std::uint8_t> ones;
            std::transform(row.begin(), row.end(), std::back_inserter(ones), [](float value) {
                return static_cast<std::uint8_t>(value > 0 ? 1 : 0);
            });
            return ones;
        }();
        std::vector<std::uint64_t> packed(link::wordsOf(bits.size()));
        link::packBits(bits.data(), bits.size(), packed.data());
        std::vector<float> ratios(row.size());
        channel.receive(i, 0, packed.data(), row.size(), ratios.data());
        for (std::size_t k = 0; k < row.size(); ++k) {
            row[k] = ratios[k - k % 6 + order[k % 6]];
        }
    }
    const ChainDiagnosis diagnosis = examined(cases, formatOf(sender));
    EXPECT_EQ(diagnosis.verdict, Verdict::unexplained) << textOf(diagnosis);
    EXPECT_EQ(found(diagnosis), std::set<Names>{Names{}});
    EXPECT_NE(textOf(diagnosis).find("of the signs are wrong in bit "), std::string::npos) << textOf(diagnosis);
}

/// What is close to a mistake that it does not know, but leaves wrong signs where noise does not put them.
TEST(ChainDiagnosis, NamesNoMistakeThatExplainsOnlySomeOfTheSigns)
{
    const std::vector<std::pair<std::string, std::function<void(ChainSender&)>>> unknown = {
        {"second parity seven positions later",
         [](ChainSender& s) {
             s.delay = 7;
         }},
        {"parities swapped, and as above",
         [](ChainSender& s) {
             s.order = {0, 2, 1};
             s.delay = 7;
         }},
        {"a column late",
         [](ChainSender& s) {
             s.offset = 3;
         }},
        {"columns rotated", [](ChainSender& s) {
             std::rotate(s.columnOrder.begin(), s.columnOrder.begin() + 16, s.columnOrder.end());
         }}};
    for (const ChainSender& right : senders()) {
        for (const auto& [what, happen] : unknown) {
            ChainSender wrong = right;
            happen(wrong);
            const ChainDiagnosis diagnosis = examined(casesOf(wrong, 2, moderate, 1), formatOf(right));
            EXPECT_EQ(found(diagnosis), std::set<Names>{Names{}}) << what << '\n' << textOf(diagnosis);
            EXPECT_TRUE(diagnosis.verdict == Verdict::unexplained || diagnosis.verdict == Verdict::unrelated) << what;
        }
    }
}

/// Zeros have a CRC of zeros, so that anything decodes into them that has strong values for 0 alone.
TEST(ChainDiagnosis, TakesNoZerosForBitsThatWereSent)
{
    const ChainSender right = senders()[0];
    std::vector<ChainCase> cases = casesOf(right, 2, moderate, 1, false);
    for (ChainCase& each : cases) {
        for (float& value : each.rows.front()) {
            value = std::abs(value);
        }
    }
    const ChainDiagnosis diagnosis = examined(cases, formatOf(right));
    EXPECT_EQ(diagnosis.known, 0U);
    EXPECT_EQ(diagnosis.verdict, Verdict::unrelated) << textOf(diagnosis);
}

TEST(ChainDiagnosis, TellsWhenBitsBelongToOtherBlocks)
{
    for (const ChainSender& sender : senders()) {
        std::vector<ChainCase> cases = casesOf(sender, 2, moderate, 1);
        std::swap(cases[0].sent, cases[1].sent);
        const ChainDiagnosis diagnosis = examined(cases, formatOf(sender));
        EXPECT_EQ(diagnosis.verdict, Verdict::unrelated) << textOf(diagnosis);
    }
}

}  // namespace
}  // namespace morvik::diagnosis
