// Arguments: what option values are allowed, and how a refusal reads.
#include "Arguments.h"

#include "Text.h"

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

}  // namespace morvik
