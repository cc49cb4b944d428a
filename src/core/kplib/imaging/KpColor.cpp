#include <kplib/imaging/KpColor.h>

#include <kplib/foundation/KpString.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>

void (*KpColor::getColorFromName)(float* red, float* green, float* blue, const char* name) = nullptr;

namespace {

bool isLetter(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

void divideBy255(float* rgb)
{
    for (int i = 0; i < 3; ++i)
        rgb[i] /= 255.0f;
}

bool readNumbers(float* rgb, const char* text)
{
    const int count = std::sscanf(text, "%g%g%g", &rgb[0], &rgb[1], &rgb[2]);
    if (count == 1)
        rgb[1] = rgb[2] = rgb[0];
    else if (count != 3)
        return false;
    if (rgb[0] > 1 || rgb[1] > 1 || rgb[2] > 1)
        divideBy255(rgb);
    return true;
}

bool readHex(float* rgb, const char* digits)
{
    unsigned number = 0;
    const bool ok = std::sscanf(digits, "%x", &number) == 1;
    for (int i = 0; i < 3; ++i)
        rgb[i] = static_cast<float>(number >> (16 - 8 * i) & 0xFF);
    divideBy255(rgb);
    return ok;
}

}  // namespace

bool KpColor::setValue(float* rgb, const char* text)
{
    if (!text)
        text = "";
    while (*text == ' ' || (*text >= '\t' && *text <= '\r'))
        ++text;
    if (*text >= '0' && *text <= '9')
        return readNumbers(rgb, text);
    if (*text == '#')
        return readHex(rgb, text + 1);
    if (isLetter(*text) && getColorFromName) {
        getColorFromName(&rgb[0], &rgb[1], &rgb[2], text);
        return true;
    }
    std::fill(rgb, rgb + 3, 0.0f);
    return false;
}

bool KpColor::setValue(int argc, char** argv)
{
    return setValue(argc, static_cast<const char* const*>(argv));
}

bool KpColor::setValue(int argc, const char* const* argv)
{
    KpString text;
    for (int i = 0; i < argc; ++i) {
        text += argv[i];
        text += ' ';
    }
    return setValue(text.c_str());
}

void KpColor::setValue(unsigned int rgb)
{
    for (int i = 0; i < 3; ++i)
        rgb_[i] = static_cast<float>(rgb >> (16 - 8 * i) & 0xFF) * 0.003921569f;
}

bool KpColor::equals(const KpColor& other, float tolerance) const
{
    for (int i = 0; i < 3; ++i) {
        if (std::abs(rgb_[i] - other.rgb_[i]) > tolerance)
            return false;
    }
    return true;
}

void KpColor::setRandomColor()
{
    static float hue = 0;
    hue += static_cast<float>(drand48());
    hue -= std::floor(hue);
    setHSVValue(hue, 0.8f, 0.8f);
}

void KpColor::setHSVValue(float h, float s, float v)
{
    if (s == 0) {
        *this = KpColor(v, v, v);
        return;
    }
    h -= std::trunc(h);  // all whole steps at once, which is exact
    if (h < 0)
        h += 1;
    if (h >= 1)  // the sum above may have been rounded up
        h -= 1;
    const float x = 6 * h, i = std::floor(x), f = x - i;
    const float p = (1 - s) * v, q = (1 - f * s) * v, t = (1 - (1 - f) * s) * v;
    const KpColor sectors[] = {{v, t, p}, {q, v, p}, {p, v, t}, {p, q, v}, {t, p, v}, {v, p, q}};
    if (i >= 0 && i < 6)
        *this = sectors[static_cast<int>(i)];
}

void KpColor::getHSVValue(float& h, float& s, float& v) const
{
    const float r = rgb_[0], g = rgb_[1], b = rgb_[2];
    v = std::max({r, g, b});
    const float d = v - std::min({r, g, b});
    if (v == 0 || d == 0) {
        h = s = 0;
        return;
    }
    s = d / v;
    if (r == v)
        h = (g - b) / d;
    else if (g == v)
        h = (b - r) / d + 2;
    else
        h = (r - g) / d + 4;
    h /= 6;
    while (h < 0)
        h += 1;
}

void KpColor::setCIELabValue(float L, float a, float b)
{
    float lab[] = {L, a, b}, xyz[3];
    CIELab2XYZ(lab, xyz);
    XYZ2rgb(xyz, rgb_);
}

void KpColor::getCIELabValue(float& L, float& a, float& b) const
{
    float rgb[] = {rgb_[0], rgb_[1], rgb_[2]}, xyz[3], lab[3];
    rgb2XYZ(rgb, xyz);
    XYZ2CIELab(xyz, lab);
    L = lab[0];
    a = lab[1];
    b = lab[2];
}

namespace {

constexpr double white[] = {95.047, 100, 108.883};  // D65

using Matrix = double[3][3];

void multiply(const Matrix& rows, const double* in, double* out)
{
    for (int i = 0; i < 3; ++i)
        out[i] = rows[i][0] * in[0] + rows[i][1] * in[1] + rows[i][2] * in[2];
}

// Correctly rounded: the C library's root differs in its last bit between processors, and differences of roots show
// it. One step of Newton from there, with the residual t - root^3 exact but for its own rounding.
double cubeRoot(double t)
{
    const double root = std::cbrt(t), square = root * root, rest = std::fma(root, root, -square);
    const double residual = std::fma(-square, root, t) - rest * root;
    return root + residual / (3 * square);
}

}  // namespace

void rgb2XYZ(float* rgb, float* xyz)
{
    static constexpr Matrix rows = {{0.4124, 0.3576, 0.1805}, {0.2126, 0.7152, 0.0722}, {0.0193, 0.1192, 0.9505}};
    double linear[3], sums[3];
    for (int i = 0; i < 3; ++i) {
        const double c = std::clamp(static_cast<double>(rgb[i]), 0.0, 1.0);
        linear[i] = 100 * (c > 0.04045 ? std::pow((c + 0.055) / 1.055, 2.4) : c / 12.92);
    }
    multiply(rows, linear, sums);
    std::copy(sums, sums + 3, xyz);
}

void XYZ2CIELab(float* xyz, float* lab)
{
    double terms[3];
    for (int i = 0; i < 3; ++i) {
        const double t = std::clamp(static_cast<double>(xyz[i]) / white[i], 0.0, 1.0);
        terms[i] = t > 0.008856 ? cubeRoot(t) : 7.787 * t + 0.13793103;
    }
    lab[0] = static_cast<float>(116 * terms[1] - 16);
    lab[1] = static_cast<float>(500 * (terms[0] - terms[1]));
    lab[2] = static_cast<float>(200 * (terms[1] - terms[2]));
}

void CIELab2XYZ(float* lab, float* xyz)
{
    const double y = (static_cast<double>(lab[0]) + 16) / 116;
    const double terms[] = {static_cast<double>(lab[1]) / 500 + y, y, y - static_cast<double>(lab[2]) / 200};
    for (int i = 0; i < 3; ++i) {
        const double cube = terms[i] * terms[i] * terms[i];
        const double t = cube > 0.008856 ? cube : (terms[i] - 0.13793103) / 7.787;
        xyz[i] = static_cast<float>(std::clamp(t, 0.0, 1.0) * white[i]);
    }
}

bool XYZ2rgb(float* xyz, float* rgb)
{
    static constexpr Matrix rows = {{3.2406, -1.5372, -0.4986}, {-0.9689, 1.8758, 0.0415}, {0.0557, -0.2040, 1.0570}};
    double clamped[3], linear[3], c = 0;
    for (int i = 0; i < 3; ++i)
        clamped[i] = std::clamp(static_cast<double>(xyz[i]), 0.0, white[i]) / 100;
    multiply(rows, clamped, linear);
    for (int i = 0; i < 3; ++i) {
        c = linear[i] > 0.0031308 ? 1.055 * std::pow(linear[i], 1 / 2.4) - 0.055 : 12.92 * linear[i];
        rgb[i] = static_cast<float>(std::clamp(c, 0.0, 1.0));
    }
    return !(c > 0) || c > 1;
}
