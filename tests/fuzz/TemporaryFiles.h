// TemporaryFiles: files for readers that open them by name.
#ifndef MORVIK_TESTS_FUZZ_TEMPORARYFILES_H
#define MORVIK_TESTS_FUZZ_TEMPORARYFILES_H

#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <string>

/// A folder of this process, emptied at the end.
class TemporaryFiles {
public:
    TemporaryFiles() : itsFolder(std::filesystem::temp_directory_path() / ("morvik_fuzz_" + std::to_string(getpid())))
    {
        std::filesystem::create_directory(itsFolder);
    }

    ~TemporaryFiles()
    {
        std::filesystem::remove_all(itsFolder);
    }

    TemporaryFiles(const TemporaryFiles&) = delete;
    TemporaryFiles& operator=(const TemporaryFiles&) = delete;

    const std::string& folder() const
    {
        return itsFolder;
    }

    /// Gives the path.
    std::string write(const std::string& name, const std::string& content) const
    {
        const std::string path = itsFolder + '/' + name;
        std::ofstream(path, std::ios::binary) << content;
        return path;
    }

private:
    std::string itsFolder;
};

#endif
