// DumpFiles: reads dumps of any form from files.
#ifndef MORVIK_APP_COMPARE_DUMPFILES_H
#define MORVIK_APP_COMPARE_DUMPFILES_H

#include <string>

#include "hardware/comparison/Dump.h"
#include "hardware/comparison/DumpNames.h"

namespace morvik {

/// Reads the dump of a block. `form` is csv, vcd, or the format of a table `internal` of morvik vectors; if empty,
/// content and name tell. Throws base::Error.
void readDump(const std::string& file, const std::string& form, const comparison::NameMap& map, comparison::Dump& dump);

/// Reads dumps of blocks 0 to `blocks` - 1, or of some of them.
void readDumps(const std::string& file,
               const std::string& form,
               const comparison::NameMap& map,
               std::uint64_t blocks,
               comparison::DumpSink& sink);

/// Reads the names in a dump.
comparison::DumpNames readDumpNames(const std::string& file, const std::string& form);

/// The name of a dump in messages.
std::string shownName(const std::string& file);

}  // namespace morvik

#endif
