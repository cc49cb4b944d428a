#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace kplib::detail {

// Reads a value at an unaligned place in a row.
template <typename T>
T readAt(const char* place)
{
    T value;
    std::memcpy(&value, place, sizeof value);
    return value;
}

template <typename T>
void writeAt(char* place, const T& value)
{
    std::memcpy(place, &value, sizeof value);
}

// The distance between two blocks that are not parts of one array.
inline std::intptr_t distance(const void* from, const void* to)
{
    return reinterpret_cast<std::intptr_t>(to) - reinterpret_cast<std::intptr_t>(from);
}

// The address `bytes` after that of a pointer; null stays null.
template <typename T>
T* shifted(T* pointer, std::intptr_t bytes)
{
    // Integer arithmetic, as the two blocks are not parts of one array. (clang-tidy 14 crashes on
    // a bit_cast here.)
    // NOLINTNEXTLINE(performance-no-int-to-ptr)
    return pointer ? reinterpret_cast<T*>(reinterpret_cast<std::intptr_t>(pointer) + bytes) : nullptr;
}

// The two words at the head of a row.
constexpr std::uint32_t rowInUse = 0, rowFree = 1;
constexpr int tableIdOffset = 4, rowHeadSize = 8;

}  // namespace kplib::detail
