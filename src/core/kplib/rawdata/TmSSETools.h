#pragma once

#include <kplib/foundation/KpExport.h>

/// Operations on rows of pixels. All processors give the same bits. No alignment is required. Any
/// number of threads, on different rows.
class KPLIB_API TmSSETools {
public:
    TmSSETools() = delete;

    /// dst[i] = src[i] * factor for `n` values; returns dst + n. `dst` may be `src`.
    static float* multiplyAndStoreUnaligned(float* src, float factor, long long n, float* dst);
    /// dst[i] += src[i] * factor for `n` values, rounded after each step; returns dst + n.
    static float* multiplyAndAddUnaligned(float* src, float factor, long long n, float* dst);

    /// Reverses the order of the rows in place; nothing if they have no bytes.
    static void mirrorY(char* data, long rows, long rowBytes);
    /// Copies the rows in reverse order, as many bytes of each as both sides have room for, to
    /// memory that does not overlap. Does nothing if any number is below 1.
    static void memcpyMirrorY(const unsigned char* src, long rows, long srcRowBytes, unsigned char* dst,
                              long dstRowBytes);
};
