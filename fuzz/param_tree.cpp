#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <map>
#include <string>

namespace {

/// The fuzz bytes as a row of small numbers and short texts.
class Input {
public:
    Input(const std::uint8_t* data, size_t size) : data_(data), end_(data + size) {}
    bool isEmpty() const { return data_ == end_; }
    unsigned byte() { return isEmpty() ? 0 : *data_++; }
    std::string text()
    {
        std::string result;
        for (unsigned n = byte() % 24; n > 0 && !isEmpty(); --n)
            result += static_cast<char>(byte());
        return result.c_str();
    }
    /// One of few tags, so that they meet again, in either case, and with groups odd and even.
    std::string tag()
    {
        char name[16];
        const unsigned group = byte() % 4 + 8, element = byte() % 16;
        std::snprintf(name, sizeof(name), element & 1 ? "G%04X-%04X" : "g%04x-%04x", group, element);
        return name;
    }

private:
    const std::uint8_t* data_;
    const std::uint8_t* end_;
};

void require(bool holds)
{
    if (!holds)
        std::abort();
}

std::string upper(std::string name)
{
    for (char& c : name)
        c = static_cast<char>(c >= 'a' && c <= 'z' ? c - 32 : c);
    return name;
}

void checkTree(const HxParamBundle& bundle)
{
    long i = 0;
    for (const HxParamBase* child : bundle) {
        require(child->parent() == &bundle && bundle.index(child) == i);
        require(child->isBundle() == (i < bundle.nBundles()));
        if (child->isBundle())
            checkTree(static_cast<const HxParamBundle&>(*child));
        ++i;
    }
}

/// A copy gives names to nameless bundles and titles to the reserved ones; nothing more happens to a copy of it.
void checkCopy(const HxParamBundle& root)
{
    KpString text, copied;
    const HxParamBundle copy(root);
    copy.print(text);
    HxParamBundle(copy).print(copied);
    require(text == copied && copy.size() <= root.size());
}

/// Looks `name` up in all ways there are.
void lookUp(HxParamBundle& root, const std::string& name)
{
    const char* const text = name.c_str();
    const char* found = nullptr;
    int n[3];
    float f[3] = {};
    KpDArray<float> values;
    KpString mapped;
    HxParamBundle& all = *root.dicomAllCreate();
    for (HxParamBundle* bundle : {&root, &all}) {
        bundle->findBase(text);
        bundle->findString(text, found);
        bundle->findNum(text, 3, n);
        bundle->findReal(text, 3, f);
        bundle->findColor(text, f);
        bundle->findRecursive(text);
        bundle->bundle(text, 0);
    }
    root.findTag(text, f[0]);
    root.findTag(text, values);
    all.findTagInAll(text, n[0]);
    all.findTagInEnhancedDicomBundle(text, "");
    HxParamBundle::replaceTag(text, mapped);
}

void change(HxParamBundle& at, HxParamBundle& all, Input& in)
{
    const std::string name = in.text(), value = in.text();
    switch (in.byte() % 12) {
    case 0:
        at.set(name.c_str(), value.c_str());
        break;
    case 1:
        at.set(name.c_str(), static_cast<int>(in.byte()));
        break;
    case 2:
        at.insert(new HxParameter(name.c_str(), 1, KpPrimType::UInt, "1234"), in.byte() % 2);
        break;
    case 3:
        at.insert(new HxParamBundle(name.c_str()), in.byte() % 2);
        break;
    case 4:
        at.bundle(name.c_str(), 1)->setName(value.c_str());
        break;
    case 5:
        at.remove(name.c_str());
        break;
    case 6:
        all.setPrivateTagInAll(value.c_str(), name.c_str(), in.byte() % 2 ? "x" : nullptr);
        break;
    case 7:
        all.privateSequenceItemInAll(value.c_str(), name.c_str(), "d", static_cast<int>(in.byte()), in.byte() % 2);
        break;
    case 8:
        all.setPrivateTagInAll(value.c_str(), "G0009-xx20", name.c_str());
        break;
    case 9:
        at.bundle("G5200-9230", 1)->bundle("Item_0", 1)->set(name.c_str(), value.c_str());
        break;
    case 10:
        at.copyAll(HxParamBundle(at));
        break;
    default:
        at.sortParameters();
    }
}

}  // namespace

// A tree that grows by the fuzz bytes, its tags beside a map.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size)
{
    Input in(data, size);
    HxParamBundle root("root"), tags("tags");
    std::map<std::string, std::string> model;
    for (int step = 0; !in.isEmpty() && step < 64; ++step) {
        const std::string tag = in.tag(), value = in.text();
        if (in.byte() % 4 == 0) {
            tags.dicomAllCreate()->remove(tag.c_str());
            model.erase(upper(tag));
        } else {
            tags.setTag(tag.c_str(), value.c_str());
            model[upper(tag)] = value;
        }
        const std::string asked = in.tag();
        const char* const found = tags.findTag(asked.c_str(), nullptr);
        const auto expected = model.find(upper(asked));
        require(found ? expected != model.end() && expected->second == found : expected == model.end());

        HxParamBundle& all = *root.dicomAllCreate();
        HxParamBundle* const child = root.bundle(static_cast<int>(in.byte() % 4));
        change(child ? *child : root, all, in);
        lookUp(root, in.text());
        lookUp(root, asked);
    }
    checkTree(root);
    checkCopy(root);
    return 0;
}
