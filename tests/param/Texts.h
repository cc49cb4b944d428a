#pragma once

#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>

#include <string>

/// The text of a parameter, "-" if there is none.
inline std::string valueOf(const HxParamBundle& bundle, const char* name)
{
    const char* text = "-";
    bundle.findString(name, text);
    return text;
}

/// The text form of a tree.
inline std::string textOf(const HxParamBundle& bundle)
{
    KpString text;
    bundle.print(text);
    return text.c_str();
}
