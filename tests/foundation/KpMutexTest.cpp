#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpThreadLocalStorage.h>
#include <kplib/foundation/KpWaitCondition.h>
#include <kplib/foundation/detail/Deadline.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <climits>
#include <future>
#include <thread>

using Lock = KpScopedLockT<KpMutex>;

TEST(KpMutexThreads, isHeldUntilTheLastUnlock)
{
    for (bool recursive : {true, false}) {
        KpMutex mutex(recursive);
        const auto expectFree = [&](bool free) {
            std::thread([&] { EXPECT_EQ(mutex.tryLock() && (mutex.unlock(), true), free); }).join();
        };
        mutex.lock();
        if (recursive)
            const Lock nested(&mutex), none(nullptr);
        expectFree(false);
        mutex.unlock();
        expectFree(true);
    }
}

TEST(KpMutex, platformFailuresAreLoggedAndDontThrow)
{
    const kplib::test::LogCapture log;
    KpMutex notHeld(true);
    KpWaitCondition condition;
    notHeld.unlock();
    EXPECT_FALSE(condition.wait(&notHeld, ULONG_MAX));
    const Lock held(&notHeld);
    EXPECT_FALSE(condition.wait(&notHeld, 20)) << "which nobody ended";
    EXPECT_EQ(log.lines(), (kplib::test::Lines{"E [] KpMutex::unlock() failed (error code: 1)\n",
                                               "E [] KpWaitCondition::wait() failed (error code: 1)\n"}));
}

TEST(KpWaitCondition, deadlineIsOnTheMillisecond)
{
    const timespec carried = kplib::detail::deadlineAfter({1000, 700000}, 1500);
    EXPECT_EQ(std::tuple(carried.tv_sec, carried.tv_nsec), std::tuple(1002L, 200000000L));
    EXPECT_EQ(kplib::detail::deadlineAfter({1000, 999999}, 1).tv_nsec, 0);
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
    std::future<void> waits[3];
    for (std::future<void>& wait : waits)
        wait = std::async(std::launch::async, waitWith, &wait == waits ? 60000 : ULONG_MAX);
    for (int howMany : {1, 2}) {
        for (bool ready = false; !ready; std::this_thread::yield()) {
            const Lock lock(&mutex);
            ready = waiting == 3 && go == 0;
            go = ready ? howMany : go;
        }
        howMany == 1 ? condition.wakeOne() : condition.wakeAll();
    }
}

TEST(KpThreadLocalStorageThreads, eachThreadHasItsValueAndItsEnd)
{
    static int destroyed = 0;
    int mine = 1, other = 2;
    KpThreadLocalStorage<int> storage([](void* value) { destroyed += *static_cast<int*>(value); });
    storage.set(&mine);
    std::thread([&] {
        EXPECT_EQ(storage.get(), nullptr);
        storage.set(&other);
    }).join();
    EXPECT_EQ(std::tuple(destroyed, storage.get()), std::tuple(2, &mine)) << "the last value only";
}
