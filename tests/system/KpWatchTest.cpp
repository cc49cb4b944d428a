#include <kplib/system/KpWatch.h>

#include <kplib/system/platform/Platform.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <cmath>
#include <regex>
#include <string>

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

TEST(KpWatch, addsUpItsRuns)
{
    EXPECT_EQ(beforeAnyStart, 0);
    KpWatch watch(true);
    wait(0.01);
    EXPECT_TRUE(watch.isRunning() && watch.getTime2() >= 0.01);
    const double first = watch.stop2();
    wait(0.01);
    EXPECT_TRUE(!watch.isRunning() && watch.getTime2() == first && watch.getTime() == static_cast<float>(first));
    EXPECT_EQ(watch.getTimeMSec(), static_cast<unsigned>(std::rint(first * 1000)));
    watch.cont();
    wait(0.01);
    const double second = watch.stop2();
    EXPECT_GE(second, first + 0.01);
    EXPECT_GE(watch.stop2(), second + 0.01) << "stopped twice, the last run counts twice";
    watch.reset();
    EXPECT_EQ(watch.getTime2(), 0);
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
    std::string all;
    for (const std::string& line : log.lines())
        all += line + '\n';
    EXPECT_TRUE(
        std::regex_match(all, std::regex("  \\[\\]  --- load 100%: [1-9]\\d* msec\n"
                                         "  \\[\\]  --- load 100% \\[07\\]: [1-9]\\d* msec  \\(\\+ [1-9]\\d* ms\\)\n"
                                         "  \\[\\]  --- load 100% \\[123\\]: \\d+ msec\n")))
        << all;
}

TEST(KpScopedWatch, leavesARunningWatchRunning)
{
    for (bool reset : {false, true}) {
        KpWatch watch(true);
        wait(0.005);
        {
            const KpScopedWatch scoped(watch, reset);
            EXPECT_TRUE(watch.isRunning());
            EXPECT_EQ(watch.getTime2() < 0.005, reset);
        }
        EXPECT_EQ(watch.isRunning(), !reset) << "a watch that was reset stood when the scope began";
    }
}
