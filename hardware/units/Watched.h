// Watched: a word that tells what the operations on it meet, for the steps of rules/Trellis.h.
#ifndef MORVIK_HARDWARE_UNITS_WATCHED_H
#define MORVIK_HARDWARE_UNITS_WATCHED_H

#include <cstdint>
#include <vector>

#include "Steps.h"

namespace morvik::units {

/// A decision between two candidates.
struct Decision {
    rules::Value difference;  ///< of the candidates, as it wraps
    bool wraps;
    bool addsPending;  ///< a correction other than 0
};

/// What a calculation has met, in its order.
struct Watch {
    std::vector<Decision> decisions;
    bool sumWraps = false;
};

struct Watched {
    rules::Value value = 0;
    Watch* watch = nullptr;
    bool isBranch = false;  ///< the difference of two metrics is a comparison, that with a branch metric a sum
};

inline rules::Value wordOf(Watched word)
{
    return word.value;
}

inline Watched result(Watched a, Watched b, std::int32_t exact, bool isSum)
{
    Watch* const watch = a.watch != nullptr ? a.watch : b.watch;
    const rules::Value value = rules::wrap16(exact);
    if (watch != nullptr && isSum && value != exact) {
        watch->sumWraps = true;
    }
    return {value, watch};
}

inline Watched addWrap(Watched a, Watched b)
{
    return result(a, b, std::int32_t{a.value} + b.value, true);
}

inline Watched subWrap(Watched a, Watched b)
{
    return result(a, b, std::int32_t{a.value} - b.value, b.isBranch);
}

/// Chooses between pending corrections.
inline Watched select(Watched difference, Watched c1, Watched c2)
{
    const Watched chosen = difference.value < 0 ? c2 : c1;
    difference.watch->decisions.back().addsPending = chosen.value != 0;
    return chosen;
}

inline Watched maxWrap(Watched c1, Watched c2)
{
    const Watched difference = subWrap(c1, c2);
    const bool wraps = difference.value != c1.value - c2.value;
    difference.watch->decisions.push_back({difference.value, wraps, false});
    return difference.value < 0 ? c2 : c1;
}

}  // namespace morvik::units

#endif
