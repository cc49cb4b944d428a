#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpThreadLocalStorage.h>
#include <kplib/foundation/KpWaitCondition.h>
#include <kplib/foundation/detail/Deadline.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <thread>

using kplib::test::LogCapture;

namespace {

bool canBeTakenByAnother(KpMutex& mutex)
{
    bool taken = false;
    std::thread([&] {
        taken = mutex.tryLock();
        if (taken)
            mutex.unlock();
    }).join();
    return taken;
}

std::string failed(const char* what)
{
    return "E [] " + std::string(what) + "() failed (error code: " + std::to_string(EPERM) + ")\n";
}

}  // namespace

TEST(KpMutexThreads, recursiveMutexStaysHeldUntilTheLastUnlock)
{
    KpMutex mutex(true);
    EXPECT_TRUE(mutex.isRecursive());
    mutex.lock();
    {
        const KpScopedLockT<KpMutex> nested(&mutex), none(nullptr);
        EXPECT_FALSE(canBeTakenByAnother(mutex));
    }
    EXPECT_FALSE(canBeTakenByAnother(mutex));
    mutex.unlock();
    EXPECT_TRUE(canBeTakenByAnother(mutex));
    EXPECT_TRUE(canBeTakenByAnother(_KpSingleton_Mutex));
    EXPECT_TRUE(_KpSingleton_Mutex.isRecursive());
}

TEST(KpMutexThreads, plainMutexIsNotTakenTwice)
{
    KpMutex mutex(false);
    EXPECT_FALSE(mutex.isRecursive());
    EXPECT_TRUE(mutex.tryLock());
    EXPECT_FALSE(mutex.tryLock());
    EXPECT_FALSE(canBeTakenByAnother(mutex));
    mutex.unlock();
    EXPECT_TRUE(canBeTakenByAnother(mutex));
}

TEST(KpMutex, platformFailuresAreLoggedAndDontThrow)
{
    const LogCapture log;
    KpMutex notHeld(true);
    KpWaitCondition condition;
    notHeld.unlock();
    EXPECT_FALSE(condition.wait(&notHeld, ULONG_MAX));
    EXPECT_FALSE(condition.wait(&notHeld, 0)) << "and without a word, unlike the wait before";
    EXPECT_EQ(log.lines(), (std::vector{failed("KpMutex::unlock"), failed("KpWaitCondition::wait")}));
}

TEST(KpWaitCondition, deadlineIsOnTheMillisecond)
{
    const struct {
        long usec;
        unsigned long wait;
        long sec, nsec;
    } cases[] = {
        {700000, 1500, 2, 200000000}, {0, 0, 0, 0},
        {999999, 0, 0, 999000000},    {999999, 1, 1, 0},
        {999999, 999, 1, 998000000},  {1999, 3600000, 3600, 1000000},
    };
    for (const auto& c : cases) {
        const timespec deadline = kplib::detail::deadlineAfter({1000, c.usec}, c.wait);
        EXPECT_EQ(deadline.tv_sec, 1000 + c.sec) << c.usec << " + " << c.wait;
        EXPECT_EQ(deadline.tv_nsec, c.nsec) << c.usec << " + " << c.wait;
    }
}

TEST(KpWaitCondition, timesOutSilently)
{
    const LogCapture log;
    KpMutex mutex(true);
    KpWaitCondition condition;
    const KpScopedLockT<KpMutex> lock(&mutex);
    for (unsigned long milliseconds : {0, 20})
        EXPECT_FALSE(condition.wait(&mutex, milliseconds));
    EXPECT_TRUE(log.lines().empty());
}

TEST(KpWaitConditionThreads, wakesThoseWhoWait)
{
    KpMutex mutex(false);
    KpWaitCondition condition;
    int waiting = 0, go = 0, woken = 0;
    const auto waitWith = [&](unsigned long milliseconds) {
        const KpScopedLockT<KpMutex> lock(&mutex);
        ++waiting;
        bool ok = true;
        while (go == 0 && ok)
            ok = condition.wait(&mutex, milliseconds);
        go -= go > 0;
        woken += ok;
    };
    std::thread threads[] = {std::thread(waitWith, ULONG_MAX), std::thread(waitWith, ULONG_MAX),
                             std::thread(waitWith, 60000)};
    const auto let = [&](int howMany, void (KpWaitCondition::*wake)()) {
        for (bool ready = false; !ready; std::this_thread::yield()) {
            const KpScopedLockT<KpMutex> lock(&mutex);
            ready = waiting == 3 && go == 0;
        }
        const KpScopedLockT<KpMutex> lock(&mutex);
        go = howMany;
        (condition.*wake)();
    };
    let(1, &KpWaitCondition::wakeOne);
    let(2, &KpWaitCondition::wakeAll);
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(woken, 3);
}

TEST(KpThreadLocalStorageThreads, eachThreadHasItsValueAndItsEnd)
{
    static int destroyed;
    destroyed = 0;
    int mine = 1, other = 2;
    KpThreadLocalStorage<int> storage([](void* value) { destroyed += *static_cast<int*>(value); });
    EXPECT_EQ(storage.get(), nullptr);
    storage.set(&mine);
    std::thread([&] {
        EXPECT_EQ(storage.get(), nullptr);
        storage.set(&mine);
        storage.set(&other);
        EXPECT_EQ(storage.get(), &other);
    }).join();
    EXPECT_EQ(destroyed, 2) << "the last value only";
    std::thread([&] {
        storage.set(&other);
        storage.set(nullptr);
    }).join();
    EXPECT_EQ(destroyed, 2);
    EXPECT_EQ(storage.get(), &mine);
}
