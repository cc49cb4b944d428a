#include <kplib/rawdata/detail/TransposeKernels.h>

#include <kplib/cpu/Loose.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <utility>

namespace kplib::detail {
namespace {

// The tile of a matrix from (row, column) on, at any address.
template <typename T>
struct Tile {
    const Loose<T>* from;
    Loose<T>* to;
    long rows, columns;

    const Loose<T>* source(long row, long column) const { return from + row * columns + column; }
    Loose<T>* target(long row, long column) const { return to + column * rows + row; }

    void transposePlain(long row, long rowEnd, long column, long columnEnd) const
    {
        for (long j = column; j < columnEnd; ++j) {
            for (long i = row; i < rowEnd; ++i)
                *target(i, j) = *source(i, j);
        }
    }
};

// Block by block, so that source and target both stay in the first cache.
template <typename T, typename Block>
void blockwise(const void* from, void* to, long rows, long columns, Block block)
{
    constexpr long side = 32;
    const Tile<T> tile{static_cast<const Loose<T>*>(from), static_cast<Loose<T>*>(to), rows, columns};
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

// A tile of as many rows as 16 bytes have elements, a row a vector. Each round pairs rows that are half the tile
// apart; after as many rounds as there are halvings a row holds what was a column. Written out, since compilers gather
// the elements of a column one by one.
template <typename T, int... I>
void transposeTile(const Tile<T>& tile, long row, long column, std::integer_sequence<int, I...>)
{
    typedef T Row __attribute__((vector_size(16)));
    constexpr int side = sizeof...(I);
    Row rows[sizeof...(I)], next[sizeof...(I)];
    for (int k = 0; k < side; ++k)
        std::memcpy(&rows[k], tile.source(row + k, column), sizeof(Row));
    for (int round = 1; round < side; round *= 2) {
        for (int k = 0; k < side / 2; ++k) {
            next[2 * k] = __builtin_shufflevector(rows[k], rows[k + side / 2], (I / 2 + I % 2 * side)...);
            next[2 * k + 1] =
                __builtin_shufflevector(rows[k], rows[k + side / 2], (side / 2 + I / 2 + I % 2 * side)...);
        }
        std::copy_n(next, side, rows);
    }
    for (int k = 0; k < side; ++k)
        std::memcpy(tile.target(row, column + k), &rows[k], sizeof(Row));
}

template <typename T>
void transposeTiles(const void* from, void* to, long rows, long columns)
{
    constexpr int side = 16 / sizeof(T);
    blockwise<T>(from, to, rows, columns, [](const Tile<T>& tile, long i, long iEnd, long j, long jEnd) {
        const long iWhole = i + (iEnd - i) / side * side, jWhole = j + (jEnd - j) / side * side;
        for (long jj = j; jj < jWhole; jj += side) {
            for (long ii = i; ii < iWhole; ii += side)
                transposeTile(tile, ii, jj, std::make_integer_sequence<int, side>());
        }
        tile.transposePlain(iWhole, iEnd, j, jEnd);
        tile.transposePlain(i, iWhole, jWhole, jEnd);
    });
}

template <typename T>
std::span<const KernelPath<Transpose>> pathsOf()
{
    static const KernelPath<Transpose> paths[] = {{"plain", true, transposePlain<T>},
                                                  {"tiles", true, transposeTiles<T>}};
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
