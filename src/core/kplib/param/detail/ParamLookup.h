#pragma once

#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>
#include <kplib/param/detail/ParamName.h>

// The two look-ups of each access to a DICOM tag, for inlining: calls took a quarter of its time.

namespace kplib::detail {

inline const HxParamBundle* asBundle(const HxParamBase* node)
{
    return static_cast<const HxParamBundle*>(node);
}

inline const HxParameter* asParameter(const HxParamBase* node)
{
    return static_cast<const HxParameter*>(node);
}

}  // namespace kplib::detail

inline const HxParameter* HxParamBundle::findSorted(const kplib::detail::NameKey& key) const
{
    if (!isSorted())
        sortParameters();
    const HxParamBase* const* const children = begin();
    long lo = nBundles(), hi = size() - 1;
    while (lo <= hi) {
        const long mid = (lo + hi) / 2;
        const int order = key.order(*children[mid]);
        if (order == 0)
            return kplib::detail::asParameter(children[mid]);
        if (order < 0)
            hi = mid - 1;
        else
            lo = mid + 1;
    }
    return nullptr;
}

inline const HxParamBundle* HxParamBundle::bundle(const kplib::detail::NameKey& key) const
{
    bool mayBeTitled = false;
    const HxParamBase* const* const children = begin();
    const int count = nBundles();
    for (int i = 0; i < count; ++i) {
        const HxParamBundle* const child = kplib::detail::asBundle(children[i]);
        if (key.matches(*child))
            return child;
        mayBeTitled |= child->hasParameters();
    }
    return mayBeTitled ? titled(key) : nullptr;
}
