// ChainSpread: whether noise alone can have made the signs wrong that mistakes leave.
#include "ChainSpread.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <map>

namespace morvik::diagnosis {

namespace {

/// What is misread is wrong as often as by chance, but for what it has in common with the right reading.
constexpr double nearlyChance = 0.35;
/// How often a part's signs are wrong, by what its values and the errors of the others promise.
constexpr double beyondPromise = 1.35;
/// The same in standard deviations.
constexpr double certain = 6;

constexpr unsigned slices = 8;  // of a code block's values: eighths

/// Signs, and how many of them would be wrong if the values were ratios.
struct Portion {
    Signs signs;
    double promised = 0;

    Portion& operator+=(const Portion& other)
    {
        signs.wrong += other.signs.wrong;
        signs.all += other.signs.all;
        promised += other.promised;
        return *this;
    }
};

Portion operator-(const Portion& a, const Portion& b)
{
    return {{a.signs.wrong - b.signs.wrong, a.signs.all - b.signs.all}, a.promised - b.promised};
}

std::string streamName(unsigned stream)
{
    constexpr std::array<const char*, 4> names = {
        "the systematic stream", "the first parity", "the second parity", "the tail"};
    return names.at(stream);
}

std::string transmissionName(unsigned transmission)
{
    return "transmission " + std::to_string(transmission + 1);
}

std::string codeBlockName(unsigned codeBlock)
{
    return "code block " + std::to_string(codeBlock);
}

std::string symbolBitName(unsigned bit)
{
    return "bit " + std::to_string(bit) + " of each symbol";
}

std::string eighthName(unsigned eighth)
{
    return "eighth " + std::to_string(eighth % slices + 1) + " of a code block's values in " +
           transmissionName(eighth / slices);
}

/// Values by a property that says nothing of how often noise makes them wrong, but for what they promise themselves.
struct Division {
    std::string (*name)(unsigned number);
    std::vector<unsigned> numbers;  ///< of each value
};

std::vector<Division> divisionsOf(const std::vector<AgreeingValue>& values)
{
    std::vector<Division> divisions = {
        {streamName, {}}, {transmissionName, {}}, {codeBlockName, {}}, {symbolBitName, {}}, {eighthName, {}}};
    for (const AgreeingValue& each : values) {
        divisions[0].numbers.push_back(each.stream);
        divisions[1].numbers.push_back(each.transmission);
        divisions[2].numbers.push_back(each.codeBlock);
        divisions[3].numbers.push_back(each.symbolBit);
        divisions[4].numbers.push_back(slices * each.transmission + each.eighth);
    }
    return divisions;
}

/// Whether the sign is wrong: 0 or 1, or half of it where there is no sign.
double wrongOf(const AgreeingValue& value)
{
    return value.value < 0 ? 1 : value.value > 0 ? 0 : 0.5;
}

/// By how many standard deviations too many signs are wrong; 0 for a part that does not stand out.
double excess(const Portion& part, const Portion& others)
{
    if (others.promised <= 0 || part.signs.fraction() < nearlyChance) {
        return 0;
    }
    const double expected = part.promised * others.signs.wrong / others.promised;
    const double deviations = (part.signs.wrong - expected) / std::sqrt(std::max(expected, 1.0));
    return part.signs.wrong > beyondPromise * expected && deviations > certain ? deviations : 0;
}

}  // namespace

Signs signsOfAll(const std::vector<AgreeingValue>& values)
{
    Signs signs;
    for (const AgreeingValue& each : values) {
        signs.wrong += wrongOf(each);
        signs.all += 1;
    }
    return signs;
}

std::optional<UnevenPart> unevenPart(const std::vector<AgreeingValue>& values, double unit)
{
    std::vector<Portion> each;
    Portion all;
    for (const AgreeingValue& value : values) {
        each.push_back({{wrongOf(value), 1}, unit > 0 ? 1 / (1 + std::exp(std::abs(value.value) / unit)) : 0});
        all += each.back();
    }
    std::optional<UnevenPart> found;
    double most = 0;
    for (const Division& division : divisionsOf(values)) {
        std::map<unsigned, Portion> parts;
        for (std::size_t i = 0; i < values.size(); ++i) {
            parts[division.numbers[i]] += each[i];
        }
        for (const auto& [number, part] : parts) {
            const Portion others = all - part;
            const double deviations = excess(part, others);
            if (deviations > most) {
                most = deviations;
                found = {division.name(number), part.signs, others.signs};
            }
        }
    }
    return found;
}

}  // namespace morvik::diagnosis
