// Files: the files and standard streams that a command reads and writes, and what can go wrong with them.
#ifndef MORVIK_FILES_H
#define MORVIK_FILES_H

#include <cstddef>
#include <fstream>
#include <istream>
#include <ostream>
#include <stdexcept>
#include <string>
#include <vector>

namespace morvik {

/// The path that stands for a standard stream.
constexpr char standardStream[] = "-";

/// Something is wrong with a file. The text opens with the place, FILE or FILE:LINE.
class FileError : public std::runtime_error {
public:
    FileError(const std::string& file, const std::string& what);
    FileError(const std::string& file, std::size_t line, const std::string& what);
};

/// "cannot be ACTION: " and the operating system's reason for the failure just seen.
std::string cannotBe(const std::string& action);

/// Throws FileError when the file that is to take the content, in the plural, is one of `inputs`.
void expectOwnFile(const std::string& path, const std::vector<std::string>& inputs, const std::string& content);

/// A file open for reading, or standard input.
class InputFile {
public:
    /// Throws FileError when the file cannot be opened.
    explicit InputFile(const std::string& path);

    std::istream& stream();

    /// The path, or <stdin>.
    const std::string& name() const;

private:
    std::string itsName;
    std::ifstream itsFile;
    std::istream& itsStream;
};

/// A file open for writing, or standard output.
class OutputFile {
public:
    /// Empties the file. Throws FileError when it cannot be opened, or when it is one of `inputs`.
    OutputFile(const std::string& path, const std::vector<std::string>& inputs);

    bool isStandardOutput() const;

    /// Writes the text through to the file. Throws FileError when that fails.
    void write(const std::string& text);

private:
    std::string itsName;
    std::ofstream itsFile;
    std::ostream& itsStream;
};

}  // namespace morvik

#endif
