#include <kplib/foundation/KpDArray.h>

#include <gtest/gtest.h>

TEST(KpDArray, growsByHalfItsSize)
{
    KpDArray<int> array;
    KpDArray<long> capacities;
    for (int i = 0; i < 211; ++i) {
        array.append(i);
        if (capacities.size() == 0 || capacities[capacities.size() - 1] != array.capacity())
            capacities.append(array.capacity());
    }
    const long expected[] = {1, 2, 3, 4, 6, 9, 13, 19, 28, 42, 63, 94, 141, 211};
    ASSERT_EQ(capacities.size(), 14);
    for (long i = 0; i < 14; ++i)
        EXPECT_EQ(capacities[i], expected[i]);
}
