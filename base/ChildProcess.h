// ChildProcess: runs another program to completion, without a shell.
#ifndef MORVIK_BASE_CHILDPROCESS_H
#define MORVIK_BASE_CHILDPROCESS_H

#include <string>
#include <vector>

namespace morvik::base {

/// The result of a finished program.
struct Outcome {
    bool succeeded;  // ended with exit status 0
    std::string out;
    std::string err;
};

/// Runs a program found through PATH, with `input` on its standard input, and waits for it to end. Throws
/// std::system_error if it cannot be started.
Outcome runProgram(const std::vector<std::string>& commandLine, const std::string& input);

}  // namespace morvik::base

#endif
