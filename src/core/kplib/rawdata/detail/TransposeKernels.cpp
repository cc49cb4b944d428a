#include <kplib/rawdata/detail/TransposeKernels.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <emmintrin.h>

namespace kplib::detail {
namespace {

/// The tile of a matrix from (row, column) on.
template <typename T>
struct Tile {
    const T* from;
    T* to;
    long rows, columns;

    const T* source(long row, long column) const { return from + row * columns + column; }
    T* target(long row, long column) const { return to + column * rows + row; }

    void transposePlain(long row, long rowEnd, long column, long columnEnd) const
    {
        for (long j = column; j < columnEnd; ++j) {
            for (long i = row; i < rowEnd; ++i)
                *target(i, j) = *source(i, j);
        }
    }
};

/// Block by block, so that what is read and what is written both stay in the first cache.
template <typename T, typename Block>
void blockwise(const void* from, void* to, long rows, long columns, Block block)
{
    constexpr long side = 32;
    const Tile<T> tile{static_cast<const T*>(from), static_cast<T*>(to), rows, columns};
    for (long i = 0; i < rows; i += side) {
        for (long j = 0; j < columns; j += side)
            block(tile, i, std::min(i + side, rows), j, std::min(j + side, columns));
    }
}

// The reference.
template <typename T>
void transposePlain(const void* from, void* to, long rows, long columns)
{
    blockwise<T>(from, to, rows, columns, [](const Tile<T>& tile, long i, long iEnd, long j, long jEnd) {
        tile.transposePlain(i, iEnd, j, jEnd);
    });
}

__m128i load(const void* place)
{
    return _mm_loadu_si128(static_cast<const __m128i*>(place));
}

void store(void* place, __m128i value)
{
    _mm_storeu_si128(static_cast<__m128i*>(place), value);
}

// By hand: compilers gather the elements of a column one by one. Each round pairs rows that are half the tile apart;
// after as many rounds as there are halvings a row holds what was a column.

/// 8 x 8 elements of 2 bytes, a row a register.
void transposeTile(const Tile<std::uint16_t>& tile, long i, long j)
{
    __m128i rows[8], next[8];
    for (int k = 0; k < 8; ++k)
        rows[k] = load(tile.source(i + k, j));
    for (int round = 0; round < 3; ++round) {
        for (int k = 0; k < 4; ++k) {
            next[2 * k] = _mm_unpacklo_epi16(rows[k], rows[k + 4]);
            next[2 * k + 1] = _mm_unpackhi_epi16(rows[k], rows[k + 4]);
        }
        std::copy_n(next, 8, rows);
    }
    for (int k = 0; k < 8; ++k)
        store(tile.target(i, j + k), rows[k]);
}

/// 16 x 16 bytes.
void transposeTile(const Tile<std::uint8_t>& tile, long i, long j)
{
    __m128i rows[16], next[16];
    for (int k = 0; k < 16; ++k)
        rows[k] = load(tile.source(i + k, j));
    for (int round = 0; round < 4; ++round) {
        for (int k = 0; k < 8; ++k) {
            next[2 * k] = _mm_unpacklo_epi8(rows[k], rows[k + 8]);
            next[2 * k + 1] = _mm_unpackhi_epi8(rows[k], rows[k + 8]);
        }
        std::copy_n(next, 16, rows);
    }
    for (int k = 0; k < 16; ++k)
        store(tile.target(i, j + k), rows[k]);
}

/// 4 x 4 elements of 4 bytes.
void transposeTile(const Tile<std::uint32_t>& tile, long i, long j)
{
    __m128i rows[4], next[4];
    for (int k = 0; k < 4; ++k)
        rows[k] = load(tile.source(i + k, j));
    for (int round = 0; round < 2; ++round) {
        for (int k = 0; k < 2; ++k) {
            next[2 * k] = _mm_unpacklo_epi32(rows[k], rows[k + 2]);
            next[2 * k + 1] = _mm_unpackhi_epi32(rows[k], rows[k + 2]);
        }
        std::copy_n(next, 4, rows);
    }
    for (int k = 0; k < 4; ++k)
        store(tile.target(i, j + k), rows[k]);
}

/// 2 x 2 elements of 8 bytes.
void transposeTile(const Tile<std::uint64_t>& tile, long i, long j)
{
    const __m128i first = load(tile.source(i, j)), second = load(tile.source(i + 1, j));
    store(tile.target(i, j), _mm_unpacklo_epi64(first, second));
    store(tile.target(i, j + 1), _mm_unpackhi_epi64(first, second));
}

template <typename T>
void transposeSse2(const void* from, void* to, long rows, long columns)
{
    constexpr long side = 16 / sizeof(T);
    blockwise<T>(from, to, rows, columns, [](const Tile<T>& tile, long i, long iEnd, long j, long jEnd) {
        const long iWhole = i + (iEnd - i) / side * side, jWhole = j + (jEnd - j) / side * side;
        for (long jj = j; jj < jWhole; jj += side) {
            for (long ii = i; ii < iWhole; ii += side)
                transposeTile(tile, ii, jj);
        }
        tile.transposePlain(iWhole, iEnd, j, jEnd);
        tile.transposePlain(i, iWhole, jWhole, jEnd);
    });
}

template <typename T>
std::span<const KernelPath<Transpose>> pathsOf()
{
    static const KernelPath<Transpose> paths[] = {{"plain", true, transposePlain<T>}, {"sse2", true, transposeSse2<T>}};
    return paths;
}

}  // namespace

std::span<const KernelPath<Transpose>> transposePaths(long elementSize)
{
    switch (elementSize) {
    case 1:
        return pathsOf<std::uint8_t>();
    case 2:
        return pathsOf<std::uint16_t>();
    case 4:
        return pathsOf<std::uint32_t>();
    case 8:
        return pathsOf<std::uint64_t>();
    default:
        return {};
    }
}

}  // namespace kplib::detail
