// text_fuzz: the text and value utilities take any text and number.
#include <cstring>
#include <map>
#include <sstream>

#include "FuzzInput.h"
#include "Misc.h"

namespace {

void parseParameters(const std::string& text)
{
    std::map<std::string, std::string> known = {{"a", "1"}, {"b", ""}};
    std::istringstream checked(text);
    parse(checked, known, true);
    require(known.size() == 2, "checking names adds none");
    std::map<std::string, std::string> any;
    std::istringstream unchecked(text);
    require(parse(unchecked, any, false), "without checking nothing is refused");
}

void tidy(const std::string& text)
{
    const std::string stripped = stripws(text);
    require(stripws(stripped) == stripped, "stripping twice strips no more");
    require(nocase_compare(text, text), "a text equals itself");
    require(toFilename(text).size() <= 2 * text.size(), "a file name grows by no more than percent signs");
    std::size_t characters = 0;
    for (const std::string& token : stringtok(text, ",;", " \t\r\n")) {
        characters += token.size();
    }
    require(characters <= text.size(), "tokens are parts of the text");
    const auto [head, tail] = splitString(text, ":_");
    require(head.size() + tail.size() + 1 >= text.size(), "a split loses the delimiter alone");
    require(expandTabs(text, {1, 7, 3}).find('\t') == std::string::npos, "no tab is left");
}

void convert(const std::string& text)
{
    stringToTime(text);
    double number = 0.0;
    std::memcpy(&number, text.data(), std::min(text.size(), sizeof number));
    require(!toSIString(number, static_cast<unsigned>(text.size() % 30)).empty(), "a number has digits");
    require(!timeToString(number).empty(), "a time has digits");
    require(!timeToString(static_cast<std::uint32_t>(text.size())).empty(), "a time has digits");
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const SilencedStreams silenced;
    FuzzInput input(data, size);
    const std::string text = input.text();
    parseParameters(text);
    tidy(text);
    convert(text);
    return 0;
}
