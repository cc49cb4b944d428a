#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>

// Writes the results of a loop over elements to memory.

namespace kplib::detail {

// From this size in bytes a target is written past the caches, since it would not stay in them:
// reading its old contents first would cost a third of the time.
inline constexpr long streamedSize = 8L << 20;

// Copies past the caches. `dst` and `bytes` are multiples of 64. streamFence() must follow before
// other threads read.
void streamCopy(void* dst, const void* src, long bytes);
void streamFence();

// Whether a target is large enough to be streamed, and can be brought to a cache line by whole elements.
inline bool isStreamed(const void* dst, long n, int size)
{
    return n >= streamedSize / size && reinterpret_cast<std::uintptr_t>(dst) % static_cast<unsigned>(size) == 0;
}

// Elements of `size` bytes before the next cache line begins.
inline long toCacheLine(const void* dst, int size)
{
    return static_cast<long>(-reinterpret_cast<std::uintptr_t>(dst) % 64) / size;
}

// A target and the source that it is made of, element by element and forward.
struct Transfer {
    void* dst;
    const void* src;
    long n;
    int dstSize, srcSize;  // bytes of an element

    char* target(long i) const { return static_cast<char*>(dst) + i * dstSize; }
    const char* source(long i) const { return static_cast<const char*>(src) + i * srcSize; }
    bool overlaps() const { return target(0) < source(n) && source(0) < target(n); }
};

// Performs the transfer by calls of `make(dst, src, n)`, whose arguments never overlap: in one
// call, or by blocks that are computed in the first cache and then moved to their place.
template <typename Make>
void transfer(const Transfer& t, Make&& make)
{
    constexpr long blockSize = 4096;
    alignas(64) char block[blockSize];
    const long perBlock = blockSize / std::max(t.dstSize, t.srcSize);
    if (t.overlaps()) {
        // Where later elements of the source are overwritten, they are so one by one.
        const bool isAhead = t.dst <= t.src && t.dstSize <= t.srcSize;
        for (long i = 0, count = 0; i < t.n; i += count) {
            count = isAhead ? std::min(perBlock, t.n - i) : 1;
            make(block, t.source(i), count);
            std::memcpy(t.target(i), block, static_cast<std::size_t>(count * t.dstSize));
        }
    } else if (isStreamed(t.dst, t.n, t.dstSize)) {
        long i = toCacheLine(t.dst, t.dstSize);
        make(t.target(0), t.source(0), i);
        for (; i + perBlock <= t.n; i += perBlock) {
            make(block, t.source(i), perBlock);
            streamCopy(t.target(i), block, perBlock * t.dstSize);
        }
        make(t.target(i), t.source(i), t.n - i);
        streamFence();
    } else {
        make(t.dst, t.src, t.n);
    }
}

}  // namespace kplib::detail
