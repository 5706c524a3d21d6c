// TextFiles: files that are written and read in pieces, with their places in messages.
#include "TextFiles.h"

#include <iostream>
#include <utility>

#include "simulation/Error.h"

namespace morvik::vectors {

FileWriter::FileWriter(const std::string& fileName)
    : FileWriter(fileName, std::make_unique<std::ofstream>(fileName, std::ios::binary))
{
    if (!*itsStream) {
        fail();
    }
}

FileWriter::FileWriter(std::string name, std::unique_ptr<std::ostream> stream)
    : itsName(std::move(name)), itsStream(std::move(stream))
{
}

FileWriter FileWriter::standardOutput()
{
    return {"<stdout>", std::make_unique<std::ostream>(std::cout.rdbuf())};
}

void FileWriter::write(std::string_view text)
{
    if (!itsStream->write(text.data(), static_cast<std::streamsize>(text.size()))) {
        fail();
    }
}

void FileWriter::overwriteStart(std::string_view text)
{
    itsStream->seekp(0);
    write(text);
}

void FileWriter::close()
{
    if (!itsStream->flush()) {
        fail();
    }
    itsStream.reset();
}

void FileWriter::fail() const
{
    throw simulation::fileError(itsName, "written");
}

LineFile::LineFile(const std::string& fileName) : itsName(fileName), itsFile(fileName, std::ios::binary)
{
    if (!itsFile) {
        throw simulation::fileError(fileName, "opened");
    }
}

bool LineFile::next()
{
    if (!std::getline(itsFile, itsLine)) {
        if (itsFile.bad()) {
            throw simulation::fileError(itsName, "read");
        }
        return false;
    }
    ++itsNumber;
    if (!itsLine.empty() && itsLine.back() == '\r') {
        itsLine.pop_back();
    }
    return true;
}

std::string LineFile::place() const
{
    return itsName + ':' + std::to_string(itsNumber);
}

void LineFile::fail(const std::string& what) const
{
    throw simulation::Error(place() + ": " + what);
}

}  // namespace morvik::vectors
