#include <kplib/foundation/KpFrameID.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpHash.h>
#include <kplib/foundation/KpRemotificationID.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpTransferID.h>
#include <kplib/foundation/KpUniqueID.h>
#include <kplib/foundation/TmSessionContextID.h>
#include <kplib/geometry/KpVec3i.h>
#include <kplib/geometry/KpVec4i.h>

#include <climits>
#include <gtest/gtest.h>
#include <unordered_set>

namespace {

template <typename ID>
struct Identifier : testing::Test {
};

using Identifiers = testing::Types<KpID<long long, LLONG_MIN>, KpID<int, -1>, KpUniqueID, KpTransferID, KpFrameID,
                                   KpRemotificationID, TmSessionContextID>;
TYPED_TEST_SUITE(Identifier, Identifiers);

const auto emptyOf = []<typename T, T empty>(const KpID<T, empty>&) { return empty; };

template <typename ID>
void expectAscending(const ID& a, const ID& b)
{
    EXPECT_EQ(std::tuple(a<b, a <= b, a> b, a >= b, a == b, a != b), std::tuple(true, true, false, false, false, true));
    EXPECT_EQ(std::tuple(b<a, b <= a, b> a, b >= a, a <= a, a >= a), std::tuple(false, false, true, true, true, true));
}

TYPED_TEST(Identifier, knowsItsEmptyValueAndTheOrderOfSignedNumbers)
{
    TypeParam id, other;
    static_assert(sizeof id == sizeof id.value());
    EXPECT_EQ(id.value(), emptyOf(id));
    id.valueSet(5);
    other.valueSet(-7);
    EXPECT_EQ(std::tuple(TypeParam().isEmpty(), TypeParam().isNotEmpty()), std::tuple(true, false));
    EXPECT_EQ(std::tuple(id.isEmpty(), id.isNotEmpty()), std::tuple(false, true));
    expectAscending(other, id);
    EXPECT_EQ(kp_hash(other), 0xFFFFFFF9U);
    EXPECT_EQ((std::unordered_set<TypeParam>{id, other, TypeParam(5)}).size(), 2U);
    id.makeEmpty();
    EXPECT_EQ(id, TypeParam());
}

template <typename A, typename B>
concept Mix = std::convertible_to<A, B> || requires(A a, B b)
{
    a == b;
};
static_assert(!Mix<KpFrameID, KpTransferID> && !Mix<KpFrameID, KpUniqueID> && !Mix<KpTransferID, KpUniqueID>);
static_assert(!Mix<KpRemotificationID, TmSessionContextID> && !Mix<long long, KpFrameID> && Mix<KpFrameID, KpFrameID>);

TEST(IdentifierOfTwoWords, isOrderedByTheFirstWordThenTheSecond)
{
    using ID = KpID_C<Kp128>;
    ID last;
    EXPECT_FALSE(last.isValid());
    for (const ID next : {ID({0, 1}), ID({0, ~0ULL}), ID({1, 0}), ID({~0ULL, 0})}) {
        EXPECT_TRUE(next.isValid());
        expectAscending(last, next);
        last = next;
    }
    EXPECT_EQ(kp_hash(ID({0x123456789ULL, 7})), 0x23456789U);
}

TEST(Identifiers, of64BitsReadAndWriteText)
{
    for (const long long value : {0LL, 42LL, -1LL, LLONG_MAX, LLONG_MIN}) {
        const std::string text = std::to_string(value);
        EXPECT_EQ(KpUniqueID::fromLatin1(text.c_str()), KpUniqueID::fromInt64(value));
        EXPECT_EQ(KpUniqueID::fromInt64(value).toKpString(), text.c_str());
    }
}

TEST(KpRemotificationID, namesTheSingletons)
{
    using ID = KpRemotificationID;
    const auto name = [](int value) { return ID(value).singletonClassName(); };
    EXPECT_FALSE(name(0));
    EXPECT_FALSE(name(8));
    EXPECT_STREQ(name(ID::RS_MAX), "TmPowerScribeCtrl");
}

TEST(Hash, keepsTheLowBits)
{
    EXPECT_EQ(kp_hash(""), 0U);
    EXPECT_EQ(kp_hash("ab"), 97U * 9 + 98);
    EXPECT_EQ(kp_hash("\xFF"), ~0U);  // characters are signed
    EXPECT_EQ(kp_hash(-1LL << 32 | 5), 5U);
    EXPECT_EQ(kp_hash(reinterpret_cast<void*>(0x712345678)), 0x12345678U);
    EXPECT_EQ(kp_hash(KpVec3i(33, -1, 3)), 1U * 1024 + 31 * 32 + 3);
    EXPECT_EQ(kp_hash(KpVec4i(-32, 31, 2, 35)), 31U * 1024 + 2 * 32 + 3);
}

TEST(Hash, makesKeysOfEqualValuesEqual)
{
    KpString one("a-b"), other("a-c");
    one[1] = other[1] = '\0';  // == compares the lengths, and the texts up to there
    const KpHandle<KpHandable> object(new KpHandable), same = object;
    EXPECT_EQ((std::unordered_set<KpString>{"a", one, other}).size(), 2U);
    EXPECT_EQ((std::unordered_set<Kp128>{{1, 2}, {2, 1}, {1, 2}}).size(), 2U);
    EXPECT_EQ((std::unordered_set<KpHandle<KpHandable>>{object, same, nullptr}).size(), 2U);
    EXPECT_EQ(one.view().size(), 3U) << "all that size() counts but the last NUL";
}

}  // namespace
