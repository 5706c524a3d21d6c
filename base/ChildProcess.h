// ChildProcess: another program run to its end, without a shell between.
#ifndef MORVIK_BASE_CHILDPROCESS_H
#define MORVIK_BASE_CHILDPROCESS_H

#include <string>
#include <vector>

namespace morvik::base {

/// What a program leaves behind.
struct Outcome {
    bool succeeded;  // ended with exit status 0
    std::string out;
    std::string err;
};

/// Runs a program that is looked up in PATH; the input is what it finds on its standard input. Throws
/// std::system_error when it cannot be started.
Outcome runProgram(const std::vector<std::string>& commandLine, const std::string& input);

}  // namespace morvik::base

#endif
