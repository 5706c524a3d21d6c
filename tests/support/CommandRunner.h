// CommandRunner: runs a program like a user's shell and captures its output.
#ifndef MORVIK_TESTS_SUPPORT_COMMANDRUNNER_H
#define MORVIK_TESTS_SUPPORT_COMMANDRUNNER_H

#include <sys/types.h>

#include <string>
#include <vector>

#include "TemporaryFolder.h"

namespace morvik::support {

/// The status and output of a finished program.
struct CommandResult {
    int status;  // exit status, or minus the number of the signal that ended it
    std::string out;
    std::string err;
};

/// A program that runs concurrently with the test.
class Process {
public:
    /// Starts it in a directory, with the given descriptors as its standard streams.
    Process(const std::string& program,
            const std::vector<std::string>& arguments,
            const std::string& directory,
            const int (&streams)[3]);

    pid_t id() const;

    void send(int signal);

    /// Waits for its end and returns the status, as in CommandResult.
    int wait();

private:
    pid_t itsId;
};

/// Runs a program in a directory of its own, removed with the runner.
class CommandRunner {
public:
    explicit CommandRunner(std::string program);

    const std::string& program() const;
    const std::string& directory() const;

    /// Writes a file in the directory.
    void write(const std::string& file, const std::string& text) const;

    /// The content of a file, named relative to the directory.
    std::string read(const std::string& file) const;

    /// The sorted names of all files in the directory except hidden ones.
    std::vector<std::string> names() const;

    /// Runs the program to its end. With an empty `output`, standard output is captured in the result.
    CommandResult run(const std::vector<std::string>& arguments,
                      const std::string& input = "/dev/null",
                      const std::string& output = "") const;

private:
    std::string itsProgram;
    TemporaryFolder itsFolder;
};

}  // namespace morvik::support

#endif
