#include <kplib/geometry/detail/Mat4fLoops.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {
namespace {

// The reference.
bool invertPlain(const float* in, float* out)
{
    double a[3][3];
    for (int i = 0; i < 3; ++i) {
        for (int j = 0; j < 3; ++j)
            a[i][j] = static_cast<double>(in[4 * i + j]);
    }
    double positive = 0, negative = 0;
    for (const double term : {a[0][0] * a[1][1] * a[2][2], a[0][1] * a[1][2] * a[2][0], a[0][2] * a[1][0] * a[2][1],
                              -a[0][0] * a[1][2] * a[2][1], -a[0][1] * a[1][0] * a[2][2], -a[0][2] * a[1][1] * a[2][0]})
        (term >= 0 ? positive : negative) += term;
    if (isSingular(positive, negative))
        return false;

    const double scale = 1 / (positive + negative);
    const float shift[] = {in[12], in[13], in[14]};
    for (int i = 0; i < 3; ++i) {
        for (int j = 0; j < 3; ++j) {
            const int r1 = (j + 1) % 3, r2 = (j + 2) % 3, c1 = (i + 1) % 3, c2 = (i + 2) % 3;
            out[4 * i + j] = static_cast<float>((a[r1][c1] * a[r2][c2] - a[r1][c2] * a[r2][c1]) * scale);
        }
    }
    for (int j = 0; j < 3; ++j)
        out[12 + j] = -(shift[0] * out[j] + shift[1] * out[4 + j] + shift[2] * out[8 + j]);
    out[3] = out[7] = out[11] = 0;
    out[15] = 1;
    return true;
}

}  // namespace

std::span<const KernelPath<AffineInverse>> affineInversePaths()
{
    static const KernelTable<AffineInverse> paths({{"plain", true, invertPlain}}, affineInverseX86());
    return paths;
}

}  // namespace kplib::detail
