#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

namespace {

constexpr size_t tagLength = 10;  // "Ggggg-eeee"
constexpr long firstBlock = 16, endOfBlocks = 256;

// The parameter at an index if it is named like a tag, else null.
const HxParameter* tagAt(const HxParamBundle& bundle, long i)
{
    const HxParamBase* const child = bundle[i];
    return !child->isBundle() && std::strlen(child->name()) == tagLength ? static_cast<const HxParameter*>(child)
                                                                         : nullptr;
}

bool isSameGroup(const HxParameter& reservation, const char* pattern)
{
    return std::strncmp(reservation.name(), pattern, 5) == 0;
}

// Whether a template has the positions that blocks are written to.
bool isTemplate(const char* pattern)
{
    return std::strlen(pattern) >= tagLength;
}

KpString withBlock(const char* pattern, const char* digits)
{
    KpString name(pattern);
    name[6] = digits[0];
    name[7] = digits[1];
    return name;
}

// The full name of a private tag of a creator that has a reservation; else false.
bool findPrivateTagName(const HxParamBundle& creators, const char* creator, const char* pattern, KpString* out)
{
    if (!isTemplate(pattern))
        return false;
    for (long i = creators.nBundles(); i < creators.size(); ++i) {
        const HxParameter* const reservation = tagAt(creators, i);
        if (!reservation || !isSameGroup(*reservation, pattern))
            continue;
        const char* const text = reservation->getString();
        if (!text || std::strcmp(text, creator) != 0)
            continue;
        if (out)
            *out = withBlock(pattern, reservation->name() + 8);
        return true;
    }
    return false;
}

// Whether a parameter of a header is a reservation. The group's last digit is tested by its character, so that groups
// that end in A, C and E pass and those that end in B, D and F do not. Intentional: callers depend
// on it.
bool isReservation(const char* tag)
{
    return (tag[4] & 1) && tag[6] == '0' && tag[7] == '0';
}

HxParamBundle& findOrCreatePrivateCreatorBundle(HxParamBundle& all)
{
    if (HxParamBundle* const found = all.bundle("PrivateCreators"))
        return *found;
    auto creators = std::make_unique<HxParamBundle>("PrivateCreators");
    creators->setFlag(HxParamBase::FlagNoSave, 1);
    for (long i = all.nBundles(); i < all.size(); ++i) {
        const HxParameter* const leaf = tagAt(all, i);
        const char* creator = nullptr;
        if (leaf && isReservation(leaf->name()) && leaf->getBundleTagValue(creator))
            creators->insert(new HxParameter(leaf->name(), creator), 0);
    }
    HxParamBundle& made = *creators;
    all.insert(creators.release(), 0);
    return made;
}

// The smallest block that no reservation of the group has; endOfBlocks if there is none.
long freeBlock(const HxParamBundle& creators, const char* pattern)
{
    bool isTaken[endOfBlocks] = {};
    for (long i = creators.nBundles(); i < creators.size(); ++i) {
        const HxParameter* const reservation = tagAt(creators, i);
        const long block =
            reservation && isSameGroup(*reservation, pattern) ? std::strtol(reservation->name() + 8, nullptr, 16) : 0;
        if (block > 0 && block < endOfBlocks)
            isTaken[block] = true;
    }
    long block = firstBlock;
    while (block < endOfBlocks && isTaken[block])
        ++block;
    return block;
}

// Reserves a block for a creator and gives the full name of its tag; false if the group is full.
bool createPrivateTagName(HxParamBundle& all, HxParamBundle& creators, const char* creator, const char* pattern,
                          KpString& out)
{
    if (!isTemplate(pattern))
        return false;
    const long block = freeBlock(creators, pattern);
    if (block >= endOfBlocks)
        return false;
    // Digits count on from '0' and run past '9' into what follows it, so that block 26 is `1:`, which the rules for
    // names fold into `1_`, and freeBlock() returns it again. Intentional: callers depend on it.
    const char digits[] = {static_cast<char>('0' + block / 16), static_cast<char>('0' + block % 16)};
    KpString name = withBlock(pattern, "00"), text("PrivateCreator: ");
    name[8] = digits[0];
    name[9] = digits[1];
    text += creator;
    KpString full = withBlock(pattern, digits);
    auto reservation = std::make_unique<HxParameter>(name, creator), leaf = std::make_unique<HxParameter>(name, text);
    creators.reserve(1);
    all.reserve(1);
    creators.insert(reservation.release(), 1);
    all.insert(leaf.release(), 1);
    out.swap(full);
    return true;
}

}  // namespace

const char* HxParamBundle::findPrivateTagInAll(const char* creator, const char* tag, const char* defaultValue) const
{
    if (!tag)
        return defaultValue;
    if (!creator)
        return findTagInAll(tag, defaultValue);
    // The index of creators is a cache: making it is no change that callers see.
    const HxParamBundle& creators = findOrCreatePrivateCreatorBundle(const_cast<HxParamBundle&>(*this));
    KpString name;
    return findPrivateTagName(creators, creator, tag, &name) ? findTagInAll(name, defaultValue) : defaultValue;
}

void HxParamBundle::setPrivateTagInAll(const char* creator, const char* tag, const char* value)
{
    if (!creator || !tag)
        return;
    HxParamBundle& creators = findOrCreatePrivateCreatorBundle(*this);
    KpString name;
    const bool isReserved = findPrivateTagName(creators, creator, tag, &name);
    if (!value) {
        if (isReserved)
            remove(name);
        return;
    }
    const KpString text(0, ": %s", value);
    if (isReserved || createPrivateTagName(*this, creators, creator, tag, name))
        set(name, text.c_str());
}

namespace {

void describe(HxParamBundle& bundle, const char* description)
{
    const char* text = nullptr;
    if (!bundle.findString("Description", text))
        bundle.set("Description", description);
}

KpString itemName(const char* format, int index)
{
    return KpString(0, format, index);
}

}  // namespace

HxParamBundle* HxParamBundle::privateSequenceItemInAll(const char* creator, const char* tag, const char* description,
                                                       int index, bool create)
{
    if (!creator || !tag)
        return nullptr;
    HxParamBundle& creators = findOrCreatePrivateCreatorBundle(*this);
    KpString name;
    if (!findPrivateTagName(creators, creator, tag, &name) &&
        !createPrivateTagName(*this, creators, creator, tag, name))
        return nullptr;
    HxParamBundle* const sequence = bundle(name, create);
    if (!sequence)
        return nullptr;
    describe(*sequence, description);
    HxParamBundle* const item = sequence->bundle(itemName("Item_%d", index), create);
    if (item)
        describe(*item, itemName("Item %d", index));
    return item;
}

const HxParamBundle* HxParamBundle::privateSequenceItemInAll(const char* creator, const char* tag, int index) const
{
    const HxParamBundle* const creators = creator && tag ? bundle("PrivateCreators") : nullptr;
    KpString name;
    if (!creators || !findPrivateTagName(*creators, creator, tag, &name))
        return nullptr;
    const HxParamBundle* const sequence = bundle(name.c_str());
    return sequence ? sequence->bundle(itemName("Item_%d", index).c_str()) : nullptr;
}
