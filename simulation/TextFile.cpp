// TextFile: reads a file as a whole.
#include "TextFile.h"

#include <array>
#include <fstream>

#include "Error.h"

namespace simulation {

std::string readText(const std::string& fileName)
{
    std::ifstream file(fileName, std::ios::binary);
    if (!file) {
        throw fileError(fileName, "opened");
    }
    std::string text;
    std::array<char, 65536> part = {};
    while (file.read(part.data(), part.size()) || file.gcount() > 0) {
        text.append(part.data(), static_cast<std::size_t>(file.gcount()));
    }
    if (file.bad()) {
        throw fileError(fileName, "read");
    }
    return text;
}

}  // namespace simulation
