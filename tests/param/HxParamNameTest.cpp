#include <param/Texts.h>

#include <kplib/param/HxParamEditCheck.h>
#include <kplib/param/HxParameter.h>
#include <kplib/param/detail/ParamName.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <random>
#include <string>

namespace {

/// The order of names once more: what is cut at a blank and upper-cased is compared as strings are.
int plainOrder(std::string a, std::string b)
{
    b = b.substr(0, b.find(' '));
    for (std::string* s : {&a, &b})
        std::transform(s->begin(), s->end(), s->begin(), [](int c) { return std::toupper(c); });
    return a < b ? -1 : a > b;
}

}  // namespace

TEST(ParamName, isCleaned)
{
    EXPECT_STREQ(HxParameter("2a b.c-Y_9", 1).name(), "_2a_b_c-Y_9");
    EXPECT_STREQ(HxParameter("\xC4\xD6\xDC\xDF\xE4\xE8\xE9\xEA\xF6\xFC\xC3\xEB\xFF", 1).name(), "AOUsaeeeou___");
}

TEST(ParamName, ofABundleLeavesTheRestToTheTitle)
{
    HxParamBundle bundle("Materials of heart");
    EXPECT_EQ(valueOf(bundle, "Name"), "of heart");
    EXPECT_EQ(std::tuple(bundle.touched(), bundle[0]->touched()), std::tuple(27, 18)) << "a title is set twice";
    bundle.setName("of");
    EXPECT_EQ(valueOf(bundle, "Name"), "heart") << "a title doesn't repeat the name";
    bundle.setName("heart heart");
    EXPECT_EQ(valueOf(bundle, "Name"), "-");
    bundle.setName("A \"\" A");
    EXPECT_EQ(valueOf(bundle, "Name"), "") << "an empty word is one";
    HxParamBundle shadowed("A");
    const unsigned number = 1;
    shadowed.insert(new HxParameter("Name", 1, KpPrimType::UInt, &number), 0);
    shadowed.setName("B B C");
    ASSERT_EQ(shadowed.size(), 2) << "no lookup finds a uint";
    EXPECT_STREQ(static_cast<HxParameter*>(shadowed[1])->getString(), "B C");
    HxParamBundle stale("A");
    for (const char* name : {"a", "b", "c", "d"})
        stale.set(name, 5);
    stale.sortParameters();
    stale[3]->setName("x");
    stale[0]->setName("name");  // the sort does not know
    stale.setName("B of heart");
    EXPECT_EQ(textOf(stale), "B {\n    name \"5\"\n    b 5\n    c 5\n    x 5\n    Name \"of heart\"\n}\n");
}

TEST(ParamName, isGeneratedFromTwoCounters)
{
    const auto numberOf = [](const HxParamBase& node, size_t prefix) { return std::stoi(node.name() + prefix); };
    const HxParameter first(nullptr, 1);
    const HxParamBundle bundle(nullptr), next("");
    EXPECT_EQ(numberOf(next, 6), numberOf(bundle, 6) + 1);
    EXPECT_EQ(numberOf(HxParameter("", 1), 9), numberOf(first, 9) + 3) << "bundles begin as parameters";
    HxParameter named("x", 1);
    named.setName(named.name());
    named.setName(std::string("x").c_str());
    EXPECT_EQ(named.touched(), 0);
}

TEST(ParamName, keysCompareAsTextsDo)
{
    std::mt19937 random(7);
    const char* const pieces[] = {"G0010-001", "g0010-001", "G00", "0-0", "a", "B", "_", " ", "1", "-", "Fz", "0000"};
    const auto piece = [&] { return std::string(random() % 3 ? pieces[random() % std::size(pieces)] : ""); };
    using kplib::detail::NameKey;
    for (int round = 0; round < 100'000; ++round) {
        const std::string asked = piece() + piece() + piece(), wanted = piece() + piece() + piece();
        const HxParameter node(wanted.empty() ? "x" : wanted.c_str(), 1);
        const std::string canonical = (std::isdigit(asked[0]) ? "_" : "") + asked;
        const NameKey literal(asked.c_str(), NameKey::Literal), key(asked.c_str());
        ASSERT_EQ(literal.order(node), plainOrder(asked, node.name())) << asked << '|' << node.name();
        ASSERT_EQ(key.order(node), plainOrder(canonical, node.name())) << asked << '|' << node.name();
        ASSERT_EQ(key.matches(node), plainOrder(node.name(), canonical) == 0) << asked << '|' << node.name();
        ASSERT_EQ(key.matchesToken(wanted.c_str()), plainOrder(canonical, wanted) == 0) << asked << '|' << wanted;
    }
}

TEST(ParamNode, tellsChangesToAllAbove)
{
    HxParamBundle root("root");
    HxParamBundle* const middle = root.bundle("middle", 1);
    middle->set("leaf", 1);
    HxParamBase* const leaf = middle->find("leaf", 0, 255);
    const auto masks = [&] { return std::vector<int>{leaf->touched(), middle->touched(), root.touched()}; };
    root.untouchAll(255);
    leaf->touch(0);
    leaf->touch(HxParamBase::TouchValue);
    EXPECT_EQ(masks(), (std::vector{18, 24, 24}));
    root.untouchAll(8);
    leaf->setName("other");
    EXPECT_EQ(masks(), (std::vector{19, 20, 20}));
}

TEST(ParamNode, asksTheNearestEditCheck)
{
    struct Never : HxParamEditCheck {
        bool checkDelete(HxParamBase*) override { return false; }
    } never;
    HxParamBundle root("root");
    HxParamBundle* const child = root.bundle("child", 1);
    HxParamEditCheck& check = *child->editCheck();
    root.setEditCheck(&never);
    EXPECT_EQ(child->editCheck(), &never);
    EXPECT_EQ(HxParamBundle(root).editCheck(), &check);
    HxParameter leaf("leaf", 1);
    for (int flag = HxParamBase::FlagNoDelete; flag <= HxParamBase::FlagNoSetValue; flag *= 2) {
        for (HxParamBase* const node : std::initializer_list<HxParamBase*>{child, &leaf}) {
            node->setFlag(255, 0);
            node->setFlag(flag, 1);
        }
        const bool allowed[] = {check.checkDelete(child), check.checkInsertBundle(child, "x"),
                                check.checkInsertParam(child, "x"), check.checkRename(child, "x"),
                                check.checkSetValue(&leaf, "x")};
        for (int i = 0; i < 5; ++i)
            EXPECT_EQ(allowed[i], flag != HxParamBase::FlagNoDelete << i) << i;
    }
}
