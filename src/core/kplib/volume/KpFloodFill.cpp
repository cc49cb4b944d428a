#include <kplib/log/KpLogFile.h>
#include <kplib/volume/KpMorphology.h>

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>

namespace {

using Word = std::uint64_t;
constexpr long step = 56;  // bits that eight bytes from any byte on hold for certain

constexpr Word lowBits(long n)
{
    return (Word{1} << n) - 1;
}

/// Part of a row from where to look for what is to be filled. The size matters: there may be many.
struct SF3D_Segment {
    std::int16_t z, y, xLeft, xRight;
};
static_assert(sizeof(SF3D_Segment) == 8);

struct Range {
    int min, max;

    void extend(int low, int high)
    {
        // Seldom, so this is cheaper than to write what is there.
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

/// Fields of at least 64 bits, at any position of which `step` bits may be looked at; those behind the end vary.
class Ground {
public:
    Ground(const KpBitfield& src, KpBitfield& dst, bool value) :
        src_(reinterpret_cast<const char*>(src.data())), dst_(reinterpret_cast<char*>(dst.data())),
        lastLoad_(static_cast<long>(src.nWords()) * 4 - 8), flip_(value ? 0 : ~Word{0})
    {
    }

    /// Ones where the value is.
    Word ground(long pos) const { return load(src_, pos) ^ flip_; }
    Word visited(long pos) const { return load(dst_, pos); }
    Word open(long pos) const
    {
        const long start = std::min(pos >> 3, lastLoad_);
        return ((at(src_, start) ^ flip_) & ~at(dst_, start)) >> (pos - start * 8);
    }
    bool isGround(long pos) const { return (ground(pos) & 1) != 0; }
    bool isVisited(long pos) const { return (visited(pos) & 1) != 0; }

    /// Whether some of n > 0 voxels is still to be filled.
    bool isOpen(long pos, long n) const
    {
        for (; n > step; pos += step, n -= step) {
            if ((open(pos) & lowBits(step)) != 0)
                return true;
        }
        return (open(pos) & lowBits(n)) != 0;
    }

    // The first position in [pos, end) of its kind, or `end`.

    long firstGround(long pos, long end) const
    {
        return first(pos, end, [this](long at) { return ground(at); });
    }
    long firstOff(long pos, long end) const
    {
        return first(pos, end, [this](long at) { return ~ground(at); });
    }
    long firstUnvisited(long pos, long end) const
    {
        return first(pos, end, [this](long at) { return ~visited(at); });
    }

    /// Where the run begins that `pos` is in, at `row` at the earliest.
    long runStart(long pos, long row) const
    {
        while (pos > row) {
            const long n = std::min(step, pos - row), ones = std::countl_one(ground(pos - n) << (64 - n));
            pos -= std::min(ones, n);
            if (ones < n)
                break;
        }
        return pos;
    }

    void visit(long pos, long end) const
    {
        for (; pos < end; pos += step) {
            const long start = std::min(pos >> 3, lastLoad_);
            const Word word = at(dst_, start) | lowBits(std::min(step, end - pos)) << (pos - start * 8);
            std::memcpy(dst_ + start, &word, sizeof word);
        }
    }

private:
    static Word at(const char* field, long start)
    {
        Word word;
        std::memcpy(&word, field + start, sizeof word);
        return word;
    }
    Word load(const char* field, long pos) const
    {
        const long start = std::min(pos >> 3, lastLoad_);
        return at(field, start) >> (pos - start * 8);
    }

    template <typename Bits>
    static long first(long pos, long end, Bits bits)
    {
        for (; pos < end; pos += step) {
            if (const Word found = bits(pos) & lowBits(step))
                return std::min(end, pos + std::countr_zero(found));
        }
        return end;
    }

    const char* src_;
    char* dst_;
    long lastLoad_;
    Word flip_;
};

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

    // The ground goes by value and into inlined functions: as a field it would be loaded anew after each write of bits,
    // as an argument copied by way of memory.

    /// A segment in which nothing is open has no effect, not later either. `pos` is the voxel at its left.
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

    /// Fills the runs that begin in the segment, the first one to both sides. Where runs are partly visited already,
    /// what is filled depends on these very steps: only the first looks to its left, and visited ground at the end of
    /// the segment ends it.
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

/// The fields at a size that the fill can work on.
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
    if (src.nBits() != static_cast<unsigned long>(1L * dims[0] * dims[1] * dims[2]))
        return 0;
    if (*std::max_element(dims, dims + 3) > INT16_MAX) {
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
