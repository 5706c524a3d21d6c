// Journal: what is kept on the disk while a run goes on, and which earlier run it goes on from.
#include "simulation/Journal.h"

#include <gtest/gtest.h>

#include "base/Error.h"
#include "simulation/ResultFiles.h"
#include "support/SyntheticFrames.h"
#include "support/TemporaryFolder.h"

namespace morvik::simulation {
namespace {

using Earlier = Journal::Earlier;
using Names = std::vector<std::string>;

class JournalFiles : public testing::Test {
protected:
    JournalFiles()
    {
        plan.points = pointsOf({{40}, {4}, {1}, {std::nullopt}, {8}, {0, 500}});
        plan.version = "1.2.3";
        plan.command = "morvik ber --seed 1";
    }

    static PointResult resultOf(std::size_t number, std::uint64_t blocks)
    {
        return {number,
                morvik::support::countOneByOne(morvik::support::SyntheticFrames(1), {0, blocks}, StopRules(), 1),
                1};
    }

    /// The same number of frames, behind those.
    static PointResult later(std::size_t number)
    {
        return {
            number, morvik::support::countOneByOne(morvik::support::SyntheticFrames(1), {20, 40}, StopRules(), 1), 1};
    }

    /// Why the journal cannot be opened.
    std::string refusal(Earlier earlier) const
    {
        try {
            const Journal journal(plan, output, earlier);
        } catch (const morvik::base::Error& error) {
            return error.what();
        }
        return "none";
    }

    const morvik::support::TemporaryFolder folder;
    const std::string output = folder.path("results.csv");
    const std::string checkpoint = output + ".checkpoint";
    Plan plan;
};

TEST_F(JournalFiles, AreACheckpointAtFirst)
{
    Journal journal(plan, output, Earlier::refuse);
    journal.begin();
    EXPECT_TRUE(journal.isEmpty());
    EXPECT_EQ(folder.names(), Names{"results.csv.checkpoint"});
    EXPECT_EQ(journal.resultSoFar(1).tally.blocks, 0U);
}

TEST_F(JournalFiles, LeaveEarlierResultsUntilThereAreNewOnes)
{
    folder.write("results.csv", "of last year");
    Journal journal(plan, output, Earlier::overwrite);
    journal.save(resultOf(0, 10));
    EXPECT_EQ(folder.read("results.csv"), "of last year");
    journal.end(resultOf(0, 20));
    journal.save(std::nullopt);
    EXPECT_EQ(folder.read("results.csv"), csvText(resultsOf(plan, {resultOf(0, 20)})));
}

TEST_F(JournalFiles, AreTheResultsAloneAtLast)
{
    Journal journal(plan, output, Earlier::refuse);
    journal.end(resultOf(0, 20));
    journal.end(resultOf(1, 30));
    journal.complete();
    EXPECT_EQ(folder.names(), Names{"results.csv"});
    EXPECT_EQ(folder.read("results.csv"), csvText(resultsOf(plan, {resultOf(0, 20), resultOf(1, 30)})));
}

TEST_F(JournalFiles, AreNotNeeded)
{
    Journal journal(plan, "", Earlier::refuse);
    journal.save(resultOf(0, 10));
    journal.end(resultOf(0, 20));
    journal.complete();
    EXPECT_EQ(journal.ended().size(), 1U);
    EXPECT_EQ(folder.names(), Names{});
}

TEST_F(JournalFiles, TellHowFarARunHasCome)
{
    {
        plan.rules.maxBlocks = 20;
        Journal journal(plan, output, Earlier::refuse);
        journal.end(resultOf(0, 20));
        journal.save(resultOf(1, 7));
    }
    const Journal journal(plan, output, Earlier::resume);
    EXPECT_FALSE(journal.isEmpty());
    ASSERT_EQ(journal.ended().size(), 1U);
    morvik::support::expectEqual(journal.ended()[0].tally, resultOf(0, 20).tally);
    morvik::support::expectEqual(journal.resultSoFar(1).tally, resultOf(1, 7).tally);
    EXPECT_EQ(journal.resultSoFar(1).seconds, 1);
}

TEST_F(JournalFiles, ResumeFromTheBeginningWithoutACheckpoint)
{
    const Journal journal(plan, output, Earlier::resume);
    EXPECT_TRUE(journal.isEmpty());
    EXPECT_TRUE(journal.ended().empty());
}

TEST_F(JournalFiles, OfACompleteRunHaveNothingLeftToDo)
{
    plan.rules.maxBlocks = 20;
    {
        Journal journal(plan, output, Earlier::refuse);
        journal.end(resultOf(0, 20));
        journal.end(resultOf(1, 20));
        journal.complete();
    }
    const std::string results = folder.read("results.csv");
    {
        Journal journal(plan, output, Earlier::resume);
        EXPECT_EQ(journal.ended().size(), 2U);
        journal.complete();
    }
    EXPECT_EQ(folder.read("results.csv"), results);
    EXPECT_EQ(folder.names(), Names{"results.csv"});
}

TEST_F(JournalFiles, KeepOtherResultsFromAnAttemptToResume)
{
    plan.rules.maxBlocks = 20;
    const auto expectRefused = [this](const std::string& what =
                                          "holds other results, and there is no checkpoint to resume") {
        const std::string before = folder.read("results.csv");
        EXPECT_EQ(refusal(Earlier::resume), output + ": " + what + "; --overwrite starts anew");
        EXPECT_EQ(folder.read("results.csv"), before);
        EXPECT_EQ(folder.names(), Names{"results.csv"});
    };
    const std::vector<PointResult> points = {resultOf(0, 20), resultOf(1, 20)};
    writeResults(output, resultsOf(plan, {points[0]}));
    const std::string lost = "holds 1 point of this run, which was stopped, but its checkpoint is lost or empty";
    expectRefused(lost);
    folder.write("results.csv.checkpoint", "");
    expectRefused(lost);
    Plan other = plan;
    other.seed = 2;
    writeResults(output, resultsOf(other, points));
    expectRefused();
    other = plan;
    other.frames.from = 20;
    writeResults(output, resultsOf(other, {later(0), later(1)}));
    expectRefused();
    other = plan;
    other.points = pointsOf({{40}, {4}, {1}, {std::nullopt}, {8}, {0, 500, 1000}});
    writeResults(output, resultsOf(other, {points[0], points[1], resultOf(2, 20)}));
    expectRefused();
}

TEST_F(JournalFiles, OfACompleteRunWithSmallerLimitsAreGoneOnWith)
{
    plan.command = "morvik ber --max-blocks 20";
    plan.rules.maxBlocks = 20;
    for (const char* const name : {"results.csv", "results.json"}) {
        const std::string file = folder.path(name);
        writeResults(file, resultsOf(plan, {resultOf(0, 20), resultOf(1, 20)}));
        const std::string results = folder.read(name);
        Plan larger = plan;
        larger.command = "morvik ber --max-blocks 30";
        larger.rules.maxBlocks = 30;
        {
            Journal journal(larger, file, Earlier::resume);
            EXPECT_TRUE(journal.ended().empty());
            morvik::support::expectEqual(journal.resultSoFar(1).tally, resultOf(1, 20).tally);
            journal.begin();
            EXPECT_EQ(folder.read(name), results) << "until a point has ended";
            journal.end(resultOf(0, 30));
            journal.save(std::nullopt);
        }
        Journal journal(larger, file, Earlier::resume);
        ASSERT_EQ(journal.ended().size(), 1U);
        morvik::support::expectEqual(journal.ended()[0].tally, resultOf(0, 30).tally);
        morvik::support::expectEqual(journal.resultSoFar(1).tally, resultOf(1, 20).tally);
        journal.end(resultOf(1, 30));
        journal.complete();
        const auto points = {resultOf(0, 30), resultOf(1, 30)};
        EXPECT_EQ(csvText(readResults(file)), csvText(resultsOf(larger, points)));
        EXPECT_EQ(readResults(file).command, file == output ? "" : larger.command);
    }
}

TEST_F(JournalFiles, AreNotLostToAnotherRun)
{
    {
        Journal journal(plan, output, Earlier::refuse);
        journal.save(resultOf(0, 10));
    }
    const std::string before = folder.read("results.csv.checkpoint");
    EXPECT_EQ(refusal(Earlier::refuse),
              checkpoint + ": holds an unfinished run; --resume goes on with it, --overwrite starts anew");
    EXPECT_EQ(folder.read("results.csv.checkpoint"), before);
}

TEST_F(JournalFiles, OfOtherParametersAreRefused)
{
    {
        Journal journal(plan, output, Earlier::refuse);
        journal.begin();
    }
    const std::string remedy = "; nothing but limits may change, which may grow; --overwrite starts anew";
    plan.command = "morvik ber --seed 2";
    EXPECT_EQ(refusal(Earlier::resume),
              checkpoint + ": holds a run with other parameters: --seed 1 instead of 2" + remedy);
    plan.command = "morvik ber --seed 1";
    plan.version = "1.2.4";
    EXPECT_EQ(refusal(Earlier::resume),
              checkpoint + ": holds a run of version \"1.2.3\", this is 1.2.4; --overwrite starts anew");
}

TEST_F(JournalFiles, ThatAreDamagedAreRefused)
{
    folder.write("results.csv.checkpoint", "morvik checkpoint 0123456789abcdef\n{}\n");
    EXPECT_EQ(refusal(Earlier::resume), checkpoint + ": is damaged and cannot be resumed; --overwrite starts anew");
}

TEST_F(JournalFiles, ThatCannotBeWrittenAreRefusedAtOnce)
{
    EXPECT_THROW(Journal(plan, folder.path("none/results.csv"), Earlier::refuse), morvik::base::Error);
    EXPECT_THROW(Journal(plan, folder.path("results.txt"), Earlier::refuse), morvik::base::Error);
    EXPECT_EQ(folder.names(), Names{});
}

TEST_F(JournalFiles, AreOfOneRunAtATime)
{
    const std::string taken = output + ": another run is writing it; wait for that to end, or choose another name";
    {
        Journal journal(plan, output, Earlier::refuse);
        EXPECT_EQ(refusal(Earlier::refuse), taken);
        EXPECT_EQ(refusal(Earlier::resume), taken);
        journal.begin();
        EXPECT_EQ(refusal(Earlier::resume), taken);
        journal.save(resultOf(0, 10));
        EXPECT_EQ(refusal(Earlier::resume), taken);
        journal.end(resultOf(0, 20));
        journal.complete();
    }
    EXPECT_EQ(refusal(Earlier::overwrite), "none");
    EXPECT_EQ(folder.names(), Names{"results.csv"});
}

TEST_F(JournalFiles, AreNotLeftByRunsThatNeverBegan)
{
    EXPECT_EQ(refusal(Earlier::refuse), "none");
    EXPECT_EQ(folder.names(), Names{});
    folder.write("results.csv.checkpoint", "");  // of a run that was killed when it had just taken it
    EXPECT_EQ(refusal(Earlier::refuse), "none");
}

TEST_F(JournalFiles, DoNotTakeThePlaceOfResultsUnasked)
{
    folder.write("results.csv", "of last year");
    EXPECT_EQ(refusal(Earlier::refuse),
              output + ": is there already; --overwrite replaces it, --resume goes on with the same run");
    EXPECT_EQ(folder.read("results.csv"), "of last year");
    EXPECT_EQ(folder.names(), Names{"results.csv"});
    EXPECT_EQ(refusal(Earlier::overwrite), "none");
    folder.write("results.csv", "");
    EXPECT_EQ(refusal(Earlier::refuse), "none") << "there is nothing to lose";
    EXPECT_EQ(refusal(Earlier::resume), "none");
}

TEST_F(JournalFiles, CanBeOverwrittenBeforeTheyAreFinished)
{
    {
        Journal journal(plan, output, Earlier::refuse);
        journal.end(resultOf(0, 10));
        journal.save(resultOf(1, 10));
    }
    Journal journal(plan, output, Earlier::overwrite);
    EXPECT_TRUE(journal.isEmpty());
    journal.begin();
    EXPECT_EQ(journal.resultSoFar(1).tally.blocks, 0U);
}

TEST_F(JournalFiles, OfOtherResultsTellWhatIsOtherIfTheyKnow)
{
    const std::string json = folder.path("results.json");
    plan.rules.maxBlocks = 20;
    writeResults(json, resultsOf(plan, {resultOf(0, 20), resultOf(1, 19)}));
    plan.command = "morvik ber --seed 2";
    try {
        const Journal journal(plan, json, Earlier::resume);
        ADD_FAILURE() << "not refused";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(),
                  json +
                      ": holds other results (--seed 1 instead of 2), and there is no checkpoint to resume; "
                      "--overwrite starts anew");
    }
}

}  // namespace
}  // namespace morvik::simulation
