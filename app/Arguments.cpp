// Arguments: what option values are allowed, and how a refusal reads.
#include "Arguments.h"

#include "Text.h"
#include "simulation/Thousandths.h"
#include "standard/BlockSizes.h"

namespace morvik {

CLI::Validator integerFrom(std::uint32_t min, std::uint32_t max)
{
    const auto check = [min, max](std::string& text) -> std::string {
        const auto value = parseInteger<std::uint32_t>(text);
        if (!value || *value < min || *value > max) {
            return shown(text) + " is not allowed, allowed are the integers " + std::to_string(min) + " to " +
                   std::to_string(max);
        }
        text = std::to_string(*value);
        return {};
    };
    return CLI::Validator(check, "");
}

CLI::Validator oneOf(const std::vector<std::pair<std::string, std::string>>& choices)
{
    const auto check = [choices](std::string& text) -> std::string {
        std::string allowed;
        for (const auto& [choice, value] : choices) {
            if (text == choice) {
                text = value;
                return {};
            }
            allowed += (allowed.empty() ? "" : ", ") + choice;
        }
        return shown(text) + " is not allowed, allowed are " + allowed;
    };
    return CLI::Validator(check, "");
}

void refuse(const std::string& option, const std::string& text, const std::string& allowed)
{
    throw CLI::ValidationError(option, shown(text) + " is not allowed, " + allowed);
}

void appendBlockSize(const std::string& text, std::vector<unsigned>& values)
{
    const auto K = parseInteger<std::uint32_t>(text);
    const auto& sizes = standard::blockSizes;
    if (!K || *K < sizes.front().K || *K > sizes.back().K) {
        refuse("--block-size", text, "allowed are the block sizes of 3GPP TS 36.212, 40 to 6144");
    }
    if (standard::findBlockSize(*K) == nullptr) {
        std::size_t above = 0;
        while (sizes[above].K < *K) {
            ++above;
        }
        refuse("--block-size",
               text,
               "the nearest block sizes of 3GPP TS 36.212 are " + std::to_string(sizes[above - 1].K) + " and " +
                   std::to_string(sizes[above].K));
    }
    values.push_back(*K);
}

int readMilliDecibels(const std::string& text, const std::string& otherwise)
{
    constexpr int largest = 50000;
    const auto value = simulation::parseThousandths(text);
    if (!value || *value < -largest || *value > largest) {
        refuse("--ebn0", text, "allowed are -50 to 50 dB, with at most three decimals" + otherwise);
    }
    return *value;
}

}  // namespace morvik
