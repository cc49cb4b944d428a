#pragma once

#include <kplib/foundation/KpPrimType.h>

#include <cstdint>

/// Passes an element type to a callable: a member of the tag is the C++ type.
template <typename T>
struct KpElementTag {
    /// The C++ type of an element.
    using Type = T;
};

/// Calls `work` once with the KpElementTag of `type` and returns true. Returns false without a
/// call if `type` is not a number, see KpPrimType::isNumber(). The loop over elements belongs
/// inside `work`, so that the type is tested once:
///
///     kpVisitNumberType(data.type, [&]<typename T>(KpElementTag<T>) { sum(static_cast<const T*>(data.data), n); });
template <typename Work>
bool kpVisitNumberType(KpPrimType type, Work&& work)
{
    switch (type) {
    case KpPrimType::Byte:
        work(KpElementTag<std::uint8_t>{});
        return true;
    case KpPrimType::Short:
        work(KpElementTag<std::int16_t>{});
        return true;
    case KpPrimType::Int:
        work(KpElementTag<std::int32_t>{});
        return true;
    case KpPrimType::Float:
        work(KpElementTag<float>{});
        return true;
    case KpPrimType::Double:
        work(KpElementTag<double>{});
        return true;
    case KpPrimType::UShort:
        work(KpElementTag<std::uint16_t>{});
        return true;
    case KpPrimType::Complex:
    case KpPrimType::String:
    case KpPrimType::UInt:
    case KpPrimType::SByte:
        break;
    }
    return false;
}
