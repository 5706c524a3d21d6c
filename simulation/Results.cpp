// Results: rows of result files, one for each point and iteration count.
#include "Results.h"

#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

double share(std::uint64_t count, std::uint64_t of)
{
    return of > 0 ? static_cast<double>(count) / static_cast<double>(of) : 0;
}

}  // namespace

double bitErrorRate(const ResultRow& row)
{
    return share(row.errors.bitErrors, row.frames.size() * row.point.blockSize);
}

double blockErrorRate(const ResultRow& row)
{
    return share(row.errors.blockErrors, row.frames.size());
}

double clippedFraction(const ResultRow& row)
{
    return share(row.clipped, row.frames.size() * 3 * (row.point.blockSize + rules::tailPositions));
}

Bounds bitErrorBounds(const ResultRow& row)
{
    return bitErrorBounds(row.errors, row.frames.size(), row.point.blockSize);
}

Bounds blockErrorBounds(const ResultRow& row)
{
    return blockErrorBounds(row.errors, row.frames.size());
}

}  // namespace morvik::simulation
