#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <memory>

namespace kplib::probe {

namespace {

void fill(HxParamBundle& root)
{
    root.set("Text", "a text that takes memory of its own");
    root.set("Number", 4);
    const float values[] = {1, 2.5F, 3};
    root.set("Values", 3, values);
    for (int i = 0; i < 6; ++i)
        root.bundle(KpString(0, "Bundle%d with a title", i).c_str(), 1)->set("Inner", i);
}

Digest digestOf(const HxParamBundle& root)
{
    KpString text;
    root.print(text);
    return Digest() << text;
}

Outcome tree()
{
    HxParamBundle root("Root");
    fill(root);
    return digestOf(root);
}

Outcome copies()
{
    HxParamBundle root("Root"), other("Other");
    fill(root);
    other.set("Text", "other");
    other.copy(root);
    const std::unique_ptr<HxParamBundle> twin(other.duplicate());
    return digestOf(*twin);
}

Outcome moves()
{
    HxParamBundle root("Root"), other("Other");
    fill(root);
    other.set("Text", "other");
    other.move(root);
    other.remove("Bundle2");
    return digestOf(other) << root.size();
}

Outcome lookUps()
{
    HxParamBundle root("Root");
    for (int i = 0; i < 40; ++i)
        root.set(KpString(0, "Name%d", i * 7 % 40).c_str(), i);
    Digest digest;
    for (int i = 0; i < 40; ++i)
        digest << root.findSorted(KpString(0, "Name%d", i).c_str())->getNum(0);
    const char* text = nullptr;
    root.findString("Name3", text);
    return digest << text;
}

Outcome values()
{
    const double numbers[] = {1, -2.5, 1e300};
    HxParameter parameter("Numbers", 3, numbers);
    HxParameter other(parameter);
    other.set("a text that takes memory of its own");
    other = parameter;
    other.setName("another name that takes memory of its own");
    KpString text;
    other.print(text);
    return Digest() << text << other.name();
}

Outcome dicomTags()
{
    HxParamBundle root("Volume");
    root.setTag("G0008-0060", "MR");
    root.setTag("G0028-0030", "0.5\\0.5");
    KpDArray<float> spacing;
    const bool found = root.findTag("G0028-0030", spacing);
    return Digest() << root.findTag("G0008-0060", "none") << found << spacing.size();
}

Outcome privateTags()
{
    HxParamBundle all("All");
    all.setPrivateTagInAll("A CREATOR OF SOME LENGTH", "G0029-xx10", "value");
    all.privateSequenceItemInAll("A CREATOR OF SOME LENGTH", "G0029-xx20", "sequence", 1, true);
    return digestOf(all) << all.findPrivateTagInAll("A CREATOR OF SOME LENGTH", "G0029-xx10", "none");
}

Outcome enhancedTags()
{
    HxParamBundle all("All");
    HxParamBundle* const frame = all.bundle("G5200-9230", 1)->bundle("Item_0", 1);
    frame->bundle("G0020-9113", 1)->bundle("Item_0", 1)->set("G0020-0032", "Position: 1\\2\\3");
    all.bundle("G5200-9229", 1)->bundle("Item_0", 1);
    return Digest() << all.isEnhancedDcm() << all.findTagInAll("G0020-0032", "none");
}

}  // namespace

Operations paramOperations()
{
    static constexpr Operation list[] = {
        {"a tree", tree},
        {"copies of a tree", copies},
        {"a tree moved", moves},
        {"look-ups", lookUps},
        {"values", values},
        {"DICOM tags", dicomTags},
        {"private tags", privateTags},
        {"enhanced tags", enhancedTags},
    };
    return list;
}

}  // namespace kplib::probe
