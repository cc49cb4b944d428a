#pragma once

#include <kplib/foundation/KpForward.h>

#include <type_traits>

/// A list of types, for overloads and tables that several classes share.
template <typename... Types>
struct KpTypeList {
    /// Number of types.
    static constexpr unsigned long size = sizeof...(Types);

    /// Whether T is one of the types.
    template <typename T>
    static constexpr bool contains = (std::is_same_v<T, Types> || ...);

    /// The list with `More` appended.
    template <typename... More>
    using With = KpTypeList<Types..., More...>;

    /// Calls `work.template operator()<T>()` for each type T in order.
    template <typename Work>
    static void forEach(Work&& work)
    {
        (work.template operator()<Types>(), ...);
    }
};

namespace kplib::detail {

/// The values of fixed size that messages carry and digests take, both as their bytes in memory.
using ImageValues =
    KpTypeList<unsigned char, unsigned short, int, unsigned int, float, long, long long, unsigned long long, KpVec2i,
               KpVec2f, KpVec3i, KpVec3f, KpVec3l, KpVec4f, KpPlane, KpBox3f, KpBox3i, KpMat4f, KpLib::MD5, KpUniqueID>;

}  // namespace kplib::detail
