// Checksum: the SHA-256 of a file.
#include "Checksum.h"

#include <algorithm>
#include <system_error>

#include "base/ChildProcess.h"
#include "base/Error.h"
#include "base/TextFile.h"

namespace morvik::vectors {

std::string sha256(const std::string& fileName)
{
    base::expectRegularFile(fileName);
    base::Outcome outcome{};
    try {
        outcome = base::runProgram({"sha256sum", "--", fileName}, "");
    } catch (const std::system_error& error) {
        throw base::Error(std::string("sha256sum cannot be started: ") + error.what());
    }
    if (!outcome.succeeded) {
        throw base::Error(outcome.err.substr(0, outcome.err.find('\n')));
    }
    constexpr std::size_t digits = 64;
    std::string& line = outcome.out;
    line.erase(0, line[0] == '\\' ? 1 : 0);  // marks a file name with escaped characters
    return line.substr(0, digits);
}

}  // namespace morvik::vectors
