// Tally: the counts of a point.
#include "Tally.h"

#include <algorithm>

namespace morvik::simulation {

bool operator==(const Reception& a, const Reception& b)
{
    return a.codeBlockErrors == b.codeBlockErrors && a.undetected == b.undetected &&
           a.transmissions == b.transmissions && a.iterations == b.iterations;
}

void ErrorCounts::add(std::uint64_t frame, std::uint32_t wrongBits)
{
    if (wrongBits == 0) {
        return;
    }
    bitErrors += wrongBits;
    blockErrors += 1;
    bitErrorSquares += std::uint64_t{wrongBits} * wrongBits;
    if (failures.size() < keptFailures) {
        failures.push_back(frame);
    }
}

void ErrorCounts::add(const ErrorCounts& other)
{
    bitErrors += other.bitErrors;
    blockErrors += other.blockErrors;
    bitErrorSquares += other.bitErrorSquares;
    reception.add(other.reception);
    failures.insert(failures.end(), other.failures.begin(), other.failures.end());
    std::sort(failures.begin(), failures.end());
    failures.resize(std::min(failures.size(), keptFailures));
}

}  // namespace morvik::simulation
