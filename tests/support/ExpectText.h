// ExpectText: compares a text with the expected one, line by line.
#ifndef MORVIK_TESTS_SUPPORT_EXPECTTEXT_H
#define MORVIK_TESTS_SUPPORT_EXPECTTEXT_H

#include <string>

/// Fails the test at the first line that differs. '?' in the expected text matches any character, for
/// trace cells that no computation writes.
void expectText(const std::string& name, const std::string& expected, const std::string& got);

#endif
