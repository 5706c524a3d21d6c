// Meetings: which situations of the arithmetic a block meets, and at which values.
#ifndef MORVIK_HARDWARE_COVERAGE_MEETINGS_H
#define MORVIK_HARDWARE_COVERAGE_MEETINGS_H

#include "hardware/comparison/Model.h"
#include "hardware/comparison/Values.h"

namespace morvik::coverage {

/// Takes the situations of a block, by their numbers.
class Taker {
public:
    Taker() = default;
    Taker(const Taker&) = delete;
    Taker& operator=(const Taker&) = delete;
    virtual ~Taker() = default;

    /// A situation in the computation of a value. The last columns of segments and windows are values of the pass that
    /// starts from them; one that no pass starts from has no situations.
    virtual void atValue(unsigned situation, const comparison::Place& place) = 0;

    /// A situation of the whole block.
    virtual void ofBlock(unsigned situation) = 0;
};

/// Hands over the situations of all values of the model, in any order.
void findSituations(const comparison::Model& model, Taker& taker);

}  // namespace morvik::coverage

#endif
