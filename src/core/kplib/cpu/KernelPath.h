#pragma once

#include <cstddef>
#include <initializer_list>
#include <span>

// A body shared by functions that are compiled for several processors: inlined at every level, so
// that it is compiled for the processor of its caller.
#define KPLIB_KERNEL_BODY [[gnu::always_inline]] inline

// The only place in the sources that distinguishes processors; else CMake chooses between files.
//
// KPLIB_X86_ROWS declares `name()`, the rows that a kernel's table has on x86-64 only; the
// kernel's *X86.cpp defines it. Other processors have no such rows. KPLIB_PROCESSOR_HEADER is the
// header of inline code that differs between families of processors.
#if defined(__x86_64__)
// NOLINTNEXTLINE(bugprone-macro-parentheses): it names a header
#define KPLIB_PROCESSOR_HEADER(name) <kplib/cpu/name##X86.h>
#define KPLIB_X86_ROWS(Function, name) std::span<const kplib::detail::KernelPath<Function>> name()
#else
// NOLINTNEXTLINE(bugprone-macro-parentheses): it names a header
#define KPLIB_PROCESSOR_HEADER(name) <kplib/cpu/name##Any.h>
#define KPLIB_X86_ROWS(Function, name)                                                                                 \
    inline std::span<const kplib::detail::KernelPath<Function>> name()                                                 \
    {                                                                                                                  \
        return {};                                                                                                     \
    }                                                                                                                  \
    static_assert(true)
#endif

namespace kplib::detail {

// One implementation of a kernel. All usable paths of a table give results equal to the bit.
template <typename Function>
struct KernelPath {
    const char* name;  // for tests and benchmarks: "plain", "avx2" ...
    bool usable;       // on this processor
    Function* run;
};

// All paths of a kernel: first the portable ones, of which the first is the plain loop, then those
// for this family of processors.
template <typename Function>
class KernelTable {
public:
    KernelTable(std::initializer_list<KernelPath<Function>> portable, std::span<const KernelPath<Function>> own)
    {
        for (const KernelPath<Function>& path : portable)
            paths_[size_++] = path;
        for (const KernelPath<Function>& path : own)
            paths_[size_++] = path;
    }

    operator std::span<const KernelPath<Function>>() const { return {paths_, size_}; }

private:
    KernelPath<Function> paths_[6] = {};  // the longest table has four
    std::size_t size_ = 0;
};

// The last usable path of a table; the first, the plain loop, is usable anywhere.
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

// Compiles one body for any processor: `Loop* loop = ForAny::run<Body>` is Body::run, which has to be a
// KPLIB_KERNEL_BODY of the signature Loop. Families of processors have the like in a header of their own.
struct ForAny {
    template <typename Body, typename... Args>
    [[gnu::noinline]] static auto run(Args... args) -> decltype(Body::run(args...))
    {
        return Body::run(args...);
    }
};

}  // namespace kplib::detail
