// Selection: which of the core's values a trace shows.
#ifndef MORVIK_HARDWARE_TRACE_SELECTION_H
#define MORVIK_HARDWARE_TRACE_SELECTION_H

#include <algorithm>
#include <cstdint>
#include <vector>

namespace morvik::trace {

struct Selection {
    std::uint32_t first = 0;  ///< half-iteration
    std::uint32_t last = 0;
    std::vector<unsigned> signals;     ///< indices in passSignals, ascending
    std::vector<std::uint32_t> units;  ///< empty for all

    bool showsUnit(std::uint32_t unit) const
    {
        return units.empty() || std::find(units.begin(), units.end(), unit) != units.end();
    }
};

}  // namespace morvik::trace

#endif
