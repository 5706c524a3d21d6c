// The command morvik coverage, and what morvik vectors does about situations of the arithmetic.
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "support/CommandTest.h"

namespace morvik::support {
namespace {

class Coverage : public CommandTest {
protected:
    CommandResult run(const std::string& command, const std::vector<std::string>& arguments) const
    {
        std::vector<std::string> all = {command};
        all.insert(all.end(), arguments.begin(), arguments.end());
        return morvik.run(all);
    }

    void expectRefused(const std::string& command,
                       const std::vector<std::string>& arguments,
                       const std::string& message) const
    {
        const CommandResult result = run(command, arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik " + command + ": " + message + '\n');
    }

    /// Makes a set of one random block, with a file of counts.
    void makeOne(const std::string& name, const std::string& seed) const
    {
        const CommandResult made = run("vectors",
                                       {"--out",
                                        name,
                                        "--block-size",
                                        "40",
                                        "--blocks",
                                        "1",
                                        "--no-directed",
                                        "--seed",
                                        seed,
                                        "--coverage",
                                        name + ".csv"});
        EXPECT_EQ(made.status, 0) << made.err;
    }

    nlohmann::json jsonOf(const std::vector<std::string>& inputs) const
    {
        std::vector<std::string> arguments = inputs;
        arguments.push_back("--json");
        return nlohmann::json::parse(run("coverage", arguments).out);
    }
};

TEST_F(Coverage, IsWholeInASetThatIsMadeForIt)
{
    const CommandResult made =
        run("vectors", {"--out", "set", "--cover", "all", "--no-directed", "--algorithm", "table"});
    EXPECT_EQ(made.status, 0) << made.err;
    EXPECT_EQ(made.out, "core: 2 units, table, 8 iterations\nset: 24 blocks in memh\nsituations: 174 of 174 met\n");
    EXPECT_EQ(run("vectors", {"--check", "set"}).status, 0);
    const CommandResult told = run("coverage", {"set"});
    EXPECT_EQ(told.status, 0) << told.err;
    EXPECT_EQ(told.out,
              "core: 2 units, table; 24 blocks\nsituations: 174 of 174 met\n"
              "cannot occur: 4, as no block size gives it on 2 units\ncannot occur: 4, as table does not scale\n"
              "cannot occur: 4, as the core is another one\n");
    // The command in the manifest makes the same blocks.
    const auto manifest = nlohmann::json::parse(morvik.read("set/manifest.json"));
    EXPECT_EQ(manifest["command"],
              "morvik vectors --num-pu 2 --algorithm table --iterations 8 --tag-width 8 --blocks 8 --ebn0 1 --seed 1 "
              "--no-directed --cover all --cover-limit 500 --format memh --width 8");
    run("vectors", {"--out", "again", "--cover", "all", "--no-directed", "--algorithm", "table"});
    EXPECT_EQ(nlohmann::json::parse(morvik.read("again/manifest.json")), manifest);
}

TEST_F(Coverage, OfNamedSituationsTakesFewBlocks)
{
    const CommandResult made =
        run("vectors",
            {"--out", "set", "--block-size", "40", "--blocks", "0", "--no-directed", "--cover", "input,tail.natural"});
    EXPECT_EQ(made.status, 0) << made.err;
    const auto set = jsonOf({"set"});
    for (const auto& each : set["situations"]) {
        const std::string name = each["name"];
        if (name.rfind("input.", 0) == 0 || name.rfind("tail.natural.", 0) == 0) {
            EXPECT_GT(each["count"], 0) << name;
        }
    }
    EXPECT_LT(set["cores"][0]["blocks"], 12);
    const CommandResult none = run("vectors",
                                   {"--out",
                                    "none",
                                    "--block-size",
                                    "40",
                                    "--blocks",
                                    "1",
                                    "--no-directed",
                                    "--cover",
                                    "segments",
                                    "--cover-limit",
                                    "5"});
    EXPECT_EQ(none.status, 1);
    EXPECT_NE(none.out.find("\nnot covered after 5 drawn blocks: segments.2,segments.4,segments.8\n"),
              std::string::npos)
        << none.out;
}

TEST_F(Coverage, IsSummedOverFilesAndFolders)
{
    makeOne("one", "1");
    makeOne("two", "2");
    const auto one = jsonOf({"one.csv"});
    EXPECT_EQ(jsonOf({"one"}), one);
    const auto two = jsonOf({"two"});
    const CommandResult told = run("coverage", {"one.csv", "two", "--output", "sum.csv"});
    EXPECT_EQ(told.status, 1);
    EXPECT_EQ(told.out.rfind("core: 2 units, scaled; 2 blocks\nsituations: ", 0), 0U) << told.out;
    EXPECT_NE(told.out.find("\n 12  tail.sum.below"), std::string::npos) << told.out;
    const auto sum = jsonOf({"sum.csv"});
    EXPECT_EQ(sum["cores"][0]["blocks"], 2);
    unsigned missing = 0;
    std::string names;
    for (std::size_t i = 0; i < sum["situations"].size(); ++i) {
        const auto& each = sum["situations"][i];
        const std::uint64_t count = each["count"];
        EXPECT_EQ(
            count,
            one["situations"][i]["count"].get<std::uint64_t>() + two["situations"][i]["count"].get<std::uint64_t>());
        if (count == 0 && each["impossible"].is_null()) {
            names += (missing++ == 0 ? "" : ",") + each["name"].get<std::string>();
        }
    }
    EXPECT_EQ(sum["missing"], missing);
    EXPECT_EQ(run("coverage", {"sum.csv", "--missing"}).out, names + '\n');
}

TEST_F(Coverage, ListsAllSituations)
{
    const CommandResult listed = run("coverage", {"--list"});
    EXPECT_EQ(listed.status, 0);
    EXPECT_EQ(listed.out.rfind("  2  wrap.sum.above              Forward plus backward metric is above 2047", 0), 0U)
        << listed.out;
    EXPECT_EQ(std::count(listed.out.begin(), listed.out.end(), '\n'), 186);
    EXPECT_NE(listed.out.find(" 14  extrinsic.rounded.positive  A positive scaled value"), std::string::npos);
}

TEST_F(Coverage, IsDrawnAsAPage)
{
    makeOne("one", "1");
    EXPECT_EQ(run("coverage", {"one.csv", "--report", "one.html"}).status, 1);
    const std::string page = morvik.read("one.html");
    EXPECT_NE(page.find("<td><code>size.6144</code></td><td class=\"text\">A block of 6144 bits</td><td "
                        "class=\"count\">missing</td>"),
              std::string::npos);
    EXPECT_NE(page.find("cannot occur: scaled has no table"), std::string::npos);
}

TEST_F(Coverage, RefusesWhatIsNotAllowed)
{
    expectRefused("coverage", {}, "FILE is required; see 'morvik coverage --help'");
    expectRefused("coverage", {"none.csv"}, "none.csv: cannot be opened: No such file or directory");
    morvik.write("broken.csv", "num_pu,algorithm,situation,count\n2,scaled,blocks,1\n2,scaled,wrap,0\n");
    expectRefused("coverage", {"broken.csv"}, "broken.csv:3: situation is \"wrap\", expected wrap.sum.above");
    makeOne("one", "1");
    expectRefused("coverage",
                  {"one.csv", "--report", "one.txt"},
                  "one.txt: is not a name for a report, expected one that ends in .html");
    EXPECT_EQ(run("coverage", {"one.csv", "--output", "one.csv"}).status, 2);
    const std::string manifest = morvik.read("one/manifest.json");
    EXPECT_EQ(run("coverage", {"one", "--output", "one/manifest.json"}).status, 2);
    EXPECT_EQ(morvik.read("one/manifest.json"), manifest);
    expectRefused(
        "vectors",
        {"--out", "set", "--cover", "tie.sideways"},
        "--cover: \"tie.sideways\" is not allowed, expected all, or names of situations that 'morvik coverage "
        "--list' prints; see 'morvik vectors --help'");
    expectRefused("vectors",
                  {"--out", "set", "--cover", "tie", "--no-situations"},
                  "--no-situations cannot be combined with --coverage and --cover, which count them");
    for (const auto& [name, reason] : {std::pair("table", "scaled has no table"),
                                       std::pair("segments.32", "no block size gives it on 2 units"),
                                       std::pair("core.max-log", "the core is another one")}) {
        expectRefused("vectors",
                      {"--out", "set", "--cover", std::string("tie,") + name},
                      std::string("--cover: \"") + name + "\" cannot occur, as " + reason);
    }
    for (const char* const other : {"one.csv", "--json", "--all"}) {
        expectRefused("coverage",
                      {"--list", other},
                      "--list prints all situations, and takes nothing else; see 'morvik coverage --help'");
    }
}

TEST_F(Coverage, IsNotWrittenOverTheSetThatItIsOf)
{
    makeOne("set", "1");
    expectRefused("vectors",
                  {"--out", "set", "--block-size", "40", "--no-directed", "--coverage", "set/manifest.json"},
                  "set/manifest.json: is the same file as set/manifest.json, each output needs its own");
    EXPECT_EQ(run("vectors", {"--check", "set"}).status, 0);
}

}  // namespace
}  // namespace morvik::support
