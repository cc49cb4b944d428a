#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/imaging/KpCreateUIDs.h>
#include <kplib/imaging/KpOrientationLetters.h>
#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/KpWindowLevel.h>
#include <kplib/imaging/TmgDateTime.h>
#include <kplib/imaging/TmgImages.h>
#include <kplib/imaging/TmgSeries.h>
#include <kplib/imaging/TmgText.h>
#include <kplib/param/HxParamBundle.h>

#include <string>

namespace kplib::probe {

namespace {

KpDArray<KpString> instances()
{
    KpDArray<KpString> uids;
    for (int i = 0; i < 8; ++i)
        uids.append(KpString(0, "1.2.826.0.1.3680043.2.1125.1.%d", i));
    return uids;
}

Outcome instanceList()
{
    HxParamBundle bundle("SOPInstanceUIDs");
    KpSOPInstanceUtility::setSopUIDList(&bundle, instances());
    KpDArray<KpString> found;
    if (!KpSOPInstanceUtility::sopUIDList(&bundle, found))
        return {};
    return Digest() << found.size() << KpSOPInstanceUtility::sopUIDHash(&bundle);
}

Outcome referencedInstances()
{
    HxParamBundle object("Object");
    KpSOPInstanceUtility::setSopUIDList(object.bundle("SOPInstanceUIDs", 1), instances());
    object.setTag("G0028-0008", "4");
    bool ok = false;
    const auto found = KpSOPInstanceUtility::getReferencedSOPUIDsAndFrameNumbers(object, true, &ok);
    if (!ok)
        return {};
    return Digest() << found.size() << found.back().uid;
}

Outcome images()
{
    HxParamBundle object("Object");
    object.set("ImageLevelTags", "G0020-0013,G0008-0018");
    KpDArray<KpString> texts;
    for (int i = 0; i < 5; ++i)
        texts.append(KpString(0, "%d,1.2.3.%d", i + 1, i));
    Tmg::setImageTagList(object.bundle("ImageNumberList", 1), texts);
    KpDArray<int> numbers;
    Tmg::imageNumbers3D(object, 0, 4, numbers);
    KpString value;
    bool isApproximate = false;
    if (!Tmg::imageLevelTag(object, 2, "G0008-0018", value, isApproximate))
        return {};
    return Digest() << numbers.size() << value;
}

Outcome series()
{
    Tmg::ImageSeriesHelper helper("a series with an identifier of some length");
    for (int i = 0; i < 4; ++i)
        helper.processImage("first text that takes memory of its own", "second text that takes memory of its own");
    helper.seriesInfo()->images().swap(helper.images());
    return Digest() << helper.seriesInfo()->images().size();
}

Outcome windows()
{
    const KpWindowLevelTagGroup group({"40\\400\\-600", "400\\1500\\1600", "soft tissue of the abdomen\\bone\\lung"});
    const auto presets = KpWindowLevel::createFromTags(group);
    const auto merged = KpWindowLevel::merge(presets, {KpWindowLevel(1.5F, 2.5F, "a preset with a long name")});
    const KpWindowLevelTagGroup tags = KpWindowLevel::toTags(merged);
    return Digest() << tags.center << tags.width << tags.explanation;
}

Outcome letters()
{
    const KpOrientationLetters letters("LP", "F");
    return Digest() << letters.join('/') << KpOrientationLetters(KpMat4f::identity()).join('/');
}

Outcome texts()
{
    KpString target("MR\\CT");
    const bool isAdded = Tmg::addToMultiValueString(target, "CT\\US\\PT", "\\");
    const auto parts = Tmg::splitAndReformatDateTime("20240315 123456.789", ' ');
    return Digest() << isAdded << target << parts.first << parts.second << Tmg::matchSet("M*\\C?", "US\\MR", "\\")
                    << Tmg::timeString("123456.789", true);
}

Outcome identifiers()
{
    KpCreateUIDs creator;
    creator.setRootUID("1.2.826.0.1.3680043.2.1125");
    KpString uid;
    if (!creator.createUID(KpCreateUIDs::UIDtype1, uid))
        return {};
    const bool isRefused = !creator.setRootUID("");
    return Digest() << (uid.length() > 30) << isRefused << creator.lastError();
}

}  // namespace

Operations imagingOperations()
{
    static constexpr Operation list[] = {
        {"lists of instances", instanceList},
        {"referenced instances", referencedInstances},
        {"images of a volume", images},
        {"series", series},
        {"windows", windows},
        {"letters", letters},
        {"texts", texts},
        {"identifiers", identifiers},
    };
    return list;
}

}  // namespace kplib::probe
