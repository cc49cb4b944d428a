#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpString.h>
#include <kplib/volume/KpBitfield.h>
#include <kplib/volume/detail/BitfieldKernels.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <functional>
#include <random>
#include <string>
#include <vector>

using namespace kplib::detail;

namespace {

using Words = std::vector<BitWord>;
using Labels = std::vector<unsigned char>;

constexpr unsigned long sizes[] = {0,  1,  2,   3,   4,   5,   31,  32,  33,  34,   63,   64,   65,   67,
                                   96, 97, 127, 128, 129, 191, 255, 256, 257, 4095, 4096, 4097, 12345};

/// Bits alike, alike but for one, or noise, by the seed; after the last bit there is noise.
KpBitfield someField(unsigned long nBits, unsigned seed)
{
    std::mt19937 random(seed);
    KpBitfield field(nBits, KpBitfield::INIT_NONE);
    std::generate_n(field.data(), field.nWords(), random);
    const unsigned kind = seed % 6;
    const unsigned long odd = nBits ? random() % nBits : 0;
    for (unsigned long i = 0; i < nBits && kind < 4; ++i)
        (((kind & 2) != 0) != ((kind & 1) != 0 && i == odd)) ? field.set(i) : field.unset(i);
    return field;
}

Words wordsOf(const KpBitfield& field)
{
    return Words(field.data(), field.data() + field.nWords());
}

/// Runs of 0 to 3, so that there are fours of one kind and mixed ones.
Labels someLabels(unsigned long n, unsigned seed)
{
    std::mt19937 random(seed);
    Labels labels(n);
    for (unsigned long i = 0; i < n; ++i)
        labels[i] = i > 0 && random() % 4 != 0 ? labels[i - 1] : static_cast<unsigned char>(random() % 4);
    return labels;
}

}  // namespace

TEST(KpBitfield, resizingFillsWhatIsAddedButForASpareWord)
{
    constexpr BitWord before = 0xA5A5A5A5;
    for (unsigned long old : {0, 1, 31, 32, 33, 64, 70, 96})
        for (unsigned long now : {0, 1, 31, 32, 33, 60, 64, 65, 71, 96, 200})
            for (auto init : {KpBitfield::INIT_SET, KpBitfield::INIT_UNSET, KpBitfield::INIT_NONE}) {
                KpBitfield field(old, KpBitfield::INIT_NONE);
                std::fill_n(field.data(), field.nWords(), before);
                const unsigned long oldEnd = field.nWords() * 32, words = now == 0 ? 0 : now / 32 + 1;
                field.resize(now, init);
                ASSERT_EQ(field.nBits(), now);
                ASSERT_EQ(field.nWords(), words);
                ASSERT_TRUE((now != 0 || !field.data()));
                const bool fills = init != KpBitfield::INIT_NONE, fillsLast = fills && old % 32 != 0 && now > old;
                for (unsigned long i = 0; i < (fills ? words * 32 : std::min(now, oldEnd)); ++i) {
                    const bool isAdded = i >= oldEnd || (i >= old && fillsLast);
                    ASSERT_EQ(field.test(i), isAdded ? init == KpBitfield::INIT_SET : (before >> i % 32) % 2 != 0)
                        << old << " to " << now << " by " << init << " at " << i;
                }
                field.setAll();
                field.toggleAll();
                ASSERT_EQ(wordsOf(field), Words(words, 0)) << "with the spare word";
            }
}

TEST(KpBitfield, setsRanges)
{
    for (unsigned long from = 0; from < 66; ++from)
        for (unsigned long to : {from, from + 1, from + 31, from + 32, from + 90}) {
            KpBitfield field(200, KpBitfield::INIT_UNSET), expected = field;
            field.setRange(from, to);
            for (unsigned long i = from; i <= to; ++i)
                expected.set(i);
            EXPECT_EQ(wordsOf(field), wordsOf(expected)) << from << " to " << to;
        }
}

TEST(KpBitfield, answersByItsBitsAndIgnoresWhatLiesBehind)
{
    for (unsigned long n : sizes)
        for (unsigned seed = 0; seed < 6; ++seed) {
            const KpBitfield field = someField(n, seed);
            KpString text;
            field.print(text);
            std::string bits;
            for (unsigned long i = 0; i < n; ++i)
                bits += field.test(i) ? '1' : '0';
            ASSERT_EQ(text.c_str(), bits);
            const unsigned long first = std::min(bits.find('1'), n), firstUnset = std::min(bits.find('0'), n);
            EXPECT_EQ(field.nSetBits(), static_cast<unsigned long>(std::count(bits.begin(), bits.end(), '1')));
            EXPECT_EQ(std::tuple(field.firstSetBit(), field.isAnyBitSet()), std::tuple(first, first < n)) << bits;
            EXPECT_EQ(std::tuple(field.firstUnsetBit(), field.isAnyBitUnset()), std::tuple(firstUnset, firstUnset < n))
                << bits;
            EXPECT_EQ(field.lastSetBit(), std::min(bits.rfind('1'), n)) << bits;
        }
}

TEST(KpBitfield, joinsTheWordsAndComparesTheBitsThatBothHave)
{
    for (unsigned long n : sizes)
        for (unsigned long nB : {n, n + 1, n + 40, n / 2})
            for (unsigned seed = 0; seed < 12; ++seed) {
                SCOPED_TRACE(testing::Message() << n << " and " << nB << " bits, seed " << seed);
                const KpBitfield a = someField(n, seed), b = someField(nB, seed % 7);
                bool contains = true, meets = false, isContained = true;
                for (unsigned long i = 0; i < std::min(n, nB); ++i) {
                    contains = contains && (a.test(i) || !b.test(i));
                    isContained = isContained && (b.test(i) || !a.test(i));
                    meets = meets || (a.test(i) && b.test(i));
                }
                ASSERT_EQ(std::tuple(a.isSuperset(b), a.isSubset(b), a.hasIntersection(b), a == b),
                          std::tuple(contains, isContained, meets, n == nB && contains && isContained));
                KpBitfield both = a, either = a, one = a;
                both &= b, either |= b, one ^= b;
                for (unsigned long i = 0; i < a.nWords(); ++i) {
                    const BitWord x = a.data()[i], y = i < b.nWords() ? b.data()[i] : 0;
                    ASSERT_EQ(both.data()[i], i < b.nWords() ? x & y : x);
                    ASSERT_EQ(either.data()[i], (x | y));
                    ASSERT_EQ(one.data()[i], (x ^ y));
                }
            }
}

TEST(BitfieldKernels, everyRowEqualsThePlainOne)
{
    for (unsigned long n : {0, 1, 63, 64, 65, 127, 128, 129, 256, 300, 1000})
        for (unsigned seed = 0; seed < 6; ++seed) {
            const Words a = wordsOf(someField(n * 32, seed)), b = wordsOf(someField(n * 32, seed / 2 + 7));
            const auto expectSame = [=](auto paths, auto... arguments) {
                for (const auto& path : paths)
                    if (path.usable) {
                        EXPECT_EQ(path.run(arguments...), paths[0].run(arguments...)) << path.name << n << ' ' << seed;
                    }
            };
            expectSame(countPaths(), a.data(), n);
            for (BitWord skipped : {0U, ~0U}) {
                expectSame(findFirstPaths(), a.data(), n, skipped);
                expectSame(findLastPaths(), a.data(), n, skipped);
            }
            expectSame(anyPaths<BitsMissing>(), a.data(), b.data(), n);
            for (const auto& path : combinePaths<BitXor>())
                if (Words result = a, expected = a; path.usable) {
                    path.run(result.data(), b.data(), n);
                    std::transform(a.data(), a.data() + n, b.data(), expected.data(), std::bit_xor());
                    EXPECT_EQ(result, expected) << path.name << n;
                }
        }
}

TEST(KpBitfield, takesTheVoxelsOfALabel)
{
    for (unsigned long n : sizes)
        for (unsigned char label : {0, 1, 3, 255}) {
            const unsigned long start = n % 4;
            const Labels labels = someLabels(n + start, static_cast<unsigned>(n));
            Words expected(n / 32 + 1);
            for (unsigned long i = 0; i < n; ++i) {
                const auto* four = labels.data() + start + i / 4 * 4;
                const bool isSkipped = i / 4 * 4 + 4 <= n && std::count(four, four + 4, 0) == 4;
                expected[i / 32] |= labels[start + i] == label && !isSkipped ? 1U << i % 32 : 0;
            }
            for (const auto& path : fromLabelsPaths())
                if (path.usable) {
                    Words words(n / 32 + 1, 0x12345678);
                    path.run(words.data(), labels.data() + start, n, label);
                    ASSERT_EQ(words, expected) << path.name << ' ' << n << '+' << start << " label " << int(label);
                }
        }
    KpBitfield field(400, KpBitfield::INIT_SET);
    const unsigned char labels[] = {0, 1, 0, 0, 0, 0, 0, 0, 0, 0};
    field.fromLabels(10, labels, 0);
    EXPECT_EQ(wordsOf(field), Words{0b1100001101}) << "not the four, but the last two";
}

TEST(KpBitfield, mergesIntoLabelsByPolicy)
{
    for (unsigned long n : sizes)
        for (int policy = KpBitfield::INSERT_SET; policy <= KpBitfield::INSERT_OWN; ++policy)
            for (unsigned char label : {0, 2, 200}) {
                const unsigned long start = n % 4;
                const KpBitfield field = someField(n, static_cast<unsigned>(n + label) % 6);
                const Labels labels = someLabels(n + start, 3);
                Labels expected = labels;
                for (unsigned long i = 0; i < n; ++i) {
                    unsigned char& v = expected[start + i];
                    const bool isSet = field.test(i), isFree = v == 0, isOwn = isFree || v == label;
                    const bool writes[] = {false, isSet, isSet && isFree, true, isOwn};
                    v = !writes[policy] ? v : isSet ? label : 0;
                }
                for (const auto& path : toLabelsPaths())
                    if (path.usable) {
                        Labels result = labels;
                        path.run(KpBitfield::InsertPolicy(policy))(field.data(), result.data() + start, n, label);
                        ASSERT_EQ(result, expected) << path.name << ' ' << n << ' ' << policy << ' ' << int(label);
                    }
            }
    KpBitfield field(40, KpBitfield::INIT_SET);
    Labels labels(41, 7);
    field.toLabels(41, labels.data(), 3, KpBitfield::INSERT_SET);
    for (int unknown : {0, 5, -1})
        field.toLabels(40, labels.data(), 3, KpBitfield::InsertPolicy(unknown));
    EXPECT_EQ(labels, Labels(41, 7));
    field.toLabels(39, labels.data(), 3, KpBitfield::INSERT_SET);
    EXPECT_EQ(std::tuple(labels[38], labels[39]), std::tuple(3, 7));
}

TEST(KpBitfield, filesHoldTheBytesOfTheBits)
{
    const std::string path = testing::TempDir() + "bitfield";
    for (unsigned long n : {0, 1, 8, 9, 100}) {
        const KpBitfield field = someField(n, 4);
        KpBitfield loaded(300, KpBitfield::INIT_SET);
        ASSERT_TRUE(field.save(path.c_str()));
        ASSERT_TRUE(loaded.load(path.c_str(), n));
        EXPECT_EQ(loaded, field);
        EXPECT_EQ(std::filesystem::file_size(path), (n + 7) / 8);
    }
    KpBitfield field(300, KpBitfield::INIT_SET), expected(150, KpBitfield::INIT_UNSET);
    std::ofstream(path) << "\xFF\x01";
    expected.setRange(0, 8);
    EXPECT_FALSE(field.load(path.c_str(), 150)) << "too short";
    EXPECT_EQ(wordsOf(field), wordsOf(expected));
    std::filesystem::remove(path);
    EXPECT_FALSE(field.load(path.c_str(), 96));
    EXPECT_EQ(wordsOf(field), Words(4, 0));
    EXPECT_FALSE(field.save("/no/such/folder/bitfield"));
    for (const unsigned long nBits : {1UL << 20, 9UL})
        EXPECT_FALSE(KpBitfield(nBits, KpBitfield::INIT_SET).save("/dev/full"));
}

TEST(KpBitfield, digestTakesAQuarterOfTheBitsAndTheLastWord)
{
    const std::tuple<unsigned long, Words, const char*> cases[] = {
        {64, {0xFFFF6261, 0x12345678, 0x66656463}, "E80B5017098950FC58AAD83C8C14978E"},  // abcdef
        {104, {0xFF636261, 1, 2, 0xFFFFFF64}, "181C9F04920A0CAED5C51A8FF26DD8D1"},       // abcd and three zeros
    };
    for (const auto& [nBits, words, digest] : cases) {
        KpBitfield field(nBits, KpBitfield::INIT_NONE);
        std::copy(words.begin(), words.end(), field.data());
        KpString text;
        field.md5(text);
        EXPECT_STREQ(text.c_str(), digest);
    }
}

TEST(KpBitfield, copiesByItselfAndStaysAsItWasWithoutMemory)
{
    const KpBitfield before = someField(100, 4);
    KpBitfield field = someField(40, 5);
    field = before;
    EXPECT_THROW(field.resize(~0UL, KpBitfield::INIT_SET), KpMemoryException);
    EXPECT_EQ(wordsOf(field), wordsOf(before));
    const auto* const storage = field.data();
    EXPECT_EQ(KpBitfield(std::move(field)).data(), storage);
}
