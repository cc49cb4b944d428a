#pragma once

#include <kplib/foundation/KpExport.h>

/// A colour in single-precision red, green and blue, normally from 0 to 1.
class KPLIB_API KpColor {
public:
    /// Looks up a name and writes its colour if it is known. Null, the default, disables look-ups.
    /// Process-wide: set it before other threads start.
    static void (*getColorFromName)(float* red, float* green, float* blue, const char* name);

    KpColor() = default;  ///< black
    /// Of these components.
    KpColor(float red, float green, float blue) : rgb_{red, green, blue} {}
    /// By setValue().
    KpColor(const char* text) { setValue(text); }
    /// By setValue().
    KpColor(int argc, char** argv) { setValue(argc, argv); }

    /// Reads a colour from `text` and returns true: one number (grey) or three numbers, from 0 to
    /// 1, or from 0 to 255 if one of them is above 1; "#RRGGBB" in hexadecimal; or, if
    /// getColorFromName is set, a name, known or not. Returns false for any other text and sets
    /// black, except for two numbers, which replace the first two components. Null counts as
    /// empty.
    bool setValue(const char* text) { return setValue(rgb_, text); }
    /// The same for three floats of the caller.
    static bool setValue(float* rgb, const char* text);
    /// The same for texts, put together with blanks.
    bool setValue(int argc, char** argv);
    /// As above.
    bool setValue(int argc, const char* const* argv);
    /// Sets the colour 0xRRGGBB. The overload for int is for literals: 0 would also convert to a
    /// null text.
    void setValue(unsigned int rgb);
    /// As above.
    void setValue(int rgb) { setValue(static_cast<unsigned int>(rgb)); }

    /// Whether no component differs by more than `tolerance`.
    bool equals(const KpColor& other, float tolerance) const;
    /// Whether all components are equal.
    bool operator==(const KpColor& other) const = default;

    /// Sets the next colour of a process-wide, unlocked sequence of distinguishable colours, from
    /// drand48().
    void setRandomColor();

    /// Sets hue, saturation and value, each from 0 to 1. Any finite hue is reduced to that range;
    /// a hue that is not finite changes nothing. Grey has hue and saturation 0. A. R. Smith,
    /// "Color gamut transform pairs", 1978.
    void setHSVValue(float h, float s, float v);
    /// The inverse of setHSVValue().
    void getHSVValue(float& h, float& s, float& v) const;

    /// Sets a CIE 1976 L*a*b* colour of white point D65, L from 0 to 100, by the functions below.
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

// Conversions between sRGB (IEC 61966-2-1) from 0 to 1, CIE XYZ of white point D65 with Y = 100
// for white, and CIE 1976 L*a*b*. Each reads and writes three floats, computes in double, and may
// change its input. Values outside the ranges are clamped.

/// Converts sRGB to XYZ.
KPLIB_API void rgb2XYZ(float* rgb, float* xyz);
/// Converts XYZ to L*a*b*.
KPLIB_API void XYZ2CIELab(float* xyz, float* lab);
/// Converts L*a*b* to XYZ.
KPLIB_API void CIELab2XYZ(float* lab, float* xyz);
/// Converts XYZ to sRGB. Returns true if blue is clamped or 0; red and green do not count.
KPLIB_API bool XYZ2rgb(float* xyz, float* rgb);
