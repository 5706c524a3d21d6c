// FileKind: recognises files that are not text by their first bytes.
#include "FileKind.h"

#include <array>

namespace morvik::base {

namespace {

using namespace std::string_view_literals;

struct Kind {
    std::string_view beginning;
    const char* what;
};

/// FST begins with a block of type 0 and 329 bytes or, compressed as a whole, with one of type 254.
constexpr std::array<Kind, 10> kinds = {{
    {"\x1F\x8B"sv, "is compressed by gzip; 'gunzip FILE' unpacks it"},
    {"\xFD\x37zXZ\0"sv, "is compressed by xz; 'unxz FILE' unpacks it"},
    {"\x28\xB5\x2F\xFD"sv, "is compressed by zstd; 'unzstd FILE' unpacks it"},
    {"BZh"sv, "is compressed by bzip2; 'bunzip2 FILE' unpacks it"},
    {"PK\x03\x04"sv, "is a ZIP archive; 'unzip FILE' unpacks it"},
    {"\0\0\0\0\0\0\0\x01\x49"sv, "is an FST waveform; 'fst2vcd FILE > FILE.vcd' of GTKWave makes a VCD of it"},
    {"\xFE\0\0\0"sv, "is an FST waveform; 'fst2vcd FILE > FILE.vcd' of GTKWave makes a VCD of it"},
    {"GHDLwave"sv, "is a waveform of GHDL's own; run the simulation with --vcd=FILE"},
    {"\xFF\xFE"sv, "is in UTF-16; 'iconv -f UTF-16 -t UTF-8 FILE > NEW' makes a text of it"},
    {"\xFE\xFF"sv, "is in UTF-16; 'iconv -f UTF-16 -t UTF-8 FILE > NEW' makes a text of it"},
}};

}  // namespace

const char* whyNoText(std::string_view beginning)
{
    for (const Kind& kind : kinds) {
        if (beginning.substr(0, kind.beginning.size()) == kind.beginning) {
            return kind.what;
        }
    }
    return nullptr;
}

}  // namespace morvik::base
