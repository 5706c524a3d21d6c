// Where: what the places of faults have in common.
#include "Where.h"

#include <algorithm>
#include <array>
#include <bitset>
#include <set>

namespace morvik::comparison {

namespace {

bool startsSegment(const rules::Cut& cut, const Place& place)
{
    return stageOf(place.signal) == Stage::forward && cut.startsSegment(place.step);
}

bool startsWindow(const rules::Cut& cut, const Place& place)
{
    return stageOf(place.signal) == Stage::backward && place.step < cut.K() &&
           cut.windowAt(place.step).last == place.step;
}

bool startsAtTail(const rules::Cut& cut, const Place& place)
{
    return startsWindow(cut, place) && place.step + 1 == cut.K();
}

bool startsInLastRow(const rules::Cut& cut, const Place& place)
{
    return cut.rows() > 1 && startsWindow(cut, place) && cut.windowAt(place.step).row + 1 == cut.rows();
}

/// Narrowest first.
constexpr std::array<PlaceKind, 8> kinds = {{
    {"at the beginning of segment 0 alone",
     [](const rules::Cut& cut, const Place& place) {
         return startsSegment(cut, place) && place.step == 0;
     }},
    {"at window edges alone: where segments start",
     [](const rules::Cut& cut, const Place& place) {
         return startsSegment(cut, place) && place.step > 0;
     }},
    {"at window edges alone: where segments start, segment 0 among them", startsSegment},
    {"at the tail alone: where the last window starts", startsAtTail},
    {"at window edges alone: where windows of the last row start",
     [](const rules::Cut& cut, const Place& place) {
         return startsInLastRow(cut, place) && !startsAtTail(cut, place);
     }},
    {"at window edges alone: where windows start",
     [](const rules::Cut& cut, const Place& place) {
         return startsWindow(cut, place) && !startsAtTail(cut, place);
     }},
    {"at window edges alone: where windows start, at the tail as well", startsWindow},
    {"in the tail alone",
     [](const rules::Cut& cut, const Place& place) {
         return place.step >= cut.K();
     }},
}};

/// The property's value, if all faults share it.
template <class Property>
std::optional<unsigned> common(const std::vector<Fault>& faults, Property property)
{
    const unsigned first = property(faults.front().place);
    const bool all =
        std::all_of(faults.begin(), faults.end(), [&](const Fault& fault) { return property(fault.place) == first; });
    return all ? std::optional<unsigned>(first) : std::nullopt;
}

/// All bits up to the highest one of a number.
constexpr unsigned allBits(unsigned number)
{
    unsigned bits = 0;
    while (number > bits) {
        bits = 2 * bits + 1;
    }
    return bits;
}

std::size_t bitsIn(unsigned mask)
{
    return std::bitset<32>(mask).count();
}

/// Whether the mask has low bits alone: addresses that share these are a power of two apart.
constexpr bool isPeriod(unsigned mask)
{
    return (mask & (mask + 1)) == 0;
}

std::optional<unsigned> addressOf(const Model& model, const Place& place, bool isOfExtrinsic)
{
    return isOfExtrinsic                ? extrinsicAddress(model, place)
           : place.step < model.cut.K() ? std::optional(place.step)
                                        : std::nullopt;
}

/// The bits that all addresses share; none if a fault has no address, or if there are too few to tell.
std::optional<SharedAddress> sharedBits(const Model& model, const std::vector<Fault>& faults, bool isOfExtrinsic)
{
    const auto first = addressOf(model, faults.front().place, isOfExtrinsic);
    unsigned differing = 0;
    std::set<unsigned> addresses;
    for (const Fault& fault : faults) {
        const auto address = addressOf(model, fault.place, isOfExtrinsic);
        if (!first || !address) {
            return std::nullopt;
        }
        differing |= *address ^ *first;
        addresses.insert(*address);
    }
    if (addresses.size() == 1) {
        constexpr std::size_t fewest = 4;
        return faults.size() >= fewest ? std::optional(SharedAddress{isOfExtrinsic, ~0U, *first}) : std::nullopt;
    }
    const unsigned mask = ~differing & allBits(model.cut.K() - 1);
    // Few neighbours share their high bits. Low bits are hardly shared by chance, nor is any bit of many addresses.
    constexpr std::size_t fewestCoincidences = 15;
    constexpr std::size_t fewestAddresses = 16;
    const bool isTelling = isPeriod(mask) ? (addresses.size() - 1) * bitsIn(mask) >= fewestCoincidences
                                          : addresses.size() >= fewestAddresses;
    return mask != 0 && isTelling ? std::optional(SharedAddress{isOfExtrinsic, mask, *first & mask}) : std::nullopt;
}

std::optional<SharedAddress> sharedAddress(const Model& model, const std::vector<Fault>& faults)
{
    const auto steps = sharedBits(model, faults, false);
    return steps ? steps : sharedBits(model, faults, true);
}

void append(std::string& text, const std::string& part)
{
    text += (text.empty() || part.empty() ? "" : ", ") + part;
}

}  // namespace

Where::Where(const Model& model, const Comparison& comparison, const std::vector<Fault>& faults)
    : itsModel(&model), itsStage(stageOf(faults.front().place.signal)), itsIsOfOnePass(!comparison.inputsAreKnown)
{
    const auto* const kind = std::find_if(kinds.begin(), kinds.end(), [&](const PlaceKind& each) {
        return std::all_of(
            faults.begin(), faults.end(), [&](const Fault& fault) { return each.matches(model.cut, fault.place); });
    });
    itsKind = kind != kinds.end() ? kind : nullptr;
    itsPass = common(faults, [](const Place& place) { return place.pass; });
    itsCode = common(faults, [](const Place& place) { return codeOf(place.pass); });
    for (const Fault& fault : faults) {
        itsSignals.set(fault.place.signal);
    }
    const auto [fewest, most] = std::minmax_element(
        faults.begin(), faults.end(), [](const Fault& a, const Fault& b) { return a.place.step < b.place.step; });
    itsFirst = fewest->place.step;
    itsLast = most->place.step;
    itsIsOnePlace = faults.size() == 1;
    constexpr std::size_t fewestOfKind = 8;  // a column
    if (itsKind == nullptr ? model.cut.segments() > 1 : faults.size() >= fewestOfKind && isInSegments()) {
        itsSegment = common(faults, [&](const Place& place) { return model.cut.placeOf(place.step).segment; });
        itsUnit = common(faults, [&](const Place& place) { return model.cut.placeOf(place.step).unit; });
    }
    if (model.cut.unitsAtWork() < 2) {
        itsUnit.reset();
    }
    constexpr std::size_t fewestSpread = 8;  // fewer may be close together by chance
    constexpr std::size_t fewestAtOne = 3;   // in several passes or signals
    itsHasRange = itsKind == nullptr && faults.size() >= (itsFirst == itsLast ? fewestAtOne : fewestSpread) &&
                  2 * (itsLast - itsFirst + 1) <= stepsAround();
    if (itsKind == nullptr && !itsHasRange && !itsSegment && !itsUnit) {
        itsAddress = sharedAddress(model, faults);
    }
    const auto [first, count] = signalsOf(itsStage);
    const auto inDump = std::count_if(comparison.signals.begin() + first,
                                      comparison.signals.begin() + first + count,
                                      [](const SignalCount& each) { return each.compared > 0; });
    if (inDump == 1 || 2 * itsSignals.count() > static_cast<std::size_t>(inDump)) {
        itsSignals.set();
    }
}

bool Where::isInSegments() const
{
    const rules::Cut& cut = itsModel->cut;
    std::set<unsigned> segments;
    for (unsigned step = 0; step < cut.K() && segments.size() < 2; ++step) {
        if (itsKind->matches(cut, {0, signalsOf(itsStage).first, step})) {
            segments.insert(cut.placeOf(step).segment);
        }
    }
    return segments.size() > 1;
}

unsigned Where::stepsAround() const
{
    const rules::Cut& cut = itsModel->cut;
    return itsSegment ? cut.segmentLength() : itsUnit ? cut.K() / itsModel->cut.unitsAtWork() : cut.K();
}

bool Where::contains(const Place& place) const
{
    if (stageOf(place.signal) != itsStage || !itsSignals.test(place.signal) ||
        (itsKind != nullptr && !itsKind->matches(itsModel->cut, place)) || (itsPass && *itsPass != place.pass) ||
        (itsCode && *itsCode != codeOf(place.pass))) {
        return false;
    }
    if ((itsHasRange || itsIsOnePlace) && (place.step < itsFirst || place.step > itsLast)) {
        return false;
    }
    if (!hasAddress(place)) {
        return false;
    }
    const rules::StepPlace where = itsModel->cut.placeOf(place.step);
    return (!itsSegment || *itsSegment == where.segment) && (!itsUnit || *itsUnit == where.unit);
}

bool Where::hasAddress(const Place& place) const
{
    if (!itsAddress) {
        return true;
    }
    const auto address = addressOf(*itsModel, place, itsAddress->isOfExtrinsic);
    return address && (*address & itsAddress->mask) == itsAddress->bits;
}

Where Where::ofBorders() const
{
    Where wide = itsIsOnePlace ? spread() : *this;
    wide.itsSignals.set();
    wide.itsHasRange = false;
    wide.itsAddress.reset();
    return wide;
}

Where Where::ofOperation() const
{
    Where wide = ofBorders();
    wide.itsKind = nullptr;
    return wide;
}

Where Where::spread() const
{
    Where wide = *this;
    wide.itsIsOnePlace = false;
    wide.itsSegment.reset();
    wide.itsUnit.reset();
    if (!itsIsOfOnePass) {
        wide.itsPass.reset();
        wide.itsCode.reset();
    }
    return wide;
}

std::string Where::text() const
{
    if (itsIsOnePlace) {
        return "at one place alone";
    }
    std::string text = itsKind != nullptr ? itsKind->text : "";
    append(text, passText());
    append(text, signalText());
    append(text, stepText());
    append(text, addressText());
    return text;
}

/// If the faults are only the differences of the first pass, they say nothing about passes.
std::string Where::passText() const
{
    if (itsIsOfOnePass || !itsCode) {
        return "";
    }
    return itsPass         ? "in half-iteration " + std::to_string(*itsPass) + " alone"
           : *itsCode == 0 ? "on the natural code alone"
                           : "on the interleaved code alone";
}

std::string Where::signalText() const
{
    if (itsSignals.all()) {
        return "";
    }
    std::string text;
    std::size_t left = itsSignals.count();
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        if (itsSignals.test(signal)) {
            text += (text.empty() ? "in " : left == 1 ? " and " : ", ") + std::string(passSignals[signal].name);
            --left;
        }
    }
    return text + " alone";
}

std::string Where::addressText() const
{
    if (!itsAddress) {
        return "";
    }
    const auto [isOfExtrinsic, mask, bits] = *itsAddress;
    if (mask == ~0U) {
        return "at address " + std::to_string(bits) + " of the extrinsic values alone";
    }
    const std::string what = isOfExtrinsic ? "at addresses of extrinsic values " : "at steps ";
    if (mask > 1 && isPeriod(mask)) {
        return what + std::to_string(bits) + " + " + std::to_string(mask + 1) + " n alone";
    }
    std::string text;
    for (unsigned bit = 0; mask >> bit != 0; ++bit) {
        if ((mask >> bit & 1U) != 0) {
            text += (text.empty() ? "" : " and ") + ("bit " + std::to_string(bit)) + " is " +
                    std::to_string(bits >> bit & 1U);
        }
    }
    return what + "whose " + text + " alone";
}

std::string Where::stepText() const
{
    if (itsHasRange) {
        return itsFirst == itsLast
                   ? "at step " + std::to_string(itsFirst) + " alone"
                   : "in steps " + std::to_string(itsFirst) + " to " + std::to_string(itsLast) + " alone";
    }
    return itsSegment ? "in segment " + std::to_string(*itsSegment) + " alone"
           : itsUnit  ? "in unit " + std::to_string(*itsUnit) + " alone"
                      : "";
}

}  // namespace morvik::comparison
