// FileWriter: a file that is written in pieces.
#ifndef MORVIK_VECTORS_FILEWRITER_H
#define MORVIK_VECTORS_FILEWRITER_H

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

}  // namespace morvik::vectors

#endif
