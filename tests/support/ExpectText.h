// ExpectText: compares a text with what is expected of it, line by line.
#ifndef MORVIK_TESTS_SUPPORT_EXPECTTEXT_H
#define MORVIK_TESTS_SUPPORT_EXPECTTEXT_H

#include <string>

/// Fails the test at the first line that differs. '?' in what is expected stands for any character:
/// cells of a trace that no computation writes.
void expectText(const std::string& name, const std::string& expected, const std::string& got);

#endif
