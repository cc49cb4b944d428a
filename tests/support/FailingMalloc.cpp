#include <support/FailingMalloc.h>

#include <cstddef>
#include <cstdlib>
#include <new>

// The linker leads malloc, realloc and calloc of the library's objects here (-Wl,--wrap); the operators new of this
// binary serve what they and the standard library's inline code allocate. Those for arrays lead to these by default.
// valgrind puts its own operators new in their place, so that no allocation by new fails, unless it is started where
// .valgrindrc forbids that; then it watches the malloc that they call.

namespace {

thread_local bool active = false;
thread_local long seen = 0, failFrom = -1, failUpTo = -1;

bool fails()
{
    if (!active)
        return false;
    const long number = seen++;
    return failFrom >= 0 && number >= failFrom && (failUpTo < 0 || number < failUpTo);
}

}  // namespace

extern "C" {
void* __real_malloc(size_t size);
void* __real_realloc(void* ptr, size_t size);
void* __real_calloc(size_t count, size_t size);

void* __wrap_malloc(size_t size)
{
    return fails() ? nullptr : __real_malloc(size);
}

void* __wrap_realloc(void* ptr, size_t size)
{
    return fails() ? nullptr : __real_realloc(ptr, size);
}

void* __wrap_calloc(size_t count, size_t size)
{
    return fails() ? nullptr : __real_calloc(count, size);
}
}

void* operator new(size_t size)
{
    if (void* const block = fails() ? nullptr : __real_malloc(size))
        return block;
    throw std::bad_alloc();
}

void* operator new(size_t size, const std::nothrow_t&) noexcept
{
    return fails() ? nullptr : __real_malloc(size);
}

void operator delete(void* ptr) noexcept
{
    std::free(ptr);
}

void operator delete(void* ptr, size_t) noexcept
{
    std::free(ptr);
}

namespace kplib::test {

FailingMalloc::FailingMalloc(long first, long howMany)
{
    failFrom = first;
    failUpTo = howMany < 0 ? -1 : first + howMany;
    seen = 0;
    active = true;
}

FailingMalloc::~FailingMalloc()
{
    active = false;
}

long FailingMalloc::count() const
{
    return seen;
}

}  // namespace kplib::test
