#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <algorithm>
#include <cstdio>

// Sets the parameter that find() returns by the setter of that form, or adds one by the
// constructor of that form.
template <typename... Value>
void HxParamBundle::setOrAdd(const char* name, Value... value)
{
    if (HxParameter* const found = find(name, 0, 255))
        found->set(value...);
    else
        insert(new HxParameter(name, value...), 0);
}

void HxParamBundle::set(const char* name, const char* text)
{
    setOrAdd(name, text);
}

void HxParamBundle::set(const char* name, int v)
{
    set(name, 1, &v);
}

void HxParamBundle::set(const char* name, double v)
{
    set(name, 1, &v);
}

void HxParamBundle::set(const char* name, int n, const int* values)
{
    setOrAdd(name, n, values);
}

void HxParamBundle::set(const char* name, int n, const float* values)
{
    setOrAdd(name, n, values);
}

void HxParamBundle::set(const char* name, int n, const double* values)
{
    setOrAdd(name, n, values);
}

void HxParamBundle::setAsString(const char* name, int n, const int* values)
{
    KpString text;
    text.remax(std::min(6L * n, 1024L));
    char number[16];
    for (int i = 0; i == 0 || i < n; ++i) {
        std::snprintf(number, sizeof(number), i == 0 ? "%d" : " %d", values[i]);
        text += number;
    }
    set(name, text.c_str());
}

void HxParamBundle::setColor(const float* rgb)
{
    set("Color", 3, rgb);
}
