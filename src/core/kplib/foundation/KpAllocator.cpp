#include <kplib/foundation/KpAllocator.h>

#include <cstdlib>
#include <new>
#include <utility>

namespace {

std::function<void()> sFreeUnusedUncompressedDataCB;

void* cppnew(unsigned long size)
{
    return new (std::nothrow) char[size];
}

void cppdelete(void* ptr)
{
    delete[] static_cast<char*>(ptr);
}

}  // namespace

KpAllocator::KpAllocator(AllocatorType type) : allocate_(nullptr), deallocate_(nullptr)
{
    switch (type) {
    case AllocatorMalloc:
    case AllocatorMalloc2:
        allocate_ = std::malloc;
        deallocate_ = std::free;
        break;
    case AllocatorNew:
        allocate_ = cppnew;
        deallocate_ = cppdelete;
        break;
    case AllocatorNone:
        break;
    }
}

KpAllocator::KpAllocator(void* (*allocateWith)(unsigned long), void (*deallocateWith)(void*)) :
    allocate_(allocateWith), deallocate_(deallocateWith)
{
}

void* KpAllocator::allocate(unsigned long size) const
{
    if (!allocate_)
        return nullptr;
    void* block = allocate_(size);
    if (!block && sFreeUnusedUncompressedDataCB) {
        sFreeUnusedUncompressedDataCB();
        block = allocate_(size);
    }
    return block;
}

void KpAllocator::deallocate(void* ptr) const
{
    if (deallocate_ && ptr)
        deallocate_(ptr);
}

void KpAllocator::setFreeUnusedUncompressedDataCB(std::function<void()> callback)
{
    sFreeUnusedUncompressedDataCB = std::move(callback);
}
