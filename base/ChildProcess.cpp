// ChildProcess: runs other programs, without a shell.
#include "ChildProcess.h"

#include <array>
#include <cerrno>
#include <streambuf>
#include <system_error>
#include <utility>

#include "Printable.h"
#include "System.h"

namespace morvik::base {

namespace {

Descriptor opened(Descriptor file)
{
    if (!file.isOpen()) {
        throw std::system_error(errno, std::generic_category());
    }
    return file;
}

/// A file without a name. Unlike a pipe, it never fills up and blocks the program whose standard stream it is.
class StreamFile {
public:
    explicit StreamFile(const std::string& content = {}) : itsFile(opened(system::temporaryFile()))
    {
        if (!itsFile.write(content) || !itsFile.rewind()) {
            throw std::system_error(errno, std::generic_category());
        }
    }

    int descriptor() const
    {
        return itsFile.number();
    }

    std::string content() const
    {
        std::string text;
        std::array<char, 4096> piece{};
        for (std::int64_t count = 0; (count = itsFile.readAt(text.size(), piece.data(), piece.size())) > 0;) {
            text.append(piece.data(), static_cast<std::size_t>(count));
        }
        return text;
    }

private:
    Descriptor itsFile;
};

/// Reads what comes out of a pipe.
class PipeBuffer : public std::streambuf {
public:
    explicit PipeBuffer(Descriptor pipe) : itsPipe(std::move(pipe)) {}

    bool isAtEnd() const
    {
        return itsIsAtEnd;
    }

protected:
    int_type underflow() override
    {
        const std::int64_t count = itsPipe.read(itsContent.data(), itsContent.size());
        if (count <= 0) {
            itsIsAtEnd = count == 0;
            return traits_type::eof();
        }
        setg(itsContent.data(), itsContent.data(), itsContent.data() + count);
        return traits_type::to_int_type(itsContent.front());
    }

private:
    Descriptor itsPipe;
    std::array<char, 65536> itsContent{};
    bool itsIsAtEnd = false;
};

}  // namespace

std::string Outcome::firstMessage() const
{
    const std::size_t first = err.find_first_not_of('\n');
    if (first == std::string::npos) {
        return "it failed without a message";
    }
    return visible(err.substr(first, err.find('\n', first) - first));
}

Outcome runProgram(const std::vector<std::string>& commandLine, const std::string& input)
{
    const StreamFile in(input);
    const StreamFile out;
    const StreamFile err;
    system::Process process(commandLine, {in.descriptor(), out.descriptor(), err.descriptor()});
    const bool succeeded = process.wait();
    return {succeeded, out.content(), err.content()};
}

class RunningProgram::Process {
public:
    explicit Process(const std::vector<std::string>& commandLine) : Process(commandLine, system::makePipe()) {}

    Outcome wait()
    {
        const bool succeeded = itsProcess.wait();
        return {succeeded, "", itsMessages.content()};
    }

    PipeBuffer buffer;
    std::istream output{&buffer};

private:
    Process(const std::vector<std::string>& commandLine, system::Pipe pipe)
        : buffer(opened(std::move(pipe.out))),
          itsProcess(commandLine, {itsInput.descriptor(), pipe.in.number(), itsMessages.descriptor()})
    {
    }

    StreamFile itsInput;
    StreamFile itsMessages;
    system::Process itsProcess;
};

RunningProgram::RunningProgram(const std::vector<std::string>& commandLine)
    : itsProcess(std::make_unique<Process>(commandLine))
{
}

RunningProgram::~RunningProgram() = default;

std::istream& RunningProgram::output()
{
    return itsProcess->output;
}

bool RunningProgram::isAtEnd() const
{
    return itsProcess->buffer.isAtEnd();
}

Outcome RunningProgram::wait()
{
    return itsProcess->wait();
}

}  // namespace morvik::base
