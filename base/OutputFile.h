// OutputFile: the one way in which files are written.
#ifndef MORVIK_BASE_OUTPUTFILE_H
#define MORVIK_BASE_OUTPUTFILE_H

#include <string>
#include <string_view>
#include <vector>

#include "Descriptor.h"

namespace morvik::base {

/// What names standard input and output where a file may be named.
constexpr char standardStream[] = "-";

/// A file that is written piece by piece. Whenever the process stops, there is the old file or the new one as a whole:
/// the new one has no name before it is complete, and takes the place of the other then. A symbolic link is followed;
/// permissions stay, but for those that change who a program runs as.
///
/// What is no regular file, as a device, a named pipe, or a descriptor by its name (/dev/stdout), cannot be replaced:
/// it is written to as it is, like standard output. Whatever goes wrong is thrown as an Error that opens with the name.
class OutputFile {
public:
    /// Opens the file, for standardStream the standard output.
    explicit OutputFile(const std::string& name);
    OutputFile(OutputFile&&) noexcept = default;
    OutputFile& operator=(OutputFile&&) = delete;
    ~OutputFile();

    /// Whether it is the standard output, under whatever name.
    bool isStandardOutput() const;

    /// Whether there will be a new file when all is written, and not before.
    bool isReplaced() const;

    void write(std::string_view text);

    /// Puts the text in the place of the first bytes, which only a file that is replaced has.
    void overwriteStart(std::string_view text);

    /// Hands over what has been written so far, if somebody may be reading it.
    void flush();

    /// Makes this process the only one that can lock the new file.
    void lock() const;

    /// Makes commit() wait for the disk: there is the old file or the new one even when the machine stops. For what is
    /// not easily made again.
    void secure();

    /// The file is complete. Returns it, still open, for whoever keeps it locked.
    Descriptor commit();

private:
    void openNew(const std::string& place, mode_t mode);
    bool nameNew();
    void writeOut(std::string_view text) const;
    [[noreturn]] void fail() const;

    std::string itsName;
    std::string itsPlace;      // where the new file is to be; empty if none is made
    std::string itsTemporary;  // the name that it has until then, if it needs one
    Descriptor itsFile;
    std::string itsText;  // that is still to be written
    bool itsIsStandardOutput = false;
    bool itsIsSecured = false;
};

/// Writes a file as a whole, secured.
void writeFile(const std::string& name, std::string_view content);

/// Throws Error unless a regular file of this name can be expected to be written.
void checkWritable(const std::string& name);

/// Throws Error if what is written to a file, which has its content's name in the plural, would go into one of the
/// inputs. Names are as OutputFile takes them; an empty one is no file.
void expectOwnFile(const std::string& name, const std::vector<std::string>& inputs, const std::string& content);

/// Whether what is written to one file would take the other's place. Throws Error if a link leads nowhere.
bool isSamePlace(const std::string& a, const std::string& b);

}  // namespace morvik::base

#endif
