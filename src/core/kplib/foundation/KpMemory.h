#pragma once

#include <kplib/foundation/KpExport.h>

// The library's allocation functions, over the C heap. All are safe from any thread.

/// Allocates `size` bytes. Never returns null: throws KpMemoryException(size) if memory is
/// exhausted.
KPLIB_API void* kpmalloc(unsigned long size);

/// Resizes a block of kpmalloc; a null `ptr` allocates. A size of 0 frees a `ptr` that is not null
/// and returns null. Throws KpMemoryException(size) and leaves the block unchanged if memory is
/// exhausted.
KPLIB_API void* kprealloc(void* ptr, unsigned long size);

/// Frees a block; null is ignored.
KPLIB_API void kpfree(void* ptr);

/// Deleter for blocks of kpmalloc: `std::unique_ptr<char, KpFree>`.
struct KpFree {
    /// Frees `block`; null is ignored.
    void operator()(void* block) const { kpfree(block); }
};

/// Allocates `size` bytes with the alignment of the heap (16 here), or returns null. `alignment`
/// is ignored.
KPLIB_API void* KpAlignedMalloc(unsigned long size, unsigned long alignment);

/// Frees a block of KpAlignedMalloc.
KPLIB_API void KpAlignedFree(void* ptr);

/// Whether `ptr` is a multiple of `alignment`, a power of two.
KPLIB_API bool KpIsAligned(const void* ptr, unsigned long alignment);
