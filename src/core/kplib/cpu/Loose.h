#pragma once

#include <kplib/cpu/KernelPath.h>

namespace kplib::detail {

// An element at any address that may alias any other type: buffers from files and messages may be
// unaligned, and a conversion may write its results over its source.
template <typename T>
struct __attribute__((packed, may_alias)) Loose {
    T value;

    KPLIB_KERNEL_BODY operator T() const { return value; }
};

}  // namespace kplib::detail
