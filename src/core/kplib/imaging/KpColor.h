#pragma once

#include <kplib/foundation/KpExport.h>

/// A colour in single-precision red, green and blue, normally from 0 to 1.
class KPLIB_API KpColor {
public:
    /// Looks up a name and writes its colour if there is one; null (the default) for no look-up.
    /// Process-wide: set it before other threads start.
    static void (*getColorFromName)(float* red, float* green, float* blue, const char* name);

    KpColor() = default;  ///< black
    /// Of these components.
    KpColor(float red, float green, float blue) : rgb_{red, green, blue} {}
    /// By setValue().
    KpColor(const char* text) { setValue(text); }
    /// By setValue().
    KpColor(int argc, char** argv) { setValue(argc, argv); }

    /// Reads one number (grey) or three, from 0 to 1 or from 0 to 255 if one is above 1; "#RRGGBB"
    /// in hexadecimal; or a name for getColorFromName, which gives true for unknown names, too.
    /// False for any other text, which gives black, but for two numbers, which stay in the first
    /// two components. Null counts as empty.
    bool setValue(const char* text) { return setValue(rgb_, text); }
    /// The same for three floats of the caller.
    static bool setValue(float* rgb, const char* text);
    /// The same for texts, put together with blanks.
    bool setValue(int argc, char** argv);
    /// As above.
    bool setValue(int argc, const char* const* argv);
    /// From 0xRRGGBB; the form with int is for literals, of which 0 would be a null text as well.
    void setValue(unsigned int rgb);
    /// As above.
    void setValue(int rgb) { setValue(static_cast<unsigned int>(rgb)); }

    /// Whether no component differs by more than `tolerance`.
    bool equals(const KpColor& other, float tolerance) const;
    /// Whether all components are equal.
    bool operator==(const KpColor& other) const = default;

    /// The next of a process-wide, unlocked row of well distinguishable colours, from drand48().
    void setRandomColor();

    /// Hue, saturation and value, each from 0 to 1; any finite hue is brought into the range, and one that is not
    /// finite changes nothing. Grey has hue and saturation 0. A. R. Smith, "Color gamut transform pairs", 1978.
    void setHSVValue(float h, float s, float v);
    /// The inverse of setHSVValue().
    void getHSVValue(float& h, float& s, float& v) const;

    /// CIE 1976 L*a*b* of white point D65, L from 0 to 100; by the functions below.
    void setCIELabValue(float L, float a, float b);
    /// The inverse of setCIELabValue().
    void getCIELabValue(float& L, float& a, float& b) const;

    /// @{
    /// A component.
    float red() const { return rgb_[0]; }
    float green() const { return rgb_[1]; }
    float blue() const { return rgb_[2]; }
    /// @}

    /// Component 0 to 2: red, green, blue.
    float& operator[](int i) { return rgb_[i]; }
    /// As above.
    float operator[](int i) const { return rgb_[i]; }
    /// The three components.
    const float* data() const { return rgb_; }

private:
    float rgb_[3] = {0, 0, 0};
};

// Steps between sRGB (IEC 61966-2-1) from 0 to 1, CIE XYZ of white point D65 with Y = 100 for white, and CIE 1976
// L*a*b*. Each reads and writes three floats, calculates in double, and may change its input; values outside the ranges
// are clamped.

/// From sRGB to XYZ.
KPLIB_API void rgb2XYZ(float* rgb, float* xyz);
/// From XYZ to L*a*b*.
KPLIB_API void XYZ2CIELab(float* xyz, float* lab);
/// From L*a*b* to XYZ.
KPLIB_API void CIELab2XYZ(float* lab, float* xyz);
/// From XYZ to sRGB. True when blue was clamped or 0; red and green do not count.
KPLIB_API bool XYZ2rgb(float* xyz, float* rgb);
