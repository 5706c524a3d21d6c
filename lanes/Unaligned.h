// Unaligned: access to the caller's arrays, which may have any alignment.
#ifndef MORVIK_LANES_UNALIGNED_H
#define MORVIK_LANES_UNALIGNED_H

#include <cstddef>
#include <cstring>

namespace morvik::lanes {

template <class Value>
Value valueAt(const Value* array, std::size_t i)
{
    Value value;
    std::memcpy(&value, array + i, sizeof value);
    return value;
}

template <class Value>
void setValueAt(Value* array, std::size_t i, Value value)
{
    std::memcpy(array + i, &value, sizeof value);
}

}  // namespace morvik::lanes

#endif
