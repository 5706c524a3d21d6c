// TextFile: reads whole files.
#include "TextFile.h"

#include <array>
#include <filesystem>
#include <fstream>
#include <string_view>
#include <system_error>

#include "Error.h"
#include "FileKind.h"
#include "InputFile.h"
#include "Path.h"
#include "Text.h"

namespace morvik::base {

std::string readText(const std::string& fileName)
{
    std::ifstream file = openFile(fileName);
    return readText(file, fileName, largestText);
}

std::string readText(std::istream& file, const std::string& name, std::size_t largest)
{
    std::string text;
    std::array<char, 65536> part = {};
    while (file.read(part.data(), part.size()) || file.gcount() > 0) {
        const std::string_view next(part.data(), static_cast<std::size_t>(file.gcount()));
        const char* const reason = text.empty() ? whyNoText(next) : nullptr;
        if (reason != nullptr) {
            throw Error(name + ": " + reason);
        }
        if (next.find('\0') != std::string_view::npos) {
            throw Error(name + ": is not text, it has a null character");
        }
        if (text.size() + next.size() > largest) {
            throw Error(name + ": is larger than " + std::to_string(largest) + " bytes");
        }
        text += next;
    }
    if (file.bad()) {
        throw fileError(name, "read");
    }
    text.erase(0, text.size() - withoutMark(text).size());
    return text;
}

void expectRegularFile(const std::string& fileName)
{
    std::error_code none;  // set if there is no such file
    if (const auto found = std::filesystem::status(pathOf(fileName), none);
        std::filesystem::exists(found) && !std::filesystem::is_regular_file(found)) {
        throw Error(fileName + ": is not a regular file");
    }
}

}  // namespace morvik::base
