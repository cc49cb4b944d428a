#include <kplib/threads/KpProgressGuiInterface.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/ProgressScope.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <climits>
#include <memory>
#include <string>
#include <thread>
#include <utility>

namespace {

// Records the calls: m10 a maximum, v3 a value, "text", c0 the end with that code.
struct Gui : KpProgressGuiInterface {
    void setText(const std::string& text) override { told += '"' + text + "\" "; }
    void setMaximum(int maximum) override { told += 'm' + std::to_string(maximum) + ' '; }
    void setValue(int value) override { told += 'v' + std::to_string(value) + ' '; }
    void setCompleted(const KpResult& end) override { told += 'c' + std::to_string(end.codeValue()) + end.text(); }

    std::string take() { return std::exchange(told, {}); }
    using KpProgressGuiInterface::cancelCallback;
    std::string told;
};

}  // namespace

TEST(KpProgress, nestedScopesShareOneScaleToTheirEnd)
{
    const kplib::test::LogCapture log(KpLogError);
    Gui gui;
    KpProgressInterface progress;
    progress.setProgressGui(&gui);
    progress.nextStep();
    progress.startWorking(0, "x");
    progress.startWorking(10, "a");  // before which there is no scope and no step
    progress.setProgressValue(3);
    progress.startWorking(5, "b");
    progress.setProgressValue(2);
    progress.startWorking(2, "");  // no text takes over that of the scope around
    progress.nextStep();
    progress.stopWorking();
    EXPECT_EQ(gui.take(), "m10 \"a\" v0 v3 m50 \"b\" v15 v17 m100 \"b\" v34 v35 \"b\" m50 v18 ");
    progress.setProgressValue(99);
    progress.setProgressValue(-1);
    progress.stopWorking();
    EXPECT_EQ(gui.take(), "v20 v14 \"a\" m10 v4 ") << "clipped to the end of the scope, not to its start";
    progress.setProgressInfo("c");
    progress.stopWorking();
    EXPECT_EQ(gui.take(), "\"c\" c0");
    EXPECT_EQ(std::tuple(progress.currentProgressValue(), progress.globalMaximum(), progress.isWorking()),
              std::tuple(10, 1, false));
    progress.startWorking(1, "a");
    gui.take();
    progress.setFailed(KpResult(5000, "inner", "inner"), "bad");
    EXPECT_EQ(gui.take(), "c5000bad");
    progress.setFailed(KpResult(KpResult::Interrupted, "", ""), nullptr);
    EXPECT_EQ(log.lines(), (kplib::test::Lines{"E [] Operation failed: 'bad'", "E [] Operation failed: ''"}));
}

TEST(KpProgress, scalesBeyondAnIntEndAtItsLargestValue)
{
    KpProgressInterface progress;
    const auto state = [&] { return std::pair(progress.currentProgressValue(), progress.globalMaximum()); };
    const auto openScopes = [&](int count, int maximum) {
        for (; count > 0; --count) {
            progress.startWorking(maximum, "a");
            progress.setProgressValue(maximum);
        }
    };
    openScopes(5, 2000);
    EXPECT_EQ(state(), std::pair(INT_MAX, INT_MAX));
    for (int i = 0; i < 3; ++i)
        progress.stopWorking();
    EXPECT_EQ(state(), std::pair(4002001, 4000000)) << "outer scopes keep their place";
    openScopes(20, 2000);
    openScopes(1, INT_MAX);
    progress.nextStep();
    EXPECT_EQ(state(), std::pair(INT_MAX, INT_MAX));
    progress.stopWorking();
}

TEST(KpProgress, cancelEndsAllWorkForGood)
{
    Gui gui;
    KpProgressInterface progress;
    progress.setProgressGui(&gui);
    progress.disableCancel();
    gui.cancelCallback();
    progress.startWorking(1, "a");
    progress.stopWorking();
    progress.startWorking(4, "a");
    progress.startWorking(3, "b");
    gui.take();
    gui.cancelCallback();
    EXPECT_EQ(gui.take(), "\"a\" m4 c11") << "and no more values";
    progress.startWorking(4, "a");
    EXPECT_EQ(std::tuple(progress.isCanceled(), progress.isWorking()), std::tuple(true, false));
}

TEST(KpProgress, aStartThatFailsEndsOnce)
{
    struct Failing : KpProgressInterface {
        void beforeStartWorking() override { throw 1; }
        void afterStopWorking() override { ++ends; }
        int ends = 0;
    } failing;
    EXPECT_THROW(failing.startWorking(1, ""), int);
    failing.stopWorking();
    failing.stopWorking();
    EXPECT_EQ(failing.ends, 1);
}

TEST(KpProgressThreads, aWorkerPollsWhatAnotherThreadCancels)
{
    KpProgressInterface progress;
    progress.startWorking(10, "");
    std::thread worker([&] {
        while (!progress.isCanceled())
            std::this_thread::yield();
    });
    progress.cancel();
    worker.join();
    EXPECT_FALSE(progress.isWorking());
}

TEST(KpProgressGui, isDetachedByWhicheverGoesFirst)
{
    Gui last;
    auto progress = std::make_unique<KpProgressInterface>();
    progress->setProgressGui(std::make_unique<Gui>().get());  // gone with the statement
    progress->startWorking(1, "a");
    progress->setProgressGui(&last);
    progress.reset();
    EXPECT_FALSE(last.cancelCallback);
}

TEST(KpProgress, scopeClosesWhatIsOpenEvenWithoutMemory)
{
    KpProgressInterface progress;
    kplib::test::failAtEachAllocation(
        [&] {
            const ProgressScope scope(&progress), none(nullptr);
            progress.startWorking(3, std::string(100, 't'));
            progress.startWorking(4, "");
        },
        [&] { EXPECT_TRUE(!progress.isWorking() && progress.globalMaximum() == 1); });
}
