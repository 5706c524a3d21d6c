// Where: what the places of faults have in common.
#ifndef MORVIK_HARDWARE_COMPARISON_WHERE_H
#define MORVIK_HARDWARE_COMPARISON_WHERE_H

#include <bitset>
#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "Comparison.h"
#include "Model.h"

namespace morvik::comparison {

/// A kind of place in a block.
struct PlaceKind {
    const char* text;
    bool (*matches)(const rules::Cut&, const Place&);
};

/// What the addresses of faults share: some bits. An address is a trellis step or, of intrinsic values, that of the
/// extrinsic value.
struct SharedAddress {
    bool isOfExtrinsic;
    unsigned mask;
    unsigned bits;
};

/// A set of places of one stage.
class Where {
public:
    /// The narrowest set that contains all these faults of a stage. `model` must outlive it.
    Where(const Model& model, const Comparison& comparison, const std::vector<Fault>& faults);

    /// "in segment 1 alone"; empty if the faults are spread.
    std::string text() const;

    bool contains(const Place& place) const;

    /// Where a mistake in handing on border columns would show: in all states and steps alike. A single fault does not
    /// tell where others might be.
    Where ofBorders() const;

    /// Where a mistake in an operation would show: at window edges and elsewhere alike.
    Where ofOperation() const;

    /// The same places in all passes and segments.
    Where spread() const;

private:
    /// Whether several segments have places of the kind.
    bool isInSegments() const;
    unsigned stepsAround() const;
    std::string passText() const;
    std::string signalText() const;
    std::string stepText() const;
    std::string addressText() const;
    bool hasAddress(const Place& place) const;

    const Model* itsModel;
    Stage itsStage;
    bool itsIsOfOnePass;
    const PlaceKind* itsKind = nullptr;
    std::optional<unsigned> itsPass;
    std::optional<unsigned> itsCode;
    std::bitset<signalCount> itsSignals;
    std::optional<unsigned> itsSegment;
    std::optional<unsigned> itsUnit;
    unsigned itsFirst = 0;  ///< step
    unsigned itsLast = 0;
    bool itsHasRange = false;  ///< whether only the steps from first to last belong to it
    std::optional<SharedAddress> itsAddress;
    bool itsIsOnePlace = false;
};

}  // namespace morvik::comparison

#endif
