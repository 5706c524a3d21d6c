// morvik selftest, run as a user runs it, and on a library with a fault.
#include <filesystem>
#include <iterator>
#include <nlohmann/json.hpp>

#include "src/InstructionSetNames.h"
#include "support/CommandTest.h"

namespace morvik::support {
namespace {

using SelfTest = CommandTest;

bool has(const std::string& text, const std::string& part)
{
    return text.find(part) != std::string::npos;
}

TEST_F(SelfTest, Passes)
{
    const CommandResult result = morvik.run({"selftest"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_TRUE(has(result.out, "\nIn use: ")) << result.out;
    EXPECT_TRUE(has(result.out, "  generic     right  9 of 9 configurations")) << result.out;
    EXPECT_TRUE(has(result.out, "  component   right  9 of 9 configurations")) << result.out;
    EXPECT_TRUE(has(result.out, "\nChecked: ")) << result.out;
    EXPECT_TRUE(has(result.out, "Passed: this machine gives the promised bits.\n")) << result.out;
}

TEST_F(SelfTest, FindsAFaultOfTheLibrary)
{
    const CommandRunner broken(std::filesystem::absolute(MORVIK_BROKEN).string());
    const CommandResult result = broken.run({"selftest", "--json"});
    EXPECT_EQ(result.status, 1);
    const nlohmann::json object = nlohmann::json::parse(result.out);
    EXPECT_EQ(object.at("passed"), false);
    EXPECT_EQ(object.at("blocks_right"), true);
    ASSERT_EQ(object.at("instruction_sets").size(), std::size(morvik::instructionSetNames));
    for (const nlohmann::json& each : object.at("instruction_sets")) {
        EXPECT_EQ(each.at("differences").size(), each.at("available") ? 9U : 0U) << each;
    }
    const CommandResult text = broken.run({"selftest"});
    EXPECT_EQ(text.status, 1);
    EXPECT_TRUE(has(text.out, "  generic     WRONG  0 of 9 configurations")) << text.out;
    EXPECT_TRUE(has(text.out, "    2 units, max-log: digest ")) << text.out;
    EXPECT_TRUE(has(text.out, "FAILED: this machine does not give the promised bits.\n")) << text.out;
}

}  // namespace
}  // namespace morvik::support
