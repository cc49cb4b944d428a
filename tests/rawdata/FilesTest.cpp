#include "Elements.h"

#include <memory>
#include <thread>

#include <unistd.h>

using namespace kplib::test;

namespace {

using File = std::shared_ptr<FILE>;

constexpr size_t mebi = 1 << 20;

/// A stream of `size` bytes of memory, and no more.
File limited(size_t size, const char* mode)
{
    File f(fmemopen(nullptr, size, mode), std::fclose);
    std::setvbuf(f.get(), nullptr, _IONBF, 0);
    return f;
}

}  // namespace

TEST(Files, streamsAreServedUpToTheFirstShortPiece)
{
    std::vector<char> bytes(3 * mebi, 7), read(3 * mebi);
    EXPECT_EQ(KpRawData::fwrite(bytes.data(), 8, 3 * mebi / 8, limited(mebi + 10, "w").get()), (mebi + 10) / 8);
    const File f = limited(2 * mebi + 7, "w+");
    EXPECT_EQ(KpRawData::fwrite(bytes.data(), 3, 699052, f.get()), 699052u);
    std::rewind(f.get());
    EXPECT_EQ(KpRawData::fread(read.data(), 4, 3 * mebi / 4, f.get()), (2 * mebi + 4) / 4);
    EXPECT_TRUE(std::equal(read.begin(), read.begin() + 2 * mebi + 4, bytes.begin()));
    EXPECT_EQ(KpRawData::fread(read.data(), 4, 0, nullptr) + KpRawData::fread(read.data(), 0, 4, nullptr), 0u);
}

TEST(Files, byteOrderIsThatOfTheName)
{
    std::vector<std::int32_t> values = {0x01020304, -2, 7}, read(3);
    const File f(std::tmpfile(), std::fclose);
    EXPECT_EQ(KpRawData::writeBigEndian(values.data(), 3, f.get()), 3);
    EXPECT_EQ(values[0], 0x01020304) << "swapped back";
    EXPECT_EQ(KpRawData::writeLittleEndian(values.data(), 1, f.get()), 1);
    std::rewind(f.get());
    EXPECT_EQ(KpRawData::readBigEndian(read.data(), 3, f.get()), 3);
    EXPECT_EQ(KpRawData::readLittleEndian(read.data() + 1, 2, f.get()), 1);
    EXPECT_EQ(read, (std::vector<std::int32_t>{0x01020304, 0x01020304, 7}));
    EXPECT_EQ(KpRawData::readBigEndian(read.data(), 1, f.get()), 0);
    EXPECT_EQ(read[0], 0x04030201) << "all are swapped, however few came";
}

TEST(Files, descriptorsAreReadAndWrittenToTheEnd)
{
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    const auto sent = someValues<std::uint8_t>(5 * mebi, 8);
    std::thread writer([&] {
        EXPECT_EQ(KpRawData::write(ends[1], sent.data(), sent.size()), sent.size());
        close(ends[1]);
    });
    Bytes got(sent.size() + 1);
    EXPECT_EQ(KpRawData::read(ends[0], got.data(), static_cast<long long>(got.size()), true), 5 * long(mebi));
    writer.join();
    got.pop_back();
    EXPECT_EQ(got, sent);
    EXPECT_EQ(KpRawData::write(ends[1], sent.data(), 1), ~0UL) << "closed";
    EXPECT_EQ(KpRawData::write(ends[1], sent.data(), 0), 0UL);
    close(ends[0]);
}

TEST(Files, failedReadsAreLoggedWithTheSizeOfTheCall)
{
    const auto failure = [](long long size, bool isLimited) {
        return logged([=] { EXPECT_EQ(KpRawData::read(-1, nullptr, size, isLimited), 0); });
    };
    const std::string head = "E KpRawData::read() failed, ret=-1, size=", tail = ", errno=9 (Bad file descriptor)";
    EXPECT_EQ(failure(5LL << 30, true), head + "4194304" + tail);
    EXPECT_EQ(failure(5LL << 30, false), head + "4294967295" + tail);
    EXPECT_EQ(failure(10, true) + failure(0, false) + failure(-5, true), head + "10" + tail);
}
