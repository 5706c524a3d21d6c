// TextFiles: files that are written and read in pieces, with their places in messages.
#ifndef MORVIK_VECTORS_TEXTFILES_H
#define MORVIK_VECTORS_TEXTFILES_H

#include <cstddef>
#include <cstdint>
#include <fstream>
#include <memory>
#include <ostream>
#include <string>
#include <string_view>

namespace morvik::vectors {

/// A new file, or standard output. What goes wrong is thrown as a simulation::Error that opens with the file.
class FileWriter {
public:
    explicit FileWriter(const std::string& fileName);

    /// To standard output, as it is now: redirecting std::cout afterwards changes nothing.
    static FileWriter standardOutput();

    void write(std::string_view text);

    /// Puts the text in the place of the file's first bytes.
    void overwriteStart(std::string_view text);

    /// Nothing may be written behind it.
    void close();

private:
    FileWriter(std::string name, std::unique_ptr<std::ostream> stream);
    [[noreturn]] void fail() const;

    std::string itsName;
    std::unique_ptr<std::ostream> itsStream;
};

/// Reads lines that end in \n or \r\n. What goes wrong is thrown as a simulation::Error that opens with the place.
class LineFile {
public:
    explicit LineFile(const std::string& fileName);

    /// Goes to the next line; false at the end.
    bool next();

    const std::string& line() const
    {
        return itsLine;
    }

    /// FILE:LINE
    std::string place() const;

    [[noreturn]] void fail(const std::string& what) const;

private:
    std::string itsName;
    std::ifstream itsFile;
    std::string itsLine;
    std::size_t itsNumber = 0;
};

}  // namespace morvik::vectors

#endif
