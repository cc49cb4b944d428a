#include <kplib/threads/KpProgressGuiInterface.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/ProgressScope.h>

#include <support/ExhaustedMemory.h>
#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>
#include <utility>

namespace {

// Writes down what it is told: m10 a maximum, v3 a value, "text", c0 the end with that code.
struct Gui : KpProgressGuiInterface {
    void setText(const std::string& text) override { told += '"' + text + "\" "; }
    void setMaximum(int maximum) override { told += 'm' + std::to_string(maximum) + ' '; }
    void setValue(int value) override { told += 'v' + std::to_string(value) + ' '; }
    void setCompleted(const KpResult& end) override { told += 'c' + std::to_string(end.codeValue()) + end.text(); }

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
    const std::pair<std::function<void()>, const char*> steps[] = {
        // clang-format off
        {[&] { progress.nextStep(); progress.setProgressValue(3); }, ""},
        {[&] { progress.startWorking(0, "x"); }, ""},
        {[&] { progress.startWorking(10, "a"); }, "m10 \"a\" v0 "},
        {[&] { progress.setProgressValue(3); }, "v3 "},
        {[&] { progress.startWorking(5, "b"); }, "m50 \"b\" v15 "},
        {[&] { progress.setProgressValue(2); }, "v17 "},
        {[&] { progress.startWorking(2, ""); }, "m100 \"b\" v34 "},  // no text takes over that of the scope around
        {[&] { progress.nextStep(); }, "v35 "},
        {[&] { progress.stopWorking(); }, "\"b\" m50 v18 "},
        {[&] { progress.setProgressValue(99); }, "v20 "},  // clipped to the end of the scope,
        {[&] { progress.setProgressValue(-1); }, "v14 "},  // and not below
        {[&] { progress.stopWorking(); }, "\"a\" m10 v4 "},
        {[&] { progress.setProgressInfo("c"); }, "\"c\" "},
        {[&] { progress.stopWorking(); }, "c0"},
        // clang-format on
    };
    for (const auto& [step, told] : steps) {
        step();
        EXPECT_EQ(gui.take(), told);
    }
    EXPECT_TRUE(progress.currentProgressValue() == 10 && progress.globalMaximum() == 1 && !progress.isWorking());
}

TEST_F(KpProgressTest, cancelAndFailureEndAllWork)
{
    progress.disableCancel();
    progress.startWorking(4, "a");
    gui.cancelCallback();
    EXPECT_FALSE(progress.isCanceled());
    progress.stopWorking();
    progress.startWorking(4, "a");
    progress.startWorking(3, "b");
    gui.take();
    gui.cancelCallback();
    EXPECT_EQ(gui.take(), "\"a\" m4 c11") << "and no more values";
    progress.startWorking(4, "a");
    EXPECT_TRUE(progress.isCanceled() && !progress.isWorking());
    KpProgressInterface failing;
    Gui heard;
    failing.startWorking(4, "a");
    failing.setProgressGui(&heard);
    failing.setFailed(KpResult(5000, "inner", "inner"), "bad");
    EXPECT_EQ(heard.take(), "c5000bad");
    EXPECT_EQ(log.lines(), kplib::test::Lines{"E [] Operation failed: 'bad'"});
    failing.cancel();
    failing.afterStopWorking();
    EXPECT_EQ(failing.result().code(), 5000) << "which a later cancel doesn't hide";
}

TEST_F(KpProgressTest, scopeClosesWhatIsOpen)
{
    progress.startWorking(10, "outer");
    {
        const ProgressScope scope(&progress), none(nullptr);
        progress.startWorking(5, "inner");
        progress.startWorking(5, "innermost");
    }
    EXPECT_TRUE(progress.globalMaximum() == 10 && progress.currentProgressValue() == 1);
}

TEST(KpProgressGui, isDetachedByWhicheverGoesFirst)
{
    auto progress = std::make_unique<KpProgressInterface>();
    auto first = std::make_unique<Gui>(), last = std::make_unique<Gui>();
    progress->setProgressGui(first.get());
    first.reset();
    progress->startWorking(1, "a");
    progress->setProgressGui(last.get());
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
        },
        [&] { EXPECT_TRUE(!progress.isWorking() && progress.globalMaximum() == 1); });
}
