#pragma once

#include <support/FailingMalloc.h>

#include <gtest/gtest.h>

namespace kplib::test {

/// Runs `work` with its first allocation failing, then its second, and so on until it gets through; runs `check` after
/// each. A failure has to come out as an exception.
template <typename Work, typename Check>
void failAtEachAllocation(Work work, Check check)
{
    for (long n = 0;; ++n) {
        SCOPED_TRACE(n);
        bool failed = false, allocated = false;
        {
            const FailingMalloc failing(n, 1);
            try {
                work();
            } catch (...) {  // KpMemoryException, or bad_alloc of the standard library
                failed = true;
            }
            allocated = failing.count() > n;
        }
        check();
        if (!allocated)
            return;
        EXPECT_TRUE(failed);
    }
}

}  // namespace kplib::test
