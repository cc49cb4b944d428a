#include <kplib/threads/KpThread.h>
#include <kplib/threads/KpWorkerThread.h>

#include "Schedule.h"

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <functional>
#include <optional>
#include <random>
#include <regex>
#include <semaphore>
#include <string>
#include <utility>

namespace {

using State = KpWorkerThread::State;

// Its passes do what the test orders, step by step, and keep a journal: (C, ) of constructor, passes and destructor.
class Puppet final : public KpWorkerThread {
public:
    Puppet() : KpWorkerThread("puppet") {}
    ~Puppet() override
    {
        orders_.release();
        terminate();
    }

    /// A step of the pass under way, from one halt to the next; it is sleeping in suspended() if that doesn't return.
    void order(std::function<void()> step)
    {
        step_ = std::move(step);
        orders_.release();
    }
    void order(void (Puppet::*step)())
    {
        order([this, step] { (this->*step)(); });
    }
    void pause() { pauses += suspended(); }
    void leave() { leaving_ = true; }
    void awaitHalt() { halts_.acquire(); }

    /// A pass under way, up to its first halt.
    void begin()
    {
        ASSERT_TRUE(start(false));
        awaitHalt();
    }
    /// From the halt to the end of the pass.
    void end()
    {
        order(&Puppet::leave);
        wait();
    }
    void bringTo(int wanted);

    std::string journal;
    int pauses = 0;
    int stateInDtor = -1;
    unsigned long threadIds[3] = {};  // of constructor, pass and destructor

private:
    void computeCtor() override
    {
        journal += '(';
        threadIds[0] = tmCurrentThreadId();
    }
    void compute() override
    {
        journal += 'C';
        threadIds[1] = tmCurrentThreadId();
        for (leaving_ = false; !leaving_;) {
            halts_.release();
            orders_.acquire();
            const auto step = std::exchange(step_, nullptr);
            step ? step() : leave();
        }
    }
    void computeDtor() override
    {
        journal += ')';
        threadIds[2] = tmCurrentThreadId();
        stateInDtor = state();
    }

    std::function<void()> step_;
    bool leaving_ = false;
    std::counting_semaphore<> orders_{0}, halts_{0};
};

void Puppet::bringTo(int wanted)
{
    if (wanted == NotStarted)
        return;
    begin();
    if (wanted == SuspendRequested || wanted == Suspended)
        suspend();
    if (wanted == CancelRequested || wanted == CanceledIdle)
        cancel();
    if (wanted == Suspended) {
        order(&Puppet::pause);
        wait();
    }
    if (wanted == Idle || wanted == CanceledIdle)
        end();
    ASSERT_EQ(state(), wanted);
}

}  // namespace

TEST(KpWorkerThreadThreads, followsTheTableOfStates)
{
    struct Outcome {
        bool result;
        int to;
    };
    struct Row {
        int from;
        Outcome start, suspend, resume, cancel, wait;
    };
    constexpr int not_ = State::NotStarted, idle = State::Idle, comp = State::Computing, susp = State::Suspended,
                  cIdle = State::CanceledIdle, sReq = State::SuspendRequested, cReq = State::CancelRequested;
    const Row rows[] = {
        {not_, {true, comp}, {false, not_}, {false, not_}, {false, not_}, {false, not_}},
        {idle, {true, comp}, {false, idle}, {false, idle}, {false, idle}, {false, idle}},
        {comp, {false, comp}, {true, sReq}, {false, comp}, {true, cReq}, {true, comp}},
        {susp, {false, susp}, {false, susp}, {true, comp}, {true, cReq}, {false, susp}},
        {cIdle, {true, comp}, {false, cIdle}, {false, cIdle}, {false, cIdle}, {false, cIdle}},
        {sReq, {false, sReq}, {false, sReq}, {false, comp}, {true, cReq}, {true, sReq}},
        {cReq, {false, cReq}, {false, cReq}, {false, cReq}, {false, cReq}, {true, cReq}},
    };
    bool timedOut = false;
    const std::function<bool(Puppet&)> events[] = {
        [](Puppet& puppet) { return puppet.start(false); },       [](Puppet& puppet) { return puppet.suspend(); },
        [](Puppet& puppet) { return puppet.resume(); },           [](Puppet& puppet) { return puppet.cancel(); },
        [&](Puppet& puppet) { return puppet.wait(timedOut, 1); },
    };
    for (const Row& row : rows) {
        const Outcome* const outcomes[] = {&row.start, &row.suspend, &row.resume, &row.cancel, &row.wait};
        for (int event = 0; event < 5; ++event) {
            SCOPED_TRACE("from " + std::to_string(row.from) + " by event " + std::to_string(event));
            const Outcome& expected = *outcomes[event];
            Puppet puppet;
            ASSERT_NO_FATAL_FAILURE(puppet.bringTo(row.from));
            timedOut = true;
            EXPECT_EQ(events[event](puppet), expected.result);
            EXPECT_EQ(timedOut, event < 4 || expected.result) << "a wait here never sees the end of a pass";
            EXPECT_EQ(puppet.state(), expected.to);
            puppet.order(&Puppet::leave);
            EXPECT_FALSE(puppet.terminate());
            EXPECT_EQ(puppet.state(), State::NotStarted);
            const bool began = row.from != not_ || event == 0,
                       twice = event == 0 && expected.result && row.from != not_;
            EXPECT_EQ(puppet.journal, began ? twice ? "(CC)" : "(C)" : "") << "no pass that wasn't accepted";
        }
    }
}

TEST(KpWorkerThreadThreads, oneThreadServesFromConstructorToDestructor)
{
    Puppet puppet;
    EXPECT_FALSE(puppet.terminate());
    EXPECT_EQ(puppet.journal, "");
    for (int life = 1; life <= 2; ++life) {
        for (int pass = 0; pass < 2; ++pass) {
            puppet.begin();
            puppet.end();
        }
        puppet.terminate();
        EXPECT_EQ(puppet.stateInDtor, State::TerminateRequested);
        EXPECT_EQ(puppet.state(), State::NotStarted);
        for (unsigned long id : puppet.threadIds)
            EXPECT_TRUE(id == puppet.threadIds[0] && id != tmCurrentThreadId());
    }
    EXPECT_EQ(puppet.journal, "(CC)(CC)");
}

TEST(KpWorkerThreadThreads, aSuspendedPassGoesOnOrIsCanceled)
{
    for (const char* how : {"resume", "cancel", "terminate"}) {
        SCOPED_TRACE(how);
        Puppet puppet;
        puppet.bringTo(State::Suspended);
        bool canceled = false;
        if (*how == 't') {
            puppet.order(&Puppet::leave);
            puppet.terminate();
        } else {
            *how == 'r' ? puppet.resume() : puppet.cancel();
            puppet.awaitHalt();
            puppet.order([&] { canceled = puppet.canceled(); });
            puppet.awaitHalt();
            puppet.order(&Puppet::pause);  // nobody asks for it
            puppet.awaitHalt();
            puppet.end();
        }
        EXPECT_EQ(canceled, *how == 'c');
        EXPECT_EQ(puppet.state(), *how == 't' ? State::NotStarted : canceled ? State::CanceledIdle : State::Idle);
        EXPECT_EQ(puppet.pauses, 1);
        EXPECT_EQ(puppet.journal, *how == 't' ? "(C)" : "(C") << "still one pass";
    }
}

TEST(KpWorkerThreadThreads, aCallerIsReleasedBeforeTheEnd)
{
    Puppet puppet;
    puppet.order(&Puppet::wakeCaller);
    EXPECT_TRUE(puppet.start(true));
    EXPECT_EQ(puppet.state(), State::Computing);
    puppet.end();
    puppet.order(&Puppet::leave);
    EXPECT_TRUE(puppet.start(true)) << "and this time sleeps to the end";
    puppet.wait();
    EXPECT_EQ(puppet.state(), State::Idle);
}

namespace {

struct Quick final : KpWorkerThread {
    Quick() : KpWorkerThread(nullptr) {}
    ~Quick() override { terminate(); }
    void compute() override
    {
        if (passes % 2 == 0)
            wakeCaller();
        ++passes;
    }
    long passes = 0;
};

}  // namespace

TEST(KpWorkerThreadThreads, noWakeUpIsLost)
{
    for (bool delays : {false, true}) {
        const long passes = delays ? 3000 : 100'000;
        std::optional<kplib::test::RandomSchedule> schedule;
        if (delays)
            schedule.emplace(1u);
        Quick quick;
        for (long i = 0; i < passes; ++i) {
            ASSERT_TRUE(quick.start(true));
            quick.wait();
            ASSERT_EQ(quick.passes, i + 1);
        }
    }
}

namespace {

struct Polling final : KpWorkerThread {
    Polling() : KpWorkerThread("polling") {}
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

bool isWaiting(int state)
{
    return state == State::Idle || state == State::CanceledIdle;
}

// One event after the other, against what they promise whatever the worker does meanwhile.
void driveAtRandom(Polling& worker, std::mt19937& random, int events)
{
    long accepted = worker.passes;
    bool canceled = false;  // the last pass
    for (int i = 0; i < events; ++i) {
        const int before = worker.state();
        const bool atRest = isWaiting(before) || before == State::NotStarted;
        const unsigned event = random() % 16;
        if (event < 6) {
            if (atRest)
                worker.polls = static_cast<int>(random() % 40);
            const bool started = worker.start(event < 3);
            ASSERT_TRUE(started || !atRest);
            accepted += started;
            canceled = canceled && !started;
        } else if (event < 9) {
            const bool suspended = worker.suspend();
            ASSERT_TRUE(!suspended || before == State::Computing);
        } else if (event < 11) {
            const bool resumed = worker.resume();
            ASSERT_TRUE(resumed || before != State::Suspended);
        } else if (event < 12) {
            const bool asked = worker.cancel();
            ASSERT_TRUE(!asked || !atRest);
            canceled = canceled || asked;
        } else if (event < 15) {
            bool timedOut = false;
            const bool waited = event < 14 ? worker.wait() : worker.wait(timedOut, 1);
            const int after = worker.state();
            ASSERT_TRUE(!waited || !atRest);
            ASSERT_TRUE(timedOut || isWaiting(after) || after == State::Suspended || after == State::NotStarted);
            if (isWaiting(after)) {
                ASSERT_EQ(after == State::CanceledIdle, canceled);
            }
        } else if (random() % 4 == 0) {
            worker.terminate();
            canceled = false;
            ASSERT_EQ(worker.state(), State::NotStarted);
            ASSERT_EQ(worker.lives, 0);
            ASSERT_EQ(worker.passes, accepted);
        }
    }
}

}  // namespace

// KPLIB_TEST_SECONDS makes it longer.
TEST(KpWorkerThreadThreads, keepsItsPromisesOnAnySchedule)
{
#ifdef __SANITIZE_THREAD__
    const char* const usual = "3";
#else
    const char* const usual = "1";
#endif
    const char* const asked = std::getenv("KPLIB_TEST_SECONDS");
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(std::atoi(asked ? asked : usual));
    for (unsigned seed = 1; std::chrono::steady_clock::now() < end; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        const kplib::test::RandomSchedule schedule(seed);
        std::mt19937 random(seed);
        Polling worker;
        ASSERT_NO_FATAL_FAILURE(driveAtRandom(worker, random, 200));
    }
}

TEST(KpWorkerThreadThreads, selfTestLogsItsRate)
{
    const kplib::test::LogCapture log;
    KpWorkerThread::test();
    ASSERT_EQ(log.lines().size(), 1);
    EXPECT_TRUE(std::regex_match(log.lines()[0],
                                 std::regex("  \\[\\] KpWorkerThread::test\\(\\): [1-9][0-9]* passes per second\n")))
        << log.lines()[0];
}
