#pragma once

#include <kplib/volume/KpBitfield.h>

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>

namespace kplib::detail {

// The two fields of a flood fill: `src` with the ground, the voxels that have the value, and `dst`
// with the visited voxels.
//
// The fields have at least 64 bits. At any position `step` bits may be read; bits after the end of
// the field are unspecified.
class FloodGround {
public:
    using Word = std::uint64_t;
    static constexpr long step = 56;  // bits from any position that a load of eight bytes contains

    FloodGround(const KpBitfield& src, KpBitfield& dst, bool value) :
        src_(reinterpret_cast<const char*>(src.data())), dst_(reinterpret_cast<char*>(dst.data())),
        lastLoad_(static_cast<long>(src.nWords()) * 4 - 8), flip_(value ? 0 : ~Word{0})
    {
    }

    // Ones where the value is.
    Word ground(long pos) const { return load(src_, pos) ^ flip_; }
    Word visited(long pos) const { return load(dst_, pos); }
    Word open(long pos) const
    {
        const long start = std::min(pos >> 3, lastLoad_);
        return ((at(src_, start) ^ flip_) & ~at(dst_, start)) >> (pos - start * 8);
    }
    bool isGround(long pos) const { return (ground(pos) & 1) != 0; }
    bool isVisited(long pos) const { return (visited(pos) & 1) != 0; }

    // Whether any of n > 0 voxels is ground and not visited.
    bool isOpen(long pos, long n) const
    {
        for (; n > step; pos += step, n -= step) {
            if ((open(pos) & lowBits(step)) != 0)
                return true;
        }
        return (open(pos) & lowBits(n)) != 0;
    }

    // The first such position in [pos, end), or `end`.

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

    // The start of the run that contains `pos`, not before `row`.
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
    static constexpr Word lowBits(long n) { return (Word{1} << n) - 1; }

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

}  // namespace kplib::detail
