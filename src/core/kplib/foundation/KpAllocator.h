#pragma once

#include <kplib/foundation/KpExport.h>

#include <functional>

/// A pair of functions that allocate and free memory, stored beside a buffer so that the buffer is
/// freed by the function that matches its allocation. A plain value. Nothing throws.
class KPLIB_API KpAllocator {
public:
    /// Which pair of functions.
    enum AllocatorType : int {
        AllocatorNone = 0,     ///< allocates and frees nothing: the memory is owned elsewhere
        AllocatorMalloc = 1,   ///< malloc and free
        AllocatorMalloc2 = 2,  ///< the same pair as AllocatorMalloc
        AllocatorNew = 3,      ///< array new and delete of bytes
    };

    /// The pair of `type`. Any other value counts as AllocatorNone.
    KpAllocator(AllocatorType type);

    /// The given pair; either may be null.
    KpAllocator(void* (*allocateWith)(unsigned long), void (*deallocateWith)(void*));

    /// Returns `size` bytes, or null on failure. If the first attempt fails and a callback is set
    /// by setFreeUnusedUncompressedDataCB(), calls it and tries once more.
    void* allocate(unsigned long size) const;

    /// Frees memory of allocate(); null is ignored.
    void deallocate(void* ptr) const;

    /// Whether both functions are the same.
    bool operator==(const KpAllocator& other) const = default;

    /// Sets the function that is called when an allocation fails, for example to release a cache.
    /// An empty function removes it. Process-wide and unlocked: set it before other threads start.
    static void setFreeUnusedUncompressedDataCB(std::function<void()> callback);

private:
    void* (*allocate_)(unsigned long);
    void (*deallocate_)(void*);
};
