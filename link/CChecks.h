// CChecks: the argument checks of include/morvik_link.h, and their statuses.
#ifndef MORVIK_LINK_CCHECKS_H
#define MORVIK_LINK_CCHECKS_H

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <stdexcept>
#include <vector>

#include "link/coding/CodeBlocks.h"
#include "link/coding/PackedBits.h"
#include "link/coding/RateMatching.h"
#include "morvik_link.h"
#include "rules/BlockSizes.h"

namespace morvik::link::c {

constexpr unsigned unlimited(std::uint32_t size)
{
    return size == 0 ? unlimitedBuffer : size;
}

/// The first status that is not MORVIK_LINK_OK.
template <typename... Status>
std::int32_t firstOf(std::int32_t first, Status... rest)
{
    if constexpr (sizeof...(rest) > 0) {
        return first != MORVIK_LINK_OK ? first : firstOf(rest...);
    } else {
        return first;
    }
}

constexpr std::int32_t unless(bool good, std::int32_t status)
{
    return good ? MORVIK_LINK_OK : status;
}

template <typename... Pointer>
bool anyNull(const Pointer*... pointers)
{
    return (... || (pointers == nullptr));
}

/// Whether one is null of arrays with values of `count` things; without any, they may be.
template <typename... Pointer>
bool anyNullOf(std::size_t count, const Pointer*... pointers)
{
    return count > 0 && anyNull(pointers...);
}

inline std::int32_t checkedCodeBlock(std::uint32_t K, std::uint32_t fillers)
{
    return firstOf(unless(rules::findBlockSize(K) != nullptr, MORVIK_LINK_BLOCK_SIZE),
                   unless(fillers < K, MORVIK_LINK_FILLERS));
}

inline std::int32_t checkedVersion(std::uint32_t version)
{
    return unless(version < redundancyVersions, MORVIK_LINK_REDUNDANCY_VERSION);
}

inline std::int32_t checkedPositive(float number, std::int32_t status)
{
    return unless(std::isfinite(number) && number > 0, status);
}

inline std::int32_t checkedWidth(std::uint32_t width)
{
    return unless(width >= 2 && width <= 16, MORVIK_LINK_WIDTH);
}

inline std::int32_t checkedBitsPerSymbol(std::uint32_t bits)
{
    return unless(bits == 1 || (bits >= 2 && bits <= 8 && bits % 2 == 0), MORVIK_LINK_BITS_PER_SYMBOL);
}

inline std::int32_t checkedTransportBlockSize(std::uint32_t size)
{
    return unless(size >= 1 && size <= mostTransportBits, MORVIK_LINK_TRANSPORT_BLOCK_SIZE);
}

/// Returns `checked` unless it is MORVIK_LINK_OK; otherwise calls `work` and turns exceptions into statuses.
template <typename Work>
std::int32_t guarded(std::int32_t checked, Work work)
{
    if (checked != MORVIK_LINK_OK) {
        return checked;
    }
    try {
        work();
        return MORVIK_LINK_OK;
    } catch (const std::invalid_argument&) {
        return MORVIK_LINK_BUFFER_SIZE;  // all else has been checked
    } catch (const std::exception&) {
        return MORVIK_LINK_OUT_OF_MEMORY;
    }
}

/// Packs `count` bytes, one bit each.
inline std::vector<std::uint64_t> packed(const std::uint8_t* bits, std::size_t count)
{
    std::vector<std::uint64_t> row(wordsOf(count));
    packBits(bits, count, row.data());
    return row;
}

}  // namespace morvik::link::c

#endif
