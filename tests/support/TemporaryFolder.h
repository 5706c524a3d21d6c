// TemporaryFolder: a temporary folder for a test.
#ifndef MORVIK_TESTS_SUPPORT_TEMPORARYFOLDER_H
#define MORVIK_TESTS_SUPPORT_TEMPORARYFOLDER_H

#include <string>
#include <vector>

namespace morvik::support {

/// Creates an empty folder, and removes it with its contents on destruction.
class TemporaryFolder {
public:
    TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;
    ~TemporaryFolder();

    const std::string& path() const;

    /// The path of a file in the folder; an absolute name stays as it is.
    std::string path(const std::string& file) const;

    void write(const std::string& file, const std::string& text) const;
    std::string read(const std::string& file) const;

    /// The sorted names of everything in the folder except hidden files.
    std::vector<std::string> names() const;

private:
    std::string itsPath;
};

}  // namespace morvik::support

#endif
