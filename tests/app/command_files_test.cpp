// The command morvik and its files: which it accepts, which it refuses, and in what words.
#include <fcntl.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <regex>

#include "support/CommandTest.h"

namespace morvik::support {
namespace {

class CommandFiles : public CommandTest {
protected:
    /// Runs the script, to which the command is known as $0, where its files are.
    CommandResult shell(const std::string& script) const
    {
        return CommandRunner("/bin/sh").run({"-c", "cd \"$1\" && " + script, morvik.program(), morvik.directory()});
    }

    /// Expects that the text is refused with this line, after these decisions.
    void expectRefused(const std::string& text, const std::string& line, const std::string& decisions = "") const
    {
        const CommandResult result = decode(text);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err, "morvik decode: " + line + '\n');
        EXPECT_EQ(result.out, decisions);
    }

    /// Expects that two blocks of zero bits with this reference are refused with this line.
    void expectReferenceRefused(const std::string& reference, const std::string& line) const
    {
        morvik.write("ref.bits", reference);
        const CommandResult result = decode(twoBlocks(), {"--reference", "ref.bits"});
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err, "morvik decode: " + line + '\n');
        EXPECT_EQ(result.out.substr(0, zeroDecision.size()), zeroDecision) << "the first block is kept";
    }
};

const std::string allowedRows = "expected K + 4 rows, where K is a block size of 3GPP TS 36.212 (40 to 6144)";
const std::string allowedValues = " is not allowed, expected an integer from -2147483648 to 2147483647";

// ---- What a file may look like

TEST_F(CommandFiles, AcceptsCarriageReturns)
{
    const std::string text = std::regex_replace(twoBlocks(), std::regex("\n"), "\r\n");
    const CommandResult result = decode(text);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, AcceptsALastLineWithoutAnEnd)
{
    std::string text = twoBlocks();
    text.pop_back();
    const CommandResult result = decode(text);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, AcceptsBlankLinesAtTheEnd)
{
    const CommandResult result = decode(twoBlocks() + "\n\r\n");
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, AcceptsAByteOrderMarkAndBlanks)
{
    std::string text = "\xEF\xBB\xBF" + withLine(twoBlocks(), 1, "block, rsc1_sys,\trsc1_par ,rsc2_par ");
    text = withLine(text, 2, " 0 , -64, -64\t,-64 ");
    const CommandResult result = decode(text + "  \n");
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, StartsABlockWhereTheLabelChanges)
{
    const std::string beyondSixtyFourBits = "99999999999999999999999";
    const CommandResult result =
        decode(header + '\n' + zeroRows("7", 44) + zeroRows(beyondSixtyFourBits, 44) + zeroRows("7", 44));
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, zeroDecision + zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, AcceptsTheExtremeSoftValues)
{
    std::string text = withLine(twoBlocks(), 2, "0,-2147483648,-2147483648,-2147483648");
    text = withLine(text, 3, "0,2147483647,-2147483648,-2147483648");
    const CommandResult result = decode(text);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
}

// ---- Bad input

TEST_F(CommandFiles, RefusesAMissingFile)
{
    const CommandResult result = morvik.run({"decode", "missing.csv"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik decode: missing.csv: cannot be opened: No such file or directory\n");
}

TEST_F(CommandFiles, RefusesAFileThatCannotBeOpened)
{
    std::filesystem::create_symlink("loop.csv", morvik.directory() + "/loop.csv");  // stops root as well
    const CommandResult result = morvik.run({"decode", "loop.csv"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik decode: loop.csv: cannot be opened: Too many levels of symbolic links\n");
}

TEST_F(CommandFiles, RefusesADirectory)
{
    const CommandResult named = morvik.run({"decode", "."});
    EXPECT_EQ(named.status, 2);
    EXPECT_EQ(named.err, "morvik decode: .:1: cannot be read: Is a directory\n");

    const CommandResult redirected = morvik.run({"decode"}, ".");
    EXPECT_EQ(redirected.status, 2);
    EXPECT_EQ(redirected.err, "morvik decode: <stdin>:1: cannot be read: Is a directory\n");
}

TEST_F(CommandFiles, RefusesAnEmptyFile)
{
    expectRefused("", "in.csv:1: no header, expected \"" + header + '"');
}

TEST_F(CommandFiles, NamesStandardInputInMessages)
{
    const CommandResult result = morvik.run({"decode"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik decode: <stdin>:1: no header, expected \"" + header + "\"\n");
}

TEST_F(CommandFiles, RefusesAnotherHeader)
{
    const std::string expected = ", expected \"" + header + '"';
    expectRefused("a,b,c,d\n", "in.csv:1: wrong header \"a,b,c,d\"" + expected);
    expectRefused(zeroRows("0", 44), "in.csv:1: wrong header \"0,-64,-64,-64\"" + expected);
    expectRefused("\n" + twoBlocks(), "in.csv:1: wrong header \"\"" + expected);
    expectRefused("\x7f\x45\x4c\x46\x02\n", "in.csv:1: wrong header \"\\x7fELF\\x02\"" + expected);
    expectRefused(std::string(50, 'x') + '\n', "in.csv:1: wrong header \"" + std::string(40, 'x') + "...\"" + expected);
}

TEST_F(CommandFiles, RefusesAHeaderWithoutRows)
{
    const std::string expected = ": no rows after the header, expected at least one block";
    expectRefused(header, "in.csv:2" + expected);
    expectRefused(header + '\n', "in.csv:2" + expected);
    expectRefused(header + "\n\n", "in.csv:3" + expected);
}

TEST_F(CommandFiles, RefusesTooFewOrTooManyFields)
{
    const std::string expected = ", expected the four of \"" + header + '"';
    expectRefused(withLine(twoBlocks(), 20, "0,1,2"), "in.csv:20: 3 fields" + expected);
    expectRefused(withLine(twoBlocks(), 20, "0"), "in.csv:20: 1 field" + expected);
    expectRefused(withLine(twoBlocks(), 20, "0,1,2,3,4"), "in.csv:20: 5 fields" + expected);
    expectRefused(withLine(twoBlocks(), 20, "0,1,2,3,"), "in.csv:20: 5 fields" + expected);
}

TEST_F(CommandFiles, RefusesValuesThatAreNoIntegers)
{
    expectRefused(withLine(twoBlocks(), 3, "0,x,1,1"), "in.csv:3: rsc1_sys \"x\"" + allowedValues);
    expectRefused(withLine(twoBlocks(), 3, "0,1,,1"), "in.csv:3: rsc1_par \"\"" + allowedValues);
    expectRefused(withLine(twoBlocks(), 3, "0,1,1,1.5"), "in.csv:3: rsc2_par \"1.5\"" + allowedValues);
    expectRefused(withLine(twoBlocks(), 3, "0,1 2,1,1"), "in.csv:3: rsc1_sys \"1 2\"" + allowedValues);
    expectRefused(withLine(twoBlocks(), 3, "0,1,+1,1"), "in.csv:3: rsc1_par \"+1\"" + allowedValues);
    expectRefused(withLine(twoBlocks(), 3, "0,0x10,1,1"), "in.csv:3: rsc1_sys \"0x10\"" + allowedValues);
}

TEST_F(CommandFiles, RefusesValuesOutOfThirtyTwoBits)
{
    expectRefused(withLine(twoBlocks(), 45, "0,2147483648,1,1"), "in.csv:45: rsc1_sys \"2147483648\"" + allowedValues);
    expectRefused(withLine(twoBlocks(), 45, "0,1,1,-2147483649"),
                  "in.csv:45: rsc2_par \"-2147483649\"" + allowedValues);
}

TEST_F(CommandFiles, RefusesLabelsThatAreNoNonNegativeIntegers)
{
    const std::string expected = " is not a label, expected a non-negative integer";
    expectRefused(withLine(twoBlocks(), 2, "-1,1,1,1"), "in.csv:2: block \"-1\"" + expected);
    expectRefused(withLine(twoBlocks(), 9, "first,1,1,1"), "in.csv:9: block \"first\"" + expected);
    expectRefused(withLine(twoBlocks(), 9, ",1,1,1"), "in.csv:9: block \"\"" + expected);
    expectRefused(withLine(twoBlocks(), 9, header), "in.csv:9: block \"block\"" + expected);
}

TEST_F(CommandFiles, RefusesABlankLineBetweenRows)
{
    expectRefused(withLine(twoBlocks(), 20, ""), "in.csv:20: blank line before the end");
}

TEST_F(CommandFiles, KeepsTheBlocksBeforeAMistake)
{
    const std::string text = twoBlocks() + zeroRows("2", 44);  // whose rows are in the lines 90 to 133
    expectRefused(withLine(text, 50, "1,x,1,1"), "in.csv:50: rsc1_sys \"x\"" + allowedValues, zeroDecision);
    expectRefused(
        withLine(text, 90, "2,x,1,1"), "in.csv:90: rsc1_sys \"x\"" + allowedValues, zeroDecision + zeroDecision);
    expectRefused(
        withLine(text, 133, "2,x,1,1"), "in.csv:133: rsc1_sys \"x\"" + allowedValues, zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, KeepsAWholeBlockWhateverIsWrongWithTheRowBehindIt)
{
    const std::string block = header + "\n" + zeroRows("0", 44);
    for (const std::string row : {"x,1,1,1\n", "-1,1,1,1\n", ",1,1,1\n", "\n0,1,1,1\n", "1,1,1\n"}) {
        const CommandResult result = decode(block + row);
        EXPECT_EQ(result.status, 2) << row;
        EXPECT_EQ(result.out, zeroDecision) << row;
        EXPECT_EQ(result.err.rfind("morvik decode: in.csv:46: ", 0), 0U) << result.err;
    }
    const CommandResult endless = decode(block + std::string(9000, '1'));
    EXPECT_EQ(endless.status, 2);
    EXPECT_EQ(endless.out, zeroDecision);
}

TEST_F(CommandFiles, TellsTheMistakeThatCutABlockShort)
{
    const CommandResult result = decode(header + "\n" + zeroRows("0", 20) + "x,1,1,1\n" + zeroRows("0", 24));
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err.rfind("morvik decode: in.csv:22: ", 0), 0U) << result.err;
}

TEST_F(CommandFiles, RefusesAnEmptyNameOfAReference)
{
    const CommandResult result = decode(twoBlocks(), {"--reference", ""});
    EXPECT_EQ(result.status, 2);
    EXPECT_NE(result.err.find("cannot be opened"), std::string::npos) << result.err;
}

TEST_F(CommandFiles, KeepsTheBlocksBeforeAMistakeInTheOutputFile)
{
    const CommandResult result =
        decode(withLine(twoBlocks(), 50, "1,2,3"), {"--output", "decided.bits", "--num-pu", "4"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(morvik.read("decided.bits"), zeroDecision);
}

TEST_F(CommandFiles, TellsTheDecodersReasonAndTheFirstLineOfARefusedBlock)
{
    const std::string unknown =
        "was refused by the decoder (ERROR:TDecoder3G:Block size not supported), " + allowedRows;
    expectRefused(header + '\n' + zeroRows("0", 44 + 4), "in.csv:2: block of 48 rows " + unknown);
    expectRefused(header + '\n' + zeroRows("0", 44) + zeroRows("1", 44 + 4) + zeroRows("2", 44),
                  "in.csv:46: block of 48 rows " + unknown,
                  zeroDecision);
    expectRefused(header + '\n' + zeroRows("0", 3),
                  "in.csv:2: block of 3 rows was refused by the decoder (ERROR:TDecoder3G:Number of soft inputs does "
                  "not match rate and number of tail bits), " +
                      allowedRows);
}

TEST_F(CommandFiles, RefusesABlockOfTailBitsOnly)
{
    expectRefused(header + '\n' + zeroRows("0", 4),
                  "in.csv:2: block of 4 rows has no bits besides the tail, " + allowedRows);
}

TEST_F(CommandFiles, RefusesABlockAsSoonAsItIsTooLarge)
{
    // The last row would be refused if it were reached.
    const std::string text = header + '\n' + zeroRows("0", 44) + zeroRows("1", 6149) + "1,x,1,1\n";
    expectRefused(text, "in.csv:46: block of more than 6148 rows, " + allowedRows, zeroDecision);
}

TEST_F(CommandFiles, RefusesALineWithoutAnEnd)
{
    const CommandResult result = morvik.run({"decode", "/dev/zero"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik decode: /dev/zero:1: line is longer than 8192 characters\n");
}

TEST_F(CommandFiles, RefusesBlankLinesWithoutAnEnd)
{
    const std::string blank(10002, '\n');
    const std::string endless = "more than 10000 blank lines";
    expectRefused(twoBlocks() + blank, "in.csv:90: " + endless, zeroDecision + zeroDecision);
    expectReferenceRefused(zeroDecision + zeroDecision + blank, "ref.bits:2: " + endless);
}

TEST_F(CommandFiles, TellsHowToReadACompressedFile)
{
    const std::string reason = "is compressed with gzip; unpack it by 'gunzip FILE'";
    const std::string compressed = "\x1f\x8b\x08" + std::string(9000, 'x');
    expectRefused(compressed, "in.csv: " + reason);
    expectReferenceRefused(compressed, "ref.bits: " + reason);
    morvik.write("results.csv", compressed);
    EXPECT_EQ(morvik.run({"merge", "results.csv"}).err, "morvik merge: results.csv: " + reason + '\n');
}

TEST_F(CommandFiles, AllowsLinesUpToTheLongestLength)
{
    const std::string longLabel(8192 - 12, '1');
    const CommandResult result = decode(header + '\n' + zeroRows(longLabel, 44));
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, zeroDecision);
    expectRefused(header + '\n' + zeroRows(longLabel + '1', 44), "in.csv:2: line is longer than 8192 characters");
}

// ---- Output that cannot be written

TEST_F(CommandFiles, RefusesAnOutputThatCannotBeWritten)
{
    const CommandResult missing = decode(twoBlocks(), {"--output", "missing/decided.bits"});
    EXPECT_EQ(missing.status, 2);
    EXPECT_EQ(missing.err, "morvik decode: missing/decided.bits: cannot be written: No such file or directory\n");

    const CommandResult directory = decode(twoBlocks(), {"--output", "."});
    EXPECT_EQ(directory.status, 2);
    EXPECT_EQ(directory.err, "morvik decode: .: cannot be written: Is a directory\n");
}

TEST_F(CommandFiles, ReportsAFullDisk)
{
    const CommandResult named = decode(twoBlocks(), {"--output", "/dev/full"});
    EXPECT_EQ(named.status, 2);
    EXPECT_EQ(named.err, "morvik decode: /dev/full: cannot be written: No space left on device\n");

    const CommandResult redirected = morvik.run({"decode", vectors("k40.csv")}, "/dev/null", "/dev/full");
    EXPECT_EQ(redirected.status, 2);
    EXPECT_EQ(redirected.err, "morvik decode: <stdout>: cannot be written: No space left on device\n");
}

TEST_F(CommandFiles, ReportsADiskThatIsTooFullForTheTrace)
{
    const CommandResult result = morvik.run(
        {"decode", vectors("k40.csv"), "--trace", "1", "--output", "decided.bits"}, "/dev/null", "/dev/full");
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik decode: <stdout>: cannot be written with the decoder's messages\n");
}

TEST_F(CommandFiles, NeverOverwritesWhatItReads)
{
    morvik.write("ref.bits", zeroDecision + zeroDecision);
    const CommandResult input = decode(twoBlocks(), {"--output", "./in.csv"});
    EXPECT_EQ(input.status, 2);
    EXPECT_EQ(input.err, "morvik decode: ./in.csv: is read as in.csv, the decisions need a file of their own\n");
    EXPECT_EQ(morvik.read("in.csv"), twoBlocks());

    const CommandResult reference = decode(twoBlocks(), {"--reference", "ref.bits", "--output", "ref.bits"});
    EXPECT_EQ(reference.status, 2);
    EXPECT_EQ(morvik.read("ref.bits"), zeroDecision + zeroDecision);
}

TEST_F(CommandFiles, NeverOverwritesWhatItReadsUnderAnotherName)
{
    morvik.write("in.csv", twoBlocks());
    std::filesystem::create_symlink("in.csv", morvik.directory() + "/soft.csv");
    std::filesystem::create_hard_link(morvik.directory() + "/in.csv", morvik.directory() + "/hard.csv");
    for (const std::string name : {"in.csv", "soft.csv", "hard.csv"}) {
        const CommandResult result = morvik.run({"decode", "--output", name}, "in.csv");
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err,
                  "morvik decode: " + name + ": is read as <stdin>, the decisions need a file of their own\n");
        EXPECT_EQ(morvik.read("in.csv"), twoBlocks());
    }
    const CommandResult appended = shell("\"$0\" decode in.csv >>in.csv");
    EXPECT_EQ(appended.status, 2);
    EXPECT_EQ(appended.err, "morvik decode: <stdout>: is read as in.csv, the decisions need a file of their own\n");
    EXPECT_EQ(morvik.read("in.csv"), twoBlocks());
}

TEST_F(CommandFiles, NeverPrintsIntoWhatItReads)
{
    const std::string dump = "half_iteration,step,signal,value\n0,0,llr,5\n";
    morvik.write("in.csv", twoBlocks());
    morvik.write("dump.csv", dump);
    morvik.write("map.json", "{}");
    morvik.write("ref.bits", zeroDecision + zeroDecision);
    ASSERT_EQ(shell("\"$0\" ber --block-size 40 --ebn0 5 --frames 0:4 --output a.csv >/dev/null").status, 0);
    ASSERT_EQ(shell("\"$0\" vectors --out set --block-size 40 --blocks 1 --no-directed >/dev/null").status, 0);
    const std::string compare = "compare --block in.csv --dump dump.csv --map map.json";
    const std::string doctor = "doctor in.csv --reference ref.bits";
    for (const auto& [arguments, file] : std::vector<std::pair<std::string, std::string>>{
             {compare, "in.csv"},
             {compare, "dump.csv"},
             {compare, "map.json"},
             {doctor, "in.csv"},
             {doctor, "ref.bits"},
             {"decode in.csv --output out.bits --trace 1", "in.csv"},
             {"decode in.csv --output out.bits --reference ref.bits", "ref.bits"},
             {"merge a.csv", "a.csv"},
             {"merge a.csv --plot a.svg --reference a.csv", "a.csv"},
             {"vectors --check set", "set/manifest.json"}}) {
        const std::string before = morvik.read(file);
        for (const std::string printedTo : {" >>", " 1<>"}) {
            const std::string script = "\"$0\" " + arguments + printedTo + file;
            const CommandResult result = shell(script);
            EXPECT_EQ(result.status, 2) << script;
            const std::string expected = ": <stdout>: is read as " + file;
            EXPECT_NE(result.err.find(expected), std::string::npos) << script << '\n' << result.err;
            EXPECT_TRUE(morvik.read(file) == before) << script;
        }
    }
    EXPECT_EQ(shell("\"$0\" " + doctor + " <in.csv >found.txt").status, 0);
}

TEST_F(CommandFiles, NeverPrintsIntoAFileInThePlaceOfAClosedStream)
{
    morvik.write("in.csv", twoBlocks());
    const CommandResult output = shell("\"$0\" decode in.csv --trace 1 --output decided.bits >&-");
    EXPECT_EQ(output.status, 2);
    EXPECT_EQ(output.err, "morvik decode: <stdout>: cannot be written with the decoder's messages\n");
    EXPECT_EQ(morvik.read("decided.bits"), zeroDecision);

    EXPECT_EQ(shell("\"$0\" decode in.csv --output decided.bits 2>&-").status, 0);
    EXPECT_EQ(morvik.read("decided.bits"), zeroDecision + zeroDecision);
    EXPECT_EQ(shell("\"$0\" decode in.csv --output decided.bits <&- >&- 2>&-").status, 0);
    EXPECT_EQ(morvik.read("decided.bits"), zeroDecision + zeroDecision);

    EXPECT_EQ(shell("\"$0\" decode in.csv >&-").err,
              "morvik decode: <stdout>: cannot be written: Bad file descriptor\n");
    EXPECT_EQ(shell("\"$0\" decode <&-").err, "morvik decode: <stdin>:1: cannot be read: Bad file descriptor\n");
    for (const std::string what : {"--help", "--version", "decode --help", "info 40"}) {
        EXPECT_EQ(shell("\"$0\" " + what + " >&-").status, 2) << what;
    }
}

TEST_F(CommandFiles, TellsWhatCannotBePrinted)
{
    const std::vector<std::string> replay = {"ber", "--block-size", "40", "--ebn0", "1", "--replay", "0:1"};
    const std::vector<std::vector<std::string>> all = {{"--help"},
                                                       {"--version"},
                                                       {"ber", "--help"},
                                                       replay,
                                                       {"info"},
                                                       {"vectors", "--out", "set", "--block-size", "40"}};
    for (const std::vector<std::string>& arguments : all) {
        const CommandResult result = morvik.run(arguments, "/dev/null", "/dev/full");
        EXPECT_EQ(result.status, 2) << arguments.front();
        EXPECT_NE(result.err.find(": <stdout>: cannot be written: No space left on device\n"), std::string::npos)
            << arguments.front() << ": " << result.err;
    }
}

TEST_F(CommandFiles, WritesThroughTheNameOfStandardOutput)
{
    morvik.write("in.csv", twoBlocks());
    const CommandResult result =
        shell("(echo before; \"$0\" decode in.csv --trace 1 --output /dev/stdout; echo after) >all.txt");
    EXPECT_EQ(morvik.read("all.txt"), "before\n" + zeroDecision + zeroDecision + "after\n");
    EXPECT_NE(result.err.find(" siso=0"), std::string::npos) << "not between the decisions";
}

TEST_F(CommandFiles, LeavesTheOldOutputWhenItIsKilled)
{
    morvik.write("decided.bits", "precious");
    morvik.write("decided.bits.unfinished", "precious, too");
    const std::vector<std::string> names = morvik.names();
    int input[2];
    int trace[2];
    ASSERT_EQ(pipe2(input, O_CLOEXEC), 0);
    ASSERT_EQ(pipe2(trace, O_CLOEXEC), 0);
    const int streams[] = {input[0], trace[1], trace[1]};
    Process process(
        morvik.program(), {"decode", "--trace", "1", "--output", "decided.bits"}, morvik.directory(), streams);
    close(input[0]);
    close(trace[1]);
    const std::string text = header + '\n' + zeroRows("0", 44) + zeroRows("1", 1);
    EXPECT_EQ(write(input[1], text.data(), text.size()), static_cast<ssize_t>(text.size()));
    char begun = 0;
    EXPECT_EQ(read(trace[0], &begun, 1), 1);
    process.send(SIGKILL);
    EXPECT_EQ(process.wait(), -SIGKILL);
    close(input[1]);
    close(trace[0]);
    EXPECT_EQ(morvik.names(), names);
    EXPECT_EQ(morvik.read("decided.bits"), "precious");
    EXPECT_EQ(morvik.read("decided.bits.unfinished"), "precious, too");
}

TEST_F(CommandFiles, KeepsTerminalsFromWhatNamesBring)
{
    const std::string wild =
        "a\x1b]0;title\x07\n\x9b"
        "1m";
    const std::string shown = "a\\x1b]0;title\\x07\\x0a\\x9b1m";
    EXPECT_EQ(morvik.run({"decode", wild}).err,
              "morvik decode: " + shown + ": cannot be opened: No such file or directory\n");
    const std::vector<std::vector<std::string>> all = {{wild},
                                                       {"decode", "--" + wild},
                                                       {"decode", "one", wild},
                                                       {"decode", "--num-pu", wild},
                                                       {"decode", vectors("k40.csv"), "--output", wild + "/x"},
                                                       {"merge", wild},
                                                       {"vectors", "--check", wild},
                                                       {"ber", "--block-size", "40", "--reference", wild},
                                                       {"compare", "--block", wild, "--dump", wild}};
    for (const std::vector<std::string>& arguments : all) {
        const CommandResult result = morvik.run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err.find_first_of("\x1b\x07\x9b"), std::string::npos) << arguments.front();
        EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
    }
    const CommandResult made = morvik.run({"vectors", "--out", wild, "--block-size", "40", "--blocks", "1"});
    EXPECT_NE(made.out.find('\n' + shown + ": "), std::string::npos) << made.out;
}

TEST_F(CommandFiles, LeavesTheOutputAloneWhenTheHeaderIsWrong)
{
    morvik.write("decided.bits", "precious");
    const CommandResult result = decode("a,b,c,d\n", {"--output", "decided.bits"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(morvik.read("decided.bits"), "precious");
}

// ---- The reference

TEST_F(CommandFiles, CountsBitAndBlockErrors)
{
    std::string wrong = zeroDecision;
    wrong[0] = wrong[7] = wrong[39] = '1';
    morvik.write("ref.bits", zeroDecision + wrong);
    const CommandResult two = decode(twoBlocks(), {"--reference", "ref.bits"});
    EXPECT_EQ(two.status, 1);
    EXPECT_EQ(two.out, zeroDecision + zeroDecision);
    EXPECT_TRUE(isSummary(two.err, "2 blocks of 40 bits, 3 bit errors, 1 block error"));

    morvik.write("ref.bits", wrong);
    const CommandResult one = decode(header + '\n' + zeroRows("0", 44), {"--reference", "ref.bits"});
    EXPECT_EQ(one.status, 1);
    EXPECT_TRUE(isSummary(one.err, "1 block of 40 bits, 3 bit errors, 1 block error"));
}

TEST_F(CommandFiles, BadInputCountsMoreThanErrors)
{
    morvik.write("ref.bits", std::string(40, '1') + '\n' + zeroDecision);
    const CommandResult result = decode(withLine(twoBlocks(), 50, "1,2"), {"--reference", "ref.bits"});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.out, zeroDecision);
}

TEST_F(CommandFiles, AcceptsAReferenceWithOtherLineEnds)
{
    morvik.write("ref.bits", std::string(40, '0') + "\r\n" + std::string(40, '0'));
    EXPECT_EQ(decode(twoBlocks(), {"--reference", "ref.bits"}).status, 0);
    morvik.write("ref.bits", zeroDecision + zeroDecision + "\n");
    EXPECT_EQ(decode(twoBlocks(), {"--reference", "ref.bits"}).status, 0);
}

TEST_F(CommandFiles, RefusesAReferenceWithLinesOfAnotherLength)
{
    expectReferenceRefused(zeroDecision + std::string(39, '0') + '\n',
                           "ref.bits:2: 39 bits, expected the 40 of the block");
    expectReferenceRefused(zeroDecision + std::string(41, '0') + '\n',
                           "ref.bits:2: 41 bits, expected the 40 of the block");
    expectReferenceRefused('\n' + zeroDecision, "ref.bits:1: 0 bits, expected the 40 of the block");
}

TEST_F(CommandFiles, RefusesAReferenceWithAnotherNumberOfLines)
{
    expectReferenceRefused("", "ref.bits:1: no line for block 1, expected one for each block");
    expectReferenceRefused(zeroDecision, "ref.bits:2: no line for block 2, expected one for each block");
    expectReferenceRefused(zeroDecision + zeroDecision + zeroDecision,
                           "ref.bits:3: more lines than blocks, expected 2");
}

TEST_F(CommandFiles, RefusesAReferenceWithOtherCharacters)
{
    expectReferenceRefused(zeroDecision + std::string(20, '0') + 'x' + std::string(19, '0') + '\n',
                           "ref.bits:2: character \"x\" in column 21, expected 0 or 1");
    expectReferenceRefused(zeroDecision + std::string(40, ' ') + '\n',
                           "ref.bits:2: character \" \" in column 1, expected 0 or 1");
}

TEST_F(CommandFiles, RefusesAReferenceThatCannotBeRead)
{
    const CommandResult missing = decode(twoBlocks(), {"--reference", "missing.bits"});
    EXPECT_EQ(missing.status, 2);
    EXPECT_EQ(missing.err, "morvik decode: missing.bits: cannot be opened: No such file or directory\n");
    EXPECT_EQ(missing.out, "");
    expectReferenceRefused(zeroDecision + std::string(8193, '0'), "ref.bits:2: line is longer than 8192 characters");
}

}  // namespace
}  // namespace morvik::support
