#include <param/Texts.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <string>

namespace {

/// The bundle at the end of a row of sequences and items, which are made.
HxParamBundle& below(HxParamBundle& bundle, std::initializer_list<const char*> path)
{
    HxParamBundle* at = &bundle;
    for (const char* name : path)
        at = at->bundle(name, 1);
    return *at;
}

}  // namespace

TEST(DicomTags, areFoundByTheirText)
{
    HxParamBundle root("root");
    for (const auto& [tag, value] :
         {std::pair("G0008-0060", "CT"), {"G0010-4000", ""}, {"G0020-0013", "12"}, {"G0028-0030", "0.5\\0.25"}})
        root.setTag(tag, value);
    root.dicomAllCreate()->set("G0008-0070", "no colon");
    for (const auto& [tag, value] : {std::pair("g0008-0060", "CT"), {"G0010-4000", ""}, {"G0008-0070", "none"}})
        EXPECT_STREQ(root.findTag(tag, "none"), value);
    EXPECT_STREQ(root.findTag(nullptr, "none"), "none");
    int number = 7;
    float real = 7;
    EXPECT_TRUE(root.dicomAll()->findTagInAll("G0020-0013", number));
    EXPECT_FALSE(root.dicomAll()->findTagInAll("G0008-0060", number) || number != 12);
    EXPECT_TRUE(root.findTag("G0028-0030", real));
    EXPECT_EQ(real, 0.5f);
    EXPECT_FALSE(root.findTag("G0008-0060", real) || !std::isnan(real));
}

TEST(DicomTags, holdManyValues)
{
    // A 7 is left as it was.
    const std::tuple<const char*, bool, KpDArray<float>> cases[] = {
        {"0.5\\0.25", true, {0.5f, 0.25f}}, {"3", true, {3}}, {"3\\", false, {3, 7}}, {"", false, {7}}};
    for (const auto& [text, ok, expected] : cases) {
        HxParamBundle root("root");
        root.setTag("G0028-0030", text);
        KpDArray<float> values{7, 7, 7};
        EXPECT_FALSE(root.findTag("G0028-0031", values) || values.size() != 3);
        EXPECT_EQ(root.findTag("G0028-0030", values), ok) << text;
        EXPECT_TRUE(std::equal(values.begin(), values.end(), expected.begin(), expected.end())) << text;
    }
}

TEST(DicomTags, ofEnhancedObjectsAreFoundInTheGroups)
{
    HxParamBundle root("root");
    HxParamBundle& all = *root.dicomAllCreate();
    root.setTag("G0018-0081", "classic");
    below(all, {"G5200-9229", "Item_0", "G0018-9112", "Item_0"}).set("G0018-9082", "Echo: shared");
    EXPECT_STREQ(root.findTag("G0018-0081", ""), "classic") << "the shared groups alone don't count";
    HxParamBundle& perFrame = below(all, {"G5200-9230"});
    EXPECT_STREQ(root.findTag("G0018-0081", ""), "shared");
    below(perFrame, {"Item_1"}).set("G0018-9082", ": second frame");
    below(perFrame, {"Item_0", "G0019-1001", "Item_0"}).set("G0018-9082", ": private");
    EXPECT_STREQ(root.findTag("G0018-0081", ""), "shared") << "neither other items nor odd groups are searched";
    below(perFrame, {"Item_01"}).set("G0018-9082", ": prefix");
    EXPECT_STREQ(root.findTag("G0018-0081", ""), "prefix");
    below(perFrame, {"Item_0", "G0018-9114", "Item_0"}).set("G0018-9082", ": frame");
    EXPECT_STREQ(root.findTag("G0018-0081", ""), "frame");
    below(perFrame, {"Item_0", "G0018-9114", "Item_0"}).set("G0018-9082", "no value");
    EXPECT_STREQ(root.findTag("G0018-0081", "none"), "none") << "a leaf without a value ends the search";
}

TEST(DicomTags, areMappedForEnhancedObjects)
{
    for (const auto& [tag, expected] : {std::pair("G0018-0081", "G0018-9082"),
                                        {"g0008-002a", "G0018-9074"},
                                        {"x0018.1060 and on", "G0020-9153"},
                                        {"G0018-0082", "-"},
                                        {"G0018", "-"}}) {
        KpString mapped("-");
        EXPECT_EQ(HxParamBundle::replaceTag(tag, mapped), expected != std::string("-")) << tag;
        EXPECT_EQ(mapped, expected);
    }
}

TEST(PrivateTags, takeBlocksWithHoles)
{
    HxParamBundle all("All");
    all.set("G0009-0010", "PrivateCreator: FIRST");
    all.set("G0009-0005", ": LOW");
    all.set("G0009-0012", ": THIRD");
    all.set("G000B-0010", ": AN EVEN CODE");
    all.set("G0009-1020", ": of first");
    EXPECT_STREQ(all.findPrivateTagInAll("FIRST", "G0009-xx20", "none"), "of first");
    EXPECT_STREQ(all.findPrivateTagInAll(nullptr, "G0009-1020", "none"), "of first");
    const HxParamBundle& creators = *all.bundle("PrivateCreators");
    EXPECT_EQ(creators.flags(), HxParamBase::FlagNoSave);
    EXPECT_EQ(creators.size(), 3) << "not that of group B";
    all.setPrivateTagInAll("NOBODY", "G0009-xx20", nullptr);
    all.setPrivateTagInAll("SECOND", "G0009-xx20", "2");
    all.setPrivateTagInAll("FOURTH", "G0009-xx20", "4");
    all.setPrivateTagInAll("SECOND", "G0009-xx21", "2.1");
    all.setPrivateTagInAll("SECOND", "G0021-xx21", "other group");
    EXPECT_EQ(valueOf(all, "G0009-1121") + valueOf(all, "G0009-1320"), ": 2.1: 4");
    EXPECT_EQ(valueOf(all, "G0021-1021"), ": other group");
    all.setPrivateTagInAll("SECOND", "G0009-xx21", nullptr);
    EXPECT_EQ(valueOf(all, "G0009-1121"), "-");
    all.setPrivateTagInAll("SECOND", "short", "x");
    EXPECT_EQ(creators.size(), 6) << "no value or no tag, no reservation";
}

TEST(PrivateTags, endWithTheGroup)
{
    HxParamBundle all("All");
    char name[16], creator[16];
    for (int block = 16; block < 256; ++block) {
        std::snprintf(name, sizeof(name), "G0009-00%02X", static_cast<unsigned>(block));
        std::snprintf(creator, sizeof(creator), ": C%d", block);
        if (block != 26)
            all.set(name, creator);
    }
    all.setPrivateTagInAll("LATE", "G0009-xx20", "1");
    EXPECT_EQ(valueOf(all, "G0009-001_"), "PrivateCreator: LATE") << "block 26 in digits that run past 9";
    all.setPrivateTagInAll("LATER", "G0009-xx20", "2");
    EXPECT_EQ(valueOf(all, "G0009-001_"), "PrivateCreator: LATER") << "and is given out again";
    all.set("G0009-001A", ": C26");
    all.remove("PrivateCreators");
    const long before = all.size();
    all.setPrivateTagInAll("LATEST", "G0009-xx20", "3");
    EXPECT_EQ(all.size(), before + 1) << "the index alone is new";
}

TEST(PrivateTags, holdSequences)
{
    HxParamBundle all("All");
    const HxParamBundle& constAll = all;
    EXPECT_EQ(constAll.privateSequenceItemInAll("C", "G0009-xx30", 0), nullptr);
    EXPECT_EQ(all.size(), 0);
    EXPECT_EQ(all.privateSequenceItemInAll("C", "G0009-xx30", "d", 0, false), nullptr);
    EXPECT_EQ(valueOf(all, "G0009-0010"), "PrivateCreator: C") << "reserved all the same";
    HxParamBundle* const item = all.privateSequenceItemInAll("C", "G0009-xx30", "a description", 2, true);
    ASSERT_TRUE(item);
    EXPECT_EQ(item->name() + (' ' + valueOf(*item, "Description")), "Item_2 Item 2");
    EXPECT_EQ(all.privateSequenceItemInAll("C", "G0009-xx30", "another", 2, false), item);
    EXPECT_EQ(valueOf(*all.bundle("G0009-1030"), "Description"), "a description");
    EXPECT_EQ(constAll.privateSequenceItemInAll("C", "G0009-xx30", 2), item);
}
