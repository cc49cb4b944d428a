#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpString.h>
#include <kplib/system/KpCoder.h>
#include <kplib/volume/KpBitfield.h>
#include <kplib/volume/detail/KpBitfieldKernels.h>
#include <support/ExhaustedMemory.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

using namespace kplib::detail;

namespace {

using Words = std::vector<BitWord>;
using Labels = std::vector<unsigned char>;
using Bits = std::vector<bool>;

const std::vector<unsigned long> sizes = [] {
    std::vector<unsigned long> all = {511, 512, 513, 543, 544, 4095, 4096, 4097, 8200, 12345};
    for (unsigned long n = 0; n <= 130; ++n)
        all.push_back(n);
    return all;
}();

/// Noise, one bit in all, all but one, none or all set; behind the last bit there is noise.
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

Bits bitsOf(const KpBitfield& field)
{
    Bits bits(field.nBits());
    for (unsigned long i = 0; i < bits.size(); ++i)
        bits[i] = (field.data()[i / 32] >> i % 32) % 2 != 0;
    return bits;
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

std::string textOf(const char* path)
{
    std::ifstream f(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(f), {}};
}

std::string digestOf(const KpBitfield& field)
{
    KpString text;
    field.md5(text);
    return text.c_str();
}

std::string digestOfBytes(const void* bytes, unsigned n, const void* more = nullptr, unsigned nMore = 0)
{
    KpCoder coder;
    coder.crcMD5Update(static_cast<const unsigned char*>(bytes), n);
    coder.crcMD5Update(static_cast<const unsigned char*>(more), nMore);
    coder.crcMD5Final();
    unsigned char digest[16];
    coder.crcMD5Query(digest);
    KpString text;
    KpCoder::dataToHexString(digest, 16, text, true);
    return text.c_str();
}

}  // namespace

TEST(KpBitfield, countsOneWordBeyondTheFullOnes)
{
    for (auto [bits, words] : {std::pair{0UL, 0UL}, {1, 1}, {31, 1}, {32, 2}, {33, 2}, {64, 3}}) {
        KpBitfield field(bits, KpBitfield::INIT_UNSET);
        EXPECT_TRUE(field.nBits() == bits && field.nWords() == words && (field.data() != nullptr) == (bits != 0));
        field.toggleAll();
        EXPECT_EQ(wordsOf(field), Words(words, ~0U)) << "with the spare word";
        field.unsetAll();
        EXPECT_EQ(wordsOf(field), Words(words, 0));
        field.setAll();
        EXPECT_EQ(wordsOf(field), Words(words, ~0U));
        field.resize(0, KpBitfield::INIT_SET);
        EXPECT_TRUE(field.nBits() == 0 && field.nWords() == 0 && field.data() == nullptr);
    }
}

TEST(KpBitfield, copiesByItselfAndMovesItsStorage)
{
    const KpBitfield field = someField(100, 5);
    KpBitfield copy(field), other = someField(40, 5);
    copy.toggleAll();
    EXPECT_NE(copy, field);
    other = field;
    EXPECT_EQ(wordsOf(other), wordsOf(field));
    other = *&other;
    EXPECT_EQ(wordsOf(other), wordsOf(field));
    const auto* const storage = other.data();
    KpBitfield moved(std::move(other));
    copy = std::move(moved);
    EXPECT_TRUE(copy.data() == storage && copy == field && moved.nBits() == 0);
    copy = KpBitfield();
    EXPECT_TRUE(copy == KpBitfield() && copy != field);
}

TEST(KpBitfield, resizingFillsWhatIsAddedButForASpareWord)
{
    constexpr BitWord before = 0xA5A5A5A5;
    for (unsigned long old : {0, 1, 31, 32, 33, 64, 70, 96})
        for (unsigned long now : {0, 1, 31, 32, 33, 60, 64, 65, 71, 96, 200})
            for (auto init : {KpBitfield::INIT_SET, KpBitfield::INIT_UNSET, KpBitfield::INIT_NONE}) {
                KpBitfield field(old, KpBitfield::INIT_NONE);
                std::fill_n(field.data(), field.nWords(), before);
                const unsigned long oldEnd = field.nWords() * 32;
                field.resize(now, init);
                for (unsigned long i = 0; i < field.nWords() * 32; ++i) {
                    const bool isInLastUsed = i >= old && i < oldEnd && old % 32 != 0 && now > old;
                    const bool isAdded = i >= oldEnd || isInLastUsed;
                    if (isAdded && init == KpBitfield::INIT_NONE && i >= oldEnd)
                        break;  // uninitialised
                    const bool isSet = (field.data()[i / 32] >> i % 32) % 2 != 0;
                    const bool kept = (before >> i % 32) % 2 != 0;
                    ASSERT_EQ(isSet, isAdded && init != KpBitfield::INIT_NONE ? init == KpBitfield::INIT_SET : kept)
                        << old << " to " << now << " by " << init << " at " << i;
                }
            }
}

TEST(KpBitfield, setsRangesAndSingleBits)
{
    for (unsigned long from = 0; from < 100; ++from)
        for (unsigned long to : {from, from + 1, from + 31, from + 32, from + 33, from + 90}) {
            KpBitfield field(200, KpBitfield::INIT_UNSET), one = field;
            field.setRange(from, to);
            for (unsigned long i = from; i <= to; ++i)
                one.set(i);
            ASSERT_EQ(wordsOf(field), wordsOf(one)) << from << " to " << to;
            EXPECT_TRUE(one.test(to) && !one.test(to + 1));
            one.unset(to);
            EXPECT_TRUE(!one.test(to) && one.nSetBits() == to - from);
        }
}

TEST(KpBitfield, logicGoesOverTheWordsOfTheShorter)
{
    for (unsigned long nA : sizes)
        for (unsigned long nB : {nA, nA + 40, nA / 2, 0UL}) {
            const KpBitfield a = someField(nA, 4), b = someField(nB, 5);
            Words all[] = {wordsOf(a), wordsOf(a), wordsOf(a)};
            for (unsigned long i = 0; i < std::min(a.nWords(), b.nWords()); ++i) {
                all[0][i] &= b.data()[i];
                all[1][i] |= b.data()[i];
                all[2][i] ^= b.data()[i];
            }
            KpBitfield results[] = {a, a, a};
            EXPECT_EQ(wordsOf(results[0] &= b), all[0]);
            EXPECT_EQ(wordsOf(results[1] |= b), all[1]);
            EXPECT_EQ(wordsOf(results[2] ^= b), all[2]);
        }
}

TEST(KpBitfield, answersByItsBitsAndIgnoresWhatLiesBehind)
{
    for (unsigned long n : sizes)
        for (unsigned seed = 0; seed < 6; ++seed) {
            SCOPED_TRACE(testing::Message() << n << " bits, seed " << seed);
            const KpBitfield field = someField(n, seed);
            const Bits bits = bitsOf(field);
            const auto found = [&](bool value) -> unsigned long {
                return std::find(bits.begin(), bits.end(), value) - bits.begin();
            };
            unsigned long last = n;
            for (unsigned long i = 0; i < n; ++i)
                last = bits[i] ? i : last;
            EXPECT_EQ(field.nSetBits(), static_cast<unsigned long>(std::count(bits.begin(), bits.end(), true)));
            EXPECT_EQ(field.firstSetBit(), found(true));
            EXPECT_EQ(field.firstUnsetBit(), found(false));
            EXPECT_EQ(field.lastSetBit(), last);
            EXPECT_TRUE(field.isAnyBitSet() == (found(true) < n) && field.isAnyBitUnset() == (found(false) < n));
            KpString text;
            field.print(text);
            for (unsigned long i = 0; i < n; ++i)
                ASSERT_EQ(text[static_cast<long>(i)], bits[i] ? '1' : '0');
            EXPECT_EQ(text.size(), static_cast<long>(n) + 1);
        }
}

TEST(KpBitfield, comparesTheBitsThatBothHave)
{
    for (unsigned long n : sizes)
        for (unsigned long nB : {n, n + 1, n / 2, n + 77})
            for (unsigned seed = 0; seed < 12; ++seed) {
                const KpBitfield a = someField(n, seed), b = someField(nB, seed % 7);
                const Bits bitsA = bitsOf(a), bitsB = bitsOf(b);
                bool contains = true, meets = false, isContained = true;
                for (unsigned long i = 0; i < std::min(n, nB); ++i) {
                    contains = contains && (bitsA[i] || !bitsB[i]);
                    isContained = isContained && (bitsB[i] || !bitsA[i]);
                    meets = meets || (bitsA[i] && bitsB[i]);
                }
                ASSERT_TRUE(a.isSuperset(b) == contains && a.isSubset(b) == isContained)
                    << n << ' ' << nB << ' ' << seed;
                ASSERT_TRUE(a.hasIntersection(b) == meets && (a == b) == (bitsA == bitsB))
                    << n << ' ' << nB << ' ' << seed;
            }
}

TEST(BitfieldKernels, everyRowEqualsThePlainOne)
{
    for (unsigned long n : {0, 1, 2, 63, 64, 65, 127, 128, 129, 255, 256, 300, 1000})
        for (unsigned seed = 0; seed < 6; ++seed) {
            SCOPED_TRACE(testing::Message() << n << " words, seed " << seed);
            const Words a = wordsOf(someField(n * 32, seed)), b = wordsOf(someField(n * 32, seed / 2 + 7));
            const auto expectSame = [n](auto paths, auto ask) {
                for (const auto& path : paths)
                    if (path.usable) {
                        EXPECT_EQ(ask(path.run), ask(paths[0].run)) << path.name;
                    }
            };
            const auto any = [&](auto* run) { return run(a.data(), b.data(), n); };
            const auto combined = [&](auto* run) {
                Words result = a;
                run(result.data(), b.data(), n);
                return result;
            };
            expectSame(countPaths(), [&](auto* run) { return run(a.data(), n); });
            for (BitWord skipped : {0U, ~0U}) {
                expectSame(findFirstPaths(), [&](auto* run) { return run(a.data(), n, skipped); });
                expectSame(findLastPaths(), [&](auto* run) { return run(a.data(), n, skipped); });
            }
            expectSame(anyPaths<BitAnd>(), any);
            expectSame(anyPaths<BitXor>(), any);
            expectSame(anyPaths<BitsMissing>(), any);
            expectSame(combinePaths<BitAnd>(), combined);
            expectSame(combinePaths<BitOr>(), combined);
            expectSame(combinePaths<BitXor>(), combined);
        }
}

TEST(KpBitfield, takesALabelsVoxels)
{
    const auto bitsFor = [](Labels labels, unsigned char label) {
        KpBitfield field(400, KpBitfield::INIT_SET);
        field.fromLabels(labels.size(), labels.data(), label);
        KpString text;
        field.print(text);
        return std::string(text.c_str());
    };
    EXPECT_EQ(bitsFor({0, 0, 0, 0}, 0), "0000");
    EXPECT_EQ(bitsFor({0, 1, 0, 0, 0, 0, 0, 0, 0, 0}, 0), "1011000011") << "the last two by themselves";
    EXPECT_EQ(bitsFor({7, 7, 7, 7, 0, 7}, 7), "111101");
    for (unsigned long n : sizes)
        for (unsigned char label : {0, 1, 3, 255})
            for (unsigned long start : {0, 1, 3}) {
                const Labels labels = someLabels(n + start, static_cast<unsigned>(n));
                Words expected(n / 32 + 1);
                for (unsigned long i = 0; i < n; ++i) {
                    const unsigned long four = i / 4 * 4;
                    const auto* group = labels.data() + start + four;
                    if (labels[start + i] == label && !(four + 4 <= n && std::count(group, group + 4, 0) == 4))
                        expected[i / 32] |= 1U << i % 32;
                }
                for (const auto& path : fromLabelsPaths()) {
                    Words words(n / 32 + 1, 0x12345678);
                    if (path.usable) {
                        path.run(words.data(), labels.data() + start, n, label);
                        ASSERT_EQ(words, expected) << path.name << ' ' << n << '+' << start << " label " << int(label);
                    }
                }
            }
}

TEST(KpBitfield, mergesIntoLabelsByPolicy)
{
    const auto merged = [](int policy, bool isSet, unsigned char old, unsigned char label) -> unsigned char {
        const bool isFree = old == 0, isOwn = isFree || old == label;
        const bool writes[] = {false, isSet, isSet && isFree, true, isOwn};
        return !writes[policy] ? old : isSet ? label : 0;
    };
    for (unsigned long n : sizes)
        for (int policy = KpBitfield::INSERT_SET; policy <= KpBitfield::INSERT_OWN; ++policy)
            for (unsigned char label : {0, 2, 200})
                for (const auto& path : toLabelsPaths()) {
                    const unsigned long start = n % 4;
                    const KpBitfield field = someField(n, static_cast<unsigned>(n + label) % 6);
                    const Bits bits = bitsOf(field);
                    Labels labels = someLabels(n + start, 3), expected = labels;
                    for (unsigned long i = 0; i < n; ++i)
                        expected[start + i] = merged(policy, bits[i], labels[start + i], label);
                    if (path.usable) {
                        path.run(KpBitfield::InsertPolicy(policy))(field.data(), labels.data() + start, n, label);
                        ASSERT_EQ(labels, expected) << path.name << ' ' << n << ' ' << policy << ' ' << int(label);
                    }
                }
    KpBitfield field(40, KpBitfield::INIT_SET);
    Labels labels(41, 7);
    field.toLabels(41, labels.data(), 3, KpBitfield::INSERT_SET);
    for (int unknown : {0, 5, -1})
        field.toLabels(40, labels.data(), 3, KpBitfield::InsertPolicy(unknown));
    EXPECT_EQ(labels, Labels(41, 7));
    field.toLabels(39, labels.data(), 3, KpBitfield::INSERT_SET);
    EXPECT_TRUE(labels[38] == 3 && labels[39] == 7);
}

TEST(KpBitfield, filesHoldTheBytesOfTheBits)
{
    const std::string path = testing::TempDir() + "bitfield";
    for (unsigned long n : {0, 1, 8, 9, 32, 100}) {
        const KpBitfield field = someField(n, 4);
        ASSERT_TRUE(field.save(path.c_str()));
        const auto* bytes = reinterpret_cast<const char*>(field.data());
        EXPECT_EQ(textOf(path.c_str()), std::string(bytes, bytes + (n + 7) / 8));
        KpBitfield loaded(300, KpBitfield::INIT_SET);
        ASSERT_TRUE(loaded.load(path.c_str(), n));
        EXPECT_EQ(loaded, field);
    }
    KpBitfield field(300, KpBitfield::INIT_SET), expected(150, KpBitfield::INIT_UNSET);
    std::ofstream(path) << "\xFF\x01";
    expected.setRange(0, 8);
    EXPECT_FALSE(field.load(path.c_str(), 150)) << "too short";
    EXPECT_EQ(wordsOf(field), wordsOf(expected));
    std::remove(path.c_str());
    field.setAll();
    EXPECT_FALSE(field.load(path.c_str(), 96));
    EXPECT_EQ(wordsOf(field), Words(4, 0));
    EXPECT_FALSE(field.save("/no/such/folder/bitfield"));
    EXPECT_FALSE(KpBitfield(1 << 20, KpBitfield::INIT_SET).save("/dev/full"));
}

TEST(KpBitfield, digestTakesAQuarterOfTheBitsAndTheLastWord)
{
    for (unsigned long n : {1, 31, 32, 33, 64, 1000, 1024}) {
        KpBitfield field = someField(n, 4);
        const BitWord last = field.data()[n / 32] & (n % 32 ? (1U << n % 32) - 1 : ~0U);
        EXPECT_EQ(digestOf(field), digestOfBytes(field.data(), static_cast<unsigned>(n / 32), &last, 4)) << n;
    }
    EXPECT_EQ(digestOf(KpBitfield()), "D41D8CD98F00B204E9800998ECF8427E") << "RFC 1321: of no bytes";
}

TEST(KpBitfield, exhaustedMemoryLeavesTheFieldAsItWas)
{
    KpBitfield field = someField(100, 4);
    const Words words = wordsOf(field);
    const KpBitfield large(5000, KpBitfield::INIT_SET);
    Labels labels(5000, 1);
    const auto check = [&] {
        if (field.nBits() != 5000) {
            EXPECT_TRUE(field.nBits() == 100 && wordsOf(field) == words);
        } else {
            field.resize(100, KpBitfield::INIT_NONE);
            std::copy(words.begin(), words.end(), field.data());
        }
    };
    kplib::test::failAtEachAllocation([&] { field.resize(5000, KpBitfield::INIT_SET); }, check);
    kplib::test::failAtEachAllocation([&] { field = large; }, check);
    kplib::test::failAtEachAllocation([&] { field.fromLabels(5000, labels.data(), 1); }, check);
    EXPECT_THROW(field.resize(~0UL, KpBitfield::INIT_SET), KpMemoryException);
    check();
}
