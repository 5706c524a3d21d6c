// TDecoder: the base class of turbo decoders, their common data and their factory.
#include "TDecoder.h"

#include <algorithm>
#include <cstddef>
#include <limits>
#include <new>

#include "Messages.h"
#include "Misc.h"
#include "TDecoder3GPU.h"

namespace {

/// Aligns columns to their own size, 16 bytes, so that each lies in one cache line.
unsigned char* alignColumn(unsigned char* address)
{
    const auto misalignment = reinterpret_cast<std::uintptr_t>(address) % sizeof(T8);
    return misalignment == 0 ? address : address + (sizeof(T8) - misalignment);
}

}  // namespace

bool TDecoder::allocate(unsigned int blockSize)
{
    const std::uint64_t columns = (std::uint64_t{blockSize} + 63) / 64 * 64;
    const std::uint64_t bytes = 3 * sizeof(T8) * columns + sizeof(T8);
    if (bytes > std::numeric_limits<std::uint32_t>::max()) {
        throw std::bad_alloc();
    }
    if (bytes > itsMetricBufferSize) {
        itsMetricBuffer.reset();
        itsMetricBufferSize = 0;
        itsMetricBuffer = std::make_unique<unsigned char[]>(static_cast<std::size_t>(bytes));
        itsMetricBufferSize = static_cast<std::uint32_t>(bytes);
        itsAlpha = reinterpret_cast<T8*>(alignColumn(itsMetricBuffer.get()));
        itsBeta = itsAlpha + columns;
        itsGamma = itsBeta + columns;
    }
    itsBlockSize = blockSize;
    for (std::vector<short>* values : {&itsIntrinsic, &itsLLR, &itsExtrinsic}) {
        values->assign(blockSize, 0);
    }
    return true;
}

TDecoder::~TDecoder() = default;

bool TDecoder::decode(const std::vector<short>& soft,
                      const std::vector<unsigned char>& reference,
                      std::vector<unsigned long long>& bitErrors,
                      std::vector<unsigned long long>& blockErrors)
{
    std::vector<unsigned char> hard;
    if (!decode(soft, hard, static_cast<unsigned>(bitErrors.size()))) {
        return false;
    }
    if (bitErrors.empty()) {
        return true;
    }
    blockErrors.resize(std::max(blockErrors.size(), bitErrors.size()));
    const unsigned long long errors = countBitErrors(reference, hard);
    bitErrors.back() += errors;
    blockErrors.back() += errors != 0 ? 1U : 0U;
    return true;
}

void TDecoder::dump(std::ostream&) {}

void TDecoder::dumpFull(std::ostream&, unsigned int) {}

TDecoder* TDecoder::create(const std::string& properties)
{
    const auto [type, rest] = splitString(properties, ":");
    if (type == "3GPPPU") {
        return TDecoder3GPU::create(false, rest);
    }
    morvik::messages::writeError("ERROR:TDecoder:Unrecognised type:", type);
    return nullptr;
}

std::vector<std::string> TDecoder::getNames()
{
    return {"3GPPPU"};
}

unsigned long long TDecoder::countBitErrors(const std::vector<unsigned char>& reference,
                                            const std::vector<unsigned char>& hard)
{
    const std::size_t common = std::min(reference.size(), hard.size());
    unsigned long long errors = std::max(reference.size(), hard.size()) - common;
    for (std::size_t i = 0; i < common; ++i) {
        errors += (reference[i] != 0) != (hard[i] != 0) ? 1U : 0U;
    }
    return errors;
}

bool TDecoder::checkDump(unsigned int halfIteration)
{
    if (itsDumpCount == 0) {
        return true;
    }
    dumpFull(morvik::messages::output(), halfIteration);
    --itsDumpCount;
    if (itsDumpCount == 0 && itsStopAfterDump) {
        morvik::messages::writeError("STOP:Dump complete");
        return false;
    }
    return true;
}
