// StimulusFile: soft values from any file that has them.
#ifndef MORVIK_APP_STIMULUSFILE_H
#define MORVIK_APP_STIMULUSFILE_H

#include <istream>
#include <memory>
#include <optional>
#include <streambuf>
#include <string>

#include "base/InputFile.h"

namespace morvik {

/// Opens soft values as CSV for SoftValueReader. A folder of `morvik vectors`, or a file of its stimulus in another
/// format, is turned into CSV block by block.
class StimulusFile {
public:
    /// Opens the file, or standard input for base::standardStream. Throws base::Error.
    explicit StimulusFile(const std::string& name);

    std::istream& stream()
    {
        return itsRows ? itsRowStream : itsFile->stream();
    }

    /// The file's name, or <stdin>.
    const std::string& name() const
    {
        return itsName;
    }

private:
    std::string itsName;
    std::unique_ptr<std::streambuf> itsRows;  // of a set
    std::istream itsRowStream;
    std::optional<base::InputFile> itsFile;  // otherwise
};

}  // namespace morvik

#endif
