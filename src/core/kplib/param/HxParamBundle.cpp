#include <kplib/param/HxParamBundle.h>

#include <kplib/param/HxParameter.h>
#include <kplib/param/detail/ParamName.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <utility>

HxParamBundle* HxParamBundle::create(const char* name)
{
    return new HxParamBundle(name);
}

// The constructors that may throw delegate to these two: once these return, the destructor frees
// the children.
HxParamBundle::HxParamBundle(const char* name, Untitled) : HxParamBase(TypeParameter, name)
{
    type_ = TypeBundle;
}

HxParamBundle::HxParamBundle(const HxParamBase& other, Untitled) : HxParamBase(other) {}

HxParamBundle::HxParamBundle(const char* name) : HxParamBundle(name, Untitled())
{
    setName(name);
}

HxParamBundle::HxParamBundle(const HxParamBundle& other) : HxParamBundle(other, Untitled())
{
    copy(other);
}

// NOLINTNEXTLINE(performance-noexcept-move-constructor): the copied name needs memory
HxParamBundle::HxParamBundle(HxParamBundle&& other) : HxParamBundle(other, Untitled())
{
    move(other);
}

HxParamBundle::~HxParamBundle()
{
    removeAll();
}

HxParamBundle* HxParamBundle::duplicate() const
{
    return new HxParamBundle(*this);
}

HxParamBundle& HxParamBundle::operator=(const HxParamBundle& other)
{
    if (this == &other)
        return *this;
    HxParamBundle fresh(other);  // first, since `other` may be one of the children that are deleted
    const std::uint32_t sorted = other.counts() & sortedBit;
    HxParamBase::operator=(other);
    swapChildren(fresh);
    if (size() > 0)
        touch(TouchValue);
    setCounts((counts() & ~sortedBit) | sorted);
    return *this;
}

HxParamBundle& HxParamBundle::operator=(HxParamBundle&& other) noexcept
{
    if (this == &other)
        return *this;
    KpDArray<HxParamBase*> dropped;  // last, since `other` may be one of them
    dropped.swap(children_);
    setCounts(0);
    swapChildren(other);
    for (HxParamBase* child : dropped)
        delete child;
    return *this;
}

// Exchanges the children of two bundles.
void HxParamBundle::swapChildren(HxParamBundle& other) noexcept
{
    const std::uint32_t mine = counts();
    children_.swap(other.children_);
    setCounts(other.counts());
    other.setCounts(mine);
    for (HxParamBase* child : children_)
        child->parent_ = this;
    for (HxParamBase* child : other.children_)
        child->parent_ = &other;
}

void HxParamBundle::copy(const HxParamBase& src)
{
    if (src.flags() & FlagNoCopy)
        return;
    const bool wasFilled = size() > 0;
    if (!src.isBundle()) {
        insert(src.duplicate(), wasFilled);
        return;
    }
    const auto& from = static_cast<const HxParamBundle&>(src);
    for (long i = 0; i < from.size(); ++i) {
        const HxParamBase& child = *from[i];
        if (child.flags() & FlagNoCopy)
            continue;
        if (HxParamBundle* const same = wasFilled && child.isBundle() ? bundle(child.name(), 0) : nullptr)
            same->copy(child);
        else
            insert(child.duplicate(), wasFilled);
    }
}

void HxParamBundle::copyAll(const HxParamBase& src)
{
    if (!src.isBundle()) {
        insertTwin(src);
        return;
    }
    const auto& from = static_cast<const HxParamBundle&>(src);
    for (long i = 0; i < from.size(); ++i) {
        const HxParamBase& child = *from[i];
        if (HxParamBundle* const same = child.isBundle() ? bundle(child.name(), 0) : nullptr)
            same->copyAll(child);
        else
            insertTwin(child);
    }
}

void HxParamBundle::insertTwin(const HxParamBase& node)
{
    HxParamBase* const twin = node.duplicate();
    twin->setEditCheck(node.editCheck_);
    insert(twin, 1);
}

void HxParamBundle::move(HxParamBundle& other)
{
    if (this == &other)
        return;
    if (size() == 0)
        swapChildren(other);
    while (other.size() > 0)
        insert(other.takeAt(0), 1);
    other.setCounts(0);
}

void HxParamBundle::insert(HxParamBase* node, int replace)
{
    std::unique_ptr<HxParamBase> owned(node);
    if (node->isBundle()) {  // intentional: crossed, each of the two names finds the bundle by the other
        if (std::strcmp(node->name(), "BoundaryIds") == 0)
            static_cast<HxParamBundle*>(node)->set("name", "BoundaryConditions");
        else if (std::strcmp(node->name(), "BoundaryConditions") == 0)
            static_cast<HxParamBundle*>(node)->set("name", "BoundaryIds");
    }
    const long first = node->isBundle() ? 0 : nBundles(), last = node->isBundle() ? nBundles() : size();
    if (replace) {
        const kplib::detail::NameKey key(node->name(), kplib::detail::NameKey::Literal);
        for (long i = first; i < last; ++i) {
            if (key.matches(*children_[i])) {
                replaceAt(i, owned.release());
                return;
            }
        }
    }
    reserve(1);
    children_.insert(last, 1, &node);
    owned.release()->parent_ = this;
    setCounts((counts() + node->isBundle()) & ~sortedBit);
    touch(TouchValue);
}

void HxParamBundle::replaceAt(long i, HxParamBase* node)
{
    const std::unique_ptr<HxParamBase> old(std::exchange(children_[i], node));
    node->flags_ |= old->flags_;
    node->parent_ = this;
    touch(TouchValue);
}

void HxParamBundle::reserve(long more)
{
    const long needed = size() + more;
    if (needed > children_.capacity())
        children_.remax(std::max(static_cast<long>(static_cast<double>(size()) * 1.5), needed));
}

// Removes a child without a record of it, and passes it to the caller.
HxParamBase* HxParamBundle::takeAt(long i)
{
    HxParamBase* const node = children_[i];
    children_.remove(i);
    setCounts(counts() - node->isBundle());
    return node;
}

void HxParamBundle::remove(HxParamBase* node)
{
    const int i = index(node);
    if (i < 0 || (node->flags() & FlagNoDelete))
        return;
    delete takeAt(i);
    touch(TouchValue);
}

void HxParamBundle::remove(const char* name)
{
    remove(findBase(name));
}

void HxParamBundle::removeAll()
{
    for (HxParamBase* child : children_)
        delete child;
    children_.clear();
    setCounts(0);
}

int HxParamBundle::index(const HxParamBase* node) const
{
    if (!node)
        return -1;
    const long bundles = nBundles();
    if (node->isBundle()) {
        const auto end = begin() + bundles, found = std::find(begin(), end, node);
        return found == end ? -1 : static_cast<int>(found - begin());
    }
    for (long i = size() - 1; i >= bundles; --i) {
        if (children_[i] == node)
            return static_cast<int>(i);
    }
    return -1;
}

void HxParamBundle::untouchAll(int mask)
{
    touched_ &= static_cast<std::uint8_t>(~mask);
    for (HxParamBase* child : *this) {
        if (child->isBundle())
            static_cast<HxParamBundle*>(child)->untouchAll(mask);
        else
            child->touched_ &= static_cast<std::uint8_t>(~mask);
    }
}

HxParamBundle* HxParamBundle::materials(int create)
{
    HxParamBundle* const found = bundle("Materials", create);
    if (found) {
        found->setFlag(FlagNoDelete | FlagNoInsertParam | FlagNoRename, 1);
        for (HxParamBase* child : *found)
            child->setFlag(FlagNoDelete, 1);
    }
    return found;
}

HxParamBundle* HxParamBundle::boundaryIds(int create)
{
    HxParamBundle* found = bundle("BoundaryConditions", 0);
    if (!found)
        found = bundle("BoundaryIds", create);
    if (found)
        found->setFlag(FlagNoDelete | FlagNoRename, 1);
    return found;
}
