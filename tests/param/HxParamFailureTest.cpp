#include <param/Texts.h>
#include <support/ExhaustedMemory.h>

#include <kplib/param/HxParameter.h>

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <utility>

namespace {

/// Most of what a tree can do; each allocation in it is to fail once.
void liveThroughADay()
{
    const int numbers[] = {1, 2, 3};
    KpDArray<float> reals;
    HxParamBundle root("Patient of the day");
    root.set("numbers", 3, numbers);
    root.setAsString("text", 3, numbers);
    root.bundle("BoundaryIds", 1)->set("x", 1.5);
    root.setTag("G0028-0030", "1\\2");
    HxParamBundle& all = *root.dicomAllCreate();
    all.setPrivateTagInAll("CREATOR", "G0009-xx20", "value");
    all.privateSequenceItemInAll("OTHER", "G0009-xx30", "sequence", 0, true);
    root.findTag("G0028-0030", reals);
    root.findPrivateTag("CREATOR", "G0009-xx20", "");
    HxParamBundle copy(root), third("third");
    third = copy;
    third.copyAll(root);
    copy.setName("Name with title");
    *copy.find("text", 0, 255) = *root.find("numbers", 0, 255);
    third.move(copy);
    const HxParamBundle moved(std::move(third));
    textOf(moved);
}

}  // namespace

TEST(ParamFailure, ofEachAllocationIsAnExceptionWithoutALeak)
{
    kplib::test::failAtEachAllocation(liveThroughADay, [] {});
}

TEST(ParamFailure, leavesTheTreeAsItWas)
{
    const double many[100] = {};
    const HxParamBundle other("Other");
    const struct {
        const char* what;
        std::function<void(HxParamBundle&)> change;
    } cases[] = {
        {"set", [&](HxParamBundle& root) { root.set("value", 100, many); }},
        {"rename", [](HxParamBundle& root) { root.setName("Another new title"); }},
        {"rename into the title", [](HxParamBundle& root) { root.setName("with"); }},
        {"create", [](HxParamBundle& root) { root.bundle("New with title", 1); }},
        {"boundary", [](HxParamBundle& root) { root.bundle("BoundaryIds", 1); }},
        {"assign", [&](HxParamBundle& root) { root = other; }},
        {"assign a value", [](HxParamBundle& root) { *root.find("value", 0, 255) = HxParameter("renamed", "new"); }},
        {"reserve a block", [](HxParamBundle& root) {
             root.dicomAllCreate()->privateSequenceItemInAll("X", "G0009-xx20", "", 0, false);
         }}};
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        HxParamBundle root("Root with title");
        root.set("value", "old");
        root.bundle("sub", 1)->set("inner", 1);
        root.dicomAllCreate()->setPrivateTagInAll("CREATOR", "G0009-xx20", "value");
        root.untouchAll(255);
        const std::string before = textOf(root);
        bool isDone = false;
        kplib::test::failAtEachAllocation([&] { c.change(root), isDone = true; },
                                          [&] {
                                              EXPECT_NE(isDone, root.touched() == 0);
                                              EXPECT_TRUE(isDone || textOf(root) == before);
                                          });
    }
}
