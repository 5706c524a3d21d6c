// DumpFiles: reads dumps of any form from files.
#include "DumpFiles.h"

#include <filesystem>
#include <memory>

#include "base/Error.h"
#include "base/Path.h"
#include "base/UnpackedFile.h"
#include "hardware/vectors/BlockFiles.h"

namespace morvik {

namespace {

bool endsIn(const std::string& name, const std::string& ending)
{
    return name.size() > ending.size() && name.compare(name.size() - ending.size(), ending.size(), ending) == 0;
}

/// Whether the dump is a VCD, by the option, the content or the file name extension.
bool isVcd(const std::string& file, const std::string& form, const base::UnpackedFile& input)
{
    return form.empty() ? input.isFst() || endsIn(file, ".vcd") || endsIn(file, ".vcd.gz") : form == "vcd";
}

/// The format of a table of internal values, or null: CSV has a header of its own.
const tables::Format* tableFormatOf(const std::string& file, const std::string& form)
{
    const std::string ending = base::pathOf(file).extension().u8string();
    const std::string name = !form.empty() ? form : ending.empty() ? "" : ending.substr(1);
    return name == "csv" ? nullptr : tables::findFormat(name);
}

/// Reads a table whose rows are those of one block after the other, as `morvik vectors --internal` writes them.
class TableDump {
public:
    TableDump(const std::string& file, const tables::Format& format, const comparison::NameMap& map)
        : itsTable(vectors::internalTable())
    {
        const std::filesystem::path path = base::pathOf(file);
        if (map.namesRows || !map.needed.empty()) {
            throw base::Error(file + ": is a table of all signals in their order; a map has no names for it");
        }
        base::openFile(file);  // for the message that all files have
        itsTable.name = path.stem().u8string();
        const std::string folder = path.parent_path().u8string();
        itsReader = format.reader(folder.empty() ? "." : folder, itsTable);
    }

    /// Reads the rows of a block; false if there are none.
    bool next(comparison::Dump& dump)
    {
        const std::uint64_t rows = std::uint64_t{dump.values.passes()} * dump.values.steps();
        dump.given.fill(true);
        tables::Row row;
        for (std::uint64_t i = 0; i < rows; ++i) {
            if (!itsReader->next(row)) {
                itsIsAtEnd = true;
                return i > 0;
            }
            ++itsRow;
            take(row, dump);
        }
        return true;
    }

    void expectEnd()
    {
        if (tables::Row row; !itsIsAtEnd && itsReader->next(row)) {
            throw base::Error(itsReader->place() + ": has more rows than the block needs");
        }
    }

private:
    void take(const tables::Row& row, comparison::Dump& dump) const
    {
        if (row[0] >= dump.values.passes() || row[1] >= dump.values.steps()) {
            throw base::Error(itsReader->place() + ": half-iteration " + std::to_string(row[0]) + " and step " +
                              std::to_string(row[1]) + " are not allowed, expected less than " +
                              std::to_string(dump.values.passes()) + " and " + std::to_string(dump.values.steps()));
        }
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            const comparison::Place place = {static_cast<unsigned>(row[0]), signal, static_cast<unsigned>(row[1])};
            dump.values.set(place, static_cast<std::int16_t>(row[signal + 2]));
            dump.lineOf(place) = itsRow;
        }
    }

    tables::Table itsTable;
    std::unique_ptr<tables::TableReader> itsReader;
    std::uint32_t itsRow = 0;
    bool itsIsAtEnd = false;
};

template <class ReadVcd, class ReadCsv, class Target>
void read(const std::string& file,
          const std::string& form,
          const comparison::NameMap& map,
          ReadVcd readVcd,
          ReadCsv readCsv,
          Target& target)
{
    base::UnpackedFile input(file);
    try {
        if (isVcd(file, form, input)) {
            readVcd(input.stream(), input.name(), map, target);
        } else {
            readCsv(input.stream(), input.name(), map, target);
        }
    } catch (const base::Error&) {
        input.expectWhole();  // the reason, if the dump ends too early
        throw;
    }
    input.expectWhole();
}

}  // namespace

void readDump(const std::string& file, const std::string& form, const comparison::NameMap& map, comparison::Dump& dump)
{
    const tables::Format* const format = tableFormatOf(file, form);
    if (format == nullptr) {
        read(file, form, map, comparison::readVcd, comparison::readCsv, dump);
        return;
    }
    TableDump table(file, *format, map);
    table.next(dump);
    table.expectEnd();
}

void readDumps(const std::string& file,
               const std::string& form,
               const comparison::NameMap& map,
               std::uint64_t blocks,
               comparison::DumpSink& sink)
{
    const tables::Format* const format = tableFormatOf(file, form);
    if (format == nullptr) {
        read(file, form, map, comparison::readVcdBlocks, comparison::readCsvBlocks, sink);
        return;
    }
    TableDump table(file, *format, map);
    for (std::uint64_t block = 0; block < blocks; ++block) {
        if (!table.next(sink.dumpOf(block))) {
            return;
        }
    }
    table.expectEnd();
}

comparison::DumpNames readDumpNames(const std::string& file, const std::string& form)
{
    base::UnpackedFile input(file);
    const bool isWaveform = isVcd(file, form, input);
    return (isWaveform ? comparison::namesOfVcd : comparison::namesOfCsv)(input.stream(), input.name());
}

std::string shownName(const std::string& file)
{
    return file == base::standardStream ? "<stdin>" : file;
}

}  // namespace morvik
