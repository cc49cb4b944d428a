// Parameter trees, pixel memory, masks, DICOM helpers.
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpString.h>
#include <kplib/imaging/KpColor.h>
#include <kplib/imaging/KpCreateUIDs.h>
#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/KpWindowLevel.h>
#include <kplib/imaging/TmgText.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParamEditCheck.h>
#include <kplib/param/HxParameter.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/TmDataAccess.h>
#include <kplib/system/KpMD5Coder.h>
#include <kplib/threads/KpThread.h>
#include <kplib/volume/KpNeighborIterator33.h>

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace {

TEST(Interface, trees)
{
    const std::unique_ptr<HxParamBundle> tree(HxParamBundle::create("tree"));
    EXPECT_STREQ(tree->name(), "tree");
    tree->set("G0018-9082", "Echo: 80");
    EXPECT_STREQ(tree->findTagInEnhancedDicomBundle("G0018-0081", "none"), "80") << "as the enhanced tag";
    EXPECT_STREQ(tree->findTagInEnhancedDicomBundle("G0018-0080", "none"), "none");

    const double stored[2] = {0.25, -3};
    tree->set("numbers", 2, stored);
    HxParameter* const numbers = tree->find("numbers", 0, 16);
    double values[2] = {9, 9};
    numbers->getReal(values);
    EXPECT_EQ(std::tuple(values[0], values[1]), std::tuple(0.25, -3.0));

    HxParamEditCheck& check = *HxParamEditCheck::defaultEditCheck();
    EXPECT_TRUE(check.checkRename(numbers, "new") && check.checkDelete(numbers) && check.checkSetValue(numbers, "1"));
    for (int flag : {HxParamBase::FlagNoRename, HxParamBase::FlagNoDelete, HxParamBase::FlagNoSetValue}) {
        numbers->setFlag(flag, 1);
        EXPECT_EQ(check.checkRename(numbers, "new"), flag != HxParamBase::FlagNoRename);
        EXPECT_EQ(check.checkDelete(numbers), flag != HxParamBase::FlagNoDelete);
        EXPECT_EQ(check.checkSetValue(numbers, "1"), flag != HxParamBase::FlagNoSetValue);
        numbers->setFlag(flag, 0);
    }
}

TEST(Interface, pixelMemory)
{
    char bytes[] = "12345678";
    KpRawData::swapBytesWord2(bytes, 4);
    EXPECT_STREQ(bytes, "21436587");
    KpRawData::swapBytesWord4(bytes, 2);
    EXPECT_STREQ(bytes, "34127856");
    KpRawData::swapBytesWord8(bytes, 1);
    EXPECT_STREQ(bytes, "65872143");

    TmDataAccess access;
    access.moveToCurrentThread();
    EXPECT_EQ(access.lockerThreadId(), tmCurrentThreadId());

    char weights[27];
    for (int i = 0; i < 27; ++i)
        weights[i] = static_cast<char>(i - 13);
    const int dims[3] = {10, 10, 10};
    KpNeighborIterator33 neighbours(6, dims);
    neighbours.setWeights(weights, 1);
    const int sorted[6] = {-9, -3, -1, 1, 3, 9};
    for (int i = 0; i < 6; ++i)
        EXPECT_EQ(neighbours.iweights()[i], sorted[i]);
}

TEST(Interface, imageHelpers)
{
    KpColor color;
    char one[] = "1", zero[] = "0";
    char* words[] = {one, zero, zero};
    EXPECT_TRUE(color.setValue(3, words));
    EXPECT_EQ(color, KpColor(1, 0, 0));
    color.setRandomColor();
    EXPECT_FLOAT_EQ(std::max({color[0], color[1], color[2]}), 0.8F);

    KpWindowLevel window;
    window.setCenter(40.0F);
    window.setWidth(400.0F);
    EXPECT_EQ(std::tuple(window.centerString(), window.widthString()), std::tuple("40.000000", "400.000000"));
    EXPECT_EQ(window.center(), 40.0F);

    int year = 0, month = 0, day = 0, hour = -1, minute = -1, second = -1;
    KpCreateUIDs::getDateTime(year, month, day, hour, minute, second);
    EXPECT_GE(year, 2024);
    EXPECT_TRUE(month >= 1 && month <= 12 && day >= 1 && day <= 31 && hour >= 0 && hour < 24);

    KpDArray<KpString> list;
    list.append("1.2");
    list.append("3");
    EXPECT_STREQ(KpSOPInstanceUtility::sopUIDHash(list).c_str(), "579C4C7F58E485E8CCFC73E08903A08C");
    EXPECT_EQ(Tmg::networkToLocalPath("/a\\b c"), "/a\\b c");
}

}  // namespace
