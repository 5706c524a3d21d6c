// Layout: places arrays in one piece of memory.
#ifndef MORVIK_LANES_LAYOUT_H
#define MORVIK_LANES_LAYOUT_H

#include <cstddef>
#include <memory>
#include <vector>

namespace morvik::lanes {

/// Bump allocator; a null base only measures. Arrays begin on cache lines, staggered so that equal steps of different
/// arrays map to different cache sets.
class Layout {
public:
    using Storage = std::vector<unsigned char>;

    explicit Layout(unsigned char* base) : itsBase(base) {}

    template <class Element>
    Element* take(std::size_t count)
    {
        const std::size_t offset = itsSize;
        itsSize += (count * sizeof(Element) + line - 1) / line * line + stagger;
        return itsBase == nullptr ? nullptr : reinterpret_cast<Element*>(itsBase + offset);
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
