#pragma once

#include <kplib/foundation/KpExport.h>

#include <functional>

/// A value that names a pair of functions to allocate and free with, so that a buffer is freed the
/// way it was allocated. Copied by value, never throws: failure is a null result.
class KPLIB_API KpAllocator {
public:
    /// Which pair of functions.
    enum AllocatorType : int {
        AllocatorNone = 0,     ///< allocates and frees nothing: the memory is owned elsewhere
        AllocatorMalloc = 1,   ///< malloc and free
        AllocatorMalloc2 = 2,  ///< the same pair as AllocatorMalloc
        AllocatorNew = 3,      ///< array new and delete of bytes
    };

    /// The pair of that type; any other value gives that of AllocatorNone.
    KpAllocator(AllocatorType type);

    /// The given pair; either may be null.
    KpAllocator(void* (*allocateWith)(unsigned long), void (*deallocateWith)(void*));

    /// `size` bytes or null. On a first failure the callback below runs, if one is set, and one more attempt is made.
    void* allocate(unsigned long size) const;

    /// Frees memory of allocate(); null is ignored.
    void deallocate(void* ptr) const;

    /// Whether both functions are the same.
    bool operator==(const KpAllocator& other) const = default;

    /// Sets the function to run when an allocation fails, for the owner of a cache that can be
    /// dropped. It is process-wide and unlocked: set it before other threads start. An empty
    /// function removes it.
    static void setFreeUnusedUncompressedDataCB(std::function<void()> callback);

private:
    void* (*allocate_)(unsigned long);
    void (*deallocate_)(void*);
};
