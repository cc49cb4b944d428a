#pragma once

/// KPLIB_CHECK(condition, duty): checks a documented duty of the caller where KPLIB_CHECKS is defined, as it is in
/// Debug and sanitizer builds. A broken duty prints "FILE:LINE: DUTY" to standard error and aborts. Elsewhere the
/// condition is not evaluated and no code is generated.
#if defined(KPLIB_CHECKS)

#include <cstdio>
#include <cstdlib>

namespace kplib::detail {

[[noreturn]] inline void checkFailed(const char* file, int line, const char* duty)
{
    std::fprintf(stderr, "%s:%d: %s\n", file, line, duty);
    std::abort();
}

}  // namespace kplib::detail

#define KPLIB_CHECK(condition, duty) ((condition) ? void() : kplib::detail::checkFailed(__FILE__, __LINE__, duty))

#else

#define KPLIB_CHECK(condition, duty) void()

#endif
