#include "Elements.h"

#include <kplib/rawdata/KpRawData.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <thread>

#include <sys/time.h>
#include <unistd.h>

using namespace kplib::test;

namespace {

struct Closer {
    void operator()(FILE* f) const { std::fclose(f); }
};
using File = std::unique_ptr<FILE, Closer>;

/// A stream that notes the sizes of the calls it gets, and takes or gives `left` bytes in all.
struct Meter {
    std::vector<size_t> calls;
    size_t left = SIZE_MAX;

    static ssize_t transfer(void* cookie, size_t size)
    {
        auto* meter = static_cast<Meter*>(cookie);
        meter->calls.push_back(size);
        const size_t done = std::min(size, meter->left);
        meter->left -= done;
        return static_cast<ssize_t>(done);
    }
    File open(const char* mode)
    {
        File f(fopencookie(this, mode,
                           {[](void* cookie, char*, size_t size) { return transfer(cookie, size); },
                            [](void* cookie, const char*, size_t size) { return transfer(cookie, size); }, nullptr,
                            nullptr}));
        std::setvbuf(f.get(), nullptr, _IONBF, 0);
        return f;
    }
};

constexpr size_t mebi = 1 << 20;

}  // namespace

TEST(Files, streamsAreServedByMebibytesUpToTheFirstShortOne)
{
    std::vector<char> bytes(3 * mebi);
    Meter whole, cut{{}, mebi + 10}, source{{}, 2 * mebi + 7};
    EXPECT_EQ(KpRawData::fwrite(bytes.data(), 3, 700000, whole.open("w").get()), 700000u);
    EXPECT_EQ(whole.calls, (std::vector<size_t>{mebi, mebi, 2100000 - 2 * mebi}));
    EXPECT_EQ(KpRawData::fwrite(bytes.data(), 8, 3 * mebi / 8, cut.open("w").get()), (mebi + 10) / 8);
    EXPECT_EQ(KpRawData::fread(bytes.data(), 4, 3 * mebi / 4, source.open("r").get()), (2 * mebi + 7) / 4);
    const File full(std::fopen("/dev/full", "w"));
    std::setvbuf(full.get(), nullptr, _IONBF, 0);
    EXPECT_EQ(KpRawData::fwrite(bytes.data(), 1, 2 * mebi, full.get()), 0u);
    EXPECT_EQ(KpRawData::fread(bytes.data(), 4, 0, full.get()), 0u);
}

TEST(Files, byteOrderIsThatOfTheName)
{
    std::vector<std::int32_t> values = {0x01020304, -2, 7};
    const auto original = values;
    const File f(std::tmpfile());
    EXPECT_EQ(KpRawData::writeBigEndian(values.data(), 3, f.get()), 3);
    EXPECT_EQ(values, original) << "swapped back";
    EXPECT_EQ(KpRawData::writeLittleEndian(values.data(), 1, f.get()), 1);
    std::rewind(f.get());
    EXPECT_EQ(std::fgetc(f.get()), 1);
    std::rewind(f.get());
    std::vector<std::int32_t> read(3);
    EXPECT_EQ(KpRawData::readBigEndian(read.data(), 3, f.get()), 3);
    EXPECT_EQ(read, original);
    EXPECT_EQ(KpRawData::readLittleEndian(read.data(), 3, f.get()), 1);
    EXPECT_EQ(read, original);
    read[0] = 0x0a0b0c0d;
    EXPECT_EQ(KpRawData::readBigEndian(read.data(), 1, f.get()), 0);
    EXPECT_EQ(read[0], 0x0d0c0b0a) << "all are swapped, however few came";
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
    std::vector<std::uint8_t> got(sent.size() + 1);
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
    const struct {
        long long size;
        bool limited;
        const char* line;  // null: none
    } cases[] = {{5LL << 30, true, "ret=-1, size=4194304, errno=9 (Bad file descriptor)"},
                 {5LL << 30, false, "ret=-1, size=4294967295, errno=9 (Bad file descriptor)"},
                 {10, true, "ret=-1, size=10, errno=9 (Bad file descriptor)"},
                 {0, false, nullptr},
                 {-5, true, nullptr}};
    for (const auto& c : cases) {
        const LogCapture log;
        EXPECT_EQ(KpRawData::read(-1, nullptr, c.size, c.limited), 0);
        ASSERT_EQ(log.lines().size(), c.line ? 1u : 0u);
        if (c.line) {
            EXPECT_TRUE(log.lines()[0].ends_with(std::string("KpRawData::read() failed, ") + c.line)) << log.lines()[0];
        }
    }
}

TEST(Files, interruptedReadIsAFailure)
{
    struct sigaction ring {}, before;
    ring.sa_handler = [](int) {};
    sigaction(SIGALRM, &ring, &before);
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    ASSERT_EQ(::write(ends[1], "abc", 3), 3);
    const itimerval soon{{0, 20000}, {0, 20000}}, never{};
    setitimer(ITIMER_REAL, &soon, nullptr);
    char bytes[10];
    const LogCapture log;
    EXPECT_EQ(KpRawData::read(ends[0], bytes, 10, false), 3);
    setitimer(ITIMER_REAL, &never, nullptr);
    sigaction(SIGALRM, &before, nullptr);
    ASSERT_EQ(log.lines().size(), 1u);
    EXPECT_NE(log.lines()[0].find("ret=-1, size=7, errno=4 ("), std::string::npos) << log.lines()[0];
    close(ends[0]);
    close(ends[1]);
}
