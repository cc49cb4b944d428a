#include <kplib/imaging/KpColor.h>

#include <cstdint>
#include <cstdlib>
#include <string>

// A colour from any text: an accepted colour stays from 0 to 1 after conversion to HSV and L*a*b*
// and back. No text causes a fault.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    KpColor color;
    if (!color.setValue(text.c_str()))
        return 0;
    float h = 0, s = 0, v = 0;
    color.getHSVValue(h, s, v);
    color.setHSVValue(h, s, v);
    color.getCIELabValue(h, s, v);
    color.setCIELabValue(h, s, v);
    for (int i = 0; i < 3; ++i) {
        if (color[i] < 0 || color[i] > 1)
            std::abort();
    }
    return 0;
}
