#pragma once

#include <kplib/foundation/KpPrimType.h>

#include <cstdint>

/// Address of typed memory and the type of its elements: a plain pair, passed by value, that owns
/// nothing and checks nothing. No lock: the owner of the buffer guards the memory.
struct KpTypedPointer {
    void* data;       ///< the first element
    KpPrimType type;  ///< what lies there

    constexpr KpTypedPointer() : data(nullptr) {}
    /// Of any type.
    constexpr KpTypedPointer(void* address, KpPrimType elementType) : data(address), type(elementType) {}

    /// From the address of elements that the library computes with.
    constexpr KpTypedPointer(std::uint8_t* bytes) : data(bytes), type(KpPrimType::Byte) {}
    /// @{
    /// As above, for elements of that type.
    constexpr KpTypedPointer(std::int16_t* shorts) : data(shorts), type(KpPrimType::Short) {}
    constexpr KpTypedPointer(std::int32_t* ints) : data(ints), type(KpPrimType::Int) {}
    constexpr KpTypedPointer(float* floats) : data(floats), type(KpPrimType::Float) {}
    constexpr KpTypedPointer(double* doubles) : data(doubles), type(KpPrimType::Double) {}
    constexpr KpTypedPointer(std::uint16_t* ushorts) : data(ushorts), type(KpPrimType::UShort) {}
    /// @}
};
