#include <kplib/imaging/KpCreateUIDs.h>

#include <kplib/imaging/detail/UIDClock.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <future>
#include <set>
#include <string>
#include <vector>

#include <unistd.h>

namespace {

std::atomic<std::time_t> fakeTime;

/// Local time is UTC, and the clock stands at what `fakeTime` says: at first later than in all tests before, since the
/// numbers that a process gives only rise.
class CreateUIDs : public testing::Test {
protected:
    void SetUp() override
    {
        setenv("TZ", "UTC", 1);
        tzset();
        kplib::detail::uidClock = [] { return fakeTime.load(); };
        fakeTime = start += 1000000;
    }
    void TearDown() override { kplib::detail::uidClock = realClock; }

private:
    static inline std::time_t start = 4102542245;  // in 2100
    std::time_t (*realClock)() = kplib::detail::uidClock;
};

KpDArray<KpString> parts(const KpString& uid)
{
    KpDArray<KpString> pieces;
    uid.explode('.', pieces);
    return pieces;
}

long long counterOf(const KpString& uid)
{
    return std::stoll(parts(uid)[8].c_str());
}

TEST_F(CreateUIDs, theTextIsMadeOfItsParts)
{
    const std::time_t now = fakeTime;
    char time[20];  // years count from 2000
    std::strftime(time, sizeof time, "1%y%m%d%H%M%S", std::gmtime(&now));
    KpCreateUIDs creator;
    KpString uid;
    ASSERT_TRUE(creator.createUID(KpCreateUIDs::UIDtype0, uid));
    const auto pieces = parts(uid);
    ASSERT_EQ(pieces.size(), 10);
    EXPECT_TRUE(std::string(uid.c_str()).starts_with("1.2.276.0.77.7.2.8432031"));
    EXPECT_TRUE(std::string(pieces[8].c_str()).starts_with(time));
    EXPECT_EQ(std::strlen(pieces[8].c_str()), 18U);
    EXPECT_EQ(std::atoi(pieces[9].c_str()), kplib::detail::uidProcessPart(getpid()));

    EXPECT_TRUE(creator.setRootUID("1.2"));
    EXPECT_TRUE(creator.setVersion("9"));
    EXPECT_FALSE(creator.setRootUID(""));
    EXPECT_STREQ(creator.lastError(), "[setRootUID] Got empty root UID.");
    EXPECT_FALSE(creator.setVersion(""));
    EXPECT_STREQ(creator.lastError(), "[setVersion] Got empty version string.");
    ASSERT_TRUE(creator.createUID(KpCreateUIDs::UIDtype4, uid));
    EXPECT_TRUE(std::string(uid.c_str()).starts_with("1.2.9.6."));
    EXPECT_FALSE(creator.createUID(static_cast<KpCreateUIDs::UIDtype>(5), uid));
    EXPECT_TRUE(uid.isEmpty());
    EXPECT_STREQ(creator.lastError(), "[createUID] Invalid type specified.");
}

TEST_F(CreateUIDs, theProcessPartHasFiveDigits)
{
    const int cases[][2] = {{123456, 23456}, {100005, 90005}, {9999, 99999}, {10000, 10000}, {0, 90000}};
    for (const auto& [process, part] : cases)
        EXPECT_EQ(kplib::detail::uidProcessPart(process), part);
}

TEST_F(CreateUIDs, theCounterRisesWhenTheClockGoesBack)
{
    KpCreateUIDs creator;
    KpString uid;
    long long last = 0;
    for (const int step : {0, 0, -100000, 0, 50, 100, -50}) {
        fakeTime += step;
        ASSERT_TRUE(creator.createUID(KpCreateUIDs::UIDtype1, uid));
        EXPECT_GT(counterOf(uid), last);
        last = counterOf(uid);
    }
    fakeTime += 200000;
    ASSERT_TRUE(creator.createUID(KpCreateUIDs::UIDtype1, uid));
    EXPECT_EQ(counterOf(uid) % 100000, (last + 1) % 1000);
}

TEST_F(CreateUIDs, ThreadsNeverGetTheSame)
{
    constexpr size_t count = 20000;  // together more than a second has numbers
    std::vector<std::vector<long long>> taken(8);
    {
        std::vector<std::future<void>> threads;
        for (auto& mine : taken) {
            threads.push_back(std::async(std::launch::async, [&mine] {
                KpCreateUIDs creator;
                KpString uid;
                for (size_t i = 0; i < count; ++i) {
                    creator.createUID(KpCreateUIDs::UIDtype2, uid);
                    mine.push_back(counterOf(uid));
                }
            }));
        }
    }
    std::set<long long> all;
    for (const auto& mine : taken) {
        EXPECT_TRUE(std::is_sorted(mine.begin(), mine.end()));
        all.insert(mine.begin(), mine.end());
    }
    EXPECT_EQ(all.size(), 8 * count);
}

}  // namespace
