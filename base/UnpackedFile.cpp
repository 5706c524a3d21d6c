// UnpackedFile: opens files for reading, and unpacks them on the way.
#include "UnpackedFile.h"

#include <array>
#include <system_error>
#include <vector>

#include "Error.h"
#include "System.h"

namespace morvik::base {

namespace {

/// The packing of the file, which is left at its beginning. Pipes are not looked into.
Packing packingOfFile(const std::string& name)
{
    if (name == standardStream) {
        return Packing::none;
    }
    const auto status = system::statusOf(name);
    if (!status || !status->isRegular) {
        return Packing::none;
    }
    std::ifstream file = openFile(name);
    std::array<char, 16> beginning{};
    file.read(beginning.data(), beginning.size());
    return packingOf(std::string_view(beginning.data(), static_cast<std::size_t>(file.gcount())));
}

/// The program that unpacks, and the Debian package that has it.
struct Unpacker {
    std::vector<std::string> command;
    const char* whatItIs;
    const char* package;
};

Unpacker unpackerOf(Packing packing)
{
    return packing == Packing::fst ? Unpacker{{"fst2vcd", "-f"}, "is an FST waveform", "gtkwave"}
                                   : Unpacker{{"gzip", "-dc", "--"}, "is compressed with gzip", "gzip"};
}

std::unique_ptr<RunningProgram> startUnpacking(const std::string& name, Packing packing)
{
    if (packing == Packing::none) {
        return nullptr;
    }
    Unpacker unpacker = unpackerOf(packing);
    const std::string program = unpacker.command.front();
    unpacker.command.push_back(name);
    try {
        return std::make_unique<RunningProgram>(unpacker.command);
    } catch (const std::system_error& error) {
        throw Error(name + ": " + unpacker.whatItIs + ", which " + program + " reads (Debian package " +
                    unpacker.package + "), and " + program + " cannot be started: " + error.code().message());
    }
}

}  // namespace

UnpackedFile::UnpackedFile(const std::string& name)
    : itsFile(name), itsPacking(packingOfFile(name)), itsProgram(startUnpacking(name, itsPacking))
{
}

std::istream& UnpackedFile::stream()
{
    return itsProgram ? itsProgram->output() : itsFile.stream();
}

void UnpackedFile::expectWhole()
{
    if (!itsProgram || !itsProgram->isAtEnd()) {
        return;
    }
    const Outcome outcome = itsProgram->wait();
    if (!outcome.succeeded) {
        throw Error(name() + ": cannot be unpacked by " + unpackerOf(itsPacking).command.front() + ": " +
                    outcome.firstMessage());
    }
}

}  // namespace morvik::base
