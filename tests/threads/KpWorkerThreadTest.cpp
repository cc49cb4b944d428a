#include <kplib/threads/KpThread.h>
#include <kplib/threads/KpWorkerThread.h>

#include "Schedule.h"

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <functional>
#include <pthread.h>
#include <random>
#include <semaphore>
#include <set>
#include <string>

namespace {

using State = KpWorkerThread::State;

bool acceptsStart(int state)
{
    return state == State::NotStarted || state == State::Idle || state == State::CanceledIdle;
}

// A pass does the steps of a script: h halts until go, p polls suspended(), w wakes the caller.
struct Puppet final : KpWorkerThread {
    explicit Puppet(std::string steps) : KpWorkerThread("sixteen letters!"), script(std::move(steps)) {}
    ~Puppet() override
    {
        go.release(9);
        terminate();
    }
    void computeCtor() override
    {
        note('(');
        pthread_getname_np(pthread_self(), nativeName, sizeof nativeName);
    }
    void compute() override
    {
        note('C');
        for (char step : script)
            if (step == 'h')
                halted.release(), go.acquire();
            else if (step == 'w')
                wakeCaller();
            else if (suspended())
                note('s');
        if (canceled())
            note('x');
    }
    void computeDtor() override { note(state() == TerminateRequested ? ')' : '?'); }
    void note(char what)
    {
        journal += what;
        threads.insert(tmCurrentThreadId());
    }
    void bringTo(int wanted)
    {
        if (wanted == NotStarted)
            return;
        start(false);
        halted.acquire();
        if (wanted == SuspendRequested || wanted == Suspended)
            suspend();
        if (wanted == CancelRequested || wanted == CanceledIdle)
            cancel();
        if (wanted == Suspended || acceptsStart(wanted)) {
            go.release();
            wait();
        }
        ASSERT_EQ(state(), wanted);
    }

    std::string script, journal;
    char nativeName[16] = "";
    std::set<unsigned long> threads;
    std::counting_semaphore<> halted{0}, go{0};
};

struct Polling final : KpWorkerThread {
    Polling() : KpWorkerThread(nullptr) {}
    ~Polling() override { terminate(); }
    void computeCtor() override { ++lives; }
    void compute() override
    {
        for (int i = 0; i < polls && !canceled(); ++i) {
            suspended();
            if (i == polls / 2)
                wakeCaller();
        }
        ++passes;
    }
    void computeDtor() override { --lives; }
    int polls = 0;  // of the next pass
    int lives = 0;
    long passes = 0;
};

// Events in any order, against what they promise whatever the worker does meanwhile.
void driveAtRandom(unsigned seed)
{
    kplib::test::scheduleSeed = seed;
    std::mt19937 random(seed);
    Polling worker;
    long accepted = 0;
    bool canceled = false, timedOut = false;  // the last pass; the last wait
    for (int i = 0; i < 200; ++i) {
        const int before = worker.state();
        const unsigned event = random() % 16;
        if (event < 6) {
            if (acceptsStart(before))
                worker.polls = static_cast<int>(random() % 5 * 10);
            const bool started = worker.start(event < 3);
            ASSERT_TRUE(started || !acceptsStart(before));
            accepted += started;
            ASSERT_TRUE(!started || event >= 3 || worker.polls != 0 || worker.passes == accepted);
            canceled = canceled && !started;
        } else if (event < 9) {
            ASSERT_TRUE(!worker.suspend() || before == State::Computing);
        } else if (event < 11) {
            ASSERT_TRUE(worker.resume() || before != State::Suspended);
        } else if (event < 12) {
            canceled = worker.cancel() || canceled;
        } else if (event < 15) {
            const bool waited = worker.wait(timedOut, event < 14 ? ULONG_MAX : 1);
            const int after = worker.state();
            ASSERT_TRUE(!waited || !acceptsStart(before));
            ASSERT_TRUE(timedOut || acceptsStart(after) || after == State::Suspended);
            ASSERT_TRUE(!acceptsStart(after) || (after == State::CanceledIdle) == canceled);
        } else {
            worker.terminate();
            canceled = false;
            ASSERT_EQ(std::tuple(worker.state(), worker.lives, worker.passes),
                      std::tuple(State::NotStarted, 0, accepted));
        }
    }
}

}  // namespace

TEST(KpWorkerThreadThreads, followsTheTableOfStates)
{
    enum { Not, Idle, Comp, Susp, CIdle, SReq, CReq };
    const std::pair<bool, int> table[][5] = {
        // start, suspend, resume, cancel, wait
        {{true, Comp}, {false, Not}, {false, Not}, {false, Not}, {false, Not}},
        {{true, Comp}, {false, Idle}, {false, Idle}, {false, Idle}, {false, Idle}},
        {{false, Comp}, {true, SReq}, {false, Comp}, {true, CReq}, {true, Comp}},
        {{false, Susp}, {false, Susp}, {true, Comp}, {true, CReq}, {false, Susp}},
        {{true, Comp}, {false, CIdle}, {false, CIdle}, {false, CIdle}, {false, CIdle}},
        {{false, SReq}, {false, SReq}, {false, Comp}, {true, CReq}, {true, SReq}},
        {{false, CReq}, {false, CReq}, {false, CReq}, {false, CReq}, {true, CReq}},
    };
    bool timedOut = false;
    const std::function<bool(Puppet&)> events[] = {
        [](Puppet& puppet) { return puppet.start(false); },       [](Puppet& puppet) { return puppet.suspend(); },
        [](Puppet& puppet) { return puppet.resume(); },           [](Puppet& puppet) { return puppet.cancel(); },
        [&](Puppet& puppet) { return puppet.wait(timedOut, 1); },
    };
    for (int from = Not; from <= CReq; ++from)
        for (int event = 0; event < 5; ++event) {
            SCOPED_TRACE("from " + std::to_string(from) + " by event " + std::to_string(event));
            Puppet puppet(from == Susp ? "hph" : "h");
            ASSERT_NO_FATAL_FAILURE(puppet.bringTo(from));
            timedOut = true;
            const auto [result, to] = table[from][event];
            EXPECT_EQ(events[event](puppet), result);
            EXPECT_EQ(timedOut, event < 4 || result) << "a wait here never sees the end of a pass";
            EXPECT_EQ(puppet.state(), to);
            puppet.go.release(9);
            EXPECT_FALSE(puppet.terminate());
            EXPECT_EQ(puppet.state(), State::NotStarted);
            EXPECT_EQ(std::count(puppet.journal.begin(), puppet.journal.end(), 'C'),
                      (from != Not) + (event == 0 && result));
            EXPECT_TRUE(puppet.journal.empty() || puppet.journal.back() == ')');
        }
}

TEST(KpWorkerThreadThreads, oneThreadServesFromConstructorToDestructor)
{
    Puppet puppet("");
    for (const char* journal : {"", "(CC)", "(CC)(CC)"}) {
        EXPECT_FALSE(puppet.terminate());
        EXPECT_EQ(puppet.journal, journal);
        EXPECT_LE(puppet.threads.size(), 1u);
        EXPECT_FALSE(puppet.threads.contains(tmCurrentThreadId()));
        puppet.threads.clear();
        for (int pass = 0; pass < 2; ++pass, puppet.wait())
            EXPECT_TRUE(puppet.start(pass == 0));
    }
    EXPECT_STREQ(puppet.nativeName, "sixteen letters");
}

TEST(KpWorkerThreadThreads, startsLaterIfNoThreadCanBeMade)
{
    const kplib::test::LogCapture log;
    Puppet worker("");
    kplib::test::noNewThreads = true;
    EXPECT_FALSE(worker.start(true) || worker.start(false) || worker.wait() || worker.terminate());
    kplib::test::noNewThreads = false;
    EXPECT_TRUE(worker.start(true));
    EXPECT_EQ(worker.journal, "(C");
    EXPECT_EQ(log.lines().size(), 2U);
}

TEST(KpWorkerThreadThreads, aSuspendedPassGoesOnAndACallerMayGoBeforeTheEnd)
{
    for (bool isCanceled : {false, true}) {
        Puppet puppet("hpp");
        puppet.bringTo(State::Suspended);
        EXPECT_TRUE(isCanceled ? puppet.cancel() : puppet.resume());
        puppet.wait();
        EXPECT_EQ(std::tuple(puppet.journal, puppet.state()),
                  std::tuple(isCanceled ? "(Csx" : "(Cs", isCanceled ? State::CanceledIdle : State::Idle))
            << "which pauses once";
    }
    Puppet puppet("wh");
    EXPECT_TRUE(puppet.start(true));
    EXPECT_EQ(puppet.state(), State::Computing);
}

// KPLIB_TEST_SECONDS makes it longer.
TEST(KpWorkerThreadThreads, keepsItsPromisesOnAnySchedule)
{
    const char* const asked = std::getenv("KPLIB_TEST_SECONDS");
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(std::atoi(asked ? asked : "3"));
    for (unsigned seed = 1; std::chrono::steady_clock::now() < end && !HasFailure(); ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        driveAtRandom(seed);
    }
    kplib::test::scheduleSeed = 0;
}

TEST(KpWorkerThreadThreads, losesNoWakeUp)
{
    Polling worker;
    for (long i = 0; i < 100'000; ++i) {
        ASSERT_TRUE(worker.start(true));
        ASSERT_TRUE(worker.polls != 0 || worker.passes == i + 1);
        worker.wait();
        worker.polls = i % 3 == 0;  // then the next one releases its caller early
    }
    const kplib::test::LogCapture log;
    KpWorkerThread::test();
    EXPECT_NE(log.lines().at(0).find(" passes per second"), std::string::npos);
}
