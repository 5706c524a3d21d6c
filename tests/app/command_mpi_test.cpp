// morvik-mpi: the files of morvik ber, from any number of ranks, whatever becomes of them.
#include <dirent.h>
#include <fcntl.h>
#include <signal.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <fstream>
#include <functional>
#include <sstream>
#include <stdexcept>
#include <thread>

#include "support/BerTest.h"

namespace morvik::support {
namespace {

/// Points of two block sizes, which end by all kinds of rules.
const Arguments manyPoints = words(
    "--block-size 40,104 --ebn0 0:0.4:3.6 --max-blocks 30000 --block-errors 700 --bit-errors 4000 --iterations 4");

/// A point with as many frames as some batches have.
const Arguments eachIteration = words("--block-size 512 --ebn0 0.7 --frames 7:5000 --iterations 3 --each-iteration");

/// Transport blocks, with retransmissions.
const Arguments transportBlocks = words(
    "--transport-block-size 200 --coded-bits 400 --modulation 16qam --redundancy-versions 0,2 --esn0 4:0.5:6 "
    "--max-blocks 3000");

/// A point that takes a second or more.
const Arguments longPoint = words("--block-size 512 --ebn0 1.4 --frames 0:400000");

/// A point that takes several.
const Arguments longerPoint = words("--block-size 512 --ebn0 1.4 --frames 0:1200000");

/// A point that takes longer than any test.
const Arguments endlessPoint = words("--block-size 512 --ebn0 1.4 --frames 0:1000000000");

/// Whether the condition comes true within a minute.
bool comesTrue(const std::function<bool()>& condition)
{
    for (int i = 0; i < 6000; ++i) {
        if (condition()) {
            return true;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return false;
}

/// What can be read of a file: nothing of a folder, nor of a process that ends meanwhile.
std::string contentOf(const std::string& path)
{
    std::ostringstream content;
    content << std::ifstream(path, std::ios::binary).rdbuf();
    return content.str();
}

/// The process of a rank that mpirun has started. There must be one: 0 would be this test and all beside it.
pid_t processOf(pid_t mpirun, int rank)
{
    const std::string variable = "OMPI_COMM_WORLD_RANK=" + std::to_string(rank) + '\0';
    pid_t found = 0;
    DIR* const processes = opendir("/proc");
    while (const dirent* entry = readdir(processes)) {
        const std::string folder = std::string("/proc/") + entry->d_name;
        // "ID (NAME) STATE PARENT ..."
        const std::string status = contentOf(folder + "/stat");
        const std::size_t name = status.rfind(") ");
        if (name != std::string::npos && std::stoi(status.substr(name + 4)) == mpirun &&
            contentOf(folder + "/environ").find(variable) != std::string::npos) {
            found = static_cast<pid_t>(std::stoi(entry->d_name));
        }
    }
    closedir(processes);
    if (found == 0) {
        throw std::runtime_error("rank " + std::to_string(rank) + " has ended already");
    }
    return found;
}

class MpiRuns : public BerTest {
protected:
    MpiRuns()
    {
        // As root, and in containers, where processes may not read each other's memory; MPI's own memory is not freed.
        for (const auto& [name, value] : {std::pair("OMPI_ALLOW_RUN_AS_ROOT", "1"),
                                          std::pair("OMPI_ALLOW_RUN_AS_ROOT_CONFIRM", "1"),
                                          std::pair("OMPI_MCA_btl_vader_single_copy_mechanism", "none"),
                                          std::pair("ASAN_OPTIONS", "detect_leaks=0")}) {
            setenv(name, value, 0);
        }
    }

    static Arguments ranks(int count)
    {
        return {"--oversubscribe", "--bind-to", "none", "-n", std::to_string(count), MORVIK_MPI_COMMAND};
    }

    /// Runs `morvik-mpi ber` on so many ranks with an output file, and returns that without times.
    std::string mpiFile(int count, const Arguments& arguments, const std::string& output) const
    {
        const bool resumes = std::find(arguments.begin(), arguments.end(), "--resume") != arguments.end();
        const CommandResult result = mpirun.run(ranks(count) + Arguments{"ber", "--quiet", "--output", output} +
                                                arguments + (resumes ? Arguments{} : Arguments{"--overwrite"}));
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.err, "");
        EXPECT_EQ(result.out, "");
        return withoutTimes(mpirun.read(output));
    }

    /// Expects that a job is refused in this one line, whatever mpirun adds to it.
    void expectRefusedOnce(const Arguments& job, const std::string& line) const
    {
        const CommandResult result = mpirun.run(job);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        std::istringstream lines(result.err);
        Arguments ours;
        for (std::string each; std::getline(lines, each);) {
            if (each.find("morvik") == 0) {
                ours.push_back(each);
            }
        }
        EXPECT_EQ(ours, Arguments{line}) << result.err;
    }

    /// Starts a run on three ranks that writes results.csv, in silence.
    Process start(const Arguments& arguments, const Arguments& mpirunOptions = {}) const
    {
        const int silent = open("/dev/null", O_RDWR | O_CLOEXEC);
        const int messages =
            open((mpirun.directory() + "/.messages").c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
        const int streams[] = {silent, silent, messages};
        Process process(mpirun.program(),
                        mpirunOptions + ranks(3) + words("ber --quiet --overwrite --output results.csv") + arguments,
                        mpirun.directory(),
                        streams);
        close(silent);
        close(messages);
        return process;
    }

    std::string checkpoint() const
    {
        return contentOf(mpirun.directory() + "/results.csv.checkpoint");
    }

    /// The frames that the checkpoint has of the running point.
    std::string framesCounted() const
    {
        const std::string text = checkpoint();
        const std::size_t blocks = text.find("\"blocks\": ", text.find("\"running\""));
        return text.substr(blocks, text.find(',', blocks) - blocks);
    }

    /// Whether the checkpoint is saved several times without another frame in it.
    bool addsNothing() const
    {
        constexpr unsigned several = 5;
        const std::string before = framesCounted();
        std::string last = checkpoint();
        unsigned saves = 0;
        comesTrue([&] {
            const std::string now = checkpoint();
            saves += now != last ? 1U : 0U;
            last = now;
            return saves == several || framesCounted() != before;
        });
        return saves == several && framesCounted() == before;
    }

    bool isCounting() const
    {
        return checkpoint().find("\"running\"") != std::string::npos;
    }

    const CommandRunner mpirun{MORVIK_MPIRUN};
};

const Arguments savedOften = {"--checkpoint-interval", "0.01"};
const Arguments neverSaved = {"--checkpoint-interval", "24h"};

// ---- The same files

TEST_F(MpiRuns, GiveTheSameFilesForAnyNumberOfRanks)
{
    for (const auto& [file, run] :
         {std::pair("a.csv", manyPoints), std::pair("a.json", eachIteration), std::pair("b.csv", transportBlocks)}) {
        const std::string expected = berFile(run, file);
        for (const int count : {1, 2, 4}) {
            EXPECT_EQ(mpiFile(count, run, file), expected) << count;
        }
    }
    EXPECT_EQ(mpirun.names(), (Arguments{"a.csv", "a.json", "b.csv"}));
}

TEST_F(MpiRuns, GiveTheSameFilesForAnyNumberOfThreads)
{
    EXPECT_EQ(mpiFile(2, manyPoints + Arguments{"--threads", "3"}, "a.csv"), berFile(manyPoints));
}

TEST_F(MpiRuns, PrintTheSameTable)
{
    const CommandResult result = mpirun.run(ranks(2) + Arguments{"ber"} + manyPoints);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(withoutTimes(result.out), withoutTimes(ber(manyPoints)));
}

TEST_F(MpiRuns, NeedNoMpirunForOneRank)
{
    const CommandRunner alone(MORVIK_MPI_COMMAND);
    const CommandResult result = alone.run(Arguments{"ber", "--quiet", "--output", "a.csv"} + eachIteration);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(withoutTimes(alone.read("a.csv")), berFile(eachIteration));
}

// Results are counted in order, so that they wait for those of a rank that has come to a stop.
TEST_F(MpiRuns, GiveEveryRankItsShare)
{
    Process process = start(longPoint + savedOften);
    ASSERT_TRUE(comesTrue([this] { return isCounting(); }));
    for (const int rank : {1, 2}) {
        const pid_t id = processOf(process.id(), rank);
        ASSERT_EQ(kill(id, SIGSTOP), 0);
        EXPECT_TRUE(comesTrue([this] { return addsNothing(); }));
        EXPECT_TRUE(isCounting()) << "has not ended";
        ASSERT_EQ(kill(id, SIGCONT), 0);
    }
    EXPECT_EQ(process.wait(), 0);
    EXPECT_EQ(withoutTimes(mpirun.read("results.csv")), berFile(longPoint));
}

TEST_F(MpiRuns, ReplayOnOneRank)
{
    const Arguments replay = words("ber --block-size 40 --ebn0 0 --replay 0:77");
    const CommandResult expected = morvik.run(replay);
    const CommandResult result = mpirun.run(ranks(3) + replay);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, expected.out);
    EXPECT_EQ(mpirun.names(), (Arguments{"point0.frame77.bits", "point0.frame77.csv"}));
    EXPECT_EQ(mpirun.read("point0.frame77.csv"), morvik.read("point0.frame77.csv"));
}

// ---- Runs that are stopped

TEST_F(MpiRuns, ThatLoseARankKeepTheirCheckpoint)
{
    const std::string expected = berFile(longPoint, "results.csv");
    for (const int rank : {0, 2}) {
        Process process = start(longPoint + savedOften);
        ASSERT_TRUE(comesTrue([this] { return isCounting(); }));
        const pid_t id = processOf(process.id(), rank);
        ASSERT_EQ(kill(id, SIGKILL), 0);
        EXPECT_EQ(process.wait(), 128 + SIGKILL);
        EXPECT_TRUE(isCounting());
        if (rank == 0) {
            EXPECT_EQ(mpiFile(2, longPoint + Arguments{"--resume"}, "results.csv"), expected);
        } else {  // whoever goes on
            morvik.write("results.csv.checkpoint", checkpoint());
            EXPECT_EQ(berFile(longPoint + Arguments{"--resume"}, "results.csv"), expected);
        }
    }
}

// mpirun waits for a second, sends SIGTERM to the ranks, waits again and kills them; for longer if it is told so.
TEST_F(MpiRuns, EndBySignalsWithACheckpoint)
{
    const std::string expected = berFile(longerPoint, "results.csv");
    for (const int signal : {SIGINT, SIGTERM}) {
        Process process = start(longerPoint + neverSaved, words("--mca odls_base_sigkill_timeout 2"));
        ASSERT_TRUE(comesTrue([this] { return !checkpoint().empty(); }));
        ASSERT_FALSE(isCounting());
        process.send(signal);
        EXPECT_NE(process.wait(), 0);
        EXPECT_TRUE(isCounting());
        EXPECT_EQ(mpiFile(3, longerPoint + Arguments{"--resume"}, "results.csv"), expected);
    }
}

TEST_F(MpiRuns, EndBySignalsToRankZero)
{
    Process process = start(longPoint + neverSaved);
    ASSERT_TRUE(comesTrue([this] { return !checkpoint().empty(); }));
    ASSERT_EQ(kill(processOf(process.id(), 0), SIGTERM), 0);
    EXPECT_EQ(process.wait(), 128 + SIGTERM);
    EXPECT_TRUE(isCounting());
    EXPECT_EQ(
        mpirun.read(".messages").find("morvik-mpi ber: interrupted, --resume goes on from results.csv.checkpoint"), 0U);
}

TEST_F(MpiRuns, HaveTheirOutputForThemselves)
{
    Process process = start(endlessPoint + neverSaved);
    ASSERT_TRUE(comesTrue([this] { return !checkpoint().empty(); }));
    expectRefusedOnce(
        ranks(2) + words("ber --output results.csv --resume") + endlessPoint,
        "morvik-mpi ber: results.csv: another run is writing it; wait for that to end, or choose another name");
    ASSERT_EQ(kill(processOf(process.id(), 0), SIGTERM), 0);
    EXPECT_EQ(process.wait(), 128 + SIGTERM);
}

// ---- What is refused

TEST_F(MpiRuns, TellOnceWhatIsWrong)
{
    const Arguments three = ranks(3);
    expectRefusedOnce(three + words("ber --block-size 500"),
                      "morvik-mpi ber: --block-size: \"500\" is not allowed, the nearest block sizes of 3GPP TS 36.212 "
                      "are 496 and 504; see 'morvik-mpi ber --help'");
    expectRefusedOnce(
        three + words("ber --block-size 40 --each-iteration --iterations 4,8"),
        "morvik-mpi ber: --each-iteration counts up to one number of --iterations, give only the largest");
    expectRefusedOnce(three + words("ber --block-size 40 --output none/a.csv"),
                      "morvik-mpi ber: none/a.csv: cannot be written: No such file or directory");
    const CommandResult alone = morvik.run(words("ber --block-size 40 --instruction-set mmx"));
    expectRefusedOnce(three + words("ber --block-size 40 --instruction-set mmx"),
                      "morvik-mpi" + alone.err.substr(6, alone.err.size() - 7));
    expectRefusedOnce(three + words("decode a.csv"),
                      "morvik-mpi: The following arguments were not expected: a.csv decode; see 'morvik-mpi --help'");
}

TEST_F(MpiRuns, RefuseRanksThatDoSomethingElse)
{
    for (const std::string other : {"--seed 2", "--seed x"}) {
        const Arguments run = words("ber --block-size 40 --ebn0 0 --frames 0:1000000 --quiet --output a.csv");
        char host[256] = {};
        gethostname(host, sizeof host - 1);
        expectRefusedOnce(ranks(1) + run + words(": -n 1 " MORVIK_MPI_COMMAND) + run + words(other),
                          std::string("morvik-mpi ber: rank 1 on ") + host +
                              ": is of another version than rank 0, or has other arguments");
        ASSERT_EQ(unlink((mpirun.directory() + "/a.csv.checkpoint").c_str()), 0);
    }
}

TEST_F(MpiRuns, ExplainThemselvesOnce)
{
    const CommandResult version = mpirun.run(ranks(3) + Arguments{"--version"});
    EXPECT_EQ(version.status, 0);
    EXPECT_EQ(version.out.find("morvik-mpi "), 0U);
    EXPECT_EQ(std::count(version.out.begin(), version.out.end(), '\n'), 1);
    const CommandResult help = mpirun.run(ranks(2) + Arguments{"ber", "--help"});
    EXPECT_EQ(help.status, 0);
    const std::string threads = "Threads of each rank, by default 1";
    EXPECT_NE(help.out.find(threads), std::string::npos);
    EXPECT_EQ(help.out.find(threads), help.out.rfind(threads));
}

}  // namespace
}  // namespace morvik::support
