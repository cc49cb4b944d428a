#pragma once

#include <kplib/rawdata/KpTypedPointer.h>

#include <cstdint>

namespace kplib::detail {

/// Stands for an element type in calls: `typename decltype(tag)::Type`.
template <typename T>
struct ElementTag {
    using Type = T;
};

/// Calls `work` once with the ElementTag of `type` and gives true; gives false and calls nothing for a type that isn't
/// a number. The loop over elements belongs inside `work`.
template <typename Work>
bool visitNumberType(KpPrimType type, Work&& work)
{
    switch (type) {
    case KpPrimType::Byte:
        work(ElementTag<std::uint8_t>{});
        return true;
    case KpPrimType::Short:
        work(ElementTag<std::int16_t>{});
        return true;
    case KpPrimType::Int:
        work(ElementTag<std::int32_t>{});
        return true;
    case KpPrimType::Float:
        work(ElementTag<float>{});
        return true;
    case KpPrimType::Double:
        work(ElementTag<double>{});
        return true;
    case KpPrimType::UShort:
        work(ElementTag<std::uint16_t>{});
        return true;
    default:
        return false;
    }
}

/// The same for typed memory: calls `work` with the address as a pointer to its element type.
template <typename Work>
bool visitNumbers(KpTypedPointer memory, Work&& work)
{
    return visitNumberType(memory.type,
                           [&](auto tag) { work(static_cast<typename decltype(tag)::Type*>(memory.data)); });
}

/// Whether the library computes with elements of this type.
inline bool isNumberType(KpPrimType type)
{
    return visitNumberType(type, [](auto) {});
}

}  // namespace kplib::detail
