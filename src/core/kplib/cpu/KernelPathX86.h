#pragma once

#include <kplib/cpu/KernelPath.h>

// Definitions for the sources for x86-64, *X86.cpp. They are compiled with the same flags as all
// others and mark each function with its target: separate flags would also apply to inline
// functions of the standard library, of which the linker may keep the copy that an older processor
// cannot run.

// Compiles a function for processors that have `features`; it may be called only where they were found.
#define KPLIB_TARGET(features) [[gnu::target(features)]]
#define KPLIB_TARGET_AVX2 KPLIB_TARGET("avx2")
#if defined(__clang__)
#define KPLIB_TARGET_AVX512 KPLIB_TARGET("avx512f,avx512bw,avx512dq,avx512vl,avx512vbmi")
#else
#define KPLIB_TARGET_AVX512 KPLIB_TARGET("avx512f,avx512bw,avx512dq,avx512vl,avx512vbmi,prefer-vector-width=512")
// gcc 12 reports the placeholders in its own header of vector instructions as uninitialised.
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#endif

namespace kplib::detail {

struct ForAvx2 {
    template <typename Body, typename... Args>
    KPLIB_TARGET_AVX2 [[gnu::noinline]] static auto run(Args... args) -> decltype(Body::run(args...))
    {
        return Body::run(args...);
    }
};

struct ForAvx512 {
    template <typename Body, typename... Args>
    KPLIB_TARGET_AVX512 [[gnu::noinline]] static auto run(Args... args) -> decltype(Body::run(args...))
    {
        return Body::run(args...);
    }
};

inline bool hasAvx2()
{
    return __builtin_cpu_supports("avx2");
}

// What KPLIB_TARGET_AVX512 names: the instructions on bytes and their permutation too.
inline bool hasAvx512()
{
    return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
           __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl") &&
           __builtin_cpu_supports("avx512vbmi");
}

}  // namespace kplib::detail
