// Files: the files and standard streams that a command reads and writes, and what can go wrong with them.
#include "Files.h"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <iostream>
#include <system_error>

namespace morvik {

namespace {

bool isSameFile(const std::string& a, const std::string& b)
{
    std::error_code ignored;  // a path that does not exist is no file yet
    return std::filesystem::is_regular_file(a, ignored) && std::filesystem::equivalent(a, b, ignored);
}

}  // namespace

FileError::FileError(const std::string& file, const std::string& what) : std::runtime_error(file + ": " + what) {}

FileError::FileError(const std::string& file, std::size_t line, const std::string& what)
    : std::runtime_error(file + ':' + std::to_string(line) + ": " + what)
{
}

std::string cannotBe(const std::string& action)
{
    return "cannot be " + action + ": " + std::generic_category().message(errno);
}

void expectOwnFile(const std::string& path, const std::vector<std::string>& inputs, const std::string& content)
{
    const auto same = std::find_if(
        inputs.begin(), inputs.end(), [&path](const std::string& input) { return isSameFile(path, input); });
    if (same != inputs.end()) {
        throw FileError(path, "is read as " + *same + ", " + content + " need a file of their own");
    }
}

InputFile::InputFile(const std::string& path)
    : itsName(path == standardStream ? "<stdin>" : path), itsStream(path == standardStream ? std::cin : itsFile)
{
    if (path != standardStream) {
        itsFile.open(path, std::ios::binary);
        if (!itsFile) {
            throw FileError(itsName, cannotBe("opened"));
        }
    }
}

std::istream& InputFile::stream()
{
    return itsStream;
}

const std::string& InputFile::name() const
{
    return itsName;
}

OutputFile::OutputFile(const std::string& path, const std::vector<std::string>& inputs)
    : itsName(path == standardStream ? "<stdout>" : path), itsStream(path == standardStream ? std::cout : itsFile)
{
    if (isStandardOutput()) {
        return;
    }
    expectOwnFile(path, inputs, "the decisions");
    itsFile.open(path, std::ios::binary);
    if (!itsFile) {
        throw FileError(itsName, cannotBe("written"));
    }
}

bool OutputFile::isStandardOutput() const
{
    return &itsStream == &std::cout;
}

void OutputFile::write(const std::string& text)
{
    if (!(itsStream << text << std::flush)) {
        throw FileError(itsName, cannotBe("written"));
    }
}

}  // namespace morvik
