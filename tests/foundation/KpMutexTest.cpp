#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpThreadLocalStorage.h>
#include <kplib/foundation/KpWaitCondition.h>
#include <kplib/foundation/detail/Deadline.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <climits>
#include <thread>

using Lock = KpScopedLockT<KpMutex>;

namespace {

bool isFree(KpMutex& mutex)
{
    bool taken = false;
    std::thread([&] {
        taken = mutex.tryLock();
        if (taken)
            mutex.unlock();
    }).join();
    return taken;
}

}  // namespace

TEST(KpMutexThreads, isHeldUntilTheLastUnlock)
{
    for (bool recursive : {true, false}) {
        KpMutex mutex(recursive);
        EXPECT_EQ(mutex.isRecursive(), recursive);
        mutex.lock();
        if (mutex.tryLock()) {
            EXPECT_TRUE(recursive);
            mutex.unlock();
            const Lock nested(&mutex), none(nullptr);
        }
        EXPECT_FALSE(isFree(mutex));
        mutex.unlock();
        EXPECT_TRUE(isFree(mutex));
    }
    EXPECT_TRUE(_KpSingleton_Mutex.isRecursive() && isFree(_KpSingleton_Mutex));
}

TEST(KpMutex, platformFailuresAreLoggedAndDontThrow)
{
    const kplib::test::LogCapture log;
    KpMutex notHeld(true);
    KpWaitCondition condition;
    notHeld.unlock();
    EXPECT_FALSE(condition.wait(&notHeld, ULONG_MAX));
    EXPECT_FALSE(condition.wait(&notHeld, 0)) << "and without a word, unlike the wait before";
    const Lock held(&notHeld);
    EXPECT_FALSE(condition.wait(&notHeld, 20)) << "which nobody ended";
    EXPECT_EQ(log.lines(), (kplib::test::Lines{"E [] KpMutex::unlock() failed (error code: 1)\n",
                                               "E [] KpWaitCondition::wait() failed (error code: 1)\n"}));
}

TEST(KpWaitCondition, deadlineIsOnTheMillisecond)
{
    const struct {
        long usec;
        unsigned long wait;
        long sec, nsec;
    } cases[] = {{700000, 1500, 2, 200000000}, {0, 0, 0, 0},      {999999, 999, 1, 998000000},
                 {999999, 0, 0, 999000000},    {999999, 1, 1, 0}, {1999, 3600000, 3600, 1000000}};
    for (const auto& c : cases) {
        const timespec deadline = kplib::detail::deadlineAfter({1000, c.usec}, c.wait);
        EXPECT_EQ(deadline.tv_sec, 1000 + c.sec) << c.usec << " + " << c.wait;
        EXPECT_EQ(deadline.tv_nsec, c.nsec) << c.usec << " + " << c.wait;
    }
}

TEST(KpWaitConditionThreads, wakesThoseWhoWait)
{
    KpMutex mutex(false);
    KpWaitCondition condition;
    int waiting = 0, go = 0;
    const auto waitWith = [&](unsigned long milliseconds) {
        const Lock lock(&mutex);
        ++waiting;
        while (go == 0)
            EXPECT_TRUE(condition.wait(&mutex, milliseconds));
        --go;
    };
    std::thread threads[] = {std::thread(waitWith, ULONG_MAX), std::thread(waitWith, ULONG_MAX),
                             std::thread(waitWith, 60000)};
    for (int howMany : {1, 2}) {
        for (bool ready = false; !ready; std::this_thread::yield()) {
            const Lock lock(&mutex);
            ready = waiting == 3 && go == 0;
            go = ready ? howMany : go;
        }
        howMany == 1 ? condition.wakeOne() : condition.wakeAll();
    }
    for (std::thread& thread : threads)
        thread.join();
}

TEST(KpThreadLocalStorageThreads, eachThreadHasItsValueAndItsEnd)
{
    static int destroyed = 0;
    int mine = 1, other = 2;
    KpThreadLocalStorage<int> storage([](void* value) { destroyed += *static_cast<int*>(value); });
    EXPECT_EQ(storage.get(), nullptr);
    storage.set(&mine);
    for (int* last : {&other, static_cast<int*>(nullptr)}) {
        std::thread([&] {
            EXPECT_EQ(storage.get(), nullptr);
            storage.set(&mine);
            storage.set(last);
            EXPECT_EQ(storage.get(), last);
        }).join();
        EXPECT_EQ(destroyed, 2) << "the last value only, and no null";
    }
    EXPECT_EQ(storage.get(), &mine);
}
