#include <kplib/log/KpLogFile.h>
#include <kplib/volume/KpMorphology.h>
#include <kplib/volume/detail/FloodGround.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

using Ground = kplib::detail::FloodGround;

// Plan
//
// The fill proceeds by runs: maximal parts of a row that have the value (ground). `dst` holds the
// visited voxels, also those that the caller set there, which are not filled again. A stack holds
// the segments of rows to search. walk() takes the last one, fills the runs that begin in it, and
// pushes the extent of each run as a segment of the four rows around:
//
//     row        . # # # # . # # # .
//     segment        ^ ^ ^ ^ ^
//     filled     . o o o o . o o o .     the first run to both sides, the others to the right
//     pushed       ^ ^ ^ ^   ^ ^ ^       for y - 1, y + 1, z - 1 and z + 1
//
// Only segments with an open voxel, one of the ground that is not visited, are pushed. Runs are
// found in words of bits (FloodGround). A segment takes 8 bytes, so coordinates are at most 32767.

namespace {

// Part of a row to search. The size matters, as there may be many.
struct SF3D_Segment {
    std::int16_t z, y, xLeft, xRight;
};
static_assert(sizeof(SF3D_Segment) == 8);

struct Range {
    int min, max;

    void extend(int low, int high)
    {
        // Branches, as an extension is rare: cheaper than a store each time.
        if (low < min)
            min = low;
        if (high > max)
            max = high;
    }
};

struct Box {
    Range x, y, z;
};
static_assert(sizeof(Box) == 6 * sizeof(int), "as callers get it");

class FloodFill {
public:
    FloodFill(const Ground& ground, const int* dims) : ground_(ground), nx_(dims[0]), ny_(dims[1]), nz_(dims[2]) {}

    unsigned long fill(const KpVec3i& seed)
    {
        const int x = seed[0], y = seed[1], z = seed[2];
        box_ = {{x, x}, {y, y}, {z, z}};
        count_ = 0;
        const bool isInside = x >= 0 && y >= 0 && z >= 0 && x < nx_ && y < ny_ && z < nz_;
        const long pos = isInside ? row(y, z) + x : 0;
        if (!isInside || !ground_.isGround(pos))
            return 0;
        pushAround(ground_, z, y, x, x, pos);
        push(ground_, z, y, x, x, pos);
        while (depth_ > 0)
            walk(ground_, stack_.data()[--depth_]);
        return count_;
    }
    const Box& box() const { return box_; }

private:
    long row(long y, long z) const { return (z * ny_ + y) * nx_; }

    // The ground is passed by value and to inlined functions: a field would be loaded again after
    // each write of bits, and an argument of a function that is not inlined would be copied
    // through memory.

    // Pushes a segment unless it has no open voxel: it then has no effect later either. `pos` is
    // its first voxel.
    [[gnu::always_inline]] void push(Ground ground, int z, int y, int xLeft, int xRight, long pos)
    {
        if (!ground.isOpen(pos, xRight - xLeft + 1))
            return;
        if (depth_ == stack_.size())
            stack_.resize(std::max(1024L, 2 * depth_));
        stack_.data()[depth_++] = {static_cast<std::int16_t>(z), static_cast<std::int16_t>(y),
                                   static_cast<std::int16_t>(xLeft), static_cast<std::int16_t>(xRight)};
    }

    [[gnu::always_inline]] void pushAround(Ground ground, int z, int y, int xLeft, int xRight, long pos)
    {
        if (z > 0)
            push(ground, z - 1, y, xLeft, xRight, pos - nx_ * ny_);
        if (z < nz_ - 1)
            push(ground, z + 1, y, xLeft, xRight, pos + nx_ * ny_);
        if (y > 0)
            push(ground, z, y - 1, xLeft, xRight, pos - nx_);
        if (y < ny_ - 1)
            push(ground, z, y + 1, xLeft, xRight, pos + nx_);
    }

    // Fills the runs that begin in the segment, the first one to both sides. Intentional: if runs
    // are partly visited already, the result depends on these steps. Only the first run is
    // extended to the left, and visited ground at the end of the segment ends the search.
    void walk(Ground ground, const SF3D_Segment segment)
    {
        const long start = row(segment.y, segment.z), last = start + segment.xRight;
        long pos = start + segment.xLeft;
        if (!ground.isOpen(pos, last + 1 - pos))
            return;
        for (bool isFirst = true; pos <= last; isFirst = false) {
            if (ground.isGround(pos) && ground.isVisited(pos))
                pos = ground.firstUnvisited(pos, last);
            if (!ground.isGround(pos)) {
                ++pos;
            } else if (ground.isVisited(pos)) {
                return;
            } else {
                const long from = isFirst ? ground.runStart(pos, start) : pos;
                const long end = ground.firstOff(pos, start + nx_);
                ground.visit(from, end);
                found(ground, segment, start, from, end);
                pos = end + 1;
            }
            if (pos > last)
                return;
            pos = ground.firstGround(pos, last + 1);
        }
    }

    [[gnu::always_inline]] void found(Ground ground, const SF3D_Segment& segment, long start, long from, long end)
    {
        const int z = segment.z, y = segment.y;
        const int xLeft = static_cast<int>(from - start), xRight = static_cast<int>(end - 1 - start);
        count_ += static_cast<unsigned long>(end - from);
        box_.x.extend(xLeft, xRight);
        box_.y.extend(y, y);
        box_.z.extend(z, z);
        pushAround(ground, z, y, xLeft, xRight, from);
    }

    Ground ground_;
    long nx_, ny_, nz_;
    KpDArray<SF3D_Segment> stack_;
    long depth_ = 0;           // of the stack
    unsigned long count_ = 0;  // of one seed
    Box box_{};
};

unsigned long fillAll(const KpBitfield& src, KpBitfield& dst, const KpDArray<KpVec3i>& seeds, bool value,
                      const int* dims, Box& box)
{
    FloodFill floodFill(Ground(src, dst, value), dims);
    unsigned long count = 0;
    for (const KpVec3i& seed : seeds) {
        count += floodFill.fill(seed);
        const Box& one = floodFill.box();
        if (&seed == seeds.begin())
            box = one;
        box.x.extend(one.x.min, one.x.max);
        box.y.extend(one.y.min, one.y.max);
        box.z.extend(one.z.min, one.z.max);
    }
    return count;
}

// Fills fields of one word in copies of 64 bits, the smallest size of FloodGround.
unsigned long fillFew(const KpBitfield& src, KpBitfield& dst, const KpDArray<KpVec3i>& seeds, bool value,
                      const int* dims, Box& box)
{
    KpBitfield wideSrc(src), wideDst(dst);
    wideSrc.resize(64, KpBitfield::INIT_UNSET);
    wideDst.resize(64, KpBitfield::INIT_UNSET);
    const unsigned long count = fillAll(wideSrc, wideDst, seeds, value, dims, box);
    wideDst.resize(dst.nBits(), KpBitfield::INIT_UNSET);
    dst.swap(wideDst);
    return count;
}

}  // namespace

unsigned long KpMorphology::floodfill(const KpBitfield& src, KpBitfield& dst, const KpDArray<KpVec3i>& seeds,
                                      bool value, const int* dims, int* box)
{
    const auto size = [dims](int axis) { return static_cast<unsigned long>(dims[axis]); };  // unsigned: may overflow
    if (src.nBits() != size(0) * size(1) * size(2))
        return 0;
    constexpr int largest = INT16_MAX + 1;  // coordinates are counted from 0
    if (*std::max_element(dims, dims + 3) > largest) {
        getTheLogInstance().errorf("KpMorphology::floodfill(), volume of %d x %d x %d is too large\n", dims[0], dims[1],
                                   dims[2]);
        return 0;
    }
    if (dst.nBits() != src.nBits())
        dst.resize(src.nBits(), KpBitfield::INIT_UNSET);
    if (seeds.size() == 0)
        return 0;
    Box all{};
    const unsigned long count = (src.nWords() == 1 ? fillFew : fillAll)(src, dst, seeds, value, dims, all);
    if (box)
        std::memcpy(box, &all, sizeof all);
    return count;
}
