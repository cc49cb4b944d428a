#include <kplib/imaging/KpSOPInstanceUtility.h>

#include <kplib/param/HxParamBundle.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <random>

namespace {

using List = KpDArray<std::string>;
using Utility = KpSOPInstanceUtility;

KpDArray<KpString> strings(const List& list)
{
    KpDArray<KpString> texts;
    for (const std::string& each : list)
        texts.append(KpString(each.c_str()));
    return texts;
}

std::string stored(const HxParamBundle& bundle, const char* name)
{
    const char* text = nullptr;
    return bundle.findString(name, text) ? text : "(none)";
}

std::vector<std::string> asVector(const List& list)
{
    return {list.begin(), list.end()};
}

TEST(InstanceList, isStoredBehindItsCommonPrefix)
{
    const std::tuple<List, const char*, const char*> cases[] = {
        {{"1.2.3.41", "1.2.3.42"}, "1.2.3.4", "1"},
        {{"1.2", "2.2"}, "(none)", "1.2"},
        {{"1.2.3"}, "1.2.3", ""},
        {{"1.2", "1.2"}, "1.2", ""},
        {{"1.2.3", "1.2"}, "1.2", ".3"},
    };
    for (const auto& [list, prefix, first] : cases) {
        HxParamBundle bundle("SOPInstanceUIDs");
        bundle.set("Old", 1);
        Utility::setSopUIDList(&bundle, strings(list));
        EXPECT_EQ(std::tuple(stored(bundle, "Prefix"), stored(bundle, "Image00001"), stored(bundle, "Old")),
                  std::tuple(prefix, first, "(none)"));
        List read;
        ASSERT_TRUE(Utility::sopUIDList(&bundle, read));
        EXPECT_EQ(asVector(read), asVector(list));
        KpDArray<KpString> texts = strings({"old"});
        EXPECT_TRUE(Utility::sopUIDList(&bundle, texts));
        EXPECT_EQ(texts.size(), read.size());
        EXPECT_EQ(stored(bundle, "MD5Hash"), Utility::sopUIDHash(list).c_str());
        EXPECT_FALSE(Utility::sopUIDList(&bundle, read));  // not empty any more
    }
    EXPECT_STREQ(Utility::sopUIDHash(List()), "D41D8CD98F00B204E9800998ECF8427E");
    EXPECT_STREQ(Utility::sopUIDHash(List({"a", "bc"})), "900150983CD24FB0D6963F7D28E17F72");  // of "abc", RFC 1321
}

TEST(InstanceList, goesRoundInAllSizesAlsoSorted)
{
    std::mt19937 random(7);
    for (const long count : {2L, 1000L, 99999L, 100000L}) {
        List list, read;
        for (long i = 0; i < count; ++i)
            list.append("1.2.840." + std::to_string(random()) + '.' + std::to_string(i));
        HxParamBundle bundle("B");
        Utility::setSopUIDList(&bundle, list);
        ASSERT_TRUE(Utility::sopUIDList(&bundle, read));
        EXPECT_TRUE(asVector(read) == asVector(list));
        bundle.findSorted("MD5Hash");
        read.clear();
        EXPECT_EQ(Utility::sopUIDList(&bundle, read), count < 100000) << count;
    }
}

TEST(InstanceList, theStoredHashIsTaken)
{
    HxParamBundle bundle("B");
    EXPECT_FALSE(Utility::hasSopUIDHash(&bundle) || Utility::hasSopUIDHash(nullptr));
    for (const HxParamBundle* without : {&bundle, static_cast<HxParamBundle*>(nullptr)})
        EXPECT_STREQ(Utility::sopUIDHash(without), "");
    const List list({"1.2", "2.3"});
    Utility::setSopUIDList(&bundle, list);
    const KpString hash = Utility::sopUIDHash(list);
    EXPECT_TRUE(Utility::checkSOPInstanceUID(&bundle, hash));
    bundle.remove("MD5Hash");
    EXPECT_STREQ(Utility::sopUIDHash(&bundle), hash);
    bundle.set("MD5Hash", "stale");
    EXPECT_STREQ(Utility::sopUIDHash(&bundle), "stale");
    EXPECT_FALSE(Utility::checkSOPInstanceUID(&bundle, hash) || Utility::checkSOPInstanceUID(&bundle, "") ||
                 Utility::checkSOPInstanceUID(nullptr, hash));

    EXPECT_TRUE(Utility::checkSOPInstanceUID(&bundle, list));
    for (const List& other : {List({"1.2", "2.4"}), List({"1.2"})})
        EXPECT_FALSE(Utility::checkSOPInstanceUID(&bundle, other));
    bundle.set("Image00003", "3.4");
    EXPECT_FALSE(Utility::checkSOPInstanceUID(&bundle, list));
    bundle.remove("Image00003");
    bundle.remove("Image00001");
    EXPECT_FALSE(Utility::checkSOPInstanceUID(&bundle, list));
    const List prefixed({"1.2", "1.3"});
    Utility::setSopUIDList(&bundle, prefixed);
    EXPECT_FALSE(Utility::checkSOPInstanceUID(&bundle, prefixed));
}

TEST(InstanceList, aListOutOfOrderIsNone)
{
    HxParamBundle empty("B");
    empty.set("NumInputImages", 0);
    List none;
    EXPECT_FALSE(Utility::sopUIDList(&empty, none));
    for (const char* missing : {"Image00001", "Image00002", "NumInputImages"}) {
        HxParamBundle bundle("B");
        Utility::setSopUIDList(&bundle, List({"1.2", "2.3", "3.4"}));
        bundle.remove(missing);
        KpDArray<KpString> untouched = strings({"x"});
        EXPECT_FALSE(Utility::sopUIDList(&bundle, untouched)) << missing;
        EXPECT_EQ(untouched.size(), 1) << missing;
        Utility::setSopUIDList(&bundle, List());
        EXPECT_EQ(bundle.size(), 0);
    }
}

TEST(InstanceList, referencesAreExpandedToFrames)
{
    using Entries = std::vector<Utility::SopUIDAndFrame>;
    HxParamBundle object("Object");
    bool ok = true;
    EXPECT_TRUE(Utility::getReferencedSOPUIDsAndFrameNumbers(object, true, &ok).empty());
    EXPECT_FALSE(ok);
    Utility::setSopUIDList(object.bundle("SOPInstanceUIDs", 1), List({"1.2.0", "1.2.1", "1.2.x"}));
    EXPECT_EQ(Utility::getReferencedSOPUIDsAndFrameNumbers(object, true, &ok),
              (Entries{{"1.2.0", -1}, {"1.2.1", -1}, {"1.2.x", -1}}));
    EXPECT_TRUE(ok);
    object.setTag("G0028-0008", "1");
    EXPECT_EQ(Utility::getReferencedSOPUIDsAndFrameNumbers(object, true, nullptr)[1].frame, -1);
    object.setTag("G0028-0008", "2");
    const auto expanded = Utility::getReferencedSOPUIDsAndFrameNumbers(object, true, nullptr);
    EXPECT_EQ(expanded.size(), 6);
    EXPECT_EQ(expanded[1], (Utility::SopUIDAndFrame{"1.2.0", 1}));
    EXPECT_EQ(Utility::getReferencedSOPUIDsAndFrameNumbers(object, false, &ok), (Entries{{"1.2", 0}, {"1.2", 1}}));
}

TEST(InstanceList, framesThatTheHeaderCannotHoldAreNotListed)
{
    List list;
    for (int i = 0; i < 1025; ++i)
        list.append("1.2." + std::to_string(i));
    HxParamBundle object("Object");
    Utility::setSopUIDList(object.bundle("SOPInstanceUIDs", 1), list);
    for (const char* frames : {"2147483647", "1025"}) {
        const kplib::test::LogCapture log;
        bool ok = true;
        object.setTag("G0028-0008", frames);
        EXPECT_TRUE(Utility::getReferencedSOPUIDsAndFrameNumbers(object, true, &ok).empty());
        EXPECT_FALSE(ok);
        EXPECT_EQ(log.lines(), kplib::test::Lines{std::string("E [] The header can't hold ") + frames +
                                                  " frames for each of 1025 instances"});
    }
    HxParamBundle* const items = object.dicomAllCreate()->bundle("G5200-9230", 1);
    for (int i = 0; i < 1025; ++i)
        items->insert(new HxParamBundle(("Item_" + std::to_string(i)).c_str()), 0);
    EXPECT_EQ(Utility::getReferencedSOPUIDsAndFrameNumbers(object, true, nullptr).size(), 1025U * 1025);
}

}  // namespace
