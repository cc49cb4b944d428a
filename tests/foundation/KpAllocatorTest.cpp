#include <kplib/foundation/KpAllocator.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpPrimType.h>

#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>

namespace {
int attempts = 0;
void* refuseOnce(unsigned long size)
{
    return ++attempts == 2 ? std::malloc(size) : nullptr;
}
}  // namespace

TEST(KpAllocator, asksForMemoryToBeFreedOnceBeforeItGivesUp)
{
    int called = 0;
    KpAllocator::setFreeUnusedUncompressedDataCB([&] { ++called; });
    const KpAllocator allocator(refuseOnce, std::free);
    void* const block = allocator.allocate(10);
    EXPECT_NE(block, nullptr);
    allocator.deallocate(block);
    EXPECT_EQ(allocator.allocate(10), nullptr);
    EXPECT_EQ(attempts, 4);
    EXPECT_EQ(called, 2);
    EXPECT_EQ(KpAllocator(KpAllocator::AllocatorNone).allocate(10), nullptr);
    EXPECT_EQ(called, 2);
    KpAllocator::setFreeUnusedUncompressedDataCB(nullptr);
    EXPECT_EQ(allocator.allocate(10), nullptr);
}

TEST(KpAllocator, namesAPairByItsType)
{
    EXPECT_EQ(KpAllocator(KpAllocator::AllocatorMalloc), KpAllocator(KpAllocator::AllocatorMalloc2));
    EXPECT_EQ(KpAllocator(static_cast<KpAllocator::AllocatorType>(9)), KpAllocator(nullptr, nullptr));
    const KpAllocator byNew(KpAllocator::AllocatorNew);
    EXPECT_EQ(byNew.allocate(ULONG_MAX / 4), nullptr);
    byNew.deallocate(byNew.allocate(3));
    byNew.deallocate(nullptr);
}

TEST(KpPrimType, findsTypesByTheirExactName)
{
    KpPrimType::Type type = KpPrimType::Double;
    EXPECT_FALSE(KpPrimType::nameToType("Float", type) || KpPrimType::nameToType("", type));
    EXPECT_EQ(type, KpPrimType::Double);
    EXPECT_TRUE(KpPrimType::nameToType("ushort", type) && type == 7 && KpPrimType(type).size() == 2);
    EXPECT_TRUE(KpPrimType::nameToType("sbyte", type) && type == 9 && KpPrimType(type).size() == 1);
    EXPECT_STREQ(KpPrimType(10).name(), "unknown");
}
