#pragma once

#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <cstdlib>
#include <cstring>

namespace kplib::detail {

// The child at an index if it is a parameter, else null.
inline const HxParameter* parameterAt(const HxParamBundle& bundle, long index)
{
    if (index < 0 || index >= bundle.size())
        return nullptr;
    const HxParamBase* const child = bundle[index];
    return child && !child->isBundle() ? static_cast<const HxParameter*>(child) : nullptr;
}

// The text of a parameter, "" for one without a value.
inline const char* textOf(const HxParameter& parameter)
{
    const char* const text = parameter.getString();
    return text ? text : "";
}

// The value of a DICOM leaf "description: value": the text two characters after the colon or, if
// nothing follows a colon, all of it.
inline const char* leafValue(const char* text)
{
    const char* const colon = std::strchr(text, ':');
    return colon && colon[1] ? colon + 2 : text;
}

// The number in a name made by "Image%05d", as sscanf reads it by "Image%d"; false for other names.
inline bool imageNumberOfName(const char* name, int& number)
{
    constexpr char prefix[] = "Image";
    constexpr size_t length = sizeof prefix - 1;
    if (std::strncmp(name, prefix, length) != 0)
        return false;
    char* end = nullptr;
    const long value = std::strtol(name + length, &end, 10);
    number = static_cast<int>(value);
    return end != name + length;
}

// Adds a text parameter after the others.
inline void addText(HxParamBundle& bundle, const char* name, const char* text)
{
    bundle.insert(HxParameter::create(name, text), 0);
}

}  // namespace kplib::detail
