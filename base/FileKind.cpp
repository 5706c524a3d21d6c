// FileKind: recognises files that are not text by their first bytes.
#include "FileKind.h"

#include <array>

namespace morvik::base {

namespace {

using namespace std::string_view_literals;

struct Kind {
    std::string_view beginning;
    const char* what;
    Packing packing = Packing::none;
};

/// FST begins with a block of type 0 and 329 bytes or, compressed as a whole, with one of type 254.
constexpr std::array<Kind, 10> kinds = {{
    {"\x1F\x8B"sv, "is compressed with gzip; unpack it by 'gunzip FILE'", Packing::gzip},
    {"\xFD\x37zXZ\0"sv, "is compressed with xz; unpack it by 'unxz FILE'"},
    {"\x28\xB5\x2F\xFD"sv, "is compressed with zstd; unpack it by 'unzstd FILE'"},
    {"BZh"sv, "is compressed with bzip2; unpack it by 'bunzip2 FILE'"},
    {"PK\x03\x04"sv, "is a ZIP archive; unpack it by 'unzip FILE'"},
    {"\0\0\0\0\0\0\0\x01\x49"sv, "is an FST waveform; convert it by GTKWave's 'fst2vcd FILE > FILE.vcd'", Packing::fst},
    {"\xFE\0\0\0"sv, "is an FST waveform; convert it by GTKWave's 'fst2vcd FILE > FILE.vcd'", Packing::fst},
    {"GHDLwave"sv, "is in GHDL's own waveform format; run the simulation with --vcd=FILE"},
    {"\xFF\xFE"sv, "is in UTF-16; convert it by 'iconv -f UTF-16 -t UTF-8 FILE > NEW'"},
    {"\xFE\xFF"sv, "is in UTF-16; convert it by 'iconv -f UTF-16 -t UTF-8 FILE > NEW'"},
}};

const Kind* kindOf(std::string_view beginning)
{
    for (const Kind& kind : kinds) {
        if (beginning.substr(0, kind.beginning.size()) == kind.beginning) {
            return &kind;
        }
    }
    return nullptr;
}

}  // namespace

const char* whyNoText(std::string_view beginning)
{
    const Kind* const kind = kindOf(beginning);
    return kind == nullptr ? nullptr : kind->what;
}

Packing packingOf(std::string_view beginning)
{
    const Kind* const kind = kindOf(beginning);
    return kind == nullptr ? Packing::none : kind->packing;
}

}  // namespace morvik::base
