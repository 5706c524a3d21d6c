// TemporaryFolder: a temporary folder for a test.
#include "TemporaryFolder.h"

#include <stdlib.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <system_error>

namespace morvik::support {

TemporaryFolder::TemporaryFolder()
{
    std::string name = (std::filesystem::temp_directory_path() / "morvik-test-XXXXXX").string();
    if (mkdtemp(name.data()) == nullptr) {
        throw std::runtime_error("cannot make a temporary directory");
    }
    itsPath = name;
}

TemporaryFolder::~TemporaryFolder()
{
    std::error_code ignored;  // what cannot be removed stays behind
    std::filesystem::remove_all(itsPath, ignored);
}

const std::string& TemporaryFolder::path() const
{
    return itsPath;
}

std::string TemporaryFolder::path(const std::string& file) const
{
    return (std::filesystem::path(itsPath) / file).string();
}

void TemporaryFolder::write(const std::string& file, const std::string& text) const
{
    std::ofstream(path(file), std::ios::binary) << text;
}

std::string TemporaryFolder::read(const std::string& file) const
{
    std::ifstream stream(path(file), std::ios::binary);
    if (!stream) {
        throw std::runtime_error("cannot read " + file);
    }
    return std::string(std::istreambuf_iterator<char>(stream), {});
}

std::vector<std::string> TemporaryFolder::names() const
{
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(itsPath)) {
        const std::string name = entry.path().filename().string();
        if (name.front() != '.') {
            names.push_back(name);
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

}  // namespace morvik::support
