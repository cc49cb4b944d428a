#include <kplib/system/KpWatch.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <chrono>
#include <regex>
#include <string>
#include <thread>

constexpr auto pauseALittle = [] { std::this_thread::sleep_for(std::chrono::milliseconds(10)); };

TEST(KpWatch, addsUpItsRuns)
{
    KpWatch watch(true);
    pauseALittle();
    const double first = watch.stop2();
    pauseALittle();
    EXPECT_GE(first, 0.01);
    EXPECT_EQ(std::tuple(watch.isRunning(), watch.getTime2(), watch.getTime()),
              std::tuple(false, first, static_cast<float>(first)));
    watch.cont();
    pauseALittle();
    EXPECT_GE(watch.stop2(), first + 0.01);
    EXPECT_GE(watch.stop2(), first + 0.02) << "stopped twice, the last run counts twice";
}

TEST(KpWatch, dumpWritesALineForANamedWatch)
{
    const kplib::test::LogCapture log;
    KpWatch watch("load 100%%", true);
    pauseALittle();
    watch.dump(0);
    watch.dump(7);
    std::string all;
    for (const std::string& line : log.lines())
        all += line + '\n';
    EXPECT_TRUE(std::regex_match(all, std::regex("  \\[\\]  --- load 100%: [1-9]\\d* msec\n"
                                                 "  \\[\\]  --- load 100% \\[07\\]: \\d+ msec  \\(\\+ \\d+ ms\\)\n")))
        << all;
}

TEST(KpScopedWatch, leavesARunningWatchRunning)
{
    for (bool reset : {false, true}) {
        KpWatch watch(true);
        pauseALittle();
        KpScopedWatch(watch, reset);
        EXPECT_EQ(watch.isRunning(), !reset);
        EXPECT_EQ((watch.getTime2() < 0.01), reset);
    }
}
