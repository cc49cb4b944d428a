#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/numerics/detail/KpDelaunayCircle.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>

namespace kplib::detail::delaunay {

/// Finds the circles around a point among many, by a pyramid of grids whose cells are powers of two wide.
///
/// A circle stands in the finest level whose cells are wider than its box, in the cell of the box's low corner: so it
/// can contain points of that cell and of the next one along each axis only. The boxes are wide enough for all
/// roundings of contains(). Cells share hash buckets; strangers met there fail the test like other neighbours.
/// What has no such place (infinite, not a number, tiny but far out) is looked at for every point.
template <int Size>
class CircleGrid {
public:
    explicit CircleGrid(long circles)
    {
        const int bits = std::max(8, static_cast<int>(std::bit_width(static_cast<unsigned long>(circles))));
        shift_ = 64 - bits;
        heads_.resize((1L << bits) + 1);
        std::fill(heads_.begin(), heads_.end(), none);
    }

    void insert(std::int32_t slot, const Circle<Size>& circle)
    {
        if (slot >= nodes_.size())
            nodes_.resize(slot + 1L);
        const Place place = placeOf(circle);
        if (place.level != none) {
            ++counts_[place.level];
            lowest_ = std::min(lowest_, place.level);
            highest_ = std::max(highest_, place.level);
        }
        std::int32_t& head = heads_[place.bucket];
        nodes_[slot] = {circle, head, ~static_cast<std::int32_t>(place.bucket), place.level};
        if (head != none)
            nodes_[head].before = slot;
        head = slot;
    }

    void remove(std::int32_t slot)
    {
        const Node& node = nodes_[slot];
        if (node.level != none)
            --counts_[node.level];
        (node.before < 0 ? heads_[~node.before] : nodes_[node.before].next) = node.next;
        if (node.next != none)
            nodes_[node.next].before = node.before;
    }

    /// Writes the slots of the circles that contain `point` to `hits`, in no order and some perhaps more than once, and
    /// gives how many it wrote; -1 if it would have to look at more than `most`, or if the point isn't finite.
    long find(const Position<Size>& point, long most, std::int32_t* hits) const
    {
        for (const double x : point)
            if (!(std::abs(x) <= std::numeric_limits<float>::max()))
                return -1;
        Search search{point, most, hits};
        visit(heads_.size() - 1, search);
        for (int level = lowest_; level <= highest_ && search.left >= 0; ++level)
            if (counts_[level] != 0)
                visitLevel(level, search);
        return search.left < 0 ? -1 : search.found;
    }

private:
    static constexpr std::int32_t none = -1;
    static constexpr int smallest = -140,
                         levels = 268;          // from cells that are lost in the rounding to beyond all floats
    static constexpr double lastCell = 0x1p51;  // up to here neighbours can be told apart
    static constexpr std::uint64_t factors[] = {0x9E3779B97F4A7C15, 0xC2B2AE3D27D4EB4F, 0x165667B19E3779F9};
    static constexpr std::uint64_t levelFactor = 0xD6E8FEB86659FD93;

    struct Node {
        Circle<Size> circle;
        std::int32_t next, before;  // the first of a bucket has the complement of the bucket before it
        std::int32_t level;
    };
    struct Place {
        int level;
        long bucket;
    };
    struct Search {
        const Position<Size>& point;
        long left;
        std::int32_t* hits;
        long found = 0;
    };

    /// 1 over the width of a level's cells.
    static double scale(int level)
    {
        return std::bit_cast<double>(static_cast<std::uint64_t>(1023 - smallest - level) << 52);
    }

    /// The coarsest level that a box may need so that its cells are wider than `width`, which is at least 1e-150.
    static int levelFor(double width)
    {
        const int exponent = static_cast<int>(std::bit_cast<std::uint64_t>(width) >> 52) - 1023;
        return std::max(exponent + 1 - smallest, 0);
    }

    /// Adds the share of the cell that holds `x`, along `axis`, to the hash; false for cells beyond number `last`.
    static bool addCell(double x, int level, int axis, double last, std::uint64_t& hash)
    {
        const double cell = x * scale(level);
        if (!(std::abs(cell) < last))
            return false;
        const auto whole = static_cast<std::int64_t>(cell);
        hash += static_cast<std::uint64_t>(cell < static_cast<double>(whole) ? whole - 1 : whole) * factors[axis];
        return true;
    }

    Place placeOf(const Circle<Size>& circle) const
    {
        const Place nowhere{none, heads_.size() - 1};
        const double radius = std::sqrt(circle.squaredRadius);
        Position<Size> low;
        double width = 0;
        for (int axis = 0; axis < Size; ++axis) {
            const double center = circle.center[axis];
            const double reach = radius + (std::abs(center) + radius) * 1e-14 + 1e-150;
            low[axis] = center - reach;
            width = std::max(width, 2.0001 * reach);
        }
        const int level = levelFor(width);
        std::uint64_t hash = static_cast<std::uint64_t>(level) * levelFactor;
        for (int axis = 0; axis < Size; ++axis)
            if (level >= levels || !addCell(low[axis], level, axis, lastCell, hash))
                return nowhere;
        return {level, static_cast<long>(hash >> shift_)};
    }

    void visitLevel(int level, Search& search) const
    {
        std::uint64_t hash = static_cast<std::uint64_t>(level) * levelFactor;
        for (int axis = 0; axis < Size; ++axis)
            if (!addCell(search.point[axis], level, axis, lastCell + 2, hash))
                return;
        for (unsigned corner = 0; corner < 1U << Size; ++corner) {
            std::uint64_t moved = hash;
            for (int axis = 0; axis < Size; ++axis)
                moved -= (corner >> axis & 1) * factors[axis];
            visit(static_cast<long>(moved >> shift_), search);
        }
    }

    void visit(long bucket, Search& search) const
    {
        for (std::int32_t slot = heads_[bucket]; slot != none; slot = nodes_[slot].next) {
            if (--search.left < 0)
                return;
            if (contains<Size>(nodes_[slot].circle, search.point))
                search.hits[search.found++] = slot;
        }
    }

    int shift_;
    KpDArray<std::int32_t> heads_;  // a bucket each, and the last for what has no place
    KpDArray<Node> nodes_;          // a slot each
    std::int32_t counts_[levels] = {};
    int lowest_ = levels, highest_ = -1;
};

}  // namespace kplib::detail::delaunay
