// What the commands offer as values of their options is what they take.
#include "Programs.h"

#include <gtest/gtest.h>

#include <functional>

#include "Arguments.h"

namespace {

using Visitor = std::function<void(CLI::App&, CLI::Option&, const std::string& word)>;

/// Visits each option of each subcommand with each word that it offers. Returns the number of words.
unsigned visitOffers(const morvik::Program& program, const Visitor& visit)
{
    unsigned count = 0;
    for (const morvik::Command& command : program.commands) {
        for (CLI::Option* const option : command.arguments->get_options()) {
            for (const std::string& word : morvik::offered(*option)) {
                visit(*command.arguments, *option, word);
                ++count;
            }
        }
    }
    return count;
}

/// Whether the option, or the positional argument, takes the value. What else is required is of no interest.
bool takes(CLI::App& command, const CLI::Option& option, const std::string& value)
{
    std::vector<std::string> arguments = {value};  // in reversed order, as CLI11 has them
    if (!option.get_positional()) {
        arguments.push_back(option.get_name());
    }
    try {
        command.parse(arguments);
    } catch (const CLI::ValidationError&) {
        return false;
    } catch (const CLI::RequiredError&) {
    } catch (const CLI::RequiresError&) {
    }
    return true;
}

TEST(Programs, TakeWhatTheyOffer)
{
    const auto visit = [](CLI::App& command, CLI::Option& option, const std::string& word) {
        EXPECT_TRUE(takes(command, option, word)) << command.get_name() << ' ' << option.get_name() << ' ' << word;
    };
    EXPECT_GT(visitOffers(morvik::morvikProgram(), visit), 0U);
    EXPECT_GT(visitOffers(morvik::morvikMpiProgram(nullptr), visit), 0U);
}

TEST(Programs, OfferWordsOnlyWhereOthersAreRefused)
{
    const auto visit = [](CLI::App& command, CLI::Option& option, const std::string&) {
        if (option.get_name() != "--instruction-set") {  // the decoder knows them, and refuses later
            EXPECT_FALSE(takes(command, option, "neither")) << command.get_name() << ' ' << option.get_name();
        }
    };
    EXPECT_GT(visitOffers(morvik::morvikProgram(), visit), 0U);
}

}  // namespace
