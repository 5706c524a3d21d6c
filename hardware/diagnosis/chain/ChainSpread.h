// ChainSpread: whether noise alone can have made the signs wrong that mistakes leave. It spreads them over all streams,
// transmissions and code blocks alike; what is misread stands together.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINSPREAD_H
#define MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINSPREAD_H

#include <optional>
#include <string>
#include <vector>

#include "ChainEvidence.h"

namespace morvik::diagnosis {

/// Values of which too many signs are wrong for noise, and all others.
struct UnevenPart {
    std::string name;  ///< such as "the first parity"
    Signs inside;
    Signs others;
};

/// The signs of all values.
Signs signsOfAll(const std::vector<AgreeingValue>& values);

/// The part that stands out most, if any. `unit` is the value that says a log-likelihood ratio of 1, or 0 where too few
/// signs are wrong to tell.
std::optional<UnevenPart> unevenPart(const std::vector<AgreeingValue>& values, double unit);

}  // namespace morvik::diagnosis

#endif
