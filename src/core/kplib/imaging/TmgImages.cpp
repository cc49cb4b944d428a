#include <kplib/imaging/TmgImages.h>

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpString.h>
#include <kplib/imaging/detail/BundleTexts.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <string_view>

namespace {

using kplib::detail::leafValue;
using kplib::detail::parameterAt;
using kplib::detail::textOf;

constexpr const char* listName = "ImageNumberList";
constexpr const char* countName = "NumImageNumbers";

constexpr const char* tagNames[] = {
    "G0008-0020", "G0008-0030", "G0008-1030", "G0020-000D", "G0012-0050", "G0012-0051", "G0008-0060", "G0020-000E",
    "G0020-0011", "G0020-0060", "G0008-0021", "G0008-0031", "G0018-1030", "G0008-103E", "G0018-0015", "G0018-5100",
    "G0028-0108", "G0028-0109", "G0018-0020", "G0018-1210", "G0028-0051", "G0018-0010", "G0018-0021", "G0018-0022",
    "G0018-0023", "G0018-0024", "G0018-0025", "G0054-0400", "G0020-0020", "G0008-0008", "G0028-0030", "G0020-0037",
    "G0020-0032", "G0018-5101", "G0018-0050", "G0028-0002", "G0028-0004", "G0028-0010", "G0028-0011", "G0028-0100",
    "G0028-0101", "G0020-0052", "G0018-1120", "G0018-0081", "G0018-0080", "G0018-0082", "G0018-0087", "G0008-0070",
    "G0008-0080", "G0018-1016", "G0018-1018"};

// Text of a tag of the header; null without one.
const char* headerText(const HxParamBundle& object, const char* tag)
{
    const HxParamBundle* const all = object.dicomAll();
    const char* text = nullptr;
    return all && all->findString(tag, text) ? text : nullptr;
}

// Takes the next field, up to a comma, off `fields`; false after the last one.
bool nextField(const char*& fields, std::string_view& field)
{
    if (!fields)
        return false;
    const char* const comma = std::strchr(fields, ',');
    field = comma ? std::string_view(fields, static_cast<size_t>(comma - fields)) : std::string_view(fields);
    fields = comma ? comma + 1 : nullptr;
    return true;
}

// The field of `values` at the position of `name` in `names`; false without one.
bool findField(const char* names, const char* values, std::string_view name, std::string_view& value)
{
    std::string_view each;
    while (nextField(names, each) && nextField(values, value)) {
        if (each == name)
            return true;
    }
    return false;
}

bool hasOneImage(const HxParamBundle& bundle, const char* name)
{
    int count = 0;
    return bundle.findNum(name, 1, &count) && count == 1;
}

// Whether the value of a tag in the header of the volume may differ from that of one of its
// images.
bool isApproximate(const HxParamBundle& object, const HxParamBundle* list, const char* tag)
{
    if (list && hasOneImage(*list, countName))
        return false;
    const HxParamBundle* const instances = object.bundle("SOPInstanceUIDs");
    if (instances && hasOneImage(*instances, "NumInputImages"))
        return false;
    return !Tmg::tagsConstantInVolume.contains(tag);
}

}  // namespace

namespace Tmg {

const std::set<std::string> tagsConstantInVolume(std::begin(tagNames), std::end(tagNames));

void setImageTagList(HxParamBundle* list, const KpDArray<KpString>& texts)
{
    if (!list)
        return;
    list->removeAll();
    if (texts.size() == 0)
        return;
    list->set(countName, static_cast<int>(texts.size()));
    list->reserve(texts.size());
    for (long i = 0; i < texts.size(); ++i) {
        char name[32];
        std::snprintf(name, sizeof name, "ImageNr%05d", static_cast<int>(i + 1));
        kplib::detail::addText(*list, name, texts[i]);
    }
}

bool imageNumberFromBundle(const HxParamBundle* list, int index, int& out)
{
    int count = 0;
    if (!list || !list->findNum(countName, 1, &count) || count == 0 || index < 0)
        return false;
    const HxParameter* const image = parameterAt(*list, index + 1L);
    if (image)
        out = image->getNum(0);
    return image != nullptr;
}

bool imageNumber(const HxParamBundle& object, int index, int& out)
{
    out = 0;
    if (imageNumberFromBundle(object.bundle(listName), index, out))
        return true;
    const char* const text = headerText(object, "G0020-0013");
    if (text)
        out = std::atoi(leafValue(text));
    return text != nullptr;
}

void imageNumbers3D(const HxParamBundle& object, int first, int last, KpDArray<int>& out)
{
    const HxParamBundle* const list = object.bundle(listName);
    int count = 0;
    if (!list || !list->findNum(countName, 1, &count) || count >= list->size())
        return;
    first = std::max(first, 0);
    last = std::min(last, count - 1);
    out.resize(last - static_cast<long>(first) + 1);
    for (long i = 0; i < out.size(); ++i) {
        const HxParameter* const image = parameterAt(*list, first + i + 1);
        out[i] = image ? image->getNum(0) : 0;
    }
}

bool frameNumber(const HxParamBundle& object, bool enhanced, int index, int& out)
{
    const HxParamBundle* const all = object.dicomAll();
    const HxParameter* const frames = all ? all->findSorted("G0028-0008") : nullptr;
    const char* value = nullptr;
    if (!frames || !frames->getBundleTagValue(value) || std::atoi(value) < 2)
        return false;
    if (enhanced) {
        out = index;
        return true;
    }
    const HxParamBundle* const instances = object.bundle("SOPInstanceUIDs");
    char name[32];
    std::snprintf(name, sizeof name, "Image%05d", static_cast<int>(index + 1L));
    const char* uid = nullptr;
    if (!instances || !instances->findString(name, uid) || !uid)
        return false;
    const char* const point = std::strrchr(uid, '.');
    out = std::atoi(point ? point + 1 : uid);
    return true;
}

bool imageLevelTag(const HxParamBundle& object, int index, const char* tag, KpString& value, bool& approximate)
{
    const HxParamBundle* const list = object.bundle(listName);
    const char* names = nullptr;
    if (list && object.findString("ImageLevelTags", names) && names && std::strstr(names, tag)) {
        approximate = false;
        const HxParameter* const image = parameterAt(*list, index + 1L);
        std::string_view field;
        if (!image || !findField(names, textOf(*image), tag, field))
            return false;
        value = KpString(field);
        return !field.empty();
    }
    approximate = isApproximate(object, list, tag);
    const char* const text = headerText(object, tag);
    if (text)
        value = leafValue(text);
    return text != nullptr;
}

}  // namespace Tmg
