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
#include <utility>
#include <vector>

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
    struct : KpProgressInterface {
        void beforeStartWorking() override { starts += isWorking(); }
        int starts = 0;
    } progress;
};

}  // namespace

TEST_F(KpProgressTest, nestedScopesShareOneScale)
{
    progress.startWorking(0, "x");
    progress.stopWorking();
    progress.nextStep();
    progress.setProgressValue(3);
    EXPECT_EQ(gui.take(), "") << "what needs a scope is ignored without one";
    progress.startWorking(10, "a");
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
    progress.stopWorking();
    EXPECT_EQ(gui.take() + progress.progressText(), "\"c\" c0 ");
    EXPECT_TRUE(progress.currentProgressValue() == 10 && progress.globalMaximum() == 1);
    EXPECT_TRUE(progress.starts == 1 && !progress.isWorking());
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
    progress.startWorking(4, "a");
    EXPECT_TRUE(progress.isCanceled() && !progress.isWorking() && gui.take().empty());
}

TEST_F(KpProgressTest, failureIsLoggedAndEndsTheWork)
{
    progress.startWorking(4, "a");
    gui.take();
    progress.setFailed(KpResult(5000, "inner", "inner"), "bad");
    EXPECT_EQ(gui.take(), "c5000 bad");
    EXPECT_EQ(log.lines(), kplib::test::Lines{"E [] Operation failed: 'bad'"});
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
        EXPECT_TRUE(progress.globalMaximum() == 10 && progress.currentProgressValue() == 1);
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
    auto progress = std::make_unique<KpProgressInterface>();
    auto first = std::make_unique<Gui>(), second = std::make_unique<Gui>(), last = std::make_unique<Gui>();
    progress->setProgressGui(first.get());
    progress->setProgressGui(second.get());
    EXPECT_FALSE(first->cancelCallback);
    second.reset();
    progress->startWorking(1, "a");
    progress->setProgressGui(last.get());
    progress->stopWorking();
    EXPECT_EQ(last->take(), "c0 ");
    progress.reset();
    EXPECT_FALSE(last->cancelCallback);
}

TEST(KpProgress, exhaustedMemoryLeavesTheScopesInOrder)
{
    KpProgressInterface progress;
    kplib::test::failAtEachAllocation(
        [&] {
            const ProgressScope scope(&progress);
            progress.startWorking(3, std::string(100, 't'));
            progress.startWorking(4, "");
            KpProgressInterface canceled;
            canceled.startWorking(3, "a");
            canceled.cancel();
        },
        [&] { EXPECT_TRUE(!progress.isWorking() && progress.globalMaximum() == 1); });
}

TEST(KpProgress, tablesAreTheOnesOthersAreCompiledAgainst)
{
    using Progress = KpProgressInterface;
    EXPECT_EQ(kplib::test::slotsOf(&Progress::setProgressGui, &Progress::setProgressValue, &Progress::setFailed,
                                   &Progress::beforeStartWorking, &Progress::currentProgressValue,
                                   &Progress::setCompleted, &KpProgressGuiInterface::setText,
                                   &KpProgressGuiInterface::show),
              (std::vector<long>{0, 3, 6, 9, 12, 16, 2, 7}));
}
