#include <kplib/threads/KpThread.h>

#include "Schedule.h"

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <functional>
#include <semaphore>
#include <string_view>
#include <thread>
#include <unistd.h>

namespace {

struct Thread : KpThread {
    explicit Thread(std::function<void()> job, const char* name = nullptr) : KpThread(name), work(std::move(job)) {}
    void run() override { work(); }
    std::function<void()> work;
};

// Both are counted from the first of a process.
void namesAndMainThread()
{
    Thread first([] {}), named([] {}, "reader"), third([] {});
    first.setThreadName((std::string(first.threadName()) + named.threadName() + third.threadName()).c_str());
    unsigned long secondary = 0;
    std::thread([&] { secondary = tmIsMainThread() ? tmCurrentThreadId() : 0; }).join();
    const bool good = std::string_view(first.threadName()) == "KpThread 0readerKpThread 2" &&
                      tmCurrentProcessId() == getpid() && tmMainThreadId() == secondary && !tmIsMainThread();
    _exit(good ? 7 : 1);
}

void sleepTooLong(void (*sleep)())
{
    std::signal(SIGALRM, [](int) { _exit(7); });
    ualarm(50'000, 0);
    sleep();
    _exit(1);
}

}  // namespace

TEST(KpThreadThreads, runsAgainAfterItsEnd)
{
    std::binary_semaphore begun{0}, go{0};
    int runs = 0, running = 0;
    Thread thread([&, caller = tmCurrentThreadId()] {
        EXPECT_EQ(++running, 1) << "a start during a run has to wait for its end";
        EXPECT_NE(tmCurrentThreadId(), caller);
        begun.release();
        go.acquire();
        --running;
        ++runs;
    });
    const auto state = [&] { return std::pair(thread.running(), thread.finished()); };
    EXPECT_EQ(state(), std::pair(false, false));
    EXPECT_TRUE(thread.wait());
    for (int i = 1; i <= 3; ++i) {
        thread.start();
        begun.acquire();
        EXPECT_EQ(state(), std::pair(true, false));
        EXPECT_FALSE(thread.wait(0));
        go.release();
        if (i != 2) {  // 3 begins with the start that has to wait
            EXPECT_TRUE(thread.wait());
            EXPECT_EQ(state(), std::pair(false, true));
            EXPECT_EQ(runs, i);
        }
    }
    for (unsigned seed = 1; seed < 300; ++seed) {
        kplib::test::scheduleSeed = seed;
        Thread brief([] {});
        brief.start();
        while (!brief.finished())  // and then it may be destroyed
            KpThread::yield();
    }
    kplib::test::scheduleSeed = 0;
}

TEST(KpThreadThreads, aThreadThatCannotBeMadeIsLoggedAndCountsAsRunning)
{
    const kplib::test::LogCapture log;
    Thread thread([] {});
    kplib::test::noNewThreads = true;
    thread.start();
    kplib::test::noNewThreads = false;
    EXPECT_TRUE(thread.running());
    EXPECT_FALSE(thread.wait());
    EXPECT_EQ(log.lines(), kplib::test::Lines{"W [] KpThread::~KpThread() failed (error code: 11)\n"});
    thread.start();  // tries again
    EXPECT_TRUE(thread.wait());
}

TEST(KpThreadThreads, numbersObjectsAndTakesTheFirstToAskForTheMainThread)
{
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_EXIT(namesAndMainThread(), testing::ExitedWithCode(7), "");
}

TEST(KpThreadThreads, sleepsItsTimeThroughSignals)
{
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_EXIT(sleepTooLong([] { KpThread::usleep(1ul << 32); }), testing::ExitedWithCode(7), "");
    EXPECT_EXIT(sleepTooLong([] { KpThread::sleep(ULONG_MAX); }), testing::ExitedWithCode(7), "");
    std::signal(SIGALRM, [](int) {});
    ualarm(1000, 1000);
    const auto begin = std::chrono::steady_clock::now();
    KpThread::msleep((1ul << 32) + 30);  // the upper bits are lost
    EXPECT_GE(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(30));
    ualarm(0, 0);
}
