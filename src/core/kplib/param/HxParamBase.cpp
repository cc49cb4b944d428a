#include <kplib/param/HxParamBase.h>

#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParamEditCheck.h>
#include <kplib/param/HxParameter.h>
#include <kplib/param/detail/ParamName.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <utility>

static_assert(sizeof(HxParamBase) == 40 && sizeof(HxParameter) == 56 && sizeof(HxParamBundle) == 72,
              "other modules are compiled against this layout");

namespace {

using OwnedText = std::unique_ptr<char, KpFree>;

// In a block of its own, padded with zeros for NameKey.
OwnedText nameCopy(const char* text)
{
    constexpr size_t block = kplib::detail::nameBlock;
    const size_t prefix = kplib::detail::isDigit(*text) ? 1 : 0, length = prefix + std::strlen(text);
    const size_t size = (length / block + 1) * block;
    OwnedText name(static_cast<char*>(kpmalloc(size)));
    *name = '_';
    std::memcpy(name.get() + prefix, text, length - prefix);
    std::memset(name.get() + length, 0, size - length);
    return name;
}

OwnedText generatedName(HxParamBase::Type type)
{
    static std::uint32_t iBundle = 0, iParameter = 0;
    char text[24];
    if (type == HxParamBase::TypeBundle)
        std::snprintf(text, sizeof(text), "Bundle%u", ++iBundle);
    else
        std::snprintf(text, sizeof(text), "Parameter%u", ++iParameter);
    return nameCopy(text);
}

// Ends `name` at its first blank, and returns what follows, or null without one.
char* cutAtBlank(char* name)
{
    char* const blank = std::strchr(name, ' ');
    if (!blank)
        return nullptr;
    *blank = '\0';
    return blank + 1;
}

char cleaned(char c)
{
    if ((c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '-')
        return c;
    switch (static_cast<unsigned char>(c)) {  // Latin-1; intentional: no other letters
    case 196:
        return 'A';
    case 214:
        return 'O';
    case 220:
        return 'U';
    case 223:
        return 's';
    case 228:
        return 'a';
    case 232:
    case 233:
    case 234:
        return 'e';
    case 246:
        return 'o';
    case 252:
        return 'u';
    default:
        return '_';
    }
}

// Joins the tokens of `title` other than `name`; false without any. Quotes may hold an empty one.
bool tokensOtherThan(const char* name, const char* title, KpString& others)
{
    bool any = false;
    for (KpStringTokenizer tokens(title); tokens.hasMoreTokens();) {
        const KpString& token = tokens.nextToken();
        if (std::strcmp(token, name) == 0)
            continue;
        if (any)
            others += ' ';
        others += token;
        any = true;
    }
    return any;
}

}  // namespace

void* HxParamBase::operator new(std::size_t size)
{
    return kpmalloc(size);
}

void HxParamBase::operator delete(void* node) noexcept
{
    kpfree(node);
}

// Sets the name while the kind is still that of a parameter. Intentional: names depend on it.
HxParamBase::HxParamBase(Type type, const char* name)
{
    setName(name);
    type_ = type;
}

HxParamBase::HxParamBase(const HxParamBase& other) : touched_(other.touched_), flags_(other.flags_)
{
    setName(other.name_);
    type_ = other.type_;
}

HxParamBase::~HxParamBase()
{
    kpfree(name_);
}

HxParamBase& HxParamBase::operator=(const HxParamBase& other)
{
    const auto oldTouched = std::exchange(touched_, std::uint8_t{0});
    const auto oldFlags = std::exchange(flags_, other.flags_);
    try {
        if (this != &other)
            setName(other.name_);
    } catch (...) {
        touched_ |= oldTouched;
        flags_ = oldFlags;
        throw;
    }
    return *this;
}

void HxParamBase::setName(const char* name)
{
    if (!name || !*name) {
        adoptName(generatedName(type_).release());
        return;
    }
    if (name == name_)
        return;
    OwnedText fresh = nameCopy(name);
    char* const rest = isBundle() ? cutAtBlank(fresh.get()) : nullptr;
    for (char* c = fresh.get(); *c; ++c)
        *c = cleaned(*c);
    if (isBundle())
        retitle(fresh.get(), rest);
    if (rest)
        std::memset(rest, 0, std::strlen(rest));
    adoptName(fresh.release());
}

void HxParamBase::adoptName(char* fresh)
{
    const OwnedText old(std::exchange(name_, fresh));
    tag_ = kplib::detail::tagNumber(name_);
    if (old && std::strcmp(old.get(), name_) != 0)
        touch(TouchName);
}

// Makes `rest`, or else the old title, the title, without the tokens that repeat `name`. All memory is taken before
// the title changes.
void HxParamBase::retitle(const char* name, const char* rest)
{
    auto& bundle = static_cast<HxParamBundle&>(*this);
    if (rest && bundle.isShadowed("Name")) {
        bundle.set("Name", rest);  // adds a parameter; what is found below may be another one of that name, or none
        rest = nullptr;
    }
    const char* title = rest;
    if (!rest && !bundle.findString("Name", title))
        return;
    KpString others;
    const bool any = tokensOtherThan(name, title, others);
    if (rest || any)
        bundle.set("Name", any ? others.c_str() : rest);
    if (any)
        bundle.find("Name", 1, 64)->touch(TouchValue);  // a new title too is marked as changed
    else
        bundle.remove("Name");
}

void HxParamBase::touch(int mask)
{
    for (HxParamBase* node = this; node && mask != 0; node = node->parent_) {
        node->touched_ |= static_cast<std::uint8_t>(TouchAny | mask);
        mask = (mask & ~3) | (mask & 3) << 2;  // a change here is one of a child there
    }
}

void HxParamBase::setFlag(int mask, int on)
{
    flags_ = static_cast<std::uint16_t>(on ? flags_ | mask : flags_ & ~mask);
}

HxParamEditCheck* HxParamBase::editCheck() const
{
    for (const HxParamBase* node = this; node; node = node->parent_) {
        if (node->editCheck_)
            return node->editCheck_;
    }
    return HxParamEditCheck::defaultEditCheck();
}
