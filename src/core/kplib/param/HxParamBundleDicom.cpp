#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/detail/ParamLookup.h>

#include <cmath>
#include <cstdio>
#include <cstring>

using kplib::detail::NameKey;

namespace {

constexpr NameKey dicomKey("DICOM"), allKey("All"), perFrameKey("G5200-9230"), sharedKey("G5200-9229");

const char* tagValue(const HxParameter* leaf, const char* defaultValue)
{
    const char* value = defaultValue;
    if (leaf)
        leaf->getBundleTagValue(value);
    return value;
}

// Reads up to four hexadecimal digits from position `from` on; a shorter text has none there.
bool readHex(const char* tag, size_t from, unsigned& out)
{
    char digits[5] = {};
    if (std::strlen(tag) > from)
        std::strncpy(digits, tag + from, 4);
    return std::sscanf(digits, "%4x", &out) == 1;
}

// The name of the tag that replaces `tag` in enhanced objects.
class MappedTag {
public:
    explicit MappedTag(const char* tag)
    {
        static const unsigned map[][4] = {
            {0x0018, 0x0081, 0x0018, 0x9082}, {0x0008, 0x0008, 0x0008, 0x9007}, {0x0020, 0x0060, 0x0020, 0x9072},
            {0x0008, 0x002A, 0x0018, 0x9074}, {0x0020, 0x0100, 0x0020, 0x9128}, {0x0018, 0x1060, 0x0020, 0x9153},
        };
        unsigned group = 0, element = 0;
        if (!tag || !readHex(tag, 1, group) || !readHex(tag, 6, element))
            return;
        for (const auto& row : map) {
            if (row[0] == group && row[1] == element) {
                std::snprintf(name_, sizeof(name_), "G%04X-%04X", row[2], row[3]);
                return;
            }
        }
    }

    bool exists() const { return *name_ != '\0'; }
    const char* name() const { return name_; }
    const char* orElse(const char* tag) const { return exists() ? name_ : tag; }

private:
    char name_[16] = "";
};

// Whether a bundle is a sequence of an even group. Any name that sscanf() reads as a tag counts.
bool isStandardSequence(const char* name)
{
    unsigned group = 0, element = 0;
    return *name == 'G' && std::sscanf(name, "G%04X-%04X", &group, &element) == 2 && group % 2 == 0;
}

bool isFirstItem(const char* name)
{
    return std::strncmp(name, "Item_0", 6) == 0;
}

}  // namespace

const HxParamBundle* HxParamBundle::dicomAll() const
{
    const HxParamBundle* const dicom = bundle(dicomKey);
    return dicom ? dicom->bundle(allKey) : nullptr;
}

HxParamBundle* HxParamBundle::dicomAllCreate()
{
    return bundle("DICOM", 1)->bundle("All", 1);
}

void HxParamBundle::setTag(const char* tag, const char* value)
{
    const KpString text(0, ": %s", value ? value : "");
    dicomAllCreate()->set(tag, text.c_str());
}

const char* HxParamBundle::findTag(const char* tag, const char* defaultValue) const
{
    const HxParamBundle* const all = dicomAll();
    return all ? all->findTagInAll(tag, defaultValue) : defaultValue;
}

bool HxParamBundle::findTag(const char* tag, float& out) const
{
    const HxParamBundle* const all = dicomAll();
    const bool ok = all && all->findTagInAll(tag, out);
    if (!ok)
        out = std::nanf("0");
    return ok;
}

bool HxParamBundle::findTag(const char* tag, KpDArray<float>& out) const
{
    const HxParamBundle* const all = dicomAll();
    return all && all->findTagInAll(tag, out);
}

const char* HxParamBundle::findPrivateTag(const char* creator, const char* tag, const char* defaultValue) const
{
    const HxParamBundle* const all = dicomAll();
    return all ? all->findPrivateTagInAll(creator, tag, defaultValue) : defaultValue;
}

const char* HxParamBundle::findTagInAll(const char* tag, const char* defaultValue) const
{
    const HxParameter* leaf = findInGroups(tag);
    if (!leaf)
        leaf = findSorted(NameKey(tag, NameKey::Literal));
    return tagValue(leaf, defaultValue);
}

bool HxParamBundle::findTagInAll(const char* tag, int& out) const
{
    const char* const text = findTagInAll(tag, nullptr);
    bool ok = false;
    const int value = text ? KpString(text).toInt(ok) : 0;
    if (ok)
        out = value;
    return ok;
}

bool HxParamBundle::findTagInAll(const char* tag, float& out) const
{
    const char* const text = findTagInAll(tag, nullptr);
    bool ok = false;
    const float value = text ? KpString(text).toFloat(ok) : 0;
    if (ok)
        out = value;
    return ok;
}

bool HxParamBundle::findTagInAll(const char* tag, KpDArray<float>& out) const
{
    const char* const text = findTagInAll(tag, nullptr);
    if (!text)
        return false;
    KpDArray<KpString> pieces;
    KpString(text).explode('\\', pieces);
    out.resize(pieces.size());
    bool allOk = true;
    for (long i = 0; i < pieces.size(); ++i) {
        bool ok = false;
        if (!pieces[i].isEmpty())
            out[i] = pieces[i].toFloat(ok);
        allOk &= ok;
    }
    return allOk;
}

bool HxParamBundle::isEnhancedDcm(const HxParamBundle** perFrame, const HxParamBundle** shared) const
{
    const HxParamBundle* const found = bundle(perFrameKey);
    if (perFrame)
        *perFrame = found;
    if (shared)
        *shared = found ? bundle(sharedKey) : nullptr;
    return found;
}

// The tag in the functional groups; null in classic objects too.
const HxParameter* HxParamBundle::findInGroups(const char* tag) const
{
    const HxParamBundle *perFrame = nullptr, *shared = nullptr;
    if (!isEnhancedDcm(&perFrame, &shared))
        return nullptr;
    const MappedTag mapped(tag);
    const HxParameter* const found = perFrame->findRecursive(mapped.orElse(tag));
    return found || !shared ? found : shared->findRecursive(mapped.orElse(tag));
}

const char* HxParamBundle::findTagInEnhancedDicomBundle(const char* tag, const char* defaultValue) const
{
    return tagValue(findRecursive(MappedTag(tag).orElse(tag)), defaultValue);
}

const HxParameter* HxParamBundle::findRecursive(const char* name) const
{
    const HxParameter* found = findSorted(name);
    for (int i = 0; !found && i < nBundles(); ++i) {
        const HxParamBundle& child = *bundle(i);
        if (isStandardSequence(child.name()))
            found = child.findRecursive(name);
        if (!found && isFirstItem(child.name()))
            found = child.findRecursive(name);
    }
    return found;
}

bool HxParamBundle::replaceTag(const KpString& tag, KpString& mapped)
{
    const MappedTag replacement(tag.c_str());
    if (replacement.exists())
        mapped = replacement.name();
    return replacement.exists();
}
