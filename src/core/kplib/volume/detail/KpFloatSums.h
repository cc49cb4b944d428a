#pragma once

namespace kplib::detail {

/// Adds the coordinates of `n` voxels of one row, from `x` on, to the sums of x, y and z. The result is that of one
/// float addition after the other: as long as a sum of integers stays within 2^24 all of those are exact, and one does
/// for all.
inline void addRowTo(float (&sum)[3], long x, long y, long z, long n)
{
    constexpr float exact = 16777216.0f;
    const double sums[3] = {static_cast<double>(n * x + n * (n - 1) / 2), static_cast<double>(n * y),
                            static_cast<double>(n * z)};
    if (sum[0] + sums[0] <= exact && sum[1] + sums[1] <= exact && sum[2] + sums[2] <= exact) {
        for (int axis = 0; axis < 3; ++axis)
            sum[axis] += static_cast<float>(sums[axis]);
        return;
    }
    float sx = sum[0], sy = sum[1], sz = sum[2];
    for (long i = 0; i < n; ++i) {
        sx += static_cast<float>(x + i);
        sy += static_cast<float>(y);
        sz += static_cast<float>(z);
    }
    sum[0] = sx, sum[1] = sy, sum[2] = sz;
}

}  // namespace kplib::detail
