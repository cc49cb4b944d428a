#include <kplib/kplib.h>

#include "support/LogCapture.h"

#include <gtest/gtest.h>

#include <numeric>

namespace {

using kplib::test::Lines, kplib::test::LogCapture;

/// The bytes of a message in hexadecimal.
std::string hex(const TmMsg& msg)
{
    KpString text;
    KpCoder::dataToHexString(msg.dataPtr(), static_cast<unsigned>(msg.size()), text, false);
    return text.c_str();
}

template <typename... Values>
std::string wire(const Values&... values)
{
    TmMsg msg;
    (msg << ... << values);
    return hex(msg);
}

TEST(Message, valuesAreTheirBytesInMemory)
{
    EXPECT_EQ(wire(static_cast<unsigned char>(0xfe), true, false, static_cast<unsigned short>(0x1234)), "fe01003412");
    EXPECT_EQ(wire(-2, 0x01020304U, 1.0F), "feffffff040302010000803f");
    EXPECT_EQ(wire(-2L, -3LL), "fefffffffffffffffdffffffffffffff");
    EXPECT_EQ(wire(0x0102030405060708ULL, 1.0), "0807060504030201000000000000f03f");
    EXPECT_EQ(wire(KpVec2i(1, 2), KpVec4i(3, 4, 5, 6), KpBox3i(1, 2, 3, 4, 5, 6)),
              wire(1, 2, 3, 4, 5, 6, 1, 2, 3, 4, 5, 6));
    EXPECT_EQ(wire(KpColor(1, 2, 3), KpBox2f(4, 5, 6, 7), KpBox3f(1, 2, 1, 3, 1, 4), KpRotation::identity()),
              wire(1.F, 2.F, 3.F, 4.F, 5.F, 6.F, 7.F, 1.F, 2.F, 1.F, 3.F, 1.F, 4.F, 0.F, 0.F, 0.F, 1.F));
    EXPECT_EQ(wire(KpUniqueID(1), KpTransferID(2), KpFrameID(3), KpVec3l(4, 5, 6)), wire(1L, 2L, 3L, 4L, 5L, 6L));
    EXPECT_EQ(wire(KpRemotificationID(4), TmSessionContextID(5), KpPrimType(KpPrimType::UShort)), wire(4, 5, 7));
    KpPlane plane;
    plane.setNormal(KpVec3f(1, 2, 3));
    plane.setDistanceFromOrigin(4);
    KpLine line;
    line.setPosDir(KpVec3f(1, 2, 3), KpVec3f(0, 0, 1));
    EXPECT_EQ(wire(plane, line), wire(1.F, 2.F, 3.F, 4.F, 1.F, 2.F, 3.F, 0.F, 0.F, 1.F));
    KpLib::MD5 digest;
    std::iota(digest.data(), digest.data() + 16, static_cast<unsigned char>(0));
    EXPECT_EQ(wire(digest), "000102030405060708090a0b0c0d0e0f");
    EXPECT_EQ(wire(KpDArray<bool>{true, false}, KpDArray<long>{-1}), "02000000010001000000ffffffffffffffff");
}

TEST(Message, theFourTextFormsDiffer)
{
    EXPECT_EQ(wire("ab", ""), "030000006162000100000000");
    EXPECT_EQ(wire(std::string("a\0b", 3), std::string()), "0300000061006200000000");
    EXPECT_EQ(wire(KpString(std::string_view("a\0b", 3)), KpString(KpString::NoMemory{}), KpFilename("/c")),
              "6100002f6300");
    char ab[] = "ab";
    EXPECT_EQ(wire(KpDArray<char*>{ab, nullptr}), "020000000300000061620000000000");

    TmMsg msg;
    msg << "ab" << static_cast<const char*>(nullptr) << std::string("a\0b", 3) << KpString("k") << KpFilename("/f")
        << KpDArray<char*>{ab, nullptr} << -1;
    char *text = nullptr, *null = ab;
    std::string bytes;
    KpString string;
    KpFilename name;
    KpDArray<char*> texts{ab};
    msg >> text >> null >> bytes >> string >> name >> texts;
    EXPECT_STREQ(text, "ab");
    EXPECT_EQ(text, reinterpret_cast<char*>(msg.dataPtr()) + 4);  // no copy
    EXPECT_EQ(null, nullptr);
    EXPECT_EQ(bytes, std::string("a\0b", 3));
    EXPECT_EQ(std::tuple(string, name), std::tuple("k", "/f"));
    ASSERT_EQ(texts.size(), 2);
    EXPECT_STREQ(texts[0], "ab");
    EXPECT_EQ(texts[1], nullptr);
    msg >> texts;  // a count below 1
    EXPECT_EQ(std::tuple(texts.size(), msg.bytesAvailable()), std::tuple(0, 0));
}

template <typename T>
void goesRound()
{
    unsigned char bytes[3 * sizeof(T)];
    for (unsigned long i = 0; i < sizeof bytes; ++i)
        bytes[i] = static_cast<unsigned char>(std::is_same_v<T, bool> ? i % 2 : 251 * i + 1);
    KpDArray<T> sent, received;
    sent.resize(3);
    std::memcpy(static_cast<void*>(sent.data()), bytes, sizeof bytes);
    TmMsg msg;
    msg << static_cast<unsigned char>(7) << sent << sent[2];  // unaligned
    EXPECT_EQ(std::memcmp(msg.dataPtr() + 5, bytes, sizeof bytes), 0);
    unsigned char first = 0;
    T value;
    msg >> first >> received >> value;
    ASSERT_EQ(received.size(), 3);
    EXPECT_EQ(std::memcmp(received.data(), bytes, sizeof bytes), 0);
    EXPECT_EQ(std::memcmp(&value, bytes + 2 * sizeof(T), sizeof(T)), 0);
    EXPECT_EQ(msg.bytesAvailable(), 0U);
}

TEST(Message, arraysAndValuesGoRound)
{
    kplib::detail::WireElements::forEach([]<typename T>() { goesRound<T>(); });
}

TEST(Message, compositesHaveTheirForms)
{
    const LogCapture quiet;
    EXPECT_EQ(wire(KpResult()), "00000000");
    const KpResult failure(KpResult::InternalError, "a", "");
    EXPECT_EQ(wire(failure), "020000000200000061000f000000696e7465726e616c206572726f7200");
    TmMsg byHand;
    byHand << failure.codeValue() << failure.text() << "" << 0;
    KpResult read;
    byHand >> read;
    EXPECT_STREQ(read.data(), "internal error");
    EXPECT_EQ(read.code(), KpResult::InternalError);
    byHand >> read;
    EXPECT_TRUE(read.isOk());

    for (const unsigned bits : {0U, 1U, 31U, 32U, 33U, 64U}) {
        const KpBitfield field(bits, KpBitfield::INIT_SET);
        TmMsg msg;
        msg << field;
        EXPECT_EQ(msg.size(), 4 + (bits ? bits / 32 + 1 : 0) * 4);
        KpBitfield copy(7, KpBitfield::INIT_SET);
        msg >> copy;
        EXPECT_EQ(copy, field);
        EXPECT_EQ(copy.nWords(), field.nWords());
    }

    unsigned char foreign[8] = {};
    TmMsg inner, outer, back(8, foreign);
    int skipped = 0, after = 0, content = 0;
    inner << 5;
    inner >> skipped;  // how far it is read doesn't travel
    outer << inner << 6;
    const std::string marks = "77660000776600007766000077660000", five = "0400000005000000";
    EXPECT_EQ(hex(outer), marks + five + "06000000");
    back >> skipped;
    outer >> back >> after;
    back >> content;
    EXPECT_EQ(std::tuple(content, after, foreign[0]), std::tuple(5, 6, 0));
    inner << inner;
    EXPECT_EQ(hex(inner), "05000000" + marks + five);
}

TEST(Message, imagesLoseTheirGaps)
{
    unsigned char pixels[] = {1, 2, 99, 3, 4, 99};
    const KpTypedData2D image(2, 2, 1, 3, KpTypedPointer(pixels), 1);
    EXPECT_EQ(wire(image), "0100000000000000020000000200000001020304");
    TmMsg msg;
    msg << image << KpTypedData2D();
    KpTypedData2D copy, none(2, 2, KpPrimType::Byte, 1);
    msg >> copy >> none;
    EXPECT_TRUE(copy.isContiguous());
    EXPECT_EQ(wire(copy), wire(image));
    EXPECT_EQ(std::tuple(none.data(), none.dims()[0]), std::tuple(nullptr, 0));
}

TEST(Message, anArrayThatIsNotThereIsOneErrorLine)
{
    const LogCapture log(KpLogError);
    TmMsg msg;
    msg << 100U << 7;
    KpDArray<int> array{42};
    msg >> array;
    EXPECT_EQ(std::tuple(array.size(), array[0], msg.readOffset()), std::tuple(100, 42, 404));
    EXPECT_EQ(LogCapture::lines(),
              Lines{"E [] Buffer overrun in TmMsg::readKpDArray(), offset=4, numBytes=400, size=8"});
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
        EXPECT_EQ(std::tuple(text, bytes, texts.size(), field.nBits()), std::tuple(nullptr, "", 0, 0U));
    }
    for (const auto& [width, height] : {std::pair(-1, 3), {-1, -1}, {3, 3}, {0x7fffffff, 3}}) {
        TmMsg msg;
        msg << 2 << 0 << width << height << 0;
        KpTypedData2D image(1, 1, KpPrimType::Byte, 1);
        msg >> image;
        EXPECT_EQ(std::tuple(image.data(), image.dims()[0], image.dims()[1]), std::tuple(nullptr, 0, 0));
    }
    unsigned char endless[] = {1, 0, 0, 0, 'x', 'y'};
    TmMsg msg(5, endless);  // texts without a NUL
    char* unterminated = nullptr;
    msg >> unterminated;
    EXPECT_EQ(unterminated, nullptr);
    msg.setRawData(1, endless + 4);
    KpString text("old"), none("old");
    int number = 5;
    msg >> text >> none >> number;
    EXPECT_EQ(std::tuple(text, none, number), std::tuple("x", "", 0));
    TmMsg odd;
    odd << KpDArray<unsigned char>{2, 0};
    KpDArray<bool> bools;
    odd >> bools;  // a byte of 2 is a true like others
    EXPECT_EQ(std::tuple(bools[0], bools[1]), std::tuple(true, false));
}

TEST(Message, bytesOfOthersAreNeitherFreedNorWritten)
{
    const unsigned char sent[8] = {1, 0, 0, 0, 2, 0, 0, 0};
    unsigned char bytes[8];
    std::copy_n(sent, 8, bytes);
    TmMsg msg(8, bytes);
    msg.setMarked(1, true);
    int number = 0;
    msg >> number;
    EXPECT_EQ(number, 1);
    const TmMsg copy(msg);
    EXPECT_EQ(copy, msg);
    EXPECT_EQ(std::tuple(copy.isMarked(0), copy.isMarked(1)), std::tuple(false, true));
    EXPECT_NE(copy.dataPtr(), bytes);

    // What appending follows, and what is left of the message before it.
    const std::pair<const char*, void (*)(TmMsg&)> writers[] = {
        {"0100000002000000", [](TmMsg&) {}},
        {"01000000", [](TmMsg& m) { m.resize(4); }},
        {"0100000002000000", [](TmMsg& m) { (m.resize(9), m.resize(8)); }},
        {"", [](TmMsg& m) { m.reset(0); }},
        {"0100000002000000", [](TmMsg& m) { m.reset(8, 100); }},
        {"0400000005000000",
         [](TmMsg& m) {
             TmMsg other;
             other << 4 << 5;
             m.take(other);
             EXPECT_EQ(hex(other), "0100000002000000");
         }},
        {"", [](TmMsg& m) { m = TmMsg(); }},
    };
    for (const auto& [left, write] : writers) {
        TmMsg writer(8, bytes);
        write(writer);
        writer << 9;
        EXPECT_EQ(hex(writer), left + std::string("09000000"));
        EXPECT_EQ(std::memcmp(bytes, sent, 8), 0);
    }
}

TEST(Message, readOffsetAndBytesAreIndependent)
{
    TmMsg msg, other;
    int number = 0;
    msg << 1 << 2;
    other << 3 << 4;
    EXPECT_FALSE(msg == other);
    msg >> number;
    const unsigned char* const storage = msg.dataPtr();
    msg.take(other);  // reads on at its old offset
    EXPECT_EQ(std::tuple(other.dataPtr(), other.readOffset(), msg.readOffset()), std::tuple(storage, 0, 4));
    msg = other;
    EXPECT_EQ(hex(msg), hex(other));
    EXPECT_EQ(msg.readOffset(), 4);
    EXPECT_FALSE(msg == other);
    other >> number;
    EXPECT_EQ(number, 1);
    EXPECT_EQ(msg, other);

    other.reset(0);
    EXPECT_EQ(std::tuple(other.dataPtr(), other.readOffset(), other.size()), std::tuple(storage, 0, 0));
    msg.reset(4, 100);
    EXPECT_EQ(hex(msg), "01000000");
    EXPECT_EQ(msg.readOffset(), 0);
    for (int i = 0; i < 10; ++i)  // its own bytes, also where they move with a growth
        other.writeRawBytes(i ? other.size() : 4, i ? other.dataPtr() : msg.dataPtr());
    EXPECT_EQ(other.size(), 2048U);
    for (int i = 0; i < 512; ++i) {
        other >> number;
        EXPECT_EQ(number, 1);
    }
    unsigned char bytes[] = {7, 0, 0, 0};
    const std::unique_ptr<unsigned char, void (*)(void*)> mine(msg.dataPtr(), kpfree);  // no longer the message's
    msg >> number;
    msg.setRawData(4, bytes);
    msg >> number;
    EXPECT_EQ(number, 7);
}

TEST(Message, textsOfItsOwnAreWrittenAsTheyWere)
{
    TmMsg msg;
    for (int i = 0; i < 100; ++i) {  // past several growths
        msg.reset(0);
        msg.reset(0, i);
        msg << "hello world"
            << ""
            << "x";
        KpDArray<char*> texts, copies;
        for (int k = 0; k < 3; ++k) {
            char* text = nullptr;
            msg >> text;
            texts.append(text);
        }
        msg << texts;
        char* text = nullptr;
        msg >> copies;
        ASSERT_EQ(copies.size(), 3);
        msg << copies[0];
        msg >> text;
        ASSERT_STREQ(text, "hello world");
    }
}

TEST(Message, anInnerOneThatIsCutIsZeros)
{
    const LogCapture log(KpLogError);
    TmMsg msg, inner;
    inner << 0x01010101 << 0x01010101;
    for (int i = 0; i < 4; ++i)
        msg << 0x6677;
    msg << 8U << 7;
    msg >> inner;
    EXPECT_EQ(hex(inner), "0000000000000000");
    inner << 1;  // and can grow
    EXPECT_EQ(inner.size(), 12U);
    EXPECT_EQ(LogCapture::lines().size(), 1U);
}

TEST(Message, printShowsNothingOfIt)
{
    const LogCapture log;
    const TmMsg msg;
    msg.print("title");
    msg.print(nullptr);
    EXPECT_EQ(LogCapture::lines().size(), 5U);
}

}  // namespace
