// BerTest: fixture and helpers for the tests of `morvik ber`.
#include "BerTest.h"

#include <algorithm>
#include <regex>
#include <sstream>

namespace morvik::support {

namespace {

std::vector<std::string> fieldsOf(const std::string& line)
{
    std::vector<std::string> fields;
    std::istringstream stream(line + ',');
    for (std::string field; std::getline(stream, field, ',');) {
        fields.push_back(field);
    }
    return fields;
}

}  // namespace

Arguments words(const std::string& text)
{
    std::istringstream stream(text);
    Arguments words;
    for (std::string word; stream >> word;) {
        words.push_back(word);
    }
    return words;
}

Arguments operator+(Arguments first, const Arguments& second)
{
    first.insert(first.end(), second.begin(), second.end());
    return first;
}

std::string withoutTimes(const std::string& text)
{
    std::string result = std::regex_replace(text, std::regex(",[0-9]+\\.[0-9]{3},([0-9]+,[0-9.]+\n)"), ",T,$1");
    result = std::regex_replace(result, std::regex("\"seconds\": [0-9.]+"), "\"seconds\": T");
    return std::regex_replace(result, std::regex(" +[0-9]+ +[0-9]+:[0-9]{2}\n"), " T\n");
}

std::vector<CsvRow> csvRows(const std::string& text)
{
    std::istringstream lines(text);
    std::string line;
    std::getline(lines, line);
    const std::vector<std::string> names = fieldsOf(line);
    std::vector<CsvRow> rows;
    while (std::getline(lines, line)) {
        const std::vector<std::string> fields = fieldsOf(line);
        EXPECT_EQ(fields.size(), names.size());
        CsvRow row;
        for (std::size_t i = 0; i < fields.size(); ++i) {
            row[names[i]] = fields[i];
        }
        rows.push_back(row);
    }
    return rows;
}

std::string BerTest::ber(const Arguments& arguments) const
{
    const CommandResult result = morvik.run(Arguments{"ber"} + arguments);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.err, "");
    return result.out;
}

std::string BerTest::berFile(const Arguments& arguments, const std::string& output) const
{
    const bool resumes = std::find(arguments.begin(), arguments.end(), "--resume") != arguments.end();
    const Arguments overwrite = resumes ? Arguments{} : Arguments{"--overwrite"};
    EXPECT_EQ(ber(arguments + Arguments{"--quiet", "--output", output} + overwrite), "");
    return withoutTimes(morvik.read(output));
}

void BerTest::expectRefused(const Arguments& arguments, const std::string& line) const
{
    const CommandResult result = morvik.run(arguments);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, line + '\n');
    EXPECT_EQ(result.out, "");
}

}  // namespace morvik::support
