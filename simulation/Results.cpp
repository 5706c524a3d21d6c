// Results: rows of result files, one for each point and iteration count.
#include "Results.h"

namespace morvik::simulation {

namespace {

/// A share of `of` times `each`, whose product may not fit in 64 bits.
double share(std::uint64_t count, std::uint64_t of, std::uint64_t each = 1)
{
    return of > 0 ? static_cast<double>(count) / (static_cast<double>(of) * static_cast<double>(each)) : 0;
}

}  // namespace

double bitErrorRate(const ResultRow& row)
{
    return share(row.errors.bitErrors, row.frames.size(), countedBitsOf(row.point));
}

double blockErrorRate(const ResultRow& row)
{
    return share(row.errors.blockErrors, row.frames.size());
}

double clippedFraction(const ResultRow& row)
{
    return share(row.clipped, receptionOf(row).transmissions, softValuesOf(row.point));
}

Reception receptionOf(const ResultRow& row)
{
    const std::uint64_t blocks = row.frames.size();
    return row.point.link.hasTransportBlocks()
               ? row.errors.reception
               : Reception{row.errors.blockErrors, 0, blocks, blocks * row.point.iterations};
}

double meanIterations(const ResultRow& row)
{
    const Reception reception = receptionOf(row);
    return share(reception.iterations, reception.transmissions, codeBlocksOf(row.point));
}

double meanTransmissions(const ResultRow& row)
{
    return share(receptionOf(row).transmissions, row.frames.size());
}

double throughput(const ResultRow& row)
{
    return share(row.frames.size() - row.errors.blockErrors, receptionOf(row).transmissions) *
           bitsPerSymbolOf(row.point.link, row.point.blockSize);
}

Bounds bitErrorBounds(const ResultRow& row)
{
    return bitErrorBounds(row.errors, row.frames.size(), static_cast<unsigned>(countedBitsOf(row.point)));
}

Bounds blockErrorBounds(const ResultRow& row)
{
    return blockErrorBounds(row.errors, row.frames.size());
}

}  // namespace morvik::simulation
