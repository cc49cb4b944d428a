#pragma once

#include <kplib/cpu/Loose.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <cstdint>
#include <cstring>

namespace kplib::detail {

KPLIB_X86_ROWS(SwapLoops, swapX86);
KPLIB_X86_ROWS(ReverseLoops, reverseX86);

namespace words {

KPLIB_KERNEL_BODY std::uint16_t swapped(std::uint16_t word)
{
    return __builtin_bswap16(word);
}
KPLIB_KERNEL_BODY std::uint32_t swapped(std::uint32_t word)
{
    return __builtin_bswap32(word);
}
KPLIB_KERNEL_BODY std::uint64_t swapped(std::uint64_t word)
{
    return __builtin_bswap64(word);
}

template <typename Word>
struct SwapEach {
    KPLIB_KERNEL_BODY static void run(void* words, long n)
    {
        auto* word = static_cast<Loose<Word>*>(words);
        for (long i = 0; i < n; ++i)
            word[i].value = swapped(word[i].value);
    }
};

template <typename Word>
struct CopyReversed {
    KPLIB_KERNEL_BODY static void run(void* dst, const void* src, long n)
    {
        auto* __restrict to = static_cast<Loose<Word>*>(dst);
        auto* __restrict end = static_cast<const Loose<Word>*>(src) + n;
        for (long i = 0; i < n; ++i)
            to[i].value = end[-1 - i].value;
    }
};

// Elements of 3 bytes, the pixels of colour images. Five of them are reversed in a register of 16 bytes, whose surplus
// the next store covers; one by one they take several times as long.
struct CopyThreesReversed {
    using Sixteen = unsigned char __attribute__((vector_size(16)));

    KPLIB_KERNEL_BODY static void run(void* dst, const void* src, long n)
    {
        auto* to = static_cast<unsigned char*>(dst);
        auto* from = static_cast<const unsigned char*>(src) + 3 * n;
        for (; n > 5; n -= 5, to += 15) {
            Sixteen pixels;
            from -= 15;
            std::memcpy(&pixels, from - 1, 16);
            pixels = __builtin_shufflevector(pixels, pixels, 13, 14, 15, 10, 11, 12, 7, 8, 9, 4, 5, 6, 1, 2, 3, 0);
            std::memcpy(to, &pixels, 16);
        }
        for (; n > 0; --n, to += 3)
            std::memcpy(to, from -= 3, 3);
    }
};

template <typename Path>
SwapLoop* swapLoop(int width)
{
    switch (width) {
    case 2:
        return Path::template run<SwapEach<std::uint16_t>>;
    case 4:
        return Path::template run<SwapEach<std::uint32_t>>;
    case 8:
        return Path::template run<SwapEach<std::uint64_t>>;
    default:
        return nullptr;
    }
}

template <typename Path>
ReverseLoop* reverseLoop(int width)
{
    switch (width) {
    case 1:
        return Path::template run<CopyReversed<std::uint8_t>>;
    case 2:
        return Path::template run<CopyReversed<std::uint16_t>>;
    case 3:
        return Path::template run<CopyThreesReversed>;
    case 4:
        return Path::template run<CopyReversed<std::uint32_t>>;
    case 8:
        return Path::template run<CopyReversed<std::uint64_t>>;
    default:
        return nullptr;
    }
}

}  // namespace words
}  // namespace kplib::detail
