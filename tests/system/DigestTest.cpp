#include <kplib/kplib.h>
#include <kplib/system/detail/CoderKernels.h>

#include <array>
#include <bit>
#include <cmath>
#include <gtest/gtest.h>
#include <random>
#include <sys/resource.h>

using namespace KpLib;
using namespace kplib::detail;

namespace {

using Bytes = std::vector<unsigned char>;

Bytes noise(long size)
{
    static std::mt19937 random(5);
    Bytes bytes(static_cast<size_t>(size));
    std::generate(bytes.begin(), bytes.end(), [] { return static_cast<unsigned char>(random()); });
    return bytes;
}

/// Every short one, then some.
long nextLength(long n)
{
    return n < 300 ? n + 1 : 4 * n + 3;
}

// The definition, bit by bit.
std::uint32_t crcOfBits(std::uint32_t crc, const unsigned char* data, long n)
{
    for (long i = 0; i < 8 * n; ++i) {
        const bool bit = data[i / 8] >> (7 - i % 8) & 1, top = crc >> 31;
        crc = crc << 1 ^ (bit != top ? 0x04C11DB7 : 0);
    }
    return crc;
}

TEST(Crc, ofEveryPathEqualsTheDefinition)
{
    for (long n = 0; n < 1500000; n = nextLength(n)) {
        const long start = n % 17;
        const Bytes bytes = noise(start + n);  // of exact size, so that a read past the end shows
        const auto before = static_cast<std::uint32_t>(n * 0x9E3779B9);
        const std::uint32_t expected = crcOfBits(before, bytes.data() + start, n);
        for (const auto& path : crcPaths())
            ASSERT_TRUE(!path.usable || path.run(before, bytes.data() + start, n) == expected) << path.name << ' ' << n;
    }
}

TEST(Crc, takesTheLengthInAndIsInverted)
{
    const Bytes bytes = noise(0x10203);
    const std::pair<unsigned, Bytes> cases[] = {{0, {}}, {255, {255}}, {256, {0, 1}}, {0x10203, {3, 2, 1}}};
    for (const auto& [n, length] : cases) {
        const std::uint32_t crc = crcOfBits(0, bytes.data(), n);
        EXPECT_EQ(KpCoder::crc(bytes.data(), n), ~crcOfBits(crc, length.data(), static_cast<long>(length.size())));
    }
}

// RFC 1321, step by step.
MD5 reference(std::string bytes)
{
    static constexpr int shifts[4][4] = {{7, 12, 17, 22}, {5, 9, 14, 20}, {4, 11, 16, 23}, {6, 10, 15, 21}};
    static const auto sines = [] {
        std::array<std::uint32_t, 64> table{};
        for (int i = 0; i < 64; ++i)
            table[i] = static_cast<std::uint32_t>(0x1p32 * std::abs(std::sin(i + 1.0)));
        return table;
    }();
    const std::uint64_t bits = 8 * bytes.size();
    bytes += '\x80';
    bytes.resize((bytes.size() + 8 + 63) / 64 * 64 - 8);
    bytes.append(reinterpret_cast<const char*>(&bits), 8);
    std::uint32_t state[4] = {0x67452301, 0xEFCDAB89, 0x98BADCFE, 0x10325476};
    for (size_t block = 0; block < bytes.size(); block += 64) {
        std::uint32_t words[16], a = state[0], b = state[1], c = state[2], d = state[3];
        std::memcpy(words, bytes.data() + block, 64);
        for (int i = 0; i < 64; ++i) {
            const std::uint32_t mixed[] = {(b & c) | (~b & d), (b & d) | (c & ~d), b ^ c ^ d, c ^ (b | ~d)};
            const int word[] = {i, 5 * i + 1, 3 * i + 5, 7 * i}, round = i / 16;
            const std::uint32_t sum = a + mixed[round] + words[word[round] % 16] + sines[i];
            a = std::exchange(d, std::exchange(c, std::exchange(b, b + std::rotl(sum, shifts[round][i % 4]))));
        }
        for (const auto& [sum, term] : {std::pair(&state[0], a), {&state[1], b}, {&state[2], c}, {&state[3], d}})
            *sum += term;
    }
    MD5 digest;
    std::memcpy(digest.data(), state, sizeof state);
    return digest;
}

std::string hex(const MD5& digest)
{
    KpString text;
    digest.toString(text);
    return text.c_str();
}

template <typename T>
std::string image(const T& value)
{
    return std::string(reinterpret_cast<const char*>(&value), sizeof value);
}

TEST(KpCoder, givesTheMD5OfPiecesOfAnySize)
{
    std::mt19937 random(8);
    KpCoder coder;
    MD5 digest;
    for (long n = 0; n < 1500000; n = nextLength(n)) {
        const Bytes bytes = noise(n);
        coder.crcMD5Init();
        for (long done = 0, size = 0; done < n; done += size) {
            size = std::min<long>(n - done, random() % (random() % 4 ? 70 : 5000));
            coder.crcMD5Update(bytes.data() + done, static_cast<unsigned int>(size));
        }
        coder.crcMD5Final();
        coder.crcMD5Query(digest.data());
        ASSERT_EQ(digest, reference(std::string(bytes.begin(), bytes.end()))) << n;
    }
}

TEST(MD5Coder, countsBeyond32Bits)
{
    const std::string piece(1 << 20, 'x');
    MD5Coder coder;
    for (int i = 0; i < 513; ++i)  // a little more than 2^32 bits
        coder.append(piece.data(), piece.size());
    // head -c 513M /dev/zero | tr '\0' x | md5sum
    EXPECT_EQ(hex(coder.md5()), "7B73C90BAF10FA478814023B4F869C29");
}

TEST(Hex, ofEveryPathEqualsPrintfAndReadsBack)
{
    for (const long n : {0, 1, 15, 17, 33, 65, 1001}) {
        const Bytes bytes = noise(n);
        for (const bool upperCase : {true, false}) {
            KpString expected, digits, text("before");
            for (const unsigned char byte : bytes) {
                digits.printf(upperCase ? "%02X" : "%02x", byte);
                expected += digits;
            }
            for (const auto& path : hexPaths()) {
                std::string written(2 * n, ' ');
                if (path.usable)
                    path.run(bytes.data(), written.data(), n, upperCase ? 'A' : 'a');
                EXPECT_TRUE(!path.usable || expected == written.c_str()) << path.name << ' ' << n;
            }
            KpCoder::dataToHexString(bytes.data(), static_cast<unsigned int>(n), text, upperCase);
            EXPECT_EQ(text, expected);
            Bytes back(n);
            KpCoder::hexStringToData(back.data(), text);
            EXPECT_EQ(back, bytes);
        }
    }
}

TEST(Hex, takesAnyCharacterUntilTheNul)
{
    const std::pair<const char*, Bytes> cases[] = {{"aFA", {0xAF, 7}}, {"G0/1", {0x00, 0xF1}}, {"1g@z", {0x20, 0x23}}};
    for (const auto& [text, expected] : cases) {
        Bytes bytes(2, 7);
        KpCoder::hexStringToData(bytes.data(), text);
        EXPECT_EQ(bytes, expected) << text;
    }
}

TEST(MD5, isNullUnlessItsTextHas32Characters)
{
    const char* const text = "0123456789ABCDEFFEDCBA9876543210";
    MD5 digest;
    digest.fromString(text);
    EXPECT_EQ(hex(digest), text);
    for (const std::string& other : {std::string(31, 'A'), std::string(33, 'A')}) {
        MD5 wrong = digest;
        wrong.fromString(other.c_str());
        EXPECT_TRUE(wrong.isNull()) << other;
    }
}

TEST(MD5List, hashesFromTheBackWhatItHoldsNow)
{
    std::vector<MD5> ascending(5);  // each of these bytes counts more than the one before, whatever that is
    for (int i = 1; i < 5; ++i)
        ascending[i].data()[std::array{0, 8, 15, 0, 7}[i]] = static_cast<unsigned char>(8 - i);
    MD5List inOrder(true), asGiven;
    std::string backwards;
    for (const int i : {3, 1, 4, 0, 2}) {
        for (int j = 0; j < 5; ++j)
            EXPECT_EQ(MD5::compare(ascending[i], ascending[j]), i < j ? -1 : i > j) << i << ' ' << j;
        inOrder.insert(ascending[i]);
        asGiven.insert(ascending[i]);
        backwards.insert(0, image(ascending[i]));
        EXPECT_EQ(asGiven.hash(), reference(backwards));
        EXPECT_EQ(asGiven.hash(), reference(backwards));  // the cached one
    }
    EXPECT_TRUE(std::equal(ascending.begin(), ascending.end(), inOrder.items().begin()));
    EXPECT_NE(inOrder.hash(), asGiven.hash());
}

TEST(MD5Coder, takesTheBytesOfValues)
{
    MD5Coder coder;
    std::string bytes;
    const auto take = [&](const auto&... values) { ((coder << values, bytes += image(values)), ...); };
    take('a', static_cast<unsigned char>(200), short(-2), static_cast<unsigned short>(3), -1, 2U, 0.5F);
    take(1L, 2UL, -3LL, 4ULL, KpVec2i(1, 2), KpVec2f(1, 2), KpUniqueID(77), KpVec3i(1, 2, 3), KpVec3f(1, 2, 3));
    take(KpVec4f(1, 2, 3, 4), KpPlane(KpVec3f(0, 0, 1), 5), reference("x"), KpVec3l(1, 2, 3));
    take(KpBox3i(1, 2, 3, 4, 5, 6), KpBox3f(1, 2, 3, 4, 5, 6), KpMat3f::identity(), KpMat4f::identity());
    MD5List list;
    list.insert(reference("y"));
    coder << list;
    EXPECT_EQ(coder.md5(), reference(bytes + image(list.hash())));
}

TEST(MD5Coder, framesTextsAndTellsEmptyBlocks)
{
    const std::string withNul("a\0b", 3);
    const std::pair<MD5, std::string> cases[] = {
        {(MD5Coder() << KpString("ab")).md5(), image(3L) + std::string("ab", 3)},
        {(MD5Coder() << KpString(KpString::NoMemory())).md5(), image(0L)},
        {(MD5Coder() << static_cast<const char*>(nullptr)).md5(), image(1L) + std::string(1, '\0')},
        {(MD5Coder() << withNul).md5(), image(3L) + withNul},
        {(MD5Coder() << std::string()).md5(), image(0L)},
        {MD5Coder().append("abc", 3).md5(), "abc"},
        {MD5Coder().append(nullptr, 0).md5(), image(4711)}};
    for (const auto& [digest, bytes] : cases)
        EXPECT_EQ(hex(digest), hex(reference(bytes))) << testing::PrintToString(bytes);
    MD5Coder coder;
    coder << 1;
    EXPECT_EQ(coder.md5(), coder.md5());
    coder << 2;
    EXPECT_EQ(coder.md5(), reference(image(2))) << "the run after the digest is another one";
}

TEST(KpUUID, goesThroughItsTexts)
{
    KpUUID uuid;
    uuid.fromString("0123456789ABCDEFfedcba9876543210");
    EXPECT_EQ(kp_hash(uuid), 0x10325476U);
    const std::string formatted = "{01234567-89AB-CDEF-FEDC-BA9876543210}";
    EXPECT_EQ(uuid.toFormattedString(), formatted.c_str());
    KpUUID back;
    back.fromFormattedString(formatted.c_str());
    EXPECT_EQ(back, uuid);
    for (const size_t place : {0, 9, 14, 19, 24, 37, 38}) {
        std::string wrong = formatted + (place == 38 ? "}" : "");
        wrong[place] = '0';
        back.fromFormattedString(wrong.c_str());
        EXPECT_EQ(back, KpUUID()) << wrong;
    }
}

TEST(KpUUID, isRandomOrZeroWithoutASource)
{
    KpUUID any;
    for (int i = 0; i < 64; ++i) {
        const KpUUID uuid = KpUUID::generateUUID();
        for (int k = 0; k < 16; ++k)
            any.data()[k] |= uuid.data()[k];
    }
    EXPECT_EQ(any.toString(), std::string(32, 'F').c_str()) << "bits that are never set";

    rlimit before{};
    getrlimit(RLIMIT_NOFILE, &before);
    const rlimit none{0, before.rlim_max};
    setrlimit(RLIMIT_NOFILE, &none);
    KpID_C<KpUUID> id;
    id.valueSet(KpUUID::generateUUID());
    setrlimit(RLIMIT_NOFILE, &before);
    EXPECT_FALSE(id.isValid());
}

}  // namespace
