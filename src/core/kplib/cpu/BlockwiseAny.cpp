#include <kplib/cpu/Blockwise.h>

// Copies through the caches: the language has no stores that bypass them.

void kplib::detail::streamCopy(void* dst, const void* src, long bytes)
{
    std::memcpy(dst, src, static_cast<std::size_t>(bytes));
}

void kplib::detail::streamFence() {}
