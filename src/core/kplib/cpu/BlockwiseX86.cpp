#include <kplib/cpu/Blockwise.h>

#include <emmintrin.h>

void kplib::detail::streamCopy(void* dst, const void* src, long bytes)
{
    auto* to = static_cast<__m128i*>(dst);
    auto* from = static_cast<const __m128i*>(src);
    for (long i = 0; i < bytes / 16; ++i)
        _mm_stream_si128(to + i, _mm_loadu_si128(from + i));
}

void kplib::detail::streamFence()
{
    _mm_sfence();
}
