#pragma once

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/numerics/detail/PairwiseSum.h>

#include <cstring>

namespace kplib::detail {

// Four sums side by side, of which three are used: one instruction where the processor has vectors.
using Row4 = KpMat4f::Row;

inline Row4 toRow(const KpVec3f& v)
{
    return Row4{v.x(), v.y(), v.z(), 0};
}

inline KpVec3f toVector(Row4 row)
{
    return {row[0], row[1], row[2]};
}

// A list of points, three floats each, that are found by an index list or not, with weights by the point or without.
template <bool indexed, bool weighted>
struct PointList {
    static constexpr bool isIndexed = indexed, isWeighted = weighted;

    const float* points;
    const int* index;
    const float* weights;

    long place(long i) const
    {
        if constexpr (indexed)
            return index[i];
        else
            return i;
    }
    float weight(long i) const
    {
        if constexpr (weighted)
            return weights[place(i)];
        else
            return 1;
    }
    Row4 point(long i) const
    {
        const float* const p = points + 3 * place(i);
        return Row4{p[0], p[1], p[2], 0};
    }
    // point(i), and in the fourth place the first number of the next point, which has to exist;
    // one load.
    Row4 pointWithNext(long i) const
    {
        Row4 row;
        std::memcpy(&row, points + 3 * place(i), sizeof row);
        return row;
    }
};

// The sum over all `n` pairs, to which work(sums, i, list1's point, list2's point) adds one; the fourth numbers of the
// points are undefined.
template <typename Sums, typename List1, typename List2, typename Work>
Sums sumOfPairs(const List1& list1, const List2& list2, long n, Work work)
{
    return pairwiseSum<Sums>(n, [&](Sums& sums, long i, long end) {
        if constexpr (!List1::isIndexed && !List2::isIndexed) {
            for (const long last = std::min(end, n - 1); i < last; ++i)
                work(sums, i, list1.pointWithNext(i), list2.pointWithNext(i));
        }
        for (; i < end; ++i)
            work(sums, i, list1.point(i), list2.point(i));
    });
}

// The rows of the two matrices of a fit, made where they are needed: `a` from list 2, `b` from list 1, both less their
// centres and times the point's weight; `b` is weighted only with `weightsB`.
template <typename List1, typename List2, bool weightsB>
struct CentredRows {
    List1 list1;
    List2 list2;
    KpVec3f centre1, centre2;
    long n;

    // The sum over all rows, to which work(sums, a, b) adds one.
    template <typename Sums, typename Work>
    Sums sum(Work work) const
    {
        const Row4 c1 = toRow(centre1), c2 = toRow(centre2);
        return sumOfPairs<Sums>(list1, list2, n, [&](Sums& sums, long i, Row4 p1, Row4 p2) {
            Row4 a = p2 - c2, b = p1 - c1;
            if constexpr (List2::isWeighted)
                a *= list2.weight(i);
            if constexpr (weightsB)
                b *= list1.weight(i);
            work(sums, a, b);
        });
    }
};

// A 3 by 3 matrix of sums, the fourth column of which is undefined.
struct MatrixSums {
    Row4 rows[3];

    MatrixSums& operator+=(const MatrixSums& other)
    {
        for (int i = 0; i < 3; ++i)
            rows[i] += other.rows[i];
        return *this;
    }
};

// The sum of transpose(a) * right(a, b) over all rows.
template <typename Rows, typename Right>
KpMat3f sumOfProducts(const Rows& rows, Right right)
{
    const auto sums = rows.template sum<MatrixSums>([&](MatrixSums& s, Row4 a, Row4 b) {
        for (int j = 0; j < 3; ++j)
            s.rows[j] += a[j] * right(a, b);
    });
    return KpMat3f(toVector(sums.rows[0]), toVector(sums.rows[1]), toVector(sums.rows[2])).transpose();  // from columns
}

}  // namespace kplib::detail
