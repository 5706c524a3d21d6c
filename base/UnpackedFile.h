// UnpackedFile: opens files for reading, and unpacks them on the way.
#ifndef MORVIK_BASE_UNPACKEDFILE_H
#define MORVIK_BASE_UNPACKEDFILE_H

#include <istream>
#include <memory>
#include <string>

#include "ChildProcess.h"
#include "FileKind.h"
#include "InputFile.h"

namespace morvik::base {

/// A file open for reading. If its first bytes are those of gzip or of an FST waveform, gzip or GTKWave's fst2vcd
/// unpack it while it is read. Standard input is read as it is.
class UnpackedFile {
public:
    /// Opens the file, or standard input for standardStream. Throws Error, also if the program that unpacks it is not
    /// installed.
    explicit UnpackedFile(const std::string& name);

    std::istream& stream();

    /// The file's name, or <stdin>.
    const std::string& name() const
    {
        return itsFile.name();
    }

    /// Whether the file is an FST waveform, which is read as a value change dump.
    bool isFst() const
    {
        return itsPacking == Packing::fst;
    }

    /// Throws Error if all of the stream has been read and the program that unpacked it has failed: what it wrote is
    /// only a part.
    void expectWhole();

private:
    InputFile itsFile;
    Packing itsPacking;
    std::unique_ptr<RunningProgram> itsProgram;  // unless the file is read as it is
};

}  // namespace morvik::base

#endif
