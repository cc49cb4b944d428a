#include <kplib/imaging/KpColor.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>
#include <kplib/param/detail/ParamLookup.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <thread>
#include <utility>

using kplib::detail::asBundle;
using kplib::detail::asParameter;
using kplib::detail::isDigit;
using kplib::detail::mystrcasecmp;
using kplib::detail::NameKey;

namespace {

// The order of qsort over children.
int compareParamNames(const void* a, const void* b)
{
    return mystrcasecmp((*static_cast<HxParamBase* const*>(a))->name(), (*static_cast<HxParamBase* const*>(b))->name());
}

bool isWhite(char c)
{
    return c == ' ' || (c >= '\t' && c <= '\r');
}

// The bits of a type mask that take a value of that type: its own and those of wider ones.
int takers(KpPrimType type)
{
    enum : int { Byte = 1, Short = 2, Int = 4, Float = 8, Double = 16, Text = 64 };
    switch (type) {
    case KpPrimType::Byte:
        return Byte | Short | Int | Float | Double | Text;
    case KpPrimType::Short:
    case KpPrimType::UShort:
        return Short | Int | Float | Double | Text;
    case KpPrimType::Int:
        return Int | Float | Double | Text;
    case KpPrimType::Float:
        return Float | Double | Text;
    case KpPrimType::Double:
        return Double | Text;
    case KpPrimType::String:
        return Text;
    case KpPrimType::Complex:
    case KpPrimType::UInt:
    case KpPrimType::SByte:
        break;
    }
    return 0;
}

// The numbers at the start of a text; false if it ends before the last one. What is no digit, `-` or blank is never
// passed, so all further numbers are read there. Intentional: callers depend on it.
bool readNumbers(const char* text, int n, int* out)
{
    for (int i = 0; i < n; ++i) {
        if (!*text)
            return false;
        out[i] = std::atoi(text);
        while (isDigit(*text) || *text == '-')
            ++text;
        while (*text == ' ')
            ++text;
    }
    return true;
}

}  // namespace

void HxParamBundle::sortParameters() const
{
    while (sortLock_.exchange(1, std::memory_order_acquire) != 0)
        std::this_thread::yield();
    if (!isSorted()) {
        const long first = nBundles(), count = size() - first;
        if (count > 1)
            std::qsort(children_.data() + first, static_cast<size_t>(count), sizeof(void*), compareParamNames);
        counts_.fetch_or(sortedBit, std::memory_order_release);
    }
    sortLock_.store(0, std::memory_order_release);
}

const HxParameter* HxParamBundle::findSorted(const char* name) const
{
    return findSorted(NameKey(name, NameKey::Literal));
}

// The parameter of that name, of any type.
const HxParameter* HxParamBundle::parameter(const NameKey& key) const
{
    if (isSorted())
        return findSorted(key);
    for (long i = nBundles(); i < size(); ++i) {
        if (key.matches(*children_[i]))
            return asParameter(children_[i]);
    }
    return nullptr;
}

const HxParameter* HxParamBundle::find(const NameKey& key, int dimension, int typeMask) const
{
    const HxParameter* const found = parameter(key);
    if (!found || (dimension > 0 && dimension != found->dimension()) || !(takers(found->primType()) & typeMask))
        return nullptr;
    return found;
}

const HxParameter* HxParamBundle::find(const char* name, int dimension, int typeMask) const
{
    return find(NameKey(name), dimension, typeMask);
}

HxParameter* HxParamBundle::find(const char* name, int dimension, int typeMask)
{
    return const_cast<HxParameter*>(std::as_const(*this).find(name, dimension, typeMask));
}

// Whether there is a parameter of that name that find() does not return: one of a type without a text, or one that was
// renamed after the parameters were sorted.
bool HxParamBundle::isShadowed(const char* name) const
{
    const NameKey key(name);
    const auto matches = [&](const HxParamBase* child) { return key.matches(*child); };
    return !find(key, 0, 255) && std::any_of(children_.begin() + nBundles(), children_.end(), matches);
}

// Whether the key is one of the first 16 words of the title.
bool HxParamBundle::isTitled(const NameKey& key) const
{
    static constexpr NameKey nameKey("Name");
    const HxParameter* const title = hasParameters() ? find(nameKey, 1, 64) : nullptr;
    const char* text = title ? title->getString() : nullptr;
    for (int tokens = 0; text && tokens < 16; ++tokens) {
        while (isWhite(*text))
            ++text;
        if (!*text)
            return false;
        if (key.matchesToken(text))
            return true;
        while (*text && !isWhite(*text))
            ++text;
    }
    return false;
}

const HxParamBundle* HxParamBundle::titled(const NameKey& key) const
{
    for (int i = 0; i < nBundles(); ++i) {
        if (asBundle(children_[i])->isTitled(key))
            return asBundle(children_[i]);
    }
    return nullptr;
}

const HxParamBundle* HxParamBundle::bundle(const char* name) const
{
    return bundle(NameKey(name));
}

HxParamBundle* HxParamBundle::bundle(const char* name, int create)
{
    if (const HxParamBundle* const found = bundle(NameKey(name)))
        return const_cast<HxParamBundle*>(found);
    if (!create)
        return nullptr;
    HxParamBundle* const fresh = new HxParamBundle(name);
    insert(fresh, 1);
    return fresh;
}

const HxParamBundle* HxParamBundle::bundle(int i) const
{
    return i >= 0 && i < nBundles() ? asBundle(children_[i]) : nullptr;
}

const HxParamBase* HxParamBundle::findBase(const char* name) const
{
    const NameKey key(name);
    for (const HxParamBase* child : *this) {
        if (key.matches(*child))
            return child;
    }
    return titled(key);
}

bool HxParamBundle::findString(const char* name, const char*& text) const
{
    const HxParameter* const found = find(name, 1, 64);
    if (found)
        text = found->getString();
    return found;
}

bool HxParamBundle::findNum(const char* name, int n, int* out) const
{
    const HxParameter* const found = find(name, 0, 255);
    if (!found)
        return false;
    if (found->primType() == KpPrimType::String) {
        const char* const text = found->getString();
        return readNumbers(text ? text : "", n, out);
    }
    if (found->dimension() != n)
        return false;
    found->getNum(out);
    return true;
}

bool HxParamBundle::findReal(const char* name, int n, double* out) const
{
    const HxParameter* const found = find(name, n, 255);
    for (int i = 0; found && i < n; ++i)
        out[i] = found->getReal(i);
    return found;
}

bool HxParamBundle::findReal(const char* name, int n, float* out) const
{
    const HxParameter* const found = find(name, n, 255);
    for (int i = 0; found && i < n; ++i)
        out[i] = static_cast<float>(found->getReal(i));
    return found;
}

bool HxParamBundle::findColor(const char* name, float* rgb) const
{
    const HxParameter* const found = find(name, 0, 255);
    return found && KpColor::setValue(rgb, found->getString());
}

bool HxParamBundle::findColor(float* rgb) const
{
    return findColor("Color", rgb);
}
