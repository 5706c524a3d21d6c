// CommandTest: fixture and helpers for the tests of the command.
#include "CommandTest.h"

#include <cstdlib>
#include <filesystem>
#include <regex>
#include <sstream>

namespace morvik::support {

const std::string header = "block,rsc1_sys,rsc1_par,rsc2_par";
const std::string zeroDecision = std::string(40, '0') + '\n';

std::string zeroRows(const std::string& label, std::size_t count)
{
    std::string text;
    for (std::size_t i = 0; i < count; ++i) {
        text += label + ",-64,-64,-64\n";
    }
    return text;
}

std::string twoBlocks()
{
    return header + '\n' + zeroRows("0", 44) + zeroRows("1", 44);
}

std::string withLine(const std::string& text, std::size_t number, const std::string& line)
{
    std::istringstream stream(text);
    std::string result;
    std::string current;
    for (std::size_t i = 1; std::getline(stream, current); ++i) {
        result += (i == number ? line : current) + '\n';
    }
    return result;
}

std::string vectors(const std::string& file)
{
    return (std::filesystem::absolute(MORVIK_TEST_DATA) / "vectors" / file).string();
}

testing::AssertionResult isSummary(const std::string& text, const std::string& beginning)
{
    const std::string core = "core: [248] units, (max-log|scaled|table), [0-9]+ iterations?\n";
    if (std::regex_match(text, std::regex(core + beginning + ", [0-9]+\\.[0-9][0-9] Mbit/s\n"))) {
        return testing::AssertionSuccess();
    }
    return testing::AssertionFailure() << "not the summary \"" << beginning << ", ...\": " << text;
}

namespace {

/// The command of this build, or another in its place.
std::string command()
{
    const char* const other = std::getenv("MORVIK_TEST_COMMAND");
    return std::filesystem::absolute(other == nullptr ? MORVIK_COMMAND : other).string();
}

}  // namespace

CommandTest::CommandTest() : morvik(command()) {}

CommandResult CommandTest::decode(const std::string& text, const std::vector<std::string>& options) const
{
    morvik.write("in.csv", text);
    std::vector<std::string> arguments = {"decode", "in.csv"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    return morvik.run(arguments);
}

}  // namespace morvik::support
