// PlaceHistory: which half-iteration and step a dump named some steps or clocks ago.
#ifndef MORVIK_HARDWARE_COMPARISON_PLACEHISTORY_H
#define MORVIK_HARDWARE_COMPARISON_PLACEHISTORY_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <optional>

namespace morvik::comparison {

/// A half-iteration and a trellis step.
struct StepPlace {
    unsigned pass;
    unsigned step;
};

/// The same as the dump counts them. Between values they may be anything: counters of a core at rest.
struct NamedPlace {
    std::int64_t pass;
    std::int64_t step;

    bool operator==(const NamedPlace& other) const
    {
        return pass == other.pass && step == other.step;
    }
};

/// Keeps as many places as a delay needs. Nothing stands for a time at which the dump names none.
class PlaceHistory {
public:
    explicit PlaceHistory(unsigned delay) : itsDelay(delay) {}

    /// A new clock begins.
    void begin(std::optional<NamedPlace> place)
    {
        itsPlaces.push_back(place);
        if (itsPlaces.size() > std::size_t{itsDelay} + 1) {
            itsPlaces.pop_front();
        }
    }

    /// Registers have settled within the clock.
    void settle(std::optional<NamedPlace> place)
    {
        if (!itsPlaces.empty()) {
            itsPlaces.back() = place;
        }
    }

    /// The dump names this place, a new step if it is another one.
    void follow(std::optional<NamedPlace> place)
    {
        if (place && (itsPlaces.empty() || !(itsPlaces.back() == place))) {
            begin(place);
        }
    }

    /// The place of values that come late.
    std::optional<NamedPlace> delayed() const
    {
        return itsPlaces.size() > itsDelay ? itsPlaces.front() : std::nullopt;
    }

private:
    unsigned itsDelay;
    std::deque<std::optional<NamedPlace>> itsPlaces;
};

}  // namespace morvik::comparison

#endif
