#pragma once

#include <span>

/// Compiles a function for processors that have `features`; it may be called only where they were found.
#define KPLIB_TARGET(features) [[gnu::target(features)]]
#define KPLIB_TARGET_AVX2 KPLIB_TARGET("avx2")
#if defined(__clang__)
#define KPLIB_TARGET_AVX512 KPLIB_TARGET("avx512f,avx512bw,avx512dq,avx512vl,avx512vbmi")
#else
#define KPLIB_TARGET_AVX512 KPLIB_TARGET("avx512f,avx512bw,avx512dq,avx512vl,avx512vbmi,prefer-vector-width=512")
// gcc 12 takes the placeholders in its own header of vector instructions for values that somebody forgot to set.
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#endif

/// The body that target-marked functions share: inlined at every level, so that it is compiled for their processor.
#define KPLIB_KERNEL_BODY [[gnu::always_inline]] inline

namespace kplib::detail {

/// One way to do a kernel's work. All usable paths of a table give equal results to the bit.
template <typename Function>
struct KernelPath {
    const char* name;  ///< for tests and benchmarks: "plain", "avx2" ...
    bool usable;       ///< on this processor
    Function* run;
};

/// The last usable path of a table; the first, the plain loop, is usable anywhere.
template <typename Function>
Function* best(std::span<const KernelPath<Function>> paths)
{
    Function* chosen = nullptr;
    for (const KernelPath<Function>& path : paths) {
        if (path.usable)
            chosen = path.run;
    }
    return chosen;
}

// Compile one body for one kind of processor each: `Loop* loop = ForAvx2::run<Body>` is Body::run, which has to be a
// KPLIB_KERNEL_BODY of the signature Loop.

struct ForAny {
    template <typename Body, typename... Args>
    [[gnu::noinline]] static auto run(Args... args) -> decltype(Body::run(args...))
    {
        return Body::run(args...);
    }
};

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

/// What KPLIB_TARGET_AVX512 names: the instructions on bytes and their permutation too.
inline bool hasAvx512()
{
    return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
           __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl") &&
           __builtin_cpu_supports("avx512vbmi");
}

}  // namespace kplib::detail
