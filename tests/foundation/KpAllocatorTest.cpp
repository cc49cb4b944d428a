#include <kplib/foundation/KpAllocator.h>

#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>

TEST(KpAllocator, asksForMemoryToBeFreedOnceBeforeItGivesUp)
{
    static int attempts = 0;
    int called = 0;
    KpAllocator::setFreeUnusedUncompressedDataCB([&] { ++called; });
    const KpAllocator second([](unsigned long n) { return ++attempts == 2 ? std::malloc(n) : nullptr; }, std::free);
    void* const block = second.allocate(10);
    EXPECT_TRUE(block);
    EXPECT_FALSE(second.allocate(10));
    EXPECT_EQ(std::tuple(attempts, called), std::tuple(4, 2));
    second.deallocate(block);
    KpAllocator::setFreeUnusedUncompressedDataCB(nullptr);
    EXPECT_EQ(KpAllocator(KpAllocator::AllocatorNew).allocate(ULONG_MAX / 4), nullptr) << "without an exception";
}
