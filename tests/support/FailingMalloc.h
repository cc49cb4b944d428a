#pragma once

namespace kplib::test {

/// While one of these lives, the allocations of the library's own code on this thread are counted, and from the
/// `first`-th on (counted from 0) they fail; a negative `first` only counts. One at a time a thread.
class FailingMalloc {
public:
    explicit FailingMalloc(long first, long howMany = -1);
    ~FailingMalloc();
    FailingMalloc(const FailingMalloc&) = delete;
    FailingMalloc& operator=(const FailingMalloc&) = delete;

    /// Allocations seen so far.
    long count() const;
};

}  // namespace kplib::test
