#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpString.h>
#include <support/ExhaustedMemory.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <concepts>
#include <random>
#include <span>
#include <string>
#include <vector>

TEST(KpDArray, remaxAndResizeFollowTheirRules)
{
    KpDArray<int> array;
    EXPECT_EQ(array.remax(1000, 0), -1000);
    EXPECT_EQ(array.resize(1001), 1001);
    EXPECT_EQ(array.resize(-5), 0);
    EXPECT_EQ(array.remax(5, 10), 991);
    EXPECT_EQ(array.remax(100), -90);
    EXPECT_EQ(array.remax(), 90);
}

template <typename T, typename ValueOf>
static void changeAtRandomBesideAVector(ValueOf valueOf)
{
    std::mt19937 random(7);
    KpDArray<T> array;
    std::vector<T> model;
    long capacity = 0;
    for (int step = 0; step < 3000; ++step) {
        const long size = array.size(), pos = random() % (size + 1);
        const T value = valueOf(random());
        switch (random() % 5) {
        case 0:  // another's element or one of its own
            array.append(pos < size ? array[pos] : value);
            model.push_back(pos < size ? T(model[pos]) : value);
            break;
        case 1: {  // some of its own, from before or after the place
            const long from = random() % 2 ? pos / 2 : pos, to = from < pos ? pos : size;
            const std::vector<T> items(model.begin() + from, model.begin() + to);
            array.insert(pos, to - from, array.data() + from);
            model.insert(model.begin() + pos, items.begin(), items.end());
            break;
        }
        case 2:
            if (pos < size) {
                array.remove(pos);
                model.erase(model.begin() + pos);
            }
            break;
        case 3:
            array.resize(pos + 1);
            model.resize(pos + 1);
            array[pos] = model[pos] = value;  // a new int has no value
            break;
        default:
            capacity = std::max<long>(random() % 50, size);
            array.remax(capacity);
        }
        ASSERT_EQ(std::vector<T>(array.begin(), array.end()), model) << "step " << step;
        if (array.size() > capacity)
            capacity = std::max(size * 3 / 2, array.size());
        ASSERT_EQ(array.capacity(), capacity) << "step " << step;
    }
    const KpDArray<T> copy = array;
    EXPECT_EQ(std::vector<T>(copy.begin(), copy.end()), model);
    EXPECT_EQ(copy.capacity(), copy.size());
}

TEST(KpDArray, behavesAsAVectorThatGrowsByHalfItsSize)
{
    changeAtRandomBesideAVector<int>([](unsigned n) { return static_cast<int>(n); });
    changeAtRandomBesideAVector<std::string>([](unsigned n) { return std::string(n % 2 ? 3 : 40, char(n >> 8)); });
    changeAtRandomBesideAVector<KpString>([](unsigned n) { return KpString(0, "%u", n); });
}

TEST(KpDArray, insertsSortedBehindEqualElements)
{
    KpDArray<int> array{1, 5, 9};
    EXPECT_EQ(array.insertSorted(5, kpStandardCompare<int>), 2);
    EXPECT_EQ(array.insertSorted(0, kpStandardCompare<int>, 0, -1), 1);  // element 0 counts as known to be less
    EXPECT_EQ(std::vector<int>(array.begin(), array.end()), (std::vector<int>{1, 0, 5, 5, 9}));
}

TEST(KpDArray, isMadeOfRangesAndComparedWhole)
{
    const std::vector<KpString> texts{"a", "b", "b"};
    const std::span<const KpString> tail(texts.begin() + 1, 2);
    const KpDArray<KpString> all(texts.begin(), texts.end()), rest(tail);
    EXPECT_EQ(all, KpDArray<KpString>(texts));
    EXPECT_EQ(rest, (KpDArray<KpString>{"b", "b"}));
    EXPECT_NE(rest, (KpDArray<KpString>{"b"}));
    EXPECT_NE(rest, (KpDArray<KpString>{"b", "a"}));
    struct NotCompared {};
    static_assert(!std::equality_comparable<KpDArray<NotCompared>>);
    EXPECT_EQ(KpDArray<char>(KpString("ab")).size(), 3) << "a string stays an array with its NUL";
}

TEST(KpDArray, survivesFailingAllocations)
{
    KpDArray<KpString> array{"a", "b"};
    array.remax(100);
    kplib::test::failAtEachAllocation(
        [&] {
            array.insert(1, 2, array.data());
            array.resize(array.size() + 3);
        },
        [&] { ASSERT_TRUE(std::all_of(array.begin(), array.end(), [](auto& text) { return text.length() < 2; })); });
    EXPECT_GT(array.size(), 4);
    KpDArray<double> numbers;
    EXPECT_THROW(numbers.resize(LONG_MAX), KpMemoryException);
}

TEST(KpMemory, reportsWhatItCouldNotAllocate)
{
    EXPECT_STREQ(KpMemoryException(ULONG_MAX / 4).what(), "could not allocate 4611686018427387903 bytes");
    EXPECT_EQ(kprealloc(kpmalloc(16), 0), nullptr);
    const kplib::test::FailingMalloc failures(0);
    EXPECT_THROW(kpmalloc(1), KpMemoryException);
    EXPECT_STREQ(KpMemoryException(1).what(), "could not allocate enough memory") << "not even for the sized text";
}
