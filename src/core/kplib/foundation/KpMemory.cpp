#include <kplib/foundation/KpMemory.h>

#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpString.h>

#include <cstdint>
#include <cstdlib>

namespace {

// Formats a text and discards it. Intentional: handlers depend on the text of KpMemoryException.
// The text fits into one block, so a failure here ends in kpmalloc and cannot return to kprealloc.
void dropReallocationText(unsigned long size)
{
    try {
        KpString text{KpString::NoMemory()};
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat"
        text.printf("could not reallocate %Id bytes", size);  // intentional: the text is fixed, and discarded
#pragma GCC diagnostic pop
    } catch (const KpMemoryException&) {
        return;  // no memory for the text either
    }
}

}  // namespace

void* kpmalloc(unsigned long size)
{
    void* const block = std::malloc(size);
    if (!block)
        throw KpMemoryException(size);
    return block;
}

void* kprealloc(void* ptr, unsigned long size)
{
    if (!ptr)
        return kpmalloc(size);
    if (size == 0) {
        std::free(ptr);
        return nullptr;
    }
    void* const block = std::realloc(ptr, size);
    if (!block) {
        dropReallocationText(size);
        throw KpMemoryException(size);
    }
    return block;
}

void kpfree(void* ptr)
{
    std::free(ptr);
}

void* KpAlignedMalloc(unsigned long size, unsigned long /*alignment*/)
{
    return std::malloc(size);
}

void KpAlignedFree(void* ptr)
{
    std::free(ptr);
}

bool KpIsAligned(const void* ptr, unsigned long alignment)
{
    return (reinterpret_cast<std::uintptr_t>(ptr) & (alignment - 1)) == 0;
}
