#include "FailingHeap.h"

#include <atomic>
#include <cstddef>
#include <cstdlib>
#include <new>

// The linker redirects malloc, realloc and calloc of the library's objects to the functions here (-Wl,--wrap); the
// operators new of this program serve all shared objects too.

namespace {

kplib::probe::FailurePlan current;
std::atomic<bool> active = false;
std::atomic<long> seenCount = 0, failedCount = 0;
std::atomic<std::uint32_t> randomState = 0;

bool isChosen(long number)
{
    if (current.chance != 0) {
        const std::uint32_t next = randomState.load() * 1664525U + 1013904223U;
        randomState = next;
        return next >> 30 == 0;
    }
    return current.from >= 0 && (current.once ? number == current.from : number >= current.from);
}

bool fails()
{
    if (!active || !isChosen(seenCount++))
        return false;
    ++failedCount;
    return true;
}

}  // namespace

extern "C" {
void* __real_malloc(std::size_t size);
void* __real_realloc(void* block, std::size_t size);
void* __real_calloc(std::size_t count, std::size_t size);

void* __wrap_malloc(std::size_t size)
{
    return fails() ? nullptr : __real_malloc(size);
}

void* __wrap_realloc(void* block, std::size_t size)
{
    return fails() ? nullptr : __real_realloc(block, size);
}

void* __wrap_calloc(std::size_t count, std::size_t size)
{
    return fails() ? nullptr : __real_calloc(count, size);
}
}

void* operator new(std::size_t size)
{
    if (void* const block = fails() ? nullptr : __real_malloc(size))
        return block;
    throw std::bad_alloc();
}

void* operator new(std::size_t size, const std::nothrow_t&) noexcept
{
    return fails() ? nullptr : __real_malloc(size);
}

void operator delete(void* block) noexcept
{
    std::free(block);
}

void operator delete(void* block, std::size_t) noexcept
{
    std::free(block);
}

namespace kplib::probe {

FailingHeap::FailingHeap(const FailurePlan& plan)
{
    current = plan;
    randomState = plan.chance * 2654435761U;
    seenCount = failedCount = 0;
    active = true;
}

FailingHeap::~FailingHeap()
{
    active = false;
}

long FailingHeap::seen()
{
    return seenCount;
}

long FailingHeap::failed()
{
    return failedCount;
}

}  // namespace kplib::probe
