#pragma once

#include <kplib/geometry/numerics/detail/DelaunaySteps.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <numeric>
#include <optional>
#include <vector>

namespace kplib::test {

/// The insertion written down plainly, with a stack of slots and loops over all there is: what the library has to equal
/// in every index. Nothing if a rim has more than `limit` faces.
template <int Size, typename Simplex = detail::delaunay::Simplex<Size>>
std::optional<std::vector<Simplex>> plainDelaunay(const detail::delaunay::PointSet<Size>& set, std::size_t limit)
{
    using namespace detail::delaunay;
    const auto without = [](const Simplex& simplex, int left) {
        Face<Size> face;
        for (int k = 0, to = 0; k <= Size; ++k)
            if (k != left)
                face[to++] = simplex[k];
        return face;
    };

    std::vector<int> stack((set.n + 2) * 20);
    std::iota(stack.begin(), stack.end(), 0);
    std::vector<Simplex> slots(stack.size(), Simplex{-1});
    std::vector<Circle<Size>> circles(stack.size());
    std::iota(slots[0].begin(), slots[0].end(), set.n);
    circles[0].squaredRadius = std::numeric_limits<float>::max();
    int alive = 1;  // and the top of the stack

    for (int i = 0; i < set.n; ++i) {
        Position<Size> point;
        std::copy_n(set.points[i].begin(), Size, point.begin());
        std::vector<Face<Size>> rim;
        for (int slot = 0, left = alive; left > 0; ++slot) {
            if (slots[slot][0] < 0)
                continue;
            --left;
            if (!contains<Size>(circles[slot], point))
                continue;
            for (int k = 0; k <= Size; ++k) {
                const Face<Size> face = without(slots[slot], k);
                const auto found = rim.size() > 2 ? std::find(rim.begin(), rim.end(), face) : rim.end();
                if (found == rim.end()) {
                    if (rim.size() == limit)
                        return {};
                    rim.push_back(face);
                } else {
                    *found = rim.back();
                    rim.pop_back();
                }
            }
            slots[slot][0] = -1;
            stack[--alive] = slot;
        }
        for (const Face<Size>& face : rim) {
            if (alive == static_cast<int>(stack.size())) {  // flat sets take more slots than there are parts
                stack.push_back(alive);
                slots.push_back({-1});
                circles.emplace_back();
            }
            const int slot = stack[alive++];
            std::copy(face.begin(), face.end(), slots[slot].begin());
            slots[slot][Size] = i;
            circles[slot] = circleThrough<Size>(set.points.data(), face, i);
        }
    }

    std::vector<Simplex> result;
    for (Simplex& s : slots) {
        if (s[0] < 0 || s[0] >= set.n)
            continue;
        std::array<Point<Size>, Size> sides;
        for (int k = 0; k < Size; ++k)
            for (int axis = 0; axis < Size; ++axis)
                sides[k][axis] = set.points[s[k]][axis] - set.points[s[Size]][axis];
        const float volume = determinant(sides);
        const float flat = (Size == 2 ? set.range : set.range * set.range) * set.range * 1e-8F;
        if (volume < 0)
            std::swap(s[Size - 1], s[Size]);
        if (std::abs(volume) > flat)
            result.push_back(s);
    }
    return result;
}

}  // namespace kplib::test
