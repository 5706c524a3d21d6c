// FileWriter: a file that is written in pieces.
#include "FileWriter.h"

#include <fstream>
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

}  // namespace morvik::vectors
