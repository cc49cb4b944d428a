#include <kplib/threads/KpProgressGuiInterface.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/ProgressScope.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>
#include <support/VirtualSlot.h>

#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>
#include <string>

namespace {

// Writes down what it is told: m10 a maximum, v3 a value, "text", c0 the end with that code.
class Gui : public KpProgressGuiInterface {
public:
    void setText(const std::string& text) override { told += '"' + text + "\" "; }
    void setMaximum(int maximum) override { told += 'm' + std::to_string(maximum) + ' '; }
    void setValue(int value) override { told += 'v' + std::to_string(value) + ' '; }
    void setCompleted(const KpResult& result) override
    {
        told += 'c' + std::to_string(result.codeValue()) + ' ' + result.text() + result.data();
    }

    std::string take() { return std::exchange(told, {}); }
    using KpProgressGuiInterface::cancelCallback;

    std::string told;
};

class KpProgressTest : public testing::Test {
protected:
    KpProgressTest() { progress.setProgressGui(&gui); }

    kplib::test::LogCapture log{KpLogError};
    Gui gui;
    KpProgressInterface progress;
};

}  // namespace

TEST_F(KpProgressTest, nestedScopesShareOneScale)
{
    progress.startWorking(10, "a");
    EXPECT_TRUE(progress.isWorking());
    progress.setProgressValue(3);
    EXPECT_EQ(gui.take(), "m10 \"a\" v0 v3 ");
    progress.startWorking(5, "b");
    EXPECT_EQ(gui.take(), "m50 \"b\" v15 ");
    EXPECT_EQ(progress.globalMaximum(), 50);
    progress.setProgressValue(2);
    EXPECT_EQ(progress.currentProgressValue(), 17);
    progress.startWorking(2, "");
    progress.nextStep();
    EXPECT_EQ(gui.take(), "v17 m100 \"b\" v34 v35 ") << "no text takes over that of the scope around";
    progress.stopWorking();
    EXPECT_EQ(gui.take(), "\"b\" m50 v18 ");
    progress.setProgressValue(99);
    EXPECT_EQ(progress.currentProgressValue(), 20) << "clipped to the end of the scope";
    progress.setProgressValue(-1);
    EXPECT_EQ(progress.currentProgressValue(), 14) << "with no clip below";
    progress.stopWorking();
    EXPECT_EQ(gui.take(), "v20 v14 \"a\" m10 v4 ");
    EXPECT_STREQ(progress.progressText(), "a");
    progress.setProgressInfo("c");
    EXPECT_STREQ(progress.progressText(), "c");
    progress.stopWorking();
    EXPECT_EQ(gui.take(), "\"c\" c0 ");
    EXPECT_EQ(progress.currentProgressValue(), 10);
    EXPECT_EQ(progress.globalMaximum(), 1);
    EXPECT_FALSE(progress.isWorking());
    EXPECT_STREQ(progress.progressText(), "");
}

TEST_F(KpProgressTest, idleObjectIgnoresWhatNeedsAScope)
{
    progress.startWorking(0, "x");
    progress.startWorking(-1, "x");
    progress.stopWorking();
    progress.nextStep();
    progress.setProgressValue(3);
    progress.terminate();
    EXPECT_EQ(gui.take(), "");
    EXPECT_EQ(progress.currentProgressValue(), 0);
}

TEST_F(KpProgressTest, cancelEndsAllWorkForGood)
{
    progress.disableCancel();
    progress.startWorking(4, "a");
    gui.cancelCallback();
    EXPECT_FALSE(progress.isCanceled() || progress.canCancel());
    progress.stopWorking();
    EXPECT_TRUE(progress.canCancel());
    progress.startWorking(4, "a");
    progress.startWorking(3, "b");
    gui.take();
    gui.cancelCallback();
    EXPECT_EQ(gui.take(), "\"a\" m4 c11 operation interrupted") << "and no more values";
    EXPECT_TRUE(progress.isCanceled());
    EXPECT_FALSE(progress.isWorking());
    progress.startWorking(4, "a");
    EXPECT_EQ(gui.take(), "");
}

TEST_F(KpProgressTest, failureIsLoggedAndEndsTheWork)
{
    progress.startWorking(4, "a");
    gui.take();
    progress.setFailed(KpResult(5000, "inner", "inner"), "bad");
    EXPECT_EQ(gui.take(), "c5000 bad");
    EXPECT_EQ(log.lines(), (std::vector<std::string>{"E [] Operation failed: 'bad'"}));
    progress.cancel();
    progress.afterStopWorking();
    EXPECT_EQ(progress.result().code(), 5000) << "which a later cancel doesn't hide";
}

TEST_F(KpProgressTest, scopeClosesWhatIsOpen)
{
    progress.startWorking(10, "outer");
    try {
        const ProgressScope scope(&progress), none(nullptr);
        progress.startWorking(5, "inner");
        progress.startWorking(5, "innermost");
        throw std::runtime_error("early end");
    } catch (const std::runtime_error&) {
        EXPECT_EQ(progress.globalMaximum(), 10);
        EXPECT_EQ(progress.currentProgressValue(), 1);
    }
    {
        const ProgressScope scope(&progress);
        progress.startWorking(5, "inner");
        progress.stopWorking();
    }
    EXPECT_EQ(progress.globalMaximum(), 10) << "closed by hand and not once more";
}

TEST(KpProgressGui, isDetachedByWhicheverGoesFirst)
{
    KpProgressInterface progress;
    auto first = std::make_unique<Gui>();
    Gui second;
    progress.setProgressGui(first.get());
    progress.setProgressGui(&second);
    EXPECT_FALSE(first->cancelCallback);
    first.reset();
    progress.startWorking(1, "a");
    EXPECT_NE(second.take(), "");
    {
        KpProgressInterface shorter;
        Gui third;
        progress.setProgressGui(&third);
        shorter.setProgressGui(&second);
    }
    EXPECT_FALSE(second.cancelCallback);
    progress.stopWorking();
    EXPECT_EQ(second.take(), "");
}

TEST(KpProgress, hooksRunAroundTheOutermostScope)
{
    struct Hooked : KpProgressInterface {
        void beforeStartWorking() override { calls += isWorking() ? "before " : "?"; }
        void afterStopWorking() override { calls += isWorking() ? "?" : "after "; }
        std::string calls;
    } progress;
    for (int i = 0; i < 2; ++i)
        progress.startWorking(2, "a");
    progress.terminate();
    EXPECT_EQ(progress.calls, "before after ");
}

TEST_F(KpProgressTest, exhaustedMemoryLeavesTheScopesInOrder)
{
    const std::string text(100, 't');
    progress.setProgressGui(nullptr);
    kplib::test::failAtEachAllocation(
        [&] {
            const ProgressScope scope(&progress);
            progress.startWorking(3, text);
            progress.startWorking(4, "");
            progress.setProgressText(text.c_str());
        },
        [&] {
            EXPECT_FALSE(progress.isWorking());
            EXPECT_EQ(progress.globalMaximum(), 1);
        });
    kplib::test::failAtEachAllocation(
        [&] {
            KpProgressInterface other;
            other.startWorking(3, "a");
            other.startWorking(3, "b");
            other.cancel();
        },
        [] {});
}

TEST(KpProgress, tablesAreTheOnesOthersAreCompiledAgainst)
{
    using kplib::test::slotOf;
    using Progress = KpProgressInterface;
    EXPECT_EQ(slotOf(&Progress::setProgressGui), 0);
    EXPECT_EQ(slotOf(&Progress::setProgressValue), 3);
    EXPECT_EQ(slotOf(&Progress::setFailed), 6);
    EXPECT_EQ(slotOf(&Progress::beforeStartWorking), 9);
    EXPECT_EQ(slotOf(&Progress::currentProgressValue), 12);
    EXPECT_EQ(slotOf(&Progress::setCompleted), 16);
    EXPECT_EQ(slotOf(&KpProgressGuiInterface::setText), 2);
    EXPECT_EQ(slotOf(&KpProgressGuiInterface::show), 7);
}
