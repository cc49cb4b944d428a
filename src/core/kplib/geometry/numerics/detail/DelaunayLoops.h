#pragma once

#include <kplib/geometry/numerics/detail/DelaunayCircle.h>
#include <kplib/geometry/numerics/detail/DelaunayKernels.h>

namespace kplib::detail::delaunay {

template <int Size>
KPLIB_X86_ROWS(CircleScan, circleScanX86);

// Continues a scan at circle `i`, with `count` hits found before it.
template <int Size>
long scanFrom(long i, long count, const double* const* columns, long n, const double* point, std::int32_t* hits)
{
    Position<Size> at;
    for (std::size_t axis = 0; axis < Size; ++axis)
        at[axis] = point[axis];
    for (; i < n; ++i) {
        Circle<Size> circle;
        for (std::size_t axis = 0; axis < Size; ++axis)
            circle.center[axis] = columns[axis][i];
        circle.squaredRadius = columns[Size][i];
        if (contains<Size>(circle, at))
            hits[count++] = static_cast<std::int32_t>(i);
    }
    return count;
}

}  // namespace kplib::detail::delaunay
