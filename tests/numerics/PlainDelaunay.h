#pragma once

#include <kplib/numerics/detail/KpDelaunaySteps.h>

#include <array>
#include <cmath>
#include <cstdint>
#include <limits>
#include <numeric>
#include <optional>
#include <utility>
#include <vector>

namespace kplib::test {

/// The insertion written down plainly, with a stack of slots and loops over all there is: what the library has to equal
/// in every index. Nothing if a rim has more than `limit` faces.
template <int Size, typename Simplex = std::array<std::int32_t, Size + 1>>
std::optional<std::vector<Simplex>> plainDelaunay(const detail::delaunay::PointSet<Size>& set, std::size_t limit)
{
    using Face = std::array<std::int32_t, Size>;
    struct Slot {
        Simplex corners;
        std::array<double, Size + 1> circle;
    };
    const auto at = [&](int i, int axis) { return static_cast<double>(set.points[i][axis]); };
    const auto det2 = [](double a, double b, double c, double d) { return a * d - b * c; };
    const auto det3 = [&](const auto& a, const auto& b, const auto& c) {
        return a[0] * (b[1] * c[2] - b[2] * c[1]) - a[1] * (b[0] * c[2] - b[2] * c[0]) +
               a[2] * (b[0] * c[1] - b[1] * c[0]);
    };

    std::vector<int> stack((set.n + 2) * 20);
    std::iota(stack.begin(), stack.end(), 0);
    std::vector<Slot> slots(stack.size(), Slot{{-1}, {}});
    for (int k = 0; k <= Size; ++k)
        slots[0].corners[k] = set.n + k;
    slots[0].circle = {};
    slots[0].circle[Size] = std::numeric_limits<float>::max();
    int alive = 1;  // and the top of the stack

    for (int i = 0; i < set.n; ++i) {
        std::vector<Face> rim;
        for (int walked = 0, slot = 0, walks = alive; walked < walks; ++walked, ++slot) {
            while (slots[slot].corners[0] < 0)
                ++slot;
            double rest = slots[slot].circle[Size];
            bool isHit = true;
            for (int axis = 0; axis < Size && isHit; ++axis) {
                rest -= (at(i, axis) - slots[slot].circle[axis]) * (at(i, axis) - slots[slot].circle[axis]);
                isHit = !(rest < 0);
            }
            if (!isHit)
                continue;
            stack[--alive] = slot;
            const Simplex c = slots[slot].corners;
            slots[slot].corners[0] = -1;
            for (int without = 0; without <= Size; ++without) {
                Face face;
                for (int k = 0, to = 0; k <= Size; ++k)
                    if (k != without)
                        face[to++] = c[k];
                std::size_t found = rim.size();
                for (std::size_t e = 0; rim.size() > 2 && e < rim.size() && found == rim.size(); ++e)
                    if (rim[e] == face)
                        found = e;
                if (found < rim.size()) {
                    rim[found] = rim.back();
                    rim.pop_back();
                } else if (rim.size() == limit) {
                    return {};
                } else {
                    rim.push_back(face);
                }
            }
        }
        for (const Face& face : rim) {
            Slot& made = slots.at(stack.at(alive++));
            std::array<std::array<double, 3>, 3> side{};
            std::array<double, 3> right{};
            for (int k = 0; k < Size; ++k) {
                made.corners[k] = face[k];
                for (int axis = 0; axis < Size; ++axis) {
                    side[k][axis] = at(face[k], axis) - at(i, axis);
                    right[k] += (at(face[k], axis) + at(i, axis)) * (at(face[k], axis) - at(i, axis)) / 2;
                }
            }
            made.corners[Size] = i;
            const auto& [u, v, w] = side;
            if constexpr (Size == 2) {
                const double all = det2(u[0], u[1], v[0], v[1]);
                made.circle[0] = det2(right[0], u[1], right[1], v[1]) / all;
                made.circle[1] = det2(u[0], right[0], v[0], right[1]) / all;
            } else {
                for (int axis = 0; axis < 3; ++axis) {
                    auto a = u, b = v, c = w;
                    a[axis] = right[0], b[axis] = right[1], c[axis] = right[2];
                    made.circle[axis] = det3(a, b, c) / det3(u, v, w);
                }
            }
            made.circle[Size] = 0;
            for (int axis = 0; axis < Size; ++axis)
                made.circle[Size] += (made.circle[axis] - at(i, axis)) * (made.circle[axis] - at(i, axis));
        }
    }

    std::vector<Simplex> result;
    for (const Slot& slot : slots) {
        Simplex c = slot.corners;
        if (c[0] < 0 || c[0] >= set.n)
            continue;
        std::array<std::array<float, Size>, Size> d;
        for (int k = 0; k < Size; ++k)
            for (int axis = 0; axis < Size; ++axis)
                d[k][axis] = set.points[c[k]][axis] - set.points[c[Size]][axis];
        float volume, flat;
        if constexpr (Size == 2) {
            volume = d[0][0] * d[1][1] - d[0][1] * d[1][0];
            flat = set.range * set.range * 1e-8F;
        } else {
            volume = d[0][0] * (d[1][1] * d[2][2] - d[1][2] * d[2][1]) -
                     d[0][1] * (d[1][0] * d[2][2] - d[1][2] * d[2][0]) +
                     d[0][2] * (d[1][0] * d[2][1] - d[1][1] * d[2][0]);
            flat = set.range * set.range * set.range * 1e-8F;
        }
        if (!(volume >= 0))
            std::swap(c[Size - 1], c[Size]);
        if (std::abs(volume) > flat)
            result.push_back(c);
    }
    return result;
}

}  // namespace kplib::test
