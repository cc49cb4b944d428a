#pragma once

#include <algorithm>
#include <bit>
#include <cstdint>

// Sums of integers in floats, equal to those of one addition after the other, without all the
// additions. A sum is a multiple of the unit, the distance of floats of its magnitude. While it
// stays below the next power of two, an addition adds its term rounded to units: half a unit is
// rounded so that the sum is an even number of units.

namespace kplib::detail {

// The unit of floats around a sum of integers, and the power of two where a larger one begins.
struct FloatGrid {
    long unit, top;

    explicit FloatGrid(float sum)
    {
        const int exponent = static_cast<int>(std::bit_cast<std::uint32_t>(sum) >> 23) - 127;
        const int excess = std::max(exponent - 23, 0);
        unit = 1L << excess;
        top = (1L << 24) << excess;
    }
};

// The sum after `n` terms of `term`, one after the other. All are below 2^31, the result below 2^62.
inline float plusEqualTerms(float sum, long term, long n)
{
    while (n > 0) {
        const auto [unit, top] = FloatGrid(sum);
        const long start = static_cast<long>(sum), rest = term & (unit - 1), half = unit / 2;
        const bool isTie = unit > 1 && rest == half;
        const bool isUp = isTie ? ((term - rest) & unit) != 0 : rest > half;
        const long added = term - rest + (isUp ? unit : 0), room = top - start;
        long count = added * n <= room ? n : room / added;
        if (isTie && (start & unit) != 0)
            count = 0;  // from an odd number of units the first tie is rounded differently from later ones
        if (count > 0)
            sum = static_cast<float>(start + added * count);
        else
            sum += static_cast<float>(term);
        n -= std::max(count, 1L);
    }
    return sum;
}

// As plusRamp(), where the sum stays within the grid and its unit is above 1: ties are added one by one, what lies
// between two of them at once.
inline float plusRampWithin(FloatGrid grid, float sum, long first, long n)
{
    const long half = grid.unit / 2;
    for (const long end = first + n; first < end;) {
        long past = (first + half) & (grid.unit - 1);  // the last tie
        if (past == 0) {
            sum += static_cast<float>(first++);
            past = 1;
        }
        const long count = std::min(end - first, grid.unit - past);
        sum += static_cast<float>(count * (first + half - past));
        first += count;
    }
    return sum;
}

// The sum after `n` terms first, first + 1, ..., one after the other, with the same limits.
inline float plusRamp(float sum, long first, long n)
{
    constexpr long few = 16;
    while (n > 0) {
        const FloatGrid grid(sum);
        const long total = n * first + n * (n - 1) / 2;
        if (grid.unit == 1 && static_cast<long>(sum) + total <= grid.top)
            return sum + static_cast<float>(total);
        if (grid.unit > 2 && n > few && static_cast<long>(sum) + n * (first + n + grid.unit) <= grid.top)
            return plusRampWithin(grid, sum, first, n);
        for (long i = std::min(n, few); i > 0; --i, --n)
            sum += static_cast<float>(first++);
    }
    return sum;
}

// Adds the coordinates of `n` voxels of one row, from `x` on, to the sums of x, y and z, one after the other.
inline void addRowTo(float (&sum)[3], long x, long y, long z, long n)
{
    constexpr float large = 4611686018427387904.0f;  // 2^62
    const bool isFew = n < 8 || std::max({sum[0], sum[1], sum[2]}) >= large / 2 || std::max({x + n, y, z}) > 1L << 24;
    if (!isFew) {
        sum[0] = plusRamp(sum[0], x, n);
        sum[1] = plusEqualTerms(sum[1], y, n);
        sum[2] = plusEqualTerms(sum[2], z, n);
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
