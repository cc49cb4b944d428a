// Asked by the sanitizers at start-up, so that a test binary runs the same from a script, from ctest or by hand. The
// runtime of a sanitizer may be a shared object, which sees only what the binary exports.

#pragma GCC visibility push(default)
extern "C" {
const char* __asan_default_options();
const char* __tsan_default_options();
const char* __ubsan_default_options();

// Allocations that no machine can serve are part of the tests: they have to fail, not to end the process.
const char* __asan_default_options()
{
    return "allocator_may_return_null=1:detect_leaks=1:detect_stack_use_after_return=1";
}

const char* __tsan_default_options()
{
    return "allocator_may_return_null=1";
}

const char* __ubsan_default_options()
{
    return "print_stacktrace=1";
}
}
#pragma GCC visibility pop
