// TemporaryFolder: a folder of its own for a test.
#ifndef MORVIK_TESTS_SUPPORT_TEMPORARYFOLDER_H
#define MORVIK_TESTS_SUPPORT_TEMPORARYFOLDER_H

#include <string>
#include <vector>

namespace morvik::support {

/// An empty folder, which goes with the object and all that is in it.
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

    /// The names of all that is in the folder and not hidden, sorted.
    std::vector<std::string> names() const;

private:
    std::string itsPath;
};

}  // namespace morvik::support

#endif
