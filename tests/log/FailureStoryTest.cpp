#include <kplib/log/KpMessageCollector.h>
#include <kplib/log/KpTerminateProcess.h>

#include <gtest/gtest.h>

#include <csignal>

TEST(KpMessageCollector, reportsWhatWasCountedInOrder)
{
    KpMessageCollector collector;
    KpString report("before\n");
    EXPECT_FALSE(collector.generateReport(report, true));
    const long first = collector.addMessageSlot("first %s"), second = collector.addMessageSlot("second"),
               third = collector.addMessageSlot("third");
    for (const long slot : {third, first, first, 3L, -1L})
        collector.countMessage(slot);
    EXPECT_TRUE(collector.generateReport(report, false));
    EXPECT_STREQ(report, "before\nfirst %s (2 times)\nthird (1 times)\n");
    collector.resetSlotCounter(first);
    collector.countMessage(second);
    report = "";
    EXPECT_TRUE(collector.generateReport(report, true));
    EXPECT_FALSE(collector.generateReport(report, false));
    EXPECT_STREQ(report, "second (1 times)\nthird (1 times)\n");
    const long copy = collector.addMessageSlot(collector.slots()[first].message);  // the array grows for it
    EXPECT_STREQ(collector.slots()[copy].message, "first %s");
}

TEST(KpTerminateProcessDeathTest, endsBySignalOrByStatusWithoutExitHandlers)
{
    const auto end = [](void (*handler)(int)) {
        std::atexit([] { std::fputs("exit handler\n", stderr); });
        std::signal(SIGTERM, handler);
        KpTerminateProcess(3);
    };
    EXPECT_EXIT(end(SIG_DFL), testing::KilledBySignal(SIGTERM), "^$");
    EXPECT_EXIT(end(SIG_IGN), testing::ExitedWithCode(3), "^$");
}
