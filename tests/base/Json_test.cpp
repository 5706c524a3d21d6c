// Json: what is refused of a text, and where.
#include "base/Json.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

#include "base/Error.h"

namespace {

using morvik::base::Json;
using morvik::base::JsonMembers;

std::string refusalOf(const std::function<void()>& action)
{
    try {
        action();
    } catch (const morvik::base::Error& error) {
        return error.what();
    }
    return "none";
}

std::string refusal(const std::string& text, const morvik::base::JsonLimits& limits = {})
{
    return refusalOf([&] { morvik::base::parseJson(text, "a.json", limits); });
}

std::string nested(std::size_t levels)
{
    return std::string(levels, '[') + std::string(levels, ']');
}

TEST(Json, IsReadAsItStands)
{
    const Json json =
        morvik::base::parseJson(R"({"a": [1, 2.5, "x", null, true], "b": {"a": 18446744073709551615}})", "a.json");
    EXPECT_EQ(json["a"].size(), 5U);
    EXPECT_EQ(json["b"]["a"], UINT64_MAX);
}

TEST(Json, TellsWhereATextIsNone)
{
    EXPECT_EQ(refusal(""), "a.json:1: no JSON, character 1 is not expected there");
    EXPECT_EQ(refusal("{\n\"a\": 1,\n \"b\" 2}"), "a.json:3: no JSON, character 6 is not expected there");
    EXPECT_EQ(refusal("[1] x"), "a.json:1: no JSON, character 5 is not expected there");
    EXPECT_EQ(refusal("[\"" + std::string(100000, 'x')), "a.json:1: no JSON, character 100003 is not expected there");
    EXPECT_EQ(refusal("[\"\xff\"]"), "a.json:1: no JSON, character 3 is not expected there");
    EXPECT_EQ(refusal("[1,\n1e999]"), "a.json:2: no JSON, the number before character 6 is too large");
}

TEST(Json, OfManyLevelsIsRefusedWhereTheyBegin)
{
    EXPECT_EQ(refusal(nested(32)), "none");
    EXPECT_EQ(refusal(nested(33)), "a.json:1: character 33 opens more than 32 levels of lists and objects");
    EXPECT_EQ(refusal("\n " + std::string(1000000, '[')),
              "a.json:2: character 34 opens more than 32 levels of lists and objects");
    std::string objects;
    for (int i = 0; i < 100000; ++i) {
        objects += "{\"a\":";
    }
    EXPECT_EQ(refusal(objects), "a.json:1: character 161 opens more than 32 levels of lists and objects");
}

TEST(Json, ThatNamesAMemberTwiceIsRefused)
{
    EXPECT_EQ(refusal("{\"seed\": 1,\n\"seed\": 2}"), "a.json:2: \"seed\" appears twice");
    EXPECT_EQ(refusal(R"([{"a": {"a": 1}}, {"a": 1}])"), "none");
}

TEST(Json, OfMoreThanItsLimitsIsRefused)
{
    EXPECT_EQ(refusal("[1, 2]", {6, 3, 1}), "none");
    EXPECT_EQ(refusal("[1, 2]", {5, 3, 1}), "a.json: has more than 5 bytes of JSON");
    EXPECT_EQ(refusal("[1,\n2]", {6, 2, 1}), "a.json:2: more than 2 values of JSON");
}

TEST(Json, IsShortInMessages)
{
    EXPECT_EQ(morvik::base::shownValue(Json(std::string(1000, 'x'))), '"' + std::string(40, 'x') + "...\"");
    EXPECT_EQ(morvik::base::shownValue(Json("a\nb")), "\"a\\x0ab\"");
    EXPECT_EQ(morvik::base::shownValue(Json::array({1, 2})), "a list");
    EXPECT_EQ(morvik::base::shownValue(Json::object()), "an object");
    EXPECT_EQ(morvik::base::shownValue(Json(1.5)), "1.5");
    EXPECT_EQ(morvik::base::shownValue(Json()), "null");
}

TEST(Json, HoldsBytesThatAreNoUtf8AsReplacements)
{
    EXPECT_EQ(morvik::base::jsonString("a\xff\"\n"), "\"a\xef\xbf\xbd\\\"\\n\"");
    EXPECT_EQ(morvik::base::asUtf8("a\xff\"\n"), "a\xef\xbf\xbd\"\n");
    EXPECT_EQ(morvik::base::asUtf8("K\xc3\xb6ln"), "K\xc3\xb6ln");
}

TEST(Json, MembersAreWhatIsExpectedOfThem)
{
    const Json json =
        morvik::base::parseJson(R"({"n": 5, "x": 1.5, "t": "text", "f": true, "l": [], "big": 18446744073709551616,
        "negative": -1})",
                                "a.json");
    const JsonMembers members(json, "a.json: row 1");
    EXPECT_EQ(members.integer("n", 5, 5), 5U);
    EXPECT_EQ(members.number("x"), 1.5);
    EXPECT_EQ(members.number("n"), 5);
    EXPECT_EQ(members.text("t"), "text");
    EXPECT_TRUE(members.flag("f"));
    EXPECT_TRUE(members.list("l").empty());
    EXPECT_FALSE(members.has("m"));

    const std::string allowed = ", expected an integer from 6 to 7";
    EXPECT_EQ(refusalOf([&] { members.integer("n", 6, 7); }), "a.json: row 1: \"n\" is 5" + allowed);
    EXPECT_EQ(refusalOf([&] { members.integer("x", 6, 7); }), "a.json: row 1: \"x\" is 1.5" + allowed);
    EXPECT_EQ(refusalOf([&] { members.integer("negative", 6, 7); }), "a.json: row 1: \"negative\" is -1" + allowed);
    EXPECT_EQ(refusalOf([&] { members.integer("big", 0, UINT64_MAX); }).substr(0, 44),
              "a.json: row 1: \"big\" is 1.8446744073709552e+");
    EXPECT_EQ(refusalOf([&] { members.text("l"); }), "a.json: row 1: \"l\" is a list, expected a string");
    EXPECT_EQ(refusalOf([&] { members.flag("n"); }), "a.json: row 1: \"n\" is 5, expected true or false");
    EXPECT_EQ(refusalOf([&] { members.number("t"); }), "a.json: row 1: \"t\" is \"text\", expected a number");
    EXPECT_EQ(refusalOf([&] { members.list("n"); }), "a.json: row 1: \"n\" is 5, expected a list");
    EXPECT_EQ(refusalOf([&] { members.at("m"); }), "a.json: row 1: lacks \"m\"");
    EXPECT_EQ(refusalOf([&] { JsonMembers(json["l"], "a.json"); }), "a.json: is a list, expected an object");
}

}  // namespace
