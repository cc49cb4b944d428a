#pragma once

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/detail/Mat4fKernels.h>

#include <cmath>
#include <cstring>
#include <utility>

namespace kplib::detail {

KPLIB_X86_ROWS(TransformLoop, transformX86);
KPLIB_X86_ROWS(AffineInverse, affineInverseX86);

// The reference. A row of the matrix is a vector, its fourth lane the divisor.
struct TransformEach {
    using Row = KpMat4f::Row;

    KPLIB_KERNEL_BODY static void run(const float* matrix, const float* from, float* to, long n)
    {
        Row rows[4];
        std::memcpy(rows, matrix, sizeof rows);
        for (long i = 0; i < n; ++i, from += 3, to += 3) {
            Row sums = from[0] * rows[0] + from[1] * rows[1] + from[2] * rows[2] + rows[3];
            sums *= 1 / sums[3];
            std::memcpy(to, &sums, 12);
        }
    }
};

// `Lanes` points at a time, each of their components in a vector of its own.
//
// The points fill three vectors, first, second and third. Component c of point p is in place (3 p + c) % Lanes of one
// of these, and no other point has that c in this place, as Lanes is not a multiple of 3: two blends collect a
// component, one permutation sorts it, and the same steps backwards write it.
template <int Lanes>
struct TransformTogether {
    typedef float Vector __attribute__((vector_size(4 * Lanes)));  // gcc 12 takes such an alias for a float
    using Places = std::make_integer_sequence<int, Lanes>;

    // Which of the three vectors has component c in `place`.
    static constexpr int holder(int c, int place) { return (c - place + 3 * Lanes) * (Lanes % 3) % 3; }
    static constexpr int placeOf(int c, int point) { return (3 * point + c) % Lanes; }
    static constexpr int pointAt(int c, int place) { return (holder(c, place) * Lanes + place - c) / 3; }

    template <int C, int... I>
    KPLIB_KERNEL_BODY static void collect(const Vector (&points)[3], Vector& component,
                                          std::integer_sequence<int, I...>)
    {
        component = __builtin_shufflevector(points[0], points[1], (holder(C, I) == 1 ? Lanes + I : I)...);
        component = __builtin_shufflevector(component, points[2], (holder(C, I) == 2 ? Lanes + I : I)...);
        component = __builtin_shufflevector(component, component, placeOf(C, I)...);
    }

    template <int C, int... I>
    KPLIB_KERNEL_BODY static void spread(Vector& component, std::integer_sequence<int, I...>)
    {
        component = __builtin_shufflevector(component, component, pointAt(C, I)...);
    }

    template <int K, int... I>
    KPLIB_KERNEL_BODY static void merge(const Vector (&components)[3], float* to, std::integer_sequence<int, I...>)
    {
        Vector points = __builtin_shufflevector(components[0], components[1], (holder(1, I) == K ? Lanes + I : I)...);
        points = __builtin_shufflevector(points, components[2], (holder(2, I) == K ? Lanes + I : I)...);
        std::memcpy(to + K * Lanes, &points, sizeof points);
    }

    KPLIB_KERNEL_BODY static void run(const float* m, const float* from, float* to, long n)
    {
        long i = 0;
        for (; i + Lanes <= n; i += Lanes, from += 3 * Lanes, to += 3 * Lanes) {
            Vector points[3], v[3];
            for (int k = 0; k < 3; ++k)  // one at a time: a single copy would pass through memory
                std::memcpy(&points[k], from + k * Lanes, sizeof points[k]);
            collect<0>(points, v[0], Places());
            collect<1>(points, v[1], Places());
            collect<2>(points, v[2], Places());
            const Vector scale = 1 / (v[0] * m[3] + v[1] * m[7] + v[2] * m[11] + m[15]);
            Vector sums[3];
            for (int j = 0; j < 3; ++j)
                sums[j] = (v[0] * m[j] + v[1] * m[4 + j] + v[2] * m[8 + j] + m[12 + j]) * scale;
            spread<0>(sums[0], Places());
            spread<1>(sums[1], Places());
            spread<2>(sums[2], Places());
            merge<0>(sums, to, Places());
            merge<1>(sums, to, Places());
            merge<2>(sums, to, Places());
        }
        TransformEach::run(m, from, to, n - i);
    }
};

// Whether the determinant is negligible against the sums of its positive and its negative terms.
KPLIB_KERNEL_BODY bool isSingular(double positive, double negative)
{
    const double det = positive + negative, magnitude = positive - negative;
    // The first test avoids the division for nearly all matrices.
    return !(std::abs(det) > 1e-14 * magnitude) && std::abs(det / magnitude) < 1e-15;
}

}  // namespace kplib::detail
