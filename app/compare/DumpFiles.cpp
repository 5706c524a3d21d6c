// DumpFiles: reads dumps of any form from files.
#include "DumpFiles.h"

#include "base/Error.h"
#include "base/UnpackedFile.h"

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
    read(file, form, map, comparison::readVcd, comparison::readCsv, dump);
}

void readDumps(const std::string& file,
               const std::string& form,
               const comparison::NameMap& map,
               comparison::DumpSink& sink)
{
    read(file, form, map, comparison::readVcdBlocks, comparison::readCsvBlocks, sink);
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
