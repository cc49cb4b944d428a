#pragma once

#include <kplib/foundation/KpExport.h>

// The library's allocation functions, over the C heap. All are safe from any thread.

/// `size` bytes, never null. Throws KpMemoryException(size) when there are none.
KPLIB_API void* kpmalloc(unsigned long size);

/// Resizes a block of kpmalloc; a null `ptr` allocates. Size 0 with `ptr` set frees it and gives null. Throws
/// KpMemoryException(size) when there is no memory; `ptr` then stays as it was.
KPLIB_API void* kprealloc(void* ptr, unsigned long size);

/// Frees a block; null is ignored.
KPLIB_API void kpfree(void* ptr);

/// Deleter for blocks of kpmalloc: `std::unique_ptr<char, KpFree>`.
struct KpFree {
    /// Frees `block`; null is ignored.
    void operator()(void* block) const { kpfree(block); }
};

/// `size` bytes with the heap's own alignment (16 here) or null; `alignment` is ignored.
KPLIB_API void* KpAlignedMalloc(unsigned long size, unsigned long alignment);

/// Frees a block of KpAlignedMalloc.
KPLIB_API void KpAlignedFree(void* ptr);

/// Whether `ptr` is a multiple of `alignment`, a power of two.
KPLIB_API bool KpIsAligned(const void* ptr, unsigned long alignment);
