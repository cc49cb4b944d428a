#include <param/Texts.h>

#include <kplib/param/HxParameter.h>

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <future>
#include <map>
#include <random>
#include <string>
#include <vector>

TEST(HxParamBundle, agreesWithAMapThroughRandomChanges)
{
    std::mt19937 random(42);
    HxParamBundle bundle("tree");
    std::map<std::string, int> model;
    for (int step = 0; step < 20'000; ++step) {
        char upper[24], mixed[24];
        const unsigned n = random() % 60;
        std::snprintf(upper, sizeof(upper), n % 2 ? "G%04X-%04X" : "LONGER-NAME-%X-%X", n, n);
        std::snprintf(mixed, sizeof(mixed), n % 2 ? "g%04x-%04X" : "Longer-Name-%x-%x", n, n);
        const char* const name = random() % 2 ? upper : mixed;
        switch (random() % 6) {
        case 0:
            bundle.insert(new HxParameter(name, model[upper] = step), 1);
            break;
        case 1:
            bundle.set(name, model[upper] = step);
            break;
        case 2:
            bundle.remove(name);
            model.erase(upper);
            break;
        default:
            const HxParameter* const found = random() % 8 ? bundle.find(name, 1, 255) : bundle.findSorted(name);
            const auto expected = model.find(upper);
            ASSERT_EQ(found ? found->getNum(0) : -1, expected == model.end() ? -1 : expected->second) << name;
        }
        ASSERT_EQ(bundle.size(), static_cast<long>(model.size()));
    }
}

TEST(HxParamBundle, keepsBundlesFirstAndReplacesInPlace)
{
    HxParamBundle bundle("b");
    bundle.set("p", 1);
    bundle.set("q", 2);
    EXPECT_EQ(bundle.index(bundle.bundle("Sub", 1)), 0);
    bundle.bundle("Other", 1);
    bundle.find("p", 1, 255)->setFlag(HxParamBase::FlagHidden, 1);
    bundle.sortParameters();
    HxParameter* const fresh = new HxParameter("P", 3);
    fresh->touch(1);
    bundle.untouchAll(255);
    bundle.insert(fresh, 1);
    EXPECT_EQ(std::tuple(bundle.index(fresh), fresh->flags(), fresh->touched()),
              std::tuple(2, HxParamBase::FlagHidden, 17));
    EXPECT_EQ(bundle.touched(), HxParamBase::TouchValue | HxParamBase::TouchAny);
    bundle.insert(new HxParamBundle("SUB"), 1);
    EXPECT_TRUE(bundle.isSorted());
    EXPECT_EQ(bundle.index(bundle.bundle("Sub")), 0);
    bundle.insert(new HxParamBundle("Third"), 1);
    EXPECT_FALSE(bundle.isSorted() || bundle.bundle(3) || bundle.bundle(-1));
    fresh->setFlag(HxParamBase::FlagNoDelete, 1);
    bundle.remove("p");
    EXPECT_EQ(bundle.size(), 5);
    bundle.untouchAll(255);
    bundle.removeAll();
    EXPECT_EQ(bundle.size() + bundle.nBundles() + bundle.touched(), 0);
}

TEST(HxParamBundle, isFoundByNameAndTitle)
{
    HxParamBundle root("root");
    HxParamBundle* const lung = root.bundle("Left lung", 1);
    EXPECT_EQ(root.bundle("Left lung", 1), lung) << "found again, not replaced";
    EXPECT_EQ(root.findBase("lung"), lung);
    EXPECT_FALSE(root.bundle("lun") || root.bundle("lung left") || root.bundle(nullptr));
    EXPECT_TRUE(root.bundle("3D", 1));
    EXPECT_EQ(root.bundle("3D"), root.bundle("_3d"));
    lung->set("Name", " 1 2  3 4 5 6 7 8 9 10 11 12 13 14 15 _16 _17");
    EXPECT_EQ(root.bundle("16"), lung) << "a digit asked for has the _ of names";
    EXPECT_EQ(root.bundle("17"), nullptr) << "the 17th word";
    EXPECT_EQ(root.boundaryIds(1)->flags(), 36);
    root.bundle("Materials", 1)->set("x", 1);
    EXPECT_EQ(root.materials(0)->flags(), 52);
    EXPECT_EQ((*root.materials(0))[0]->flags(), 4);
}

TEST(HxParamBundle, answersByDimensionAndType)
{
    const int masks[] = {95, 94, 92, 88, 80, 0, 64, 94, 0, 0};
    const double zeros[4] = {};
    for (int type = 0; type < 10; ++type) {
        HxParamBundle bundle("b");
        bundle.insert(new HxParameter("x", 1, KpPrimType(type), zeros), 0);
        for (int bit : {1, 2, 4, 8, 16, 32, 64, 128})
            EXPECT_EQ(bundle.find("X", 0, bit) != nullptr, (masks[type] & bit) != 0) << type << ' ' << bit;
        EXPECT_EQ(bundle.find("x", 2, 255), nullptr);
        bundle.set("x", 1);
        EXPECT_EQ(bundle.size(), masks[type] == 0 ? 2 : 1) << "what isn't found is added once more";
    }
}

TEST(HxParamBundle, readsNumbers)
{
    HxParamBundle bundle("b");
    const int pair[] = {4, -5};
    bundle.set("pair", 2, pair);
    bundle.set("text", "1 2");
    bundle.set("real", "1.5 7");
    std::array n = {9, 9, 9};
    EXPECT_FALSE(bundle.findNum("text", 3, n.data()));
    EXPECT_EQ(n, (std::array{1, 2, 9}));
    EXPECT_TRUE(bundle.findNum("real", 3, n.data()));
    EXPECT_EQ(n, (std::array{1, 0, 0})) << "nothing passes the point: .5 is read as 0 again and again";
    EXPECT_TRUE(bundle.findNum("pair", 2, n.data()));
    EXPECT_EQ(n[1], -5);
    EXPECT_FALSE(bundle.findNum("pair", 0, n.data()));
    EXPECT_TRUE(bundle.findNum("text", 0, n.data()));
    double d[3] = {};
    float f[3] = {};
    EXPECT_TRUE(bundle.findReal("pair", 2, d));
    EXPECT_TRUE(bundle.findReal("pair", 2, f));
    EXPECT_EQ(d[1] + f[1], -10);
    EXPECT_FALSE(bundle.findReal("text", 2, d));
    bundle.setAsString("s", 2, pair);
    bundle.setAsString("none", 0, pair);
    EXPECT_EQ(valueOf(bundle, "s") + '|' + valueOf(bundle, "none"), "4 -5|4");
    bundle.set("Color", "255 128 0");
    EXPECT_TRUE(bundle.findColor(f));
    bundle.setColor(f);
    EXPECT_TRUE(bundle.findColor(f));
    EXPECT_LT(std::abs(f[1] - 128 / 255.0f), 1e-7f);
}

TEST(HxParamBundle, copiesAndMerges)
{
    HxParamBundle source("source");
    source.set("kept", 1);
    source.set("secret", 2);
    source.find("secret", 1, 255)->setFlag(HxParamBase::FlagNoCopy, 1);
    HxParamBundle& sub = *source.bundle("sub", 1);
    sub.set("inner", 3);
    sub.set("hidden", 4);
    sub.find("hidden", 1, 255)->setFlag(HxParamBase::FlagNoCopy, 1);
    EXPECT_EQ(textOf(HxParamBundle(source)), "source {\n    sub {\n        inner 3\n    }\n    kept 1\n}\n");

    HxParamBundle target("target");
    target.set("KEPT", 9);
    target.bundle("SUB", 1)->set("own", 5);
    target.copy(source);
    EXPECT_EQ(textOf(target), "target {\n    SUB {\n        own 5\n        inner 3\n    }\n    kept 1\n}\n");
    target.copyAll(source);
    EXPECT_EQ(textOf(target), "target {\n    SUB {\n        own 5\n        inner 3\n        hidden 4\n    }\n"
                              "    kept 1\n    secret 2\n}\n");
    HxParamBundle fresh("fresh");
    fresh.copyAll(source);
    EXPECT_EQ(valueOf(*fresh.bundle("sub"), "hidden"), "-") << "below the first level the flag still counts";

    target.bundle("SUB")->remove("hidden");
    target.remove("secret");
    target.sortParameters();
    fresh = target;
    EXPECT_EQ(std::tuple(fresh.isSorted(), textOf(fresh)), std::tuple(true, textOf(target)));
    fresh = *fresh.bundle("sub");
    EXPECT_EQ(textOf(fresh), "SUB {\n    own 5\n    inner 3\n}\n") << "from one of its own children";
}

TEST(HxParamBundle, moves)
{
    HxParamBundle source("source");
    source.set("a", 1);
    source.bundle("sub", 1)->bundle("deep", 1);
    source.sortParameters();
    HxParamBundle moved(std::move(source)), other("other");
    EXPECT_EQ(std::tuple(moved.bundle("sub")->parent(), moved.isSorted(), source.size()), std::tuple(&moved, true, 0));
    other.set("A", 2);
    other.set("b", 3);
    other.move(moved);
    other.move(other);
    EXPECT_EQ(textOf(other), "other {\n    sub {\n        deep {\n        }\n    }\n    a 1\n    b 3\n}\n");
    other = std::move(*other.bundle("sub"));
    EXPECT_EQ(textOf(other), "other {\n    deep {\n    }\n}\n") << "from one of its own children; the name stays";
}

TEST(HxParamBundle, printsItsTextForm)
{
    HxParamBundle root("A");
    root.bundle("B", 1)->set("N", 3);
    for (const auto& [name, text] :
         {std::pair("quoted", "say \"x\""), {"escaped", "a\\\"b\"c"}, {"path", "C:\\"}, {"hidden", "1"}, {"empty", ""}})
        root.set(name, text);
    root.set("last", 2, std::vector<float>{0.1f, 2}.data());
    root.insert(new HxParameter("null", 1, KpPrimType::String, nullptr), 0);
    for (const char* name : {"last", "null"})
        root.find(name, 0, 255)->setFlag(HxParamBase::FlagNoSave, 1);
    root.find("hidden", 0, 255)->setFlag(HxParamBase::FlagHidden, 1);
    EXPECT_EQ(textOf(root), "A {\n    B {\n        N 3\n    }\n    quoted \"say \\\"x\\\"\"\n"
                            "    escaped \"a\\'b'c\"\n    path \"C:\\ \"\n    empty \"\"\n"
                            "    last 0.1 2\n    null \"\"\n}\n");
    char text[200] = "";
    FILE* const file = fmemopen(text, sizeof text, "w");
    root.print(file);
    std::fclose(file);
    EXPECT_STREQ(text, "A {\n    B {\n        N 3\n    }\n    quoted \"say \\\"x\\\"\",\n"
                       "    escaped \"a\\'b'c\",\n    path \"C:\\ \",\n    empty \"\"\n}\n");
    KpString indented;
    HxParamBundle("x").print(indented, 1, "other");
    EXPECT_STREQ(indented, "    other {\n    }\n");
}

TEST(HxParamBundleThreads, lookUpAndSortSideBySide)
{
    for (int round = 0; round < 20; ++round) {
        HxParamBundle bundle("b");
        for (int i = 199; i >= 0; --i)
            bundle.set(std::to_string(-1000 - i).c_str(), i);
        std::future<void> threads[4];
        for (std::future<void>& thread : threads) {
            thread = std::async(std::launch::async, [&bundle] {
                for (int i = 0; i < 200; ++i)
                    ASSERT_EQ(bundle.findSorted(std::to_string(-1000 - i).c_str())->getNum(0), i);
            });
        }
    }
}
