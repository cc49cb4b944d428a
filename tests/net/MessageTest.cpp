#include <kplib/net/TmMsg.h>

#include <kplib/foundation/KpFrameID.h>
#include <kplib/foundation/KpRemotificationID.h>
#include <kplib/foundation/KpTransferID.h>
#include <kplib/foundation/KpUniqueID.h>
#include <kplib/foundation/TmSessionContextID.h>
#include <kplib/geometry/KpBox2f.h>
#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpBox3i.h>
#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec2i.h>
#include <kplib/geometry/KpVec3i.h>
#include <kplib/geometry/KpVec3l.h>
#include <kplib/geometry/KpVec4f.h>
#include <kplib/geometry/KpVec4i.h>
#include <kplib/imaging/KpColor.h>
#include <kplib/log/KpResult.h>
#include <kplib/rawdata/KpTypedData2D.h>
#include <kplib/system/KpFilename.h>
#include <kplib/system/KpMD5.h>
#include <kplib/volume/KpBitfield.h>

#include "support/LogCapture.h"

#include <gtest/gtest.h>

#include <numeric>
#include <random>

namespace {

using kplib::test::LogCapture;

/// The bytes of a message in hexadecimal, zeros behind the last other byte of each group of four left as they are.
std::string hex(const TmMsg& msg)
{
    std::string text;
    for (unsigned long i = 0; i < msg.size(); ++i) {
        constexpr const char* digits = "0123456789abcdef";
        text += digits[msg.dataPtr()[i] >> 4];
        text += digits[msg.dataPtr()[i] & 15];
    }
    return text;
}

template <typename... Values>
std::string wire(const Values&... values)
{
    TmMsg msg;
    (msg << ... << values);
    return hex(msg);
}

template <typename T>
KpDArray<T> arrayOf(std::initializer_list<T> items)
{
    return KpDArray<T>(items);
}

const std::string one = "0000803f", two = "00000040", three = "00004040", four = "00008040";  // floats

TEST(Message, valuesAreTheirBytesInMemory)
{
    EXPECT_EQ(wire(static_cast<unsigned char>(0xfe), true, false, static_cast<unsigned short>(0x1234)), "fe01003412");
    EXPECT_EQ(wire(-2, 0x01020304U, 1.0F), "feffffff"
                                           "04030201" +
                                               one);
    EXPECT_EQ(wire(-2L, -3LL, 0x0102030405060708ULL, 1.0), "feffffffffffffff"
                                                           "fdffffffffffffff"
                                                           "0807060504030201"
                                                           "000000000000f03f");
    EXPECT_EQ(wire(KpVec2i(1, 2), KpVec3i(3, 4, 5), KpVec4i(6, 7, 8, 9)), "0100000002000000"
                                                                          "030000000400000005000000"
                                                                          "06000000070000000800000009000000");
    EXPECT_EQ(wire(KpVec2f(1, 2), KpVec3f(1, 2, 3), KpVec4f(1, 2, 3, 4), KpVec3l(1, -1, 2)),
              one + two + one + two + three + one + two + three + four +
                  "0100000000000000"
                  "ffffffffffffffff"
                  "0200000000000000");
    EXPECT_EQ(wire(KpColor(1, 2, 3)), one + two + three);
    KpPlane plane;
    plane.setNormal(KpVec3f(1, 2, 3));
    plane.setDistanceFromOrigin(4);
    EXPECT_EQ(wire(plane), one + two + three + four);
    EXPECT_EQ(wire(KpRotation::identity()), "000000000000000000000000" + one);
    EXPECT_EQ(wire(KpBox2f(1, 2, 3, 4)), one + two + three + four);
    EXPECT_EQ(wire(KpBox3f(1, 2, 1, 3, 1, 4)), one + two + one + three + one + four);
    EXPECT_EQ(wire(KpBox3i(1, 2, 3, 4, 5, 6)), "010000000200000003000000040000000500000006000000");
    KpMat4f matrix;
    matrix.makeIdentity();
    matrix[0][1] = 2;  // lies second in memory
    EXPECT_EQ(wire(matrix).substr(0, 24), one + two + "00000000");
    EXPECT_EQ(wire(matrix).size(), 128U);
    EXPECT_EQ(wire(KpPrimType(KpPrimType::UShort)), "07000000");
    KpLib::MD5 digest;
    std::iota(digest.data(), digest.data() + 16, static_cast<unsigned char>(0));
    EXPECT_EQ(wire(digest), "000102030405060708090a0b0c0d0e0f");
    EXPECT_EQ(wire(KpUniqueID(1), KpTransferID(2), KpFrameID(3)), "010000000000000002000000000000000300000000000000");
    EXPECT_EQ(wire(KpRemotificationID(4), TmSessionContextID(5)), "0400000005000000");
}

TEST(Message, theFourTextFormsDiffer)
{
    EXPECT_EQ(wire("ab", ""), "03000000616200"
                              "0100000000");
    EXPECT_EQ(wire(static_cast<const char*>(nullptr)), "00000000");
    EXPECT_EQ(wire(std::string("a\0b", 3), std::string()), "03000000610062"
                                                           "00000000");
    EXPECT_EQ(wire(KpString(std::string_view("a\0b", 3)), KpString(KpString::NoMemory{}), KpFilename("/c")), "6100"
                                                                                                             "00"
                                                                                                             "2f6300");
    char ab[] = "ab";
    EXPECT_EQ(wire(arrayOf<char*>({ab, nullptr})), "02000000"
                                                   "03000000616200"
                                                   "00000000");

    TmMsg msg;
    msg << "ab" << static_cast<const char*>(nullptr) << std::string("a\0b", 3) << KpString("k") << KpFilename("/f")
        << arrayOf<char*>({ab, nullptr}) << -1;
    char* text = nullptr;
    char* null = ab;
    std::string bytes;
    KpString string;
    KpFilename name;
    KpDArray<char*> texts;
    texts.append(ab);
    msg >> text >> null >> bytes >> string >> name >> texts;
    EXPECT_STREQ(text, "ab");
    EXPECT_EQ(text, reinterpret_cast<char*>(msg.dataPtr()) + 4);  // no copy
    EXPECT_EQ(null, nullptr);
    EXPECT_EQ(bytes, std::string("a\0b", 3));
    EXPECT_TRUE(string == "k" && name == "/f");
    ASSERT_EQ(texts.size(), 2);
    EXPECT_STREQ(texts[0], "ab");
    EXPECT_EQ(texts[1], nullptr);
    msg >> texts;  // a count below 1
    EXPECT_EQ(texts.size(), 0);
    EXPECT_EQ(msg.bytesAvailable(), 0U);
}

TEST(Message, arraysAreACountAndOneBlock)
{
    EXPECT_EQ(wire(arrayOf<unsigned char>({1, 2}), arrayOf<bool>({true, false})), "020000000102"
                                                                                  "020000000100");
    EXPECT_EQ(wire(arrayOf<int>({1}), arrayOf<long>({-1}), arrayOf<float>({})), "0100000001000000"
                                                                                "01000000ffffffffffffffff"
                                                                                "00000000");
    EXPECT_EQ(wire(arrayOf<KpVec3f>({{1, 2, 3}})), "01000000" + one + two + three);
}

template <typename T>
void goesRound(std::mt19937& random)
{
    KpDArray<T> sent, received;
    sent.resize(static_cast<long>(random() % 50));
    auto* bytes = reinterpret_cast<unsigned char*>(sent.data());
    for (unsigned long i = 0; i < static_cast<unsigned long>(sent.size()) * sizeof(T); ++i)
        bytes[i] = static_cast<unsigned char>(std::is_same_v<T, bool> ? random() & 1 : random());
    TmMsg msg;
    msg << static_cast<unsigned char>(7) << sent;  // unaligned
    unsigned char first = 0;
    msg >> first >> received;
    EXPECT_EQ(msg.bytesAvailable(), 0U);
    ASSERT_EQ(received.size(), sent.size());
    EXPECT_TRUE(sent.size() == 0 ||
                std::memcmp(sent.data(), received.data(), static_cast<unsigned long>(sent.size()) * sizeof(T)) == 0);
    if constexpr (kplib::detail::WireValue<T>) {
        for (const T& value : sent)
            msg << value;
        for (const T& value : sent) {
            T copy;
            msg >> copy;
            EXPECT_EQ(std::memcmp(&copy, &value, sizeof(T)), 0);
        }
    }
}

template <typename... Elements>
void allGoRound()
{
    std::mt19937 random(6);
    for (int i = 0; i < 20; ++i)
        (goesRound<Elements>(random), ...);
}

TEST(Message, arraysAndValuesGoRound)
{
    allGoRound<unsigned char, bool, int, float, double, long, long long, KpVec2f, KpVec3i, KpVec3f, KpVec4f, KpPlane,
               KpLine, KpMat4f>();
}

TEST(Message, compositesHaveTheirForms)
{
    const LogCapture quiet;
    EXPECT_EQ(wire(KpResult()), "00000000");
    const KpResult failure(KpResult::InternalError, "a", "");
    EXPECT_EQ(wire(failure), "02000000"
                             "020000006100"
                             "0f000000"
                             "696e7465726e616c206572726f7200");
    TmMsg byHand;
    byHand << 2 << "a"
           << "";
    KpResult read;
    byHand >> read;
    EXPECT_STREQ(read.data(), "internal error");
    EXPECT_EQ(read.code(), KpResult::InternalError);
    TmMsg success;
    success << 0;
    success >> read;
    EXPECT_TRUE(read.isOk());

    for (const unsigned bits : {0U, 1U, 31U, 32U, 33U, 64U}) {
        const KpBitfield field(bits, KpBitfield::INIT_SET);
        TmMsg msg;
        msg << field;
        EXPECT_EQ(msg.size(), 4 + (bits ? bits / 32 + 1 : 0) * 4);
        KpBitfield copy(7, KpBitfield::INIT_SET);
        msg >> copy;
        EXPECT_TRUE(copy == field && copy.nWords() == field.nWords());
    }

    TmMsg inner, outer, back;
    inner << 5;
    inner.reset(4);
    int skipped = 0;
    inner >> skipped;
    outer << inner << 6;
    EXPECT_EQ(hex(outer).substr(0, 40), "77660000"
                                        "77660000"
                                        "77660000"
                                        "77660000"
                                        "04000000");
    int after = 0, content = 0;
    outer >> back >> after;
    back >> content;
    EXPECT_TRUE(content == 5 && after == 6);
}

TEST(Message, imagesLoseTheirGaps)
{
    unsigned char pixels[] = {1, 2, 99, 3, 4, 99};
    const KpTypedData2D image(2, 2, 1, 3, KpTypedPointer(pixels), 1);
    EXPECT_EQ(wire(image), "01000000"
                           "00000000"
                           "02000000"
                           "02000000"
                           "01020304");
    TmMsg msg;
    msg << image << KpTypedData2D();
    KpTypedData2D copy, none(2, 2, KpPrimType::Byte, 1);
    msg >> copy >> none;
    EXPECT_TRUE(copy.isContiguous() && copy.dims()[0] == 2 && copy.dims()[1] == 2);
    EXPECT_EQ(std::memcmp(copy.data(), "\1\2\3\4", 4), 0);
    EXPECT_EQ(none.data(), nullptr);
    EXPECT_EQ(none.dims()[0], 0);
}

TEST(Message, anArrayThatIsNotThereIsOneErrorLine)
{
    const LogCapture log(KpLogError);
    TmMsg msg;
    msg << 100U << 7;
    KpDArray<int> array;
    array.append(42);
    msg >> array;
    EXPECT_EQ(array.size(), 100);
    EXPECT_EQ(array[0], 42);
    EXPECT_EQ(msg.readOffset(), 404U);
    ASSERT_EQ(LogCapture::lines().size(), 1U);
    EXPECT_NE(LogCapture::lines()[0].find("Buffer overrun in TmMsg::readKpDArray(), offset=4, numBytes=400, size=8"),
              std::string::npos);
}

TEST(Message, nothingIsReadBeyondTheEnd)
{
    const LogCapture quiet;
    for (const unsigned count : {2U, 0x7fffffffU, 0x80000000U, 0xffffffffU}) {
        TmMsg cut;
        cut << count << static_cast<unsigned char>('x');
        TmMsg forText(cut), forBytes(cut), forTexts(cut), forField(cut);
        char* text = nullptr;
        std::string bytes = "old";
        KpDArray<char*> texts;
        KpBitfield field(3, KpBitfield::INIT_SET);
        forText >> text;
        forBytes >> bytes;
        forTexts >> texts;
        forField >> field;
        EXPECT_EQ(text, nullptr);
        EXPECT_EQ(bytes, "");
        EXPECT_EQ(texts.size(), 0);
        EXPECT_EQ(field.nBits(), 0U);
    }
    for (const int width : {-1, 3, 0x7fffffff}) {
        TmMsg msg;
        msg << 2 << 4 << width << 3;
        KpTypedData2D image(1, 1, KpPrimType::Byte, 1);
        msg >> image;
        EXPECT_EQ(image.data(), nullptr);
    }
    TmMsg msg;
    msg << static_cast<unsigned char>('x');
    KpString text("old");
    int number = 5;
    msg >> text >> number;
    EXPECT_TRUE(text == "x");
    EXPECT_EQ(number, 0);
    TmMsg odd;
    odd << arrayOf<unsigned char>({2, 0});
    KpDArray<bool> bools;
    odd >> bools;  // a byte of 2 is a true like others
    EXPECT_TRUE(bools[0] == true && bools[1] == false);
}

TEST(Message, bytesOfOthersAreNeitherFreedNorWritten)
{
    unsigned char bytes[4] = {1, 0, 0, 0};
    TmMsg msg(4, bytes);
    msg.setMarked(1, true);
    int number = 0;
    msg >> number;
    EXPECT_EQ(number, 1);
    TmMsg copy(msg);
    EXPECT_TRUE(copy == msg && copy.isMarked(1) && !copy.isMarked(0));
    EXPECT_NE(copy.dataPtr(), bytes);
    msg << 2;  // has to grow: moves to storage of its own
    msg >> number;
    EXPECT_EQ(number, 2);
    EXPECT_FALSE(copy == msg);

    TmMsg foreign(4, bytes), other;
    other << 9 << 8;
    foreign >> number;
    foreign.take(other);  // reads on at its old offset
    foreign >> number;
    EXPECT_EQ(number, 8);
    EXPECT_EQ(other.dataPtr(), bytes);
    other = foreign;
    EXPECT_EQ(bytes[0], 1);
    EXPECT_EQ(other.readOffset(), 0U);
    other >> number;
    EXPECT_EQ(number, 9);

    const unsigned char* storage = other.dataPtr();
    other.reset(0);
    EXPECT_TRUE(other.size() == 0 && other.dataPtr() == storage);
    other << arrayOf<unsigned char>({1, 2, 3});
    other.writeRawBytes(other.size(), other.dataPtr());  // its own bytes, with a growth
    EXPECT_EQ(hex(other), "0300000001020303000000010203");
}

TEST(Message, printShowsNothingOfIt)
{
    const LogCapture log;
    TmMsg msg;
    msg << 1;
    msg.print("title");
    msg.print(nullptr);
    EXPECT_EQ(LogCapture::lines().size(), 5U);
    EXPECT_NE(LogCapture::lines()[0].find("TmMsg"), std::string::npos);
}

}  // namespace
