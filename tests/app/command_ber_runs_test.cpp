// morvik ber and merge: runs in parts, by any number of threads, stopped, killed and resumed end in the same files.
#include <fcntl.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <fstream>
#include <thread>

#include "src/InstructionSetNames.h"
#include "support/BerTest.h"

namespace morvik::support {
namespace {

/// Many short points of two block sizes, which end by all kinds of rules.
const Arguments manyPoints = words(
    "--block-size 40,104 --ebn0 0:0.2:3.6 --max-blocks 30000 --block-errors 700 --bit-errors 4000 --iterations 4");

/// A point that takes a while.
const Arguments longPoint = words("--block-size 512 --ebn0 1.4 --frames 0:40000");

/// A point with as many frames as some batches have.
const Arguments shortPoint = words("--block-size 512 --ebn0 0.7 --frames 0:5000");

class BerRuns : public BerTest {
protected:
    /// Starts a run that writes results.csv, in silence.
    Process start(const Arguments& arguments) const
    {
        const int silent = open("/dev/null", O_RDWR | O_CLOEXEC);
        const int messages = create("messages");
        const int streams[] = {silent, silent, messages};
        Process process(
            morvik.program(),
            Arguments{"ber", "--quiet", "--output", "results.csv", "--checkpoint-interval", "0.01", "--threads", "1"} +
                arguments,
            morvik.directory(),
            streams);
        close(silent);
        close(messages);
        return process;
    }

    /// An empty file for a stream of a process.
    int create(const std::string& file) const
    {
        return open((morvik.directory() + '/' + file).c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    }

    /// Waits until a file holds a text; false after a minute.
    bool waitFor(const std::string& file, const std::string& text) const
    {
        for (int i = 0; i < 6000; ++i) {
            std::ifstream stream(morvik.directory() + '/' + file);
            const std::string content(std::istreambuf_iterator<char>(stream), {});
            if (content.find(text) != std::string::npos) {
                return true;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        return false;
    }

    bool waitForCheckpoint(const std::string& text) const
    {
        return waitFor("results.csv.checkpoint", text);
    }

    /// Resumes the run of results.csv to its end, and returns that without times.
    std::string resume(const Arguments& arguments) const
    {
        return berFile(arguments + Arguments{"--resume"});
    }

    std::string checkpoint() const
    {
        return morvik.read("results.csv.checkpoint");
    }
};

// ---- The same files, however they are made

TEST_F(BerRuns, GiveTheSameFilesForAnyNumberOfThreads)
{
    const Arguments eachIteration = shortPoint + words("--iterations 3 --each-iteration");
    for (const auto& [file, run] : {std::pair("a.csv", manyPoints),
                                    std::pair("a.csv", eachIteration),
                                    std::pair("a.json", shortPoint),
                                    std::pair("a.json", eachIteration)}) {
        const std::string one = berFile(run + words("--threads 1"), file);
        EXPECT_EQ(berFile(run + words("--threads 2"), file), one);
        EXPECT_EQ(berFile(run + words("--threads 3"), file), one);
        EXPECT_EQ(berFile(run, file), one);
    }
}

TEST_F(BerRuns, GiveTheSameFilesWithEachInstructionSet)
{
    const Arguments run = words("--block-size 40,1024 --num-pu 2,4,8 --algorithm 0,1,2 --ebn0 0.5 --frames 0:40");
    const std::string best = berFile(run);
    int sets = 0;
    for (const std::string name : morvik::instructionSetNames) {
        const Arguments choice = run + Arguments{"--instruction-set", name};
        if (morvik.run(Arguments{"ber", "--max-blocks", "1"} + choice).status == 0) {
            EXPECT_EQ(berFile(choice), best) << name;
            ++sets;
        }
    }
    EXPECT_GE(sets, 2);
}

// The same on every machine and for both word sizes. tests/data/ber/README.md tells how they were made.
TEST_F(BerRuns, GiveTheFilesThatAreKept)
{
    const std::string folder = std::string(MORVIK_TEST_DATA) + "/ber/";
    std::ifstream commands(folder + "commands.txt");
    int files = 0;
    for (std::string line; std::getline(commands, line); ++files) {
        const Arguments command = words(line);
        EXPECT_EQ(berFile(Arguments(command.begin() + 1, command.end()), command[0]), morvik.read(folder + command[0]));
    }
    EXPECT_EQ(files, 7);
}

// ---- Runs that are stopped

TEST_F(BerRuns, ThatAreKilledAgainAndAgainEndInTheSameFile)
{
    const std::string expected = berFile(manyPoints, "expected.csv");
    // Killed when so many points have ended, or soon after: in the middle of the work on files, at times.
    int kills = 0;
    for (const std::string point : {"3", "10", "17", "24"}) {
        Process process = start(manyPoints + (kills > 0 ? Arguments{"--resume"} : Arguments{}));
        ASSERT_TRUE(waitForCheckpoint("\"number\": " + point + ","));
        process.send(SIGKILL);
        EXPECT_EQ(process.wait(), -SIGKILL);
        ++kills;
    }
    EXPECT_EQ(resume(manyPoints), expected);
    EXPECT_EQ(morvik.names(), (Arguments{"expected.csv", "messages", "results.csv"}));
}

TEST_F(BerRuns, ThatAreKilledLoseNoCheckpoint)
{
    const std::string expected = berFile(longPoint, "expected.csv");
    Process process = start(longPoint);
    ASSERT_TRUE(waitForCheckpoint("\"running\""));
    process.send(SIGKILL);
    EXPECT_EQ(process.wait(), -SIGKILL);
    EXPECT_NE(checkpoint().find("\"running\""), std::string::npos);
    EXPECT_EQ(resume(longPoint), expected);
}

TEST_F(BerRuns, EndBySignalsWithACheckpoint)
{
    const std::string expected = berFile(longPoint, "expected.csv");
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        Process process = start(longPoint + Arguments{"--overwrite"});
        ASSERT_TRUE(waitForCheckpoint("\"running\""));
        process.send(signal);
        EXPECT_EQ(process.wait(), 128 + signal);
        EXPECT_EQ(morvik.read("messages"), "morvik ber: interrupted, --resume goes on from results.csv.checkpoint\n");
        EXPECT_EQ(resume(longPoint), expected);
        EXPECT_EQ(morvik.names(), (Arguments{"expected.csv", "messages", "results.csv"}));
    }
}

TEST_F(BerRuns, HaveTheirOutputForThemselves)
{
    const std::string expected = berFile(longPoint, "expected.csv");
    Process process = start(longPoint);
    ASSERT_TRUE(waitForCheckpoint("\"running\""));
    for (const Arguments& more : {Arguments{}, Arguments{"--resume"}, words("--seed 2 --resume")}) {
        expectRefused(
            Arguments{"ber", "--output", "results.csv", "--plot", "curves.svg"} + longPoint + more,
            "morvik ber: results.csv: another run is writing it; wait for that to end, or choose another name");
    }
    process.send(SIGKILL);
    process.wait();
    EXPECT_EQ(resume(longPoint), expected) << "a killed run has nothing any more";
    EXPECT_EQ(morvik.names(), (Arguments{"expected.csv", "messages", "results.csv"}));
}

TEST_F(BerRuns, ThatIgnoreSignalsGoOnIgnoringThem)
{
    const CommandRunner shell("/bin/sh");
    const CommandResult result = shell.run({"-c",
                                            "trap '' INT; \"$@\" & kill -INT $!; wait $!",
                                            "sh",
                                            morvik.program(),
                                            "ber",
                                            "--block-size",
                                            "40",
                                            "--ebn0",
                                            "0",
                                            "--max-blocks",
                                            "10",
                                            "--quiet",
                                            "--output",
                                            "a.csv"});
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(csvRows(shell.read("a.csv")).size(), 1U);
}

TEST_F(BerRuns, WithoutAnOutputEndBySignalsToo)
{
    const Arguments endless = words("ber --block-size 40 --ebn0 0,50 --block-errors 10 --max-blocks 1000000000000");
    const int silent = open("/dev/null", O_RDONLY | O_CLOEXEC);
    const int table = create("table");
    const int messages = create("messages");
    Process process(morvik.program(), endless, morvik.directory(), {silent, table, messages});
    for (const int stream : {silent, table, messages}) {
        close(stream);
    }
    EXPECT_TRUE(waitFor("table", "\n    0      0 ")) << "the first point has not ended";
    process.send(SIGTERM);
    EXPECT_EQ(process.wait(), 128 + SIGTERM);
    EXPECT_EQ(morvik.read("messages"), "morvik ber: interrupted\n");
}

TEST_F(BerRuns, ThatFillTheDiskLoseNothing)
{
    const std::string expected = berFile(manyPoints, "expected.csv");
    // The shell counts blocks of 512 or of 1024 bytes: room for the first points, but not for all.
    const CommandResult result = CommandRunner("/bin/sh").run(Arguments{"-c",
                                                                        "cd \"$1\"; shift; ulimit -f 4; exec \"$@\"",
                                                                        "sh",
                                                                        morvik.directory(),
                                                                        morvik.program(),
                                                                        "ber",
                                                                        "--quiet",
                                                                        "--output",
                                                                        "results.csv",
                                                                        "--checkpoint-interval",
                                                                        "0.001"} +
                                                              manyPoints);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik ber: results.csv.checkpoint: cannot be written: File too large\n");
    EXPECT_EQ(morvik.names(), (Arguments{"expected.csv", "results.csv", "results.csv.checkpoint"}));
    EXPECT_GE(csvRows(morvik.read("results.csv")).size(), 2U);
    EXPECT_EQ(resume(manyPoints), expected);
}

TEST_F(BerRuns, ResumeFromTheBeginningWhereThereIsNothing)
{
    const Arguments run = words("--block-size 40 --ebn0 0 --max-blocks 10");
    const std::string expected = berFile(run);
    const CommandResult result = morvik.run(Arguments{"ber", "--quiet", "--output", "new.csv", "--resume"} + run);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "morvik ber: nothing to resume, starts from the beginning\n");
    EXPECT_EQ(withoutTimes(morvik.read("new.csv")), expected);
}

TEST_F(BerRuns, ResumeNoOtherRun)
{
    Process process = start(longPoint);
    ASSERT_TRUE(waitForCheckpoint("\"running\""));
    process.send(SIGTERM);
    process.wait();
    const std::string kept = checkpoint();
    const Arguments again = Arguments{"ber", "--quiet", "--output", "results.csv"} + longPoint;
    const std::string place = "morvik ber: results.csv.checkpoint: ";
    expectRefused(again, place + "holds an unfinished run; --resume goes on with it, --overwrite starts anew");
    for (const auto& [other, difference] :
         {std::pair("--seed 2", "--seed 1 instead of 2"),
          std::pair("--scale 8", "--scale auto instead of 8"),
          std::pair("--num-pu 4 --iterations 7", "--iterations 8 instead of 7, --num-pu 2 instead of 4"),
          std::pair("--block-errors 100000", "without --block-errors"),
          std::pair("--each-iteration", "without --each-iteration")}) {
        expectRefused(again + words(other) + Arguments{"--resume"},
                      place + "holds a run with other parameters: " + difference +
                          "; nothing but limits may change, which may grow; --overwrite starts anew");
    }
    EXPECT_EQ(checkpoint(), kept);

    for (const std::string& damaged : {kept.substr(0, kept.size() / 2), kept + "x", std::string("\n")}) {
        morvik.write("results.csv.checkpoint", damaged);
        expectRefused(again + Arguments{"--resume"},
                      place + "is damaged and cannot be resumed; --overwrite starts anew");
        EXPECT_EQ(checkpoint(), damaged);
    }
}

TEST_F(BerRuns, FindOutThatTheirOutputCannotBeWrittenBeforeTheyStart)
{
    const Arguments run = Arguments{"ber"} + manyPoints + Arguments{"--output"};
    expectRefused(run + Arguments{"none/a.csv"},
                  "morvik ber: none/a.csv: cannot be written: No such file or directory");
    expectRefused(run + Arguments{"a.txt"},
                  "morvik ber: a.txt: is not a name for results, expected one that ends in .csv or .json");
    expectRefused(run + Arguments{"-"},
                  "morvik ber: -: is not a name for results, expected one that ends in .csv or .json");
    EXPECT_EQ(morvik.names(), Arguments{});
}

TEST_F(BerRuns, OfTooManyPointsAreRefusedAtOnce)
{
    expectRefused(words("ber --block-size 40 --ebn0 -50:0.001:50 --scale 1,2,3,4,5,6,7,8,9,10"),
                  "morvik ber: the lists combine to 1000010 points, a run has 1000000 at most");
}

TEST_F(BerRuns, TakeNoCheckpointOnTrust)
{
    const Arguments run = words("ber --quiet --block-size 40 --ebn0 0 --max-blocks 10 --output a.csv --resume");
    morvik.write("a.csv.checkpoint", "morvik checkpoint f0066aa2fa6346c5\n" + std::string(100000, '['));
    expectRefused(run, "morvik ber: a.csv.checkpoint:2: character 33 opens more than 32 levels of lists and objects");
    morvik.write("a.json", std::string(100000, '['));
    expectRefused({"merge", "a.json"},
                  "morvik merge: a.json:1: character 33 opens more than 32 levels of lists and objects");
}

TEST_F(BerRuns, ResumeACompleteRunWithoutSimulatingAnything)
{
    const Arguments run = words("ber --block-size 40 --ebn0 0,1 --max-blocks 500 --output a.csv");
    EXPECT_EQ(morvik.run(run).status, 0);
    const std::string results = morvik.read("a.csv");  // with the times that it took
    const CommandResult again = morvik.run(run + words("--resume"));
    EXPECT_EQ(again.status, 0);
    EXPECT_EQ(again.err, "");
    EXPECT_EQ(morvik.read("a.csv"), results);
    expectRefused(
        run + words("--resume --seed 2"),
        "morvik ber: a.csv: holds other results, and there is no checkpoint to resume; --overwrite starts anew");
    EXPECT_EQ(morvik.read("a.csv"), results);
    EXPECT_EQ(morvik.names(), Arguments{"a.csv"});
}

TEST_F(BerRuns, ReplaceResultsOnlyWhenTheyAreAskedTo)
{
    const Arguments run = words("ber --block-size 40 --ebn0 0 --max-blocks 10 --output a.csv --seed");
    EXPECT_EQ(morvik.run(run + Arguments{"1"}).status, 0);
    const std::string results = morvik.read("a.csv");
    expectRefused(run + Arguments{"2"},
                  "morvik ber: a.csv: is there already; --overwrite replaces it, --resume goes on with the same run");
    EXPECT_EQ(morvik.read("a.csv"), results);
    EXPECT_EQ(morvik.run(run + Arguments{"2", "--overwrite"}).status, 0);
    EXPECT_EQ(csvRows(morvik.read("a.csv"))[0].at("seed"), "2");
    const CommandResult both = morvik.run(run + Arguments{"2", "--overwrite", "--resume"});
    EXPECT_EQ(both.status, 2);
    EXPECT_EQ(both.err, "morvik ber: --resume excludes --overwrite; see 'morvik ber --help'\n");
}

// ---- Runs that are extended

/// Points of two curves, which end for all kinds of reasons; the larger limits end the curves elsewhere.
const Arguments curves = words("--block-size 40,104 --ebn0 0:0.5:4 --iterations 3 --stop-bler 0.01");
const Arguments smallLimits = words("--max-blocks 300 --block-errors 30 --bit-errors 150");
const Arguments largeLimits = words("--max-blocks 4000 --block-errors 60 --bit-errors 700");

TEST_F(BerRuns, GrowWithTheirLimitsToWhatOneRunGives)
{
    for (const Arguments& iterations : {Arguments{}, Arguments{"--each-iteration"}}) {
        const Arguments run = curves + iterations;
        for (const std::string file : {"results.csv", "results.json"}) {
            const std::string whole = berFile(run + largeLimits, "whole" + file.substr(7));
            for (const Arguments& threads : {words("--threads 1"), words("--threads 2")}) {
                EXPECT_NE(berFile(run + smallLimits + threads, file), whole);
                ber(run + largeLimits + threads + Arguments{"--quiet", "--resume", "--output", file});
                EXPECT_EQ(withoutTimes(morvik.read(file)), whole);
            }
        }
    }
}

TEST_F(BerRuns, GrowFromACheckpointToo)
{
    const Arguments points = words("--block-size 40,104 --ebn0 0:0.2:3.6 --iterations 4");
    const Arguments larger = points + words("--max-blocks 40000 --block-errors 900");
    const std::string whole = berFile(larger, "whole.csv");
    for (const Arguments& threads : {words("--threads 1"), words("--threads 2")}) {
        Process process = start(points + words("--max-blocks 30000 --block-errors 700 --overwrite"));
        ASSERT_TRUE(waitForCheckpoint("\"number\": 5,"));
        process.send(SIGTERM);
        process.wait();
        EXPECT_EQ(berFile(larger + threads + Arguments{"--resume"}), whole);
        EXPECT_EQ(morvik.names(), (Arguments{"messages", "results.csv", "whole.csv"}));
    }
}

TEST_F(BerRuns, DoNotGoOnWithSmallerLimits)
{
    const Arguments points = words("ber --quiet --block-size 40 --ebn0 0,1 --seed 3");
    const auto resumed = [&](const std::string& file, const std::string& limits) {
        return points + words(limits) + Arguments{"--resume", "--output", file};
    };
    for (const std::string file : {"a.csv", "a.json"}) {
        EXPECT_EQ(morvik.run(points + words("--max-blocks 60 --block-errors 1000 --output") + Arguments{file}).status,
                  0);
    }
    const std::string beyond =
        "holds more of point 0 than the limits of this run allow; they may be larger than before, --overwrite starts "
        "anew";
    const std::string other = ", and there is no checkpoint to resume; --overwrite starts anew";
    expectRefused(resumed("a.csv", "--max-blocks 59 --block-errors 1000"), "morvik ber: a.csv: " + beyond);
    expectRefused(resumed("a.json", "--max-blocks 59 --block-errors 1000"),
                  "morvik ber: a.json: holds other results (--max-blocks 60 instead of 59)" + other);
    // The last block error came before the last frame, which the counts alone do not tell.
    const std::vector<CsvRow> rows = csvRows(morvik.read("a.csv"));
    const CommandResult exact = morvik.run({"ber",
                                            "--block-size",
                                            "40",
                                            "--ebn0",
                                            "0",
                                            "--seed",
                                            "3",
                                            "--block-errors",
                                            rows[0].at("block_errors"),
                                            "--quiet",
                                            "--output",
                                            "b.csv"});
    EXPECT_EQ(exact.status, 0) << exact.err;
    ASSERT_NE(csvRows(morvik.read("b.csv"))[0].at("blocks"), "60") << "another seed is needed";
    expectRefused(resumed("a.csv", "--max-blocks 60 --block-errors " + rows[0].at("block_errors")),
                  "morvik ber: a.csv: " + beyond);
    expectRefused(resumed("a.json", "--max-blocks 60 --block-errors 999"),
                  "morvik ber: a.json: holds other results (--block-errors 1000 instead of 999)" + other);
    EXPECT_EQ(morvik.names(), (Arguments{"a.csv", "a.json", "b.csv"}));
}

// ---- Runs in parts

TEST_F(BerRuns, InPartsAreJoinedToTheWhole)
{
    const Arguments run = words("--block-size 40,104 --ebn0 0:0.5:2 --iterations 3 --each-iteration --frames");
    const std::string whole = berFile(run + Arguments{"0:2000"}, "whole.csv");
    const std::string wholeJson = berFile(run + Arguments{"0:2000"}, "whole.json");
    berFile(run + Arguments{"0:700"}, "a.csv");
    berFile(run + Arguments{"700:701"}, "b.json");
    berFile(run + Arguments{"701:2000"}, "c.csv");
    const CommandResult printed = morvik.run({"merge", "c.csv", "a.csv", "b.json"});
    EXPECT_EQ(printed.status, 0) << printed.err;
    EXPECT_EQ(withoutTimes(printed.out), whole);
    const CommandResult written = morvik.run({"merge", "a.csv", "b.json", "c.csv", "--output", "all.json"});
    EXPECT_EQ(written.status, 0) << written.err;
    EXPECT_EQ(written.out, "");
    const std::string json = withoutTimes(morvik.read("all.json"));
    EXPECT_EQ(json.substr(json.find("\"rows\"")), wholeJson.substr(wholeJson.find("\"rows\"")));
    EXPECT_NE(json.find("\"command\": \"morvik merge a.csv b.json c.csv\""), std::string::npos);
}

// Each task of the array runs the script with its number.
TEST_F(BerRuns, OfAJobArrayAreJoinedToTheWhole)
{
    const Arguments run = words("--block-size 40,104 --ebn0 0:1:2");
    const std::string whole = berFile(run + words("--frames 200:500"), "whole.csv");
    const CommandRunner shell("/bin/bash");
    const std::string task = "SLURM_ARRAY_TASK_ID=$i bash " MORVIK_EXAMPLES "/slurm_array.sh \"$@\"";
    const std::string tasks = "export MORVIK=\"$1\" BLOCKS=100; shift; for i in 2 3 4 3; do " + task + " || exit; done";
    const CommandResult array = shell.run(Arguments{"-ec", tasks, "bash", morvik.program()} + run);
    EXPECT_EQ(array.status, 0) << array.err;
    EXPECT_EQ(shell.names(), words("task_2.csv task_3.csv task_4.csv"));
    const std::string merge = "\"$1\" merge task_*.csv --output all.csv";
    const CommandResult merged = shell.run({"-ec", merge, "bash", morvik.program()});
    EXPECT_EQ(merged.status, 0) << merged.err;
    EXPECT_EQ(withoutTimes(shell.read("all.csv")), whole);

    const CommandResult noTask = shell.run({MORVIK_EXAMPLES "/slurm_array.sh"});
    EXPECT_NE(noTask.status, 0);
    EXPECT_NE(noTask.err.find("SLURM_ARRAY_TASK_ID: is set by Slurm"), std::string::npos) << noTask.err;
}

TEST_F(BerRuns, ThatShareFramesAreNotJoined)
{
    const Arguments run = words("--block-size 40 --ebn0 0 --frames");
    berFile(run + Arguments{"0:100"}, "a.csv");
    berFile(run + Arguments{"99:200"}, "b.csv");
    expectRefused(
        {"merge", "a.csv", "b.csv"},
        "morvik merge: b.csv: has frames that a.csv has, too: K = 40, 2 units, scaled, scale auto, 8 iterations, "
        "Eb/N0 0 dB, frames 99:200");
    berFile(run + Arguments{"100:200", "--seed", "2"}, "b.csv");
    expectRefused({"merge", "a.csv", "b.csv", "--output", "c.csv"},
                  "morvik merge: b.csv: has seed 2, but a.csv has 1; only results of the same seed are joined");
    morvik.write("b.csv", "block,rsc1_sys\n");
    const CommandResult noResults = morvik.run({"merge", "a.csv", "b.csv"});
    EXPECT_EQ(noResults.status, 2);
    EXPECT_EQ(noResults.err.substr(0, 40), "morvik merge: b.csv:1: no header of a re");
    expectRefused({"merge", "a.csv", "none.csv"},
                  "morvik merge: none.csv: cannot be opened: No such file or directory");
    EXPECT_EQ(morvik.names(), (Arguments{"a.csv", "b.csv"}));
}

}  // namespace
}  // namespace morvik::support
