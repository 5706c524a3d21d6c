// Situations: what the arithmetic of a core can meet on a block: clips, wraps, ties, corrections, borders and cuts.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_HARDWARE_COVERAGE_SITUATIONS_H
#define MORVIK_HARDWARE_COVERAGE_SITUATIONS_H

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"
#include "rules/Cut.h"

namespace morvik::coverage {

/// Families of situations. The words that tell the members of a family apart stand in Situations.cpp.
enum class Family : std::uint8_t {
    wrapOfSum,         ///< forward plus backward metric
    wrapOfBranch,      ///< a metric plus or minus a branch metric
    wrapOfDifference,  ///< a ratio's last difference
    wrapOfPending,     ///< a metric plus the pending correction
    wrapOfCompare,     ///< the difference of two candidates
    tieForward,        ///< equal candidates for a state
    tieBackward,       ///< equal candidates for a state
    tieRatio,          ///< equal candidates in the tree of a ratio
    input,             ///< soft values at the ends of their range
    branchClip,        ///< branch metrics
    branchNegated,     ///< the smallest parity value, subtracted
    algorithm,         ///< of the core
    pendingTie,        ///< equal candidates with different pending corrections
    correction,        ///< an entry of the table
    noCorrection,      ///< a difference beyond the table
    inverted,          ///< a negative difference that inversion takes to another correction
    border,            ///< stored metrics that lose bits
    tailSum,           ///< branch sums wider than branch metrics
    tailState,         ///< from which the tail leads back
    intrinsicWide,     ///< twice the intrinsic value, wider than soft values
    aprioriOdd,        ///< half an a-priori value loses its last bit
    intrinsicHalf,     ///< the intrinsic value has a bit below an eighth
    extrinsicClip,     ///< extrinsic values
    scaledInside,      ///< wider than extrinsic values until scaled
    scaledRounded,     ///< a scaled value loses bits
    pass,              ///< kinds of half-iterations
    size,              ///< ends of the list of block sizes
    decision,          ///< the sign of a ratio
    units,             ///< of the core
    segments,          ///< in which a block is cut
    unitsAtWork,       ///< on a block
    window,            ///< kinds of windows
    rows,              ///< of windows
    startForward,      ///< what a segment starts from
    startBackward      ///< what a window starts from
};

/// The members of a family differ in up to two words: 0, 0 is the first one.
unsigned situation(Family family, unsigned first = 0, unsigned second = 0);

struct Situation {
    std::string name;  ///< "tie.forward.3"
    std::string text;  ///< a sentence, without its point
    unsigned rule;
    Family family;
};

/// All situations in the order of their numbers.
const std::vector<Situation>& situations();

/// The numbers of a situation of this name, or of all whose names begin with it and a point; of all for "all". Empty if
/// there is none.
std::vector<unsigned> situationsNamed(std::string_view name);

/// A core.
struct Core {
    unsigned units = 2;
    unsigned algorithm = 0;

    friend bool operator==(const Core& a, const Core& b)
    {
        return a.units == b.units && a.algorithm == b.algorithm;
    }
};

/// The core of a configuration.
Core coreOf(const veltra_ip_morvik_v1_0_generics& generics);

/// Why the core can never meet a situation; nothing if it can.
std::optional<std::string> whyImpossible(unsigned situation, const Core& core);

/// Calls `take` with each situation that lies in the core and in its cut of a block.
void forEachOfCut(const rules::Cut& cut, unsigned algorithm, const std::function<void(unsigned)>& take);

}  // namespace morvik::coverage

#endif
