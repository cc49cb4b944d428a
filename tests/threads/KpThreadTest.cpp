#include <kplib/threads/KpThread.h>

#include "Schedule.h"

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <pthread.h>
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

void nothing() {}

}  // namespace

// In a process of its own, where no other test has made a thread or has asked for the main one; 7 is success.
#define EXPECT_EXIT_ALONE(statement, output)                                                                           \
    testing::FLAGS_gtest_death_test_style = "threadsafe";                                                              \
    EXPECT_EXIT(statement, testing::ExitedWithCode(7), output)

TEST(KpThreadThreads, countsItsObjectsInGeneratedNames)
{
    const auto names = [] {
        Thread first(nothing), named(nothing, "reader"), third(nothing);
        std::fprintf(stderr, "%s, %s, %s", first.threadName(), named.threadName(), third.threadName());
        third.setThreadName("other");
        std::_Exit(std::string_view(third.threadName()) == "other" ? 7 : 1);
    };
    EXPECT_EXIT_ALONE(names(), "^KpThread 0, reader, KpThread 2$");
}

TEST(KpThreadThreads, runsAgainAfterItsEnd)
{
    std::binary_semaphore begun{0}, go{0};
    int runs = 0, running = 0;
    unsigned long caller = tmCurrentThreadId();
    Thread thread([&] {
        EXPECT_EQ(++running, 1) << "a start during a run has to wait for its end";
        EXPECT_NE(tmCurrentThreadId(), caller);
        begun.release();
        go.acquire();
        --running;
        ++runs;
    });
    EXPECT_TRUE(!thread.finished() && !thread.running() && thread.wait());
    for (int i = 1; i <= 3; ++i) {
        thread.start();
        begun.acquire();
        EXPECT_TRUE(thread.running() && !thread.finished());
        EXPECT_FALSE(thread.wait(0));
        go.release();
        if (i == 2)
            continue;  // straight into the next start
        EXPECT_TRUE(thread.wait());
        EXPECT_TRUE(thread.finished() && !thread.running());
        EXPECT_EQ(runs, i);
    }
}

TEST(KpThreadThreads, mayGoAsSoonAsItSaysThatItHasFinished)
{
    for (int i = 0; i < 500; ++i) {
        const kplib::test::RandomSchedule schedule(static_cast<unsigned>(i));
        Thread thread(nothing);
        thread.start();
        while (!thread.finished())
            KpThread::yield();
    }
}

TEST(KpThreadThreads, aThreadThatCannotBeMadeIsLoggedAndCountsAsRunning)
{
    const kplib::test::LogCapture log;
    Thread thread(nothing);
    {
        const kplib::test::NoNewThreads exhausted;
        thread.start();
    }
    EXPECT_TRUE(thread.running());
    EXPECT_FALSE(thread.wait(1));
    EXPECT_EQ(log.lines(), kplib::test::Lines{"W [] KpThread::~KpThread() failed (error code: 11)\n"});
}

TEST(KpThreadThreads, knowsWhoAsks)
{
    EXPECT_EQ(tmCurrentProcessId(), getpid());
    EXPECT_EQ(tmCurrentThreadId(), pthread_self());
    const auto secondaryAsksFirst = [] {
        bool is = false;
        unsigned long id = 0;
        std::thread([&] { is = tmIsMainThread() && (id = tmMainThreadId()) == tmCurrentThreadId(); }).join();
        std::_Exit(is && !tmIsMainThread() && tmMainThreadId() == id ? 7 : 1);
    };
    EXPECT_EXIT_ALONE(secondaryAsksFirst(), "");
}

TEST(KpThreadThreads, carriesItsNameToThePlatform)
{
    char seen[16] = "";
    Thread thread([] {});
    thread.work = [&] {
        thread.setThreadNameNative("sixteen letters!");
        thread.setThreadNameNative(nullptr);
        pthread_getname_np(pthread_self(), seen, sizeof seen);
    };
    thread.start();
    thread.wait();
    EXPECT_STREQ(seen, "sixteen letters");
}

TEST(KpThreadThreads, sleepsItsTimeThroughSignals)
{
    std::signal(SIGUSR1, [](int) {});
    for (void (*sleep)() : {+[] { KpThread::usleep(30'000); }, +[] { KpThread::msleep(30); },
                            +[] { KpThread::msleep((1ul << 32) + 30); }}) {
        const auto begin = std::chrono::steady_clock::now();
        const pthread_t sleeper = pthread_self();
        const std::jthread nuisance([sleeper](const std::stop_token& stop) {
            while (!stop.stop_requested()) {
                pthread_kill(sleeper, SIGUSR1);
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
            }
        });
        sleep();
        EXPECT_GE(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(30));
    }
    std::signal(SIGUSR1, SIG_DFL);
    // Lengths whose low 32 bits, or whose sum in microseconds, would be next to nothing.
    const auto sleepsLong = [](auto sleep) {
        const std::jthread alarm([] { std::this_thread::sleep_for(std::chrono::milliseconds(50)), std::_Exit(7); });
        sleep();
        std::_Exit(1);
    };
    EXPECT_EXIT_ALONE(sleepsLong([] { KpThread::usleep(1ul << 32); }), "");
    EXPECT_EXIT_ALONE(sleepsLong([] { KpThread::sleep(ULONG_MAX); }), "");
}
