#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpString.h>
#include <support/ExhaustedMemory.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace {

struct Traced {  // managed; counts itself, so that a lost or doubled construction shows
    static int alive;
    int value;
    Traced(int v = -1) : value(v) { ++alive; }
    Traced(const Traced& other) : value(other.value) { ++alive; }
    Traced& operator=(const Traced&) = default;
    ~Traced() { --alive; }
    bool operator==(const Traced&) const = default;
};
int Traced::alive = 0;

struct Zeroing {  // plain, although its constructor does something
    int value = 0;
};
struct Tree {
    KpDArray<Tree> children;
};
static_assert(sizeof(Tree) == 24);
static_assert(KpElementTraits<int*>::kind == KpElementKind::Bytes);
static_assert(KpElementTraits<Zeroing>::kind == KpElementKind::Plain);
static_assert(KpElementTraits<KpString>::kind == KpElementKind::Managed && KpElementTraits<KpString>::movesAsBytes);
static_assert(!KpElementTraits<std::string>::movesAsBytes);

template <typename T>
std::vector<T> contents(const KpDArray<T>& array)
{
    return {array.begin(), array.end()};
}

}  // namespace

TEST(KpDArray, growsByHalfItsSize)
{
    KpDArray<int> array;
    std::vector<long> capacities;
    for (int i = 0; i < 211; ++i) {
        array.append(i);
        if (capacities.empty() || capacities.back() != array.capacity())
            capacities.push_back(array.capacity());
    }
    EXPECT_EQ(capacities, (std::vector<long>{1, 2, 3, 4, 6, 9, 13, 19, 28, 42, 63, 94, 141, 211}));
}

TEST(KpDArray, remaxAndResizeSetSizeAndCapacityByTheirRules)
{
    KpDArray<int> array;
    EXPECT_EQ(array.remax(1000, 0), -1000);
    EXPECT_EQ(array.resize(1001), 1001);  // half of a size of 0 is no reserve
    EXPECT_EQ(array.capacity(), 1001);
    EXPECT_EQ(array.resize(-5), 0);
    EXPECT_EQ(array.capacity(), 1001);
    EXPECT_EQ(array.remax(5, 10), 991);
    EXPECT_EQ(array.size(), 10);
    EXPECT_EQ(array.remax(100), -90);
    array.resize(7);
    EXPECT_EQ(array.remax(), 93);
    EXPECT_EQ(array.resize(8), 8);
    EXPECT_EQ(array.capacity(), 10);
    EXPECT_EQ(array.remax(0, 0), 10);
    EXPECT_EQ(array.data(), nullptr);
    array.insert(0, -1, array.data());
    array.insert(0, 3, std::vector<int>(3).data());
    EXPECT_EQ(KpDArray<int>(array).capacity(), 3);
}

template <typename T>
class KpDArrayModel : public testing::Test {
};
using ModelTypes = testing::Types<int, Traced, std::string, KpString>;
TYPED_TEST_SUITE(KpDArrayModel, ModelTypes);

template <typename T>
T makeValue(unsigned n)
{
    if constexpr (std::is_constructible_v<T, int> && !std::is_same_v<T, KpString>)
        return T(static_cast<int>(n));
    else
        return T(std::to_string(n % 2 ? n : 1'000'000'000'000'000'000u + n).c_str());
}

TYPED_TEST(KpDArrayModel, behavesAsAVectorThroughRandomChanges)
{
    std::mt19937 random(7);
    {
        KpDArray<TypeParam> array;
        std::vector<TypeParam> model;
        for (int step = 0; step < 3000; ++step) {
            const auto size = static_cast<unsigned>(model.size());
            const unsigned pos = random() % (size + 1);
            const TypeParam value = makeValue<TypeParam>(random());
            switch (random() % 7) {
            case 0:
                array.append(value);
                model.push_back(value);
                break;
            case 1:
                array.append(pos < size ? array[pos] : value);
                model.push_back(pos < size ? TypeParam(model[pos]) : value);
                break;
            case 2: {  // some of its own, from before or behind the place
                const unsigned from = random() % 2 ? pos / 2 : pos, to = from < pos ? pos : size;
                const std::vector<TypeParam> items(model.begin() + from, model.begin() + to);
                array.insert(pos, to - from, array.data() + from);
                model.insert(model.begin() + pos, items.begin(), items.end());
                break;
            }
            case 3:
                if (pos < size) {
                    array.remove(pos);
                    model.erase(model.begin() + pos);
                }
                break;
            case 4:
                array.resize(pos);
                model.resize(pos);
                break;
            case 5:
                array.remax(static_cast<long>(random() % 50));  // so that what comes next reallocates
                break;
            default:
                array = KpDArray<TypeParam>(array);
            }
            ASSERT_EQ(contents(array), model) << "step " << step;
            ASSERT_LE(array.size(), array.capacity());
        }
    }
    EXPECT_EQ(Traced::alive, 0);
}

TEST(KpDArray, constructsEachElementOnceAndSkipsPlainConstructors)
{
    {
        KpDArray<Traced> array;
        array.resize(10);
        EXPECT_EQ(Traced::alive, 10);
        array.remax(3, 4);
        EXPECT_EQ(Traced::alive, 4);
    }
    EXPECT_EQ(Traced::alive, 0);
    KpDArray<Zeroing> plain;
    plain.resize(1);
    plain[0].value = 5;
    plain.clear();
    plain.resize(1);
    EXPECT_EQ(plain[0].value, 5);
}

TEST(KpDArray, insertsSortedBehindEqualElements)
{
    KpDArray<int> array{1, 5, 9};
    EXPECT_EQ(array.insertSorted(5, kpStandardCompare<int>), 2);
    EXPECT_EQ(array.insertSorted(0, kpStandardCompare<int>, 0, -1), 1);  // element 0 counts as known to be less
    EXPECT_EQ(contents(array), (std::vector<int>{1, 0, 5, 5, 9}));
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
    EXPECT_THROW(numbers.remax(LONG_MAX / 4, 0), KpMemoryException);
    EXPECT_THROW(numbers.resize(LONG_MAX), KpMemoryException);
}

TEST(KpMemory, reportsWhatItCouldNotAllocate)
{
    const unsigned long tooMuch = ULONG_MAX / 4;
    void* const block = kprealloc(nullptr, 16);
    try {
        kprealloc(block, tooMuch);
        FAIL();
    } catch (KpMemoryException& e) {
        EXPECT_STREQ(e.what(), "could not allocate 4611686018427387903 bytes");
        EXPECT_EQ(e.size(), tooMuch);
        const std::unique_ptr<KpException> clone(e.doClone());
        EXPECT_EQ(dynamic_cast<KpMemoryException*>(clone.get()), nullptr);
        EXPECT_STREQ(clone->what(), e.what());
    }
    EXPECT_EQ(kprealloc(block, 0), nullptr);
    EXPECT_STREQ(KpMemoryException().what(), "could not allocate enough memory");

    const kplib::test::FailingMalloc failures(0);
    try {
        kpmalloc(1);
        FAIL();
    } catch (KpException& e) {
        EXPECT_STREQ(e.what(), "could not allocate enough memory");  // not even for the sized text
    }
}
