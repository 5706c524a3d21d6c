// ExpectText: compares a text with the expected one, line by line.
#include "ExpectText.h"

#include <gtest/gtest.h>

#include <sstream>

void expectText(const std::string& name, const std::string& expected, const std::string& got)
{
    std::istringstream expectedLines(expected);
    std::istringstream gotLines(got);
    std::string want;
    std::string line;
    for (unsigned number = 1; std::getline(expectedLines, want); ++number) {
        ASSERT_TRUE(std::getline(gotLines, line)) << name << " ends before line " << number;
        ASSERT_EQ(line.size(), want.size()) << name << " line " << number << ":\n" << line << "\n" << want;
        for (std::size_t i = 0; i < want.size(); ++i) {
            ASSERT_TRUE(want[i] == '?' || want[i] == line[i])
                << name << " line " << number << " column " << i + 1 << ":\n"
                << line << "\n"
                << want;
        }
    }
    EXPECT_FALSE(std::getline(gotLines, line)) << name << ": too many lines, the first is " << line;
    EXPECT_TRUE(got.empty() || got.back() == '\n') << name << ": the last line has no end";
}
