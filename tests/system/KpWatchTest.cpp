#include <kplib/system/KpWatch.h>

#include <kplib/system/platform/Platform.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <cmath>
#include <regex>

namespace {

// Taken before main(), and so before the first start() of any watch.
const double beforeAnyStart = [] {
    KpWatch watch(false);
    watch.cont();
    return watch.stop2();
}();

void wait(double seconds)
{
    const std::uint64_t end = kplib::platform::ticks() + static_cast<std::uint64_t>(seconds * 1e9);
    while (kplib::platform::ticks() < end) {
    }
}

}  // namespace

TEST(KpWatch, knowsNoTimeBeforeTheFirstStart)
{
    EXPECT_EQ(beforeAnyStart, 0);
}

TEST(KpWatch, addsUpItsRuns)
{
    KpWatch watch(true);
    EXPECT_TRUE(watch.isRunning());
    wait(0.01);
    EXPECT_GE(watch.getTime2(), 0.01) << "while running";
    const double first = watch.stop2();
    EXPECT_FALSE(watch.isRunning());
    wait(0.01);
    EXPECT_EQ(watch.getTime2(), first) << "while standing";
    EXPECT_EQ(watch.getTime(), static_cast<float>(first));
    EXPECT_EQ(watch.getTimeMSec(), static_cast<unsigned>(std::rint(first * 1000)));
    watch.cont();
    wait(0.01);
    const double second = watch.stop2();
    EXPECT_GE(second, first + 0.01);
    EXPECT_GE(watch.stop2(), second + 0.01) << "stopped twice, the last run counts twice";
    watch.reset();
    EXPECT_EQ(watch.getTime2(), 0);
    watch.start();
    EXPECT_LT(watch.stop(), second);
}

TEST(KpWatch, dumpWritesALineForANamedWatch)
{
    const kplib::test::LogCapture log;
    KpWatch watch("load 100%%", true), nameless(true), emptyName("", true), null(nullptr, false);
    for (KpWatch* silent : {&nameless, &emptyName, &null})
        silent->dump(1);
    wait(0.002);
    watch.dump(0);
    wait(0.002);
    watch.dump(7);
    watch.start();
    watch.dump(123);
    EXPECT_TRUE(watch.isRunning());
    const char* const expected[] = {
        "  \\[\\]  --- load 100%: [1-9]\\d* msec",
        "  \\[\\]  --- load 100% \\[07\\]: [1-9]\\d* msec  \\(\\+ [1-9]\\d* ms\\)",
        "  \\[\\]  --- load 100% \\[123\\]: \\d+ msec",
    };
    ASSERT_EQ(log.lines().size(), 3u);
    for (size_t i = 0; i < 3; ++i)
        EXPECT_TRUE(std::regex_match(log.lines()[i], std::regex(expected[i]))) << log.lines()[i];
}

TEST(KpScopedWatch, leavesARunningWatchRunning)
{
    KpWatch watch(true);
    {
        const KpScopedWatch scoped(watch, false);
    }
    EXPECT_TRUE(watch.isRunning());
    wait(0.005);
    {
        const KpScopedWatch scoped(watch, true);
        EXPECT_TRUE(watch.isRunning());
        EXPECT_LT(watch.getTime2(), 0.005);
    }
    EXPECT_FALSE(watch.isRunning()) << "it was reset, and so stood when the scope began";
}
