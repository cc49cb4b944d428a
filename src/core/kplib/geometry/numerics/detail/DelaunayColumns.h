#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/numerics/detail/DelaunayCircle.h>
#include <kplib/geometry/numerics/detail/DelaunayKernels.h>

namespace kplib::detail::delaunay {

// Numbered circles in the layout of the scan: an array for each coordinate of the centres, and one
// for the squared radii.
template <int Size>
class CircleColumns {
public:
    // New elements are uninitialised.
    void resize(long count)
    {
        for (KpDArray<double>& column : columns_)
            column.resize(count);
    }

    long size() const { return columns_[0].size(); }

    void set(long i, const Circle<Size>& circle)
    {
        for (std::size_t axis = 0; axis < Size; ++axis)
            columns_[axis][i] = circle.center[axis];
        columns_[Size][i] = circle.squaredRadius;
    }

    Circle<Size> operator[](long i) const
    {
        Circle<Size> circle;
        for (std::size_t axis = 0; axis < Size; ++axis)
            circle.center[axis] = columns_[axis][i];
        circle.squaredRadius = columns_[Size][i];
        return circle;
    }

    // Writes the indices of those of the first `count` that contain `point`, and returns their
    // number.
    long scan(CircleScan* run, long count, const Position<Size>& point, std::int32_t* hits) const
    {
        const double* columns[std::size_t{Size} + 1];
        for (int k = 0; k <= Size; ++k)
            columns[k] = columns_[k].data();
        return run(columns, count, point.data(), hits);
    }

private:
    KpDArray<double> columns_[std::size_t{Size} + 1];
};

}  // namespace kplib::detail::delaunay
