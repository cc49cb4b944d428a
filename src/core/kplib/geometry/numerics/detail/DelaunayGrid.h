#pragma once

#include <kplib/geometry/numerics/detail/DelaunayColumns.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <limits>
#include <utility>

namespace kplib::detail::delaunay {

// Finds the circles around a point among many, by a pyramid of grids whose cells are powers of two wide.
//
// A circle is stored in the cell of the low corner of its bounding box, in the finest level where
// a box of its width overlaps at most `reach` cells along an axis. So the circles around a point p
// are stored in the cell of p or in the `reach` - 1 cells before it along each axis:
//
//     +-------+-------+
//     |     ..|..     |      reach 2: p is in cell (1, 1), and the circles around p are
//     |   .   | p .   |      stored in the cells (0, 0), (1, 0), (0, 1) and (1, 1)
//     +---.---+---.---+
//     |   .   |   .   |
//     |   * ..|..     |      *: the low corner of the box of this circle, in cell (0, 0)
//     +-------+-------+
//
// The boxes are wide enough for all roundings of contains(). Several cells share a hash bucket:
// all circles there are tested, some of them more than once. Circles wider than a quarter of the
// range, and those without a cell (infinite, NaN, or too small for their distance from the
// origin), are in a table that is scanned for every point.
template <int Size>
class CircleGrid {
public:
    // For about `circles` circles of points in a range of width `range`.
    CircleGrid(long circles, float range, CircleScan* scan) : widest_(static_cast<double>(range) / 4), scan_(scan)
    {
        const int bits = std::max(8, static_cast<int>(std::bit_width(static_cast<unsigned long>(circles))));
        shift_ = 64 - bits;
        heads_.resize(1L << bits);
        std::fill(heads_.begin(), heads_.end(), none);
    }

    void insert(std::int32_t slot, const Circle<Size>& circle)
    {
        if (slot >= nodes_.size())
            nodes_.resize(slot + 1L);
        Node& node = nodes_[slot];
        node = {circle, none, none, placeOf(circle)};
        if (node.place.level == none)
            insertWide(slot);
        else
            insertIntoCell(slot);
    }

    void remove(std::int32_t slot)
    {
        const Node& node = nodes_[slot];
        if (node.place.level == none) {
            removeWide(node.next);
            return;
        }
        --counts_[node.place.level];
        if (node.before == none)
            heads_[node.place.bucket] = node.next;
        else
            nodes_[node.before].next = node.next;
        if (node.next != none)
            nodes_[node.next].before = node.before;
    }

    // Writes the slots of the circles that contain `point` to `hits`, in no order and some perhaps
    // more than once, and returns their number. Returns -1 if it would have to test more than
    // `most` circles, or if the point is not finite.
    long find(const Position<Size>& point, long most, std::int32_t* hits) const
    {
        for (const double x : point)
            if (!(std::abs(x) <= static_cast<double>(std::numeric_limits<float>::max())))
                return -1;
        Search search{point, most, hits, wide_.scan(scan_, wideSlots_.size(), point, hits)};
        for (long i = 0; i < search.found; ++i)
            hits[i] = wideSlots_[hits[i]];
        for (int level = lowest_; level <= highest_ && search.left >= 0; ++level)
            if (counts_[level] != 0)
                visitLevel(level, search);
        return search.left < 0 ? -1 : search.found;
    }

private:
    static constexpr std::int32_t none = -1;
    static constexpr int reach = Size == 2 ? 2 : 3;      // in space smaller cells save more tests than they cost
    static constexpr int cells = Size == 2 ? 4 : 27;     // whose boxes may contain a point
    static constexpr int smallest = -140, levels = 268;  // from below all roundings to above all floats
    static constexpr double lastCell = 0x1p51;           // up to here numbers of neighbouring cells differ
    static constexpr std::uint64_t levelFactor = 0xD6E8FEB86659FD93;
    static constexpr std::uint64_t factors[] = {0x9E3779B97F4A7C15, 0xC2B2AE3D27D4EB4F, 0x165667B19E3779F9};

    struct Place {
        std::int32_t level;
        std::int32_t bucket;
    };
    struct Node {
        Circle<Size> circle;
        std::int32_t next, before;  // in the bucket; for a wide circle `next` is its index in the table
        Place place;
    };
    struct Search {
        const Position<Size>& point;
        long left;
        std::int32_t* hits;
        long found;
    };

    void insertIntoCell(std::int32_t slot)
    {
        Node& node = nodes_[slot];
        ++counts_[node.place.level];
        lowest_ = std::min(lowest_, node.place.level);
        highest_ = std::max(highest_, node.place.level);
        node.next = std::exchange(heads_[node.place.bucket], slot);
        if (node.next != none)
            nodes_[node.next].before = slot;
    }

    void insertWide(std::int32_t slot)
    {
        const long at = wideSlots_.size();
        wideSlots_.append(slot);
        if (at >= wide_.size())
            wide_.resize(at + at / 2 + 64);
        wide_.set(at, nodes_[slot].circle);
        nodes_[slot].next = static_cast<std::int32_t>(at);
    }

    void removeWide(std::int32_t at)
    {
        const std::int32_t last = wideSlots_[wideSlots_.size() - 1];
        wideSlots_[at] = last;
        wide_.set(at, nodes_[last].circle);
        nodes_[last].next = at;
        wideSlots_.resize(wideSlots_.size() - 1);
    }

    // 1 over the width of a level's cells.
    static double scale(int level)
    {
        return std::bit_cast<double>(static_cast<std::uint64_t>(1023 - smallest - level) << 52);
    }

    static int levelFor(double width)
    {
        const int exponent = static_cast<int>(std::bit_cast<std::uint64_t>(width) >> 52) - 1023;
        return std::max(exponent + 3 - reach - smallest, 0);
    }

    // Adds the share of the cell that holds `x`, along `axis`, to the hash; false for cells beyond number `last`.
    static bool addCell(double x, int level, std::size_t axis, double last, std::uint64_t& hash)
    {
        const double cell = x * scale(level);
        if (!(std::abs(cell) < last))
            return false;
        // Rounded toward zero: the cell around zero is twice as wide, which leaves neighbours neighbours.
        hash += static_cast<std::uint64_t>(static_cast<std::int64_t>(cell)) * factors[axis];
        return true;
    }

    std::int32_t bucketOf(std::uint64_t hash) const { return static_cast<std::int32_t>(hash >> shift_); }

    Place placeOf(const Circle<Size>& circle) const
    {
        const double radius = std::sqrt(circle.squaredRadius);
        Position<Size> low;
        double width = 0;
        for (std::size_t axis = 0; axis < Size; ++axis) {
            const double center = circle.center[axis];
            const double half = radius + (std::abs(center) + radius) * 1e-14 + 1e-150;
            low[axis] = center - half;
            width = std::max(width, 2.0001 * half);
        }
        const int level = levelFor(width);
        std::uint64_t hash = static_cast<std::uint64_t>(level) * levelFactor;
        for (std::size_t axis = 0; axis < Size; ++axis)
            if (width > widest_ || level >= levels || !addCell(low[axis], level, axis, lastCell, hash))
                return {none, none};
        return {level, bucketOf(hash)};
    }

    void visitLevel(int level, Search& search) const
    {
        std::uint64_t hash = static_cast<std::uint64_t>(level) * levelFactor;
        for (std::size_t axis = 0; axis < Size; ++axis)
            if (!addCell(search.point[axis], level, axis, lastCell + reach, hash))
                return;
        for (int cell = 0; cell < cells; ++cell) {
            std::uint64_t before = hash;
            for (int axis = 0, rest = cell; axis < Size; ++axis, rest /= reach)
                before -= static_cast<std::uint64_t>(rest % reach) * factors[axis];
            visit(bucketOf(before), search);
        }
    }

    void visit(std::int32_t bucket, Search& search) const
    {
        for (std::int32_t slot = heads_[bucket]; slot != none; slot = nodes_[slot].next) {
            if (--search.left < 0)
                return;
            if (contains<Size>(nodes_[slot].circle, search.point))
                search.hits[search.found++] = slot;
        }
    }

    double widest_;
    CircleScan* scan_;
    int shift_;
    KpDArray<std::int32_t> heads_;  // a bucket each
    KpDArray<Node> nodes_;          // a slot each
    std::int32_t counts_[levels] = {};
    std::int32_t lowest_ = levels, highest_ = none;
    CircleColumns<Size> wide_;
    KpDArray<std::int32_t> wideSlots_;
};

}  // namespace kplib::detail::delaunay
