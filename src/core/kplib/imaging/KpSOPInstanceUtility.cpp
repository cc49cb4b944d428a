#include <kplib/imaging/KpSOPInstanceUtility.h>

#include <kplib/imaging/detail/BundleTexts.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpCoder.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string_view>
#include <utility>

namespace {

using kplib::detail::textOf;

constexpr const char* countName = "NumInputImages";
constexpr const char* hashName = "MD5Hash";
constexpr const char* prefixName = "Prefix";

template <typename Text>
KpString hashOf(const KpDArray<Text>& list)
{
    KpCoder coder;
    for (const Text& uid : list) {
        const std::string_view bytes(uid);
        coder.crcMD5Update(reinterpret_cast<const unsigned char*>(bytes.data()), static_cast<unsigned>(bytes.size()));
    }
    unsigned char digest[16];
    coder.crcMD5Final();
    coder.crcMD5Query(digest);
    KpString text;
    KpCoder::dataToHexString(digest, sizeof digest, text, true);
    return text;
}

// The prefix of all texts.
template <typename Text>
std::string_view commonPrefix(const KpDArray<Text>& list)
{
    std::string_view prefix(list[0]);
    for (long i = 1; i < list.size() && !prefix.empty(); ++i) {
        const std::string_view uid(list[i]);
        const auto differing = std::mismatch(prefix.begin(), prefix.end(), uid.begin(), uid.end());
        prefix = prefix.substr(0, static_cast<size_t>(differing.first - prefix.begin()));
    }
    return prefix;
}

template <typename Text>
void store(HxParamBundle* bundle, const KpDArray<Text>& list)
{
    if (!bundle)
        return;
    bundle->removeAll();
    if (list.size() == 0)
        return;
    const KpString hash = hashOf(list);
    const std::string prefix(commonPrefix(list));
    bundle->set(countName, static_cast<int>(list.size()));
    bundle->set(hashName, hash);
    if (!prefix.empty())
        bundle->set(prefixName, prefix.c_str());
    bundle->reserve(list.size());
    for (long i = 0; i < list.size(); ++i) {
        char name[32];
        std::snprintf(name, sizeof name, "Image%05d", static_cast<int>(i + 1));
        kplib::detail::addText(*bundle, name, std::string_view(list[i]).data() + prefix.size());
    }
}

// Calls `visit` with the number and the text of each image until it returns false. Returns true if
// it never did.
template <typename Visit>
bool forEachImage(const HxParamBundle& bundle, Visit&& visit)
{
    for (long i = 0; i < bundle.size(); ++i) {
        const HxParameter* const parameter = kplib::detail::parameterAt(bundle, i);
        int number = 0;
        if (parameter && kplib::detail::imageNumberOfName(parameter->name(), number) &&
            !visit(number, textOf(*parameter)))
            return false;
    }
    return true;
}

// The last parameter of exactly that name at any level: look-ups would ignore the case.
std::string prefixOf(const HxParamBundle& bundle)
{
    std::string prefix;
    for (long i = 0; i < bundle.size(); ++i) {
        const HxParameter* const parameter = kplib::detail::parameterAt(bundle, i);
        if (parameter && std::strcmp(parameter->name(), prefixName) == 0)
            prefix = textOf(*parameter);
    }
    return prefix;
}

// Whether so many frames for each instance are believed. Beyond a list that fits into memory at ease, the header has to
// show an item for each frame, in the Per-Frame Functional Groups Sequence: a damaged number alone takes no gigabytes.
bool canHold(const HxParamBundle& object, long frames, long instances)
{
    constexpr long mostEntries = 1L << 20;
    const HxParamBundle* const all = object.dicomAll();
    const HxParamBundle* const items = all ? all->bundle("G5200-9230") : nullptr;
    return frames * instances <= mostEntries || (items && frames <= items->size());
}

// An entry whose frame is the number after its last point.
bool splitFrame(const std::string& text, KpSOPInstanceUtility::SopUIDAndFrame& entry)
{
    const size_t dot = text.rfind('.');
    if (dot == std::string::npos)
        return false;
    const char* const digits = text.c_str() + dot + 1;
    char* end = nullptr;
    entry.frame = static_cast<int>(std::strtol(digits, &end, 10));
    entry.uid = text.substr(0, dot);
    return end != digits;
}

}  // namespace

void KpSOPInstanceUtility::setSopUIDList(HxParamBundle* bundle, const KpDArray<KpString>& list)
{
    store(bundle, list);
}

void KpSOPInstanceUtility::setSopUIDList(HxParamBundle* bundle, const KpDArray<std::string>& list)
{
    store(bundle, list);
}

bool KpSOPInstanceUtility::sopUIDList(const HxParamBundle* bundle, KpDArray<std::string>& list)
{
    int count = 0;
    if (!bundle || !bundle->findNum(countName, 1, &count))
        return false;
    const bool isInOrder = forEachImage(*bundle, [&list](int number, const char* text) {
        list.append(text);
        return list.size() == number;
    });
    if (!isInOrder)
        return false;
    const std::string prefix = prefixOf(*bundle);
    if (!prefix.empty()) {
        for (std::string& uid : list)
            uid.insert(0, prefix);
    }
    return count != 0 && list.size() == count;
}

bool KpSOPInstanceUtility::sopUIDList(const HxParamBundle* bundle, KpDArray<KpString>& list)
{
    KpDArray<std::string> texts;
    if (!sopUIDList(bundle, texts))
        return false;
    list.clear();
    for (const std::string& text : texts)
        list.append(KpString(text.c_str()));
    return true;
}

KpString KpSOPInstanceUtility::sopUIDHash(const KpDArray<KpString>& list)
{
    return hashOf(list);
}

KpString KpSOPInstanceUtility::sopUIDHash(const KpDArray<std::string>& list)
{
    return hashOf(list);
}

KpString KpSOPInstanceUtility::sopUIDHash(const HxParamBundle* bundle)
{
    const char* stored = nullptr;
    if (!bundle)
        return {};
    if (bundle->findString(hashName, stored))
        return stored;
    KpDArray<std::string> list;
    return sopUIDList(bundle, list) ? hashOf(list) : KpString();
}

bool KpSOPInstanceUtility::hasSopUIDHash(const HxParamBundle* bundle)
{
    const char* stored = nullptr;
    return bundle && bundle->findString(hashName, stored);
}

bool KpSOPInstanceUtility::checkSOPInstanceUID(const HxParamBundle* bundle, const char* hash)
{
    return bundle && hash && *hash && std::strcmp(hash, sopUIDHash(bundle).c_str()) == 0;
}

bool KpSOPInstanceUtility::checkSOPInstanceUID(const HxParamBundle* bundle, const KpDArray<std::string>& list)
{
    int count = 0;
    if (!bundle || !bundle->findNum(countName, 1, &count) || list.size() != count)
        return false;
    int found = 0;
    const bool isSame = forEachImage(*bundle, [&](int number, const char* text) {
        ++found;
        return number >= 1 && number <= count && list[number - 1] == text;
    });
    return isSame && found == count;
}

std::vector<KpSOPInstanceUtility::SopUIDAndFrame>
KpSOPInstanceUtility::getReferencedSOPUIDsAndFrameNumbers(const HxParamBundle& object, bool expandFrames, bool* ok)
{
    std::vector<SopUIDAndFrame> entries;
    if (ok)
        *ok = false;
    const HxParamBundle* const bundle = object.bundle("SOPInstanceUIDs");
    int count = 0;
    if (!bundle || !bundle->findNum(countName, 1, &count))
        return entries;
    const int frames = std::atoi(object.findTag("G0028-0008", "0"));
    const char* prefix = nullptr;
    long instances = 0;
    forEachImage(*bundle, [&](int, const char*) { return ++instances > 0; });
    if (expandFrames && !canHold(object, frames, instances)) {
        getTheLogInstance().errorf("The header can't hold %d frames for each of %ld instances", frames, instances);
        return entries;
    }
    bundle->findString(prefixName, prefix);
    forEachImage(*bundle, [&](int, const char* text) {
        const std::string uid = std::string(prefix ? prefix : "").append(text);
        SopUIDAndFrame entry;
        if (frames < 2)
            entries.push_back({uid, -1});
        else if (expandFrames)
            for (int frame = 0; frame < frames; ++frame)
                entries.push_back({uid, frame});
        else if (splitFrame(uid, entry))
            entries.push_back(entry);
        return true;
    });
    if (ok)
        *ok = true;
    return entries;
}
