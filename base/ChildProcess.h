// ChildProcess: runs other programs, without a shell.
#ifndef MORVIK_BASE_CHILDPROCESS_H
#define MORVIK_BASE_CHILDPROCESS_H

#include <istream>
#include <memory>
#include <string>
#include <vector>

namespace morvik::base {

/// The result of a finished program.
struct Outcome {
    bool succeeded;  // ended with exit status 0
    std::string out;
    std::string err;

    /// The first line of its messages, with control characters visible, or that there is none.
    std::string firstMessage() const;
};

/// Runs a program found through PATH, with `input` on its standard input, and waits for it to end. Throws
/// std::system_error if it cannot be started.
Outcome runProgram(const std::vector<std::string>& commandLine, const std::string& input);

/// A program whose standard output is read while it runs. It gets no standard input.
class RunningProgram {
public:
    /// Starts a program found through PATH. Throws std::system_error if it cannot be started.
    explicit RunningProgram(const std::vector<std::string>& commandLine);
    RunningProgram(const RunningProgram&) = delete;
    RunningProgram& operator=(const RunningProgram&) = delete;

    /// Ends the program if it still runs.
    ~RunningProgram();

    /// What the program writes.
    std::istream& output();

    /// Whether all of the output has been read.
    bool isAtEnd() const;

    /// Waits for the end of the program, all of whose output has been read. The outcome holds no output.
    Outcome wait();

private:
    class Process;
    std::unique_ptr<Process> itsProcess;
};

}  // namespace morvik::base

#endif
