#include <kplib/rawdata/detail/KpLoose.h>
#include <kplib/rawdata/detail/KpRawDataKernels.h>

#include <cstdint>

namespace kplib::detail {
namespace {

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
        auto* __restrict last = static_cast<const Loose<Word>*>(src) + n - 1;
        for (long i = 0; i < n; ++i)
            to[i].value = last[-i].value;
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
    case 4:
        return Path::template run<CopyReversed<std::uint32_t>>;
    case 8:
        return Path::template run<CopyReversed<std::uint64_t>>;
    default:
        return nullptr;
    }
}

}  // namespace

std::span<const KernelPath<SwapLoops>> swapPaths()
{
    static const KernelPath<SwapLoops> paths[] = {{"plain", true, swapLoop<ForAny>},
                                                  {"avx2", hasAvx2(), swapLoop<ForAvx2>},
                                                  {"avx512", hasAvx512(), swapLoop<ForAvx512>}};
    return paths;
}

std::span<const KernelPath<ReverseLoops>> reversePaths()
{
    static const KernelPath<ReverseLoops> paths[] = {{"plain", true, reverseLoop<ForAny>},
                                                     {"avx2", hasAvx2(), reverseLoop<ForAvx2>},
                                                     {"avx512", hasAvx512(), reverseLoop<ForAvx512>}};
    return paths;
}

}  // namespace kplib::detail
