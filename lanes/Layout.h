// Layout: places arrays in one piece of memory.
#ifndef MORVIK_LANES_LAYOUT_H
#define MORVIK_LANES_LAYOUT_H

#include <cstddef>
#include <memory>
#include <vector>

#include "rules/Arithmetic.h"
#if defined(__SANITIZE_ADDRESS__) || MORVIK_HAS_FEATURE(address_sanitizer)
#include <sanitizer/asan_interface.h>
#else
#define ASAN_POISON_MEMORY_REGION(begin, size) (static_cast<void>(begin), static_cast<void>(size))
#define ASAN_UNPOISON_MEMORY_REGION(begin, size) (static_cast<void>(begin), static_cast<void>(size))
#endif

namespace morvik::lanes {

/// Bump allocator; a null base only measures. Arrays begin on cache lines, staggered so that equal steps of different
/// arrays map to different cache sets. The address sanitizer reports accesses between them.
class Layout {
public:
    using Storage = std::vector<unsigned char>;

    explicit Layout(unsigned char* base) : itsBase(base) {}

    template <class Element>
    Element* take(std::size_t count)
    {
        const std::size_t offset = itsSize;
        const std::size_t bytes = count * sizeof(Element);
        itsSize += (bytes + line - 1) / line * line + stagger;
        if (itsBase == nullptr) {
            return nullptr;
        }
        ASAN_POISON_MEMORY_REGION(itsBase + offset + bytes, itsSize - offset - bytes);
        return reinterpret_cast<Element*>(itsBase + offset);
    }

    /// Runs layOut on a layout twice: to measure, and in the storage, which grows to hold it all.
    template <class LayOut>
    static void place(Storage& storage, LayOut layOut)
    {
        Layout measured(nullptr);
        layOut(measured);
        if (storage.size() < measured.itsSize + line) {
            storage = Storage(measured.itsSize + line);
        }
        ASAN_UNPOISON_MEMORY_REGION(storage.data(), storage.size());
        void* base = storage.data();
        std::size_t space = storage.size();
        Layout placed(static_cast<unsigned char*>(std::align(line, 1, base, space)));
        layOut(placed);
    }

private:
    static constexpr std::size_t line = 64;
    static constexpr std::size_t stagger = 5 * line;
    unsigned char* const itsBase;
    std::size_t itsSize = 0;
};

}  // namespace morvik::lanes

#endif
