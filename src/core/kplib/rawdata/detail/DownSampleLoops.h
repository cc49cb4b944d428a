#pragma once

#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/rawdata/detail/DownSampleKernels.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <type_traits>

namespace kplib::detail {

KPLIB_X86_ROWS(BlockLoops, blockX86);

namespace blocks {

// Sums of integers may wrap, as unsigned numbers do. The smaller State serves blocks of few voxels.
template <typename T, typename Sum>
struct Mean {
    using Element = T;
    using State = Sum;

    template <typename Item>  // a voxel, or the sum of some
    KPLIB_KERNEL_BODY static State seed(Item)
    {
        return 0;
    }
    KPLIB_KERNEL_BODY static State next(State sum, T value) { return next(sum, static_cast<State>(value)); }
    KPLIB_KERNEL_BODY static State next(State sum, State other) { return static_cast<State>(sum + other); }

    KPLIB_KERNEL_BODY static T result(State sum, long count) { return static_cast<T>(signedSum(sum) / count); }

    // A product with the reciprocal, made a little too large, and cut is the exact quotient of all sums below 2^22 in
    // single and 2^50 in double precision: it is never below an integer quotient, and never
    // reaches the next one.
    KPLIB_KERNEL_BODY static void finish(Loose<T>* dst, const State* sums, long n, long count)
    {
        if (count < (1L << 22) / largest)
            multiply<float>(dst, sums, n, count);
        else if (count < (1L << 50) / largest)
            multiply<double>(dst, sums, n, count);
        else
            for (long i = 0; i < n; ++i)
                dst[i].value = result(sums[i], count);
    }

private:
    static constexpr long largest = std::max<long>(-long(std::numeric_limits<T>::min()), std::numeric_limits<T>::max());
    using Signed = std::conditional_t<sizeof(Sum) == 8, std::int64_t, std::int32_t>;

    KPLIB_KERNEL_BODY static Signed signedSum(State sum) { return static_cast<Signed>(sum); }

    template <typename Real>
    KPLIB_KERNEL_BODY static void multiply(Loose<T>* __restrict dst, const State* __restrict sums, long n, long count)
    {
        const Real reciprocal = std::nextafter(Real(1) / static_cast<Real>(count), Real(2));
        for (long i = 0; i < n; ++i)
            dst[i].value =
                static_cast<T>(static_cast<std::int32_t>(static_cast<Real>(signedSum(sums[i])) * reciprocal));
    }
};

// Sums of real numbers are kept in their own precision and depend on their order.
template <typename T>
requires std::is_floating_point_v<T>
struct Mean<T, T> {
    using Element = T;
    using State = T;

    KPLIB_KERNEL_BODY static T seed(T) { return 0; }
    KPLIB_KERNEL_BODY static T next(T sum, T value) { return sum + value; }
    KPLIB_KERNEL_BODY static T result(T sum, long count) { return sum / static_cast<T>(count); }
    KPLIB_KERNEL_BODY static void finish(Loose<T>* __restrict dst, const T* __restrict sums, long n, long count)
    {
        for (long i = 0; i < n; ++i)
            dst[i].value = result(sums[i], count);
    }
};

// NaN is never greater, and nothing is greater than NaN: it stays only where it comes first.
template <typename T>
struct Maximum {
    using Element = T;
    using State = T;

    KPLIB_KERNEL_BODY static T seed(T first) { return first; }
    KPLIB_KERNEL_BODY static T next(T greatest, T value) { return value > greatest ? value : greatest; }
    KPLIB_KERNEL_BODY static T result(T greatest, long) { return greatest; }
    KPLIB_KERNEL_BODY static void finish(Loose<T>* __restrict dst, const T* __restrict greatest, long n, long)
    {
        for (long i = 0; i < n; ++i)
            dst[i].value = greatest[i];
    }
};

// The definition: each component of each block by itself, z, y and x ascending.
template <typename Rule>
struct PlainRow {
    static void run(const BlockRow& row)
    {
        using T = typename Rule::Element;
        auto* src = static_cast<const Loose<T>*>(row.src);
        auto* dst = static_cast<Loose<T>*>(row.dst);
        for (long i = 0; i < row.blocks; ++i) {
            for (long c = 0; c < row.components; ++c) {
                const Loose<T>* block = src + i * row.fx * row.components + c;
                typename Rule::State state = Rule::seed(block->value);
                for (long z = 0; z < row.fz; ++z)
                    for (long y = 0; y < row.fy; ++y)
                        for (long x = 0; x < row.fx; ++x)
                            state = Rule::next(
                                state, block[z * row.sliceStride + y * row.rowStride + x * row.components].value);
                dst[i * row.components + c].value = Rule::result(state, row.voxels());
            }
        }
    }
};

// The loops that a row is made of, each compiled for itself: as parts of a larger nest gcc takes them for rarely run
// code, or joins several rows to one loop, which is no faster and defeats the processor's
// prefetching.

// Joins the elements of a row to the line of states, whatever block they belong to.
template <typename Rule>
struct JoinRow {
    KPLIB_KERNEL_BODY static void run(typename Rule::State* line, const void* src, long n, bool isFirst)
    {
        auto* __restrict state = line;
        auto* __restrict from = static_cast<const Loose<typename Rule::Element>*>(src);
        if (isFirst) {
            for (long k = 0; k < n; ++k)
                state[k] = Rule::next(Rule::seed(from[k]), from[k]);
        } else {
            for (long k = 0; k < n; ++k)
                state[k] = Rule::next(state[k], from[k]);
        }
    }
};

// The next voxel of a block, `step` items on, and so forth. By recursion, since gcc unrolls a loop only after it has
// failed to vectorise the one around it.
template <typename Rule, int Count, typename Item>
KPLIB_KERNEL_BODY typename Rule::State nextOf(typename Rule::State state, const Item* item, long step)
{
    if constexpr (Count == 0)
        return state;
    else
        return nextOf<Rule, Count - 1>(Rule::next(state, *item), item + step, step);
}

// Joins to each block's state the voxels of one row of it, x ascending. `FX` and `N` are the voxels and their
// components, 0 where they are known at run time only.
template <typename Rule, typename Item, int FX, int N>
struct JoinColumns {
    KPLIB_KERNEL_BODY static void run(typename Rule::State* states, const void* items, long blocks, long fx, long n,
                                      bool isFirst)
    {
        auto* __restrict to = states;
        auto* __restrict from = static_cast<const Item*>(items);
        fx = FX ? FX : fx;
        n = N ? N : n;
        for (long i = 0; isFirst && i < blocks; ++i)
            for (long c = 0; c < n; ++c)
                to[i * n + c] = Rule::seed(from[i * fx * n + c]);
        for (long i = 0; i < blocks; ++i) {
            for (long c = 0; c < n; ++c) {
                const Item* block = from + i * fx * n + c;
                typename Rule::State state = to[i * n + c];
                if constexpr (FX > 0)
                    state = nextOf<Rule, FX>(state, block, n);
                else
                    for (long x = 0; x < fx; ++x)
                        state = Rule::next(state, block[x * n]);
                to[i * n + c] = state;
            }
        }
    }
};

// Joins a line of integers likewise, for voxels of N components, of which gcc makes no vectors. All shifts of the line
// are joined as they lie, and of the results those at the heads of the blocks are moved together.
template <typename Rule, int N>
struct JoinGroups {
    using State = typename Rule::State;
    static constexpr long slack = 4;  // a move may carry that many states, of which the next move covers the surplus
    static constexpr std::size_t moved = std::bit_ceil(N * sizeof(State));

    KPLIB_KERNEL_BODY static void run(State* joined, const State* line, long blocks, long fx)
    {
        auto* __restrict to = joined;
        auto* __restrict from = line;
        const long width = ((blocks - 1) * fx + 1) * N;
        for (long k = 0; k < width; ++k)
            to[k] = Rule::next(from[k], from[k + N]);
        for (long x = 2; x < fx; ++x)
            for (long k = 0; k < width; ++k)
                to[k] = Rule::next(to[k], from[k + x * N]);
        for (long i = 1; i < blocks; ++i) {
            unsigned char group[moved];
            std::memcpy(group, joined + i * fx * N, moved);
            std::memcpy(joined + i * N, group, moved);
        }
    }
};

template <typename Rule>
struct Finish {
    KPLIB_KERNEL_BODY static void run(void* dst, const typename Rule::State* states, long n, long voxels)
    {
        Rule::finish(static_cast<Loose<typename Rule::Element>*>(dst), states, n, voxels);
    }
};

template <typename Path, typename Rule, typename Item>
void joinColumns(typename Rule::State* states, const Item* items, long blocks, const BlockRow& row, bool isFirst)
{
    auto* join =
        Path::template run<JoinColumns<Rule, Item, 0, 0>, typename Rule::State*, const void*, long, long, long, bool>;
    if (row.components == 3 && row.fx == 2)
        join = Path::template run<JoinColumns<Rule, Item, 2, 3>>;
    if (row.components == 1 && row.fx == 2)
        join = Path::template run<JoinColumns<Rule, Item, 2, 1>>;
    if (row.components == 1 && row.fx == 3)
        join = Path::template run<JoinColumns<Rule, Item, 3, 1>>;
    if (row.components == 1 && row.fx == 4)
        join = Path::template run<JoinColumns<Rule, Item, 4, 1>>;
    join(states, items, blocks, row.fx, row.components, isFirst);
}

template <typename Path, typename Rule>
void joinLine(typename Rule::State* joined, const typename Rule::State* line, long blocks, const BlockRow& row)
{
    if constexpr (std::is_integral_v<typename Rule::Element>) {
        if (row.components == 2)
            return Path::template run<JoinGroups<Rule, 2>>(joined, line, blocks, long{row.fx});
        if (row.components == 3)
            return Path::template run<JoinGroups<Rule, 3>>(joined, line, blocks, long{row.fx});
        if (row.components == 4)
            return Path::template run<JoinGroups<Rule, 4>>(joined, line, blocks, long{row.fx});
    }
    joinColumns<Path, Rule>(joined, line, blocks, row, true);
}

constexpr long lineLength = 2048;  // states of a stretch of a row; they stay in the first cache

// A stretch of blocks whose states fit into a line. Integers are joined along y and z as they lie, then along x. The
// order of real numbers is kept: each block takes its voxels of one row after the other.
template <typename Path, typename Rule>
void joinStretch(const BlockRow& row, const void* src, void* dst, long blocks)
{
    using T = typename Rule::Element;
    using State = typename Rule::State;
    State line[lineLength], joined[lineLength + JoinGroups<Rule, 3>::slack];
    const bool isAnyOrder = std::is_integral_v<T> || row.fx == 1;
    const long width = blocks * row.fx * row.components;
    for (long z = 0; z < row.fz; ++z) {
        for (long y = 0; y < row.fy; ++y) {
            const auto* from = static_cast<const Loose<T>*>(src) + z * row.sliceStride + y * row.rowStride;
            if (isAnyOrder)
                Path::template run<JoinRow<Rule>>(line, static_cast<const void*>(from), width, z + y == 0);
            else
                joinColumns<Path, Rule>(line, from, blocks, row, z + y == 0);
        }
    }
    const bool isJoined = !isAnyOrder || row.fx == 1;
    if (!isJoined)
        joinLine<Path, Rule>(joined, line, blocks, row);
    Path::template run<Finish<Rule>>(dst, static_cast<const State*>(isJoined ? line : joined), blocks * row.components,
                                     row.voxels());
}

template <typename Path, typename Rule>
void rowByLines(const BlockRow& row)
{
    using T = typename Rule::Element;
    const long step = static_cast<long>(row.fx) * row.components;
    if (step > lineLength)
        return PlainRow<Rule>::run(row);
    const long most = lineLength / step;
    for (long done = 0; done < row.blocks; done += most)
        joinStretch<Path, Rule>(row, static_cast<const Loose<T>*>(row.src) + done * step,
                                static_cast<Loose<T>*>(row.dst) + done * row.components,
                                std::min(most, row.blocks - done));
}

// Sums of few bytes fit into 16 bits, of which a vector holds twice as many.
template <typename Path>
void meanOfBytes(const BlockRow& row)
{
    if (row.voxels() <= 65535 / 255)
        rowByLines<Path, Mean<std::uint8_t, std::uint16_t>>(row);
    else
        rowByLines<Path, Mean<std::uint8_t, std::uint32_t>>(row);
}

// Sums of the integers of a block of up to 2^32 voxels must fit: of 32 bits into 64, of fewer into 32.
template <typename T>
inline constexpr bool hasSumType = std::is_floating_point_v<T> || sizeof(T) <= sizeof(std::uint32_t);

template <typename T>
using MeanOf = Mean<T, std::conditional_t<std::is_floating_point_v<T>, T,
                                          std::conditional_t<sizeof(T) == 4, std::uint64_t, std::uint32_t>>>;

struct Plain {
    template <typename Rule>
    static constexpr BlockLoop* loop = PlainRow<Rule>::run;
};

template <typename Path>
struct ByLines {
    template <typename Rule>
    static constexpr BlockLoop* loop =
        std::is_same_v<Rule, MeanOf<std::uint8_t>> ? meanOfBytes<Path> : rowByLines<Path, Rule>;
};

template <typename Rows>
BlockLoop* blockLoop(KpPrimType type, BlockRule rule)
{
    BlockLoop* loop = nullptr;
    kpVisitNumberType(type, [&]<typename T>(KpElementTag<T>) {
        static_assert(hasSumType<T>, "a wider integer needs a wider sum: extend MeanOf");
        BlockLoop* const mean = Rows::template loop<MeanOf<T>>;
        BlockLoop* const maximum = Rows::template loop<Maximum<T>>;
        loop = rule == BlockRule::Mean ? mean : maximum;
    });
    return loop;
}

}  // namespace blocks
}  // namespace kplib::detail
