// Arguments: validates option values and words the refusals.
#include "Arguments.h"

#include <algorithm>
#include <iterator>
#include <sstream>

#include "base/Numbers.h"
#include "base/Shown.h"
#include "base/Thousandths.h"
#include "rules/BlockSizes.h"

namespace morvik {

namespace {

/// Validator names are never shown; they carry the words to offer.
std::string wordsAsName(const std::vector<std::string>& words)
{
    std::string name;
    for (const std::string& word : words) {
        name += (name.empty() ? "" : " ") + word;
    }
    return name;
}

}  // namespace

CLI::Validator integerFrom(std::uint32_t min, std::uint32_t max)
{
    const auto check = [min, max](std::string& text) -> std::string {
        const auto value = base::parseNumber<std::uint32_t>(text);
        if (!value || *value < min || *value > max) {
            return base::shown(text) + " is not allowed, expected an integer from " + std::to_string(min) + " to " +
                   std::to_string(max);
        }
        text = std::to_string(*value);
        return {};
    };
    return CLI::Validator(check, "");
}

std::string alternatives(const std::vector<std::string>& words)
{
    std::string text;
    for (const std::string& word : words) {
        text += (text.empty() ? "" : &word == &words.back() ? " or " : ", ") + word;
    }
    return text;
}

CLI::Validator oneOf(const std::vector<std::pair<std::string, std::string>>& choices)
{
    std::vector<std::string> words;
    words.reserve(choices.size());
    for (const auto& [choice, value] : choices) {
        words.push_back(choice);
    }
    const auto check = [choices, expected = alternatives(words)](std::string& text) -> std::string {
        for (const auto& [choice, value] : choices) {
            if (text == choice) {
                text = value;
                return {};
            }
        }
        return base::shown(text) + " is not allowed, expected " + expected;
    };
    return CLI::Validator(check, "", wordsAsName(words));
}

CLI::Validator offer(const std::vector<std::string>& words)
{
    return CLI::Validator().name(wordsAsName(words));
}

std::vector<std::string> blockSizeWords()
{
    std::vector<std::string> words;
    words.reserve(rules::blockSizes.size());
    for (const auto& size : rules::blockSizes) {
        words.push_back(std::to_string(size.K));
    }
    return words;
}

std::vector<std::string> offered(CLI::Option& option)
{
    std::vector<std::string> words;
    try {
        for (int i = 0;; ++i) {
            std::istringstream name(option.get_validator(i)->get_name());
            words.insert(words.end(), std::istream_iterator<std::string>(name), {});
        }
    } catch (const CLI::OptionNotFound&) {  // thrown past the last validator
    }
    return words;
}

void refuse(const std::string& option, const std::string& text, const std::string& allowed)
{
    throw CLI::ValidationError(option, base::shown(text) + " is not allowed, " + allowed);
}

std::string blockSizesNear(std::uint32_t K)
{
    const auto& sizes = rules::blockSizes;
    if (K < sizes.front().K || K > sizes.back().K) {
        return "expected a block size of 3GPP TS 36.212, " + std::to_string(sizes.front().K) + " to " +
               std::to_string(sizes.back().K);
    }
    const auto* const above =
        std::find_if(sizes.begin(), sizes.end(), [K](const rules::BlockSize& size) { return size.K > K; });
    return "the nearest block sizes of 3GPP TS 36.212 are " + std::to_string((above - 1)->K) + " and " +
           std::to_string(above->K);
}

void appendBlockSize(const std::string& text, std::vector<unsigned>& values)
{
    const auto K = base::parseNumber<std::uint32_t>(text);
    if (!K || rules::findBlockSize(*K) == nullptr) {
        refuse("--block-size", text, blockSizesNear(K.value_or(0)));
    }
    values.push_back(*K);
}

int readMilliDecibels(const std::string& option, const std::string& text, const std::string& otherwise)
{
    constexpr int largest = 50000;
    const auto value = base::parseThousandths(text);
    if (!value || *value < -largest || *value > largest) {
        refuse(option, text, "expected -50 to 50 dB, with at most three decimals" + otherwise);
    }
    return *value;
}

}  // namespace morvik
