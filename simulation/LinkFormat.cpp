// LinkFormat: how blocks reach the decoder.
#include "LinkFormat.h"

#include <tuple>

namespace morvik::simulation {

namespace {

/// The MCS comes first: its order is that of tables and legends.
auto orderOf(const LinkFormat& format)
{
    const int table = format.mcs ? 1 + static_cast<int>(format.mcs->table) : 0;
    const unsigned index = format.mcs ? format.mcs->index : 0;
    return std::tuple_cat(std::tuple(table, index),
                          std::tie(format.transportBlockSize,
                                   format.codedBits,
                                   format.modulation,
                                   format.versions,
                                   format.softBufferBits,
                                   format.softBufferSize,
                                   format.fading,
                                   format.demapper,
                                   format.stopsEarly));
}

}  // namespace

bool operator==(const LinkFormat& a, const LinkFormat& b)
{
    return orderOf(a) == orderOf(b);
}

bool operator<(const LinkFormat& a, const LinkFormat& b)
{
    return orderOf(a) < orderOf(b);
}

std::string mcsText(const std::optional<McsIndex>& mcs)
{
    return mcs ? std::string(nameOf(mcs->table)) + ' ' + std::to_string(mcs->index) : "";
}

std::string_view nameOf(link::McsTable table)
{
    return table == link::McsTable::qam64 ? "64qam" : "256qam";
}

std::optional<link::McsTable> mcsTableOf(std::string_view name)
{
    for (const link::McsTable table : {link::McsTable::qam64, link::McsTable::qam256}) {
        if (nameOf(table) == name) {
            return table;
        }
    }
    return std::nullopt;
}

std::string versionsText(const std::vector<unsigned>& versions, char separator)
{
    std::string text;
    for (const unsigned version : versions) {
        text += (text.empty() ? "" : std::string(1, separator)) + std::to_string(version);
    }
    return text;
}

}  // namespace morvik::simulation
