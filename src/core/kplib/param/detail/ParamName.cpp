#include <kplib/param/detail/ParamName.h>

namespace kplib::detail {

int mystrcasecmp(const char* a, const char* b)
{
    if (!a || !b)
        return a ? 1 : -1;
    for (;; ++a, ++b) {
        if (*a == *b && *a > ' ')
            continue;
        const unsigned char left = upperCase(*a), right = *b == ' ' ? 0 : upperCase(*b);
        if (left != right)
            return left < right ? -1 : 1;
        if (left == 0)
            return 0;
    }
}

int NameKey::orderOfText(const char* text) const
{
    if (!isPrefixed_)
        return mystrcasecmp(name_, text);
    return *text == '_' ? mystrcasecmp(name_, text + 1) : mystrcasecmp("_", text);
}

}  // namespace kplib::detail
