// OutputFile: writes files.
#ifndef MORVIK_BASE_OUTPUTFILE_H
#define MORVIK_BASE_OUTPUTFILE_H

#include <string>
#include <string_view>
#include <vector>

#include "Descriptor.h"

namespace morvik::base {

/// Stands for standard input or output in place of a file name.
constexpr char standardStream[] = "-";

/// Writes a file piece by piece and replaces it atomically: whenever the process stops, either the old file or the
/// complete new one is there. The new one gets its name only when complete. Follows symbolic links; keeps permissions,
/// except those that change the user or group that a program runs as.
///
/// Devices, named pipes and descriptors by name (/dev/stdout) cannot be replaced: they are written directly, like
/// standard output. Throws Error, opening with the name.
class OutputFile {
public:
    /// Opens the file, or standard output for standardStream.
    explicit OutputFile(const std::string& name);
    OutputFile(OutputFile&&) noexcept = default;
    OutputFile& operator=(OutputFile&&) = delete;
    ~OutputFile();

    /// Whether this is standard output, under whatever name.
    bool isStandardOutput() const;

    /// Whether commit() replaces the file; until then, nobody sees the new one.
    bool isReplaced() const;

    void write(std::string_view text);

    /// Overwrites the first bytes; only for a file that is replaced.
    void overwriteStart(std::string_view text);

    /// Writes out the buffer, unless the file is replaced and has no reader yet.
    void flush();

    /// Locks the new file for this process.
    void lock() const;

    /// Makes commit() sync to disk, so that the old or the new file survives even a crash of the machine. For content
    /// that is expensive to recreate.
    void secure();

    /// Completes the file. Returns it, still open, so that the caller can keep it locked.
    Descriptor commit();

private:
    void openNew(const std::string& place, unsigned permissions);
    bool nameNew();
    void writeOut(std::string_view text) const;
    [[noreturn]] void fail() const;

    std::string itsName;
    std::string itsPlace;      // the path to replace; empty if written directly
    std::string itsTemporary;  // the new file's name until then, if any
    Descriptor itsFile;
    std::string itsText;  // not yet written
    bool itsIsStandardOutput = false;
    bool itsIsSecured = false;
};

/// Writes a whole file, secured.
void writeFile(const std::string& name, std::string_view content);

/// Throws Error unless a regular file of this name can be written.
void checkWritable(const std::string& name);

/// Throws Error if the output file `name` is also one of the inputs. `content` names what it would hold, in the plural.
/// Names are those of OutputFile; an empty one is no file.
void expectOwnFile(const std::string& name, const std::vector<std::string>& inputs, const std::string& content);

/// Whether writing one file would replace the other; /dev/null is nobody's loss. Throws Error if a link leads nowhere.
bool isSamePlace(const std::string& a, const std::string& b);

/// Throws Error if both outputs are given and writing one would replace the other.
void expectDistinct(const std::string& file, const std::string& other);

}  // namespace morvik::base

#endif
