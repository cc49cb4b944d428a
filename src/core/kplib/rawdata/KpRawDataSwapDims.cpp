#include <kplib/rawdata/KpRawData.h>

#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/detail/TransposeKernels.h>
#include <kplib/volume/KpBitfield.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <span>
#include <utility>

// Plan
//
// Each permutation of the axes x, y, z is a product of exchanges of two adjacent axes, in place:
//
//     new axes   exchanges           yz  moves whole rows of nx voxels
//     x z y      yz                  xy  transposes each slice, from a copy in the scratch area
//     y x z      xy
//     z x y      yz, xy
//     y z x      xy, yz
//     z y x      yz, xy, yz
//
// The exchange yz is an in-place transposition of a matrix of ny * nz rows: F. Gustavson, L.
// Karlsson and B. Kagstrom, "Parallel and cache-efficient in-place matrix storage format
// conversion", 2012. Row i goes to place (i mod ny) * nz + i / ny. If ny = nz, pairs of rows are
// exchanged; otherwise each cycle of places is followed once, with a bit for each place visited.
//
// The scratch area holds a slice of the two largest sizes, and at least two rows. The bits suffice
// for the rows of any two axes. Both are allocated before the first voxel moves, so the function
// fails with nothing changed.

namespace {

using namespace kplib::detail;
using Dims = std::array<long, 3>;

// A permutation of axes: axis i of the result is axis perm[i] of the source.
using Perm = std::array<int, 3>;

bool isPermutation(const int* perm)
{
    const Perm identity{0, 1, 2};
    return std::is_permutation(perm, perm + 3, identity.begin());
}

Dims permuted(const Dims& dims, const Perm& perm)
{
    const auto size = [&](int i) { return dims[static_cast<std::size_t>(perm[static_cast<std::size_t>(i)])]; };
    return {size(0), size(1), size(2)};
}

// Permutes the axes of a block in place. A voxel has `voxelSize` bytes.
class AxisSwap {
public:
    AxisSwap(char* data, long voxelSize, char* scratch, KpBitfield& visited) :
        data_(data), voxelSize_(voxelSize), scratch_(scratch), visited_(visited)
    {
    }

    // Runs the exchanges of the permutation, of y and z and of x and y.
    void run(Dims dims, const Perm& perm)
    {
        const bool beginsWithYZ = perm == Perm{0, 2, 1} || perm[0] == 2;
        if (beginsWithYZ)
            dims = exchangeYZ(dims);
        if (perm != Perm{0, 2, 1})
            dims = exchangeXY(dims);
        if (perm == Perm{2, 1, 0} || perm == Perm{1, 2, 0})
            exchangeYZ(dims);
    }

private:
    Dims exchangeYZ(const Dims& dims)
    {
        const auto [nx, ny, nz] = dims;
        if (ny >= 2 && nz >= 2) {
            rowSize_ = static_cast<std::size_t>(nx * voxelSize_);
            if (ny == nz)
                exchangeRows(ny);
            else
                followCycles(ny, nz);
        }
        return {nx, nz, ny};
    }

    Dims exchangeXY(const Dims& dims)
    {
        const auto [nx, ny, nz] = dims;
        if (nx >= 2 && ny >= 2) {
            const long sliceSize = nx * ny * voxelSize_;
            for (long z = 0; z < nz; ++z)
                transposeSlice(data_ + z * sliceSize, nx, ny);
        }
        return {ny, nx, nz};
    }

    char* row(long index) const { return data_ + index * static_cast<long>(rowSize_); }

    void exchangeRows(long n)
    {
        for (long a = 0; a < n; ++a) {
            for (long b = 0; b < a; ++b) {
                char *const first = row(b * n + a), *const second = row(a * n + b);
                std::memcpy(scratch_, first, rowSize_);
                std::memcpy(first, second, rowSize_);
                std::memcpy(second, scratch_, rowSize_);
            }
        }
    }

    // Follows each cycle of places once. One half of the scratch area holds the row to store next,
    // the other the row that it replaces. Rows are prefetched four steps ahead, as no processor
    // predicts their addresses.
    void followCycles(long ny, long nz)
    {
        const auto placeOf = [&](long index) { return index % ny * nz + index / ny; };
        const long last = ny * nz - 1;
        visited_.unsetAll();
        for (long start = 1; start < last; ++start) {
            if (visited_.test(static_cast<unsigned long>(start)))
                continue;
            char *held = scratch_, *other = scratch_ + rowSize_;
            std::memcpy(held, row(start), rowSize_);
            long ahead = start;
            for (int i = 0; i < 4; ++i)
                ahead = placeOf(ahead);
            for (long to = placeOf(start); to != start; to = placeOf(to)) {
                askForRow(ahead);
                ahead = placeOf(ahead);
                visited_.set(static_cast<unsigned long>(to));
                std::memcpy(other, row(to), rowSize_);
                std::memcpy(row(to), held, rowSize_);
                std::swap(held, other);
            }
            std::memcpy(row(start), held, rowSize_);
        }
    }

    void askForRow(long index) const
    {
        constexpr std::size_t line = 64, most = 2048;
        for (std::size_t at = 0; at < std::min(rowSize_, most); at += line)
            __builtin_prefetch(row(index) + at, 1);
    }

    void transposeSlice(char* slice, long nx, long ny)
    {
        std::memcpy(scratch_, slice, static_cast<std::size_t>(nx * ny * voxelSize_));
        if (const auto paths = transposePaths(voxelSize_); !paths.empty()) {
            best(paths)(scratch_, slice, ny, nx);
            return;
        }
        const auto size = static_cast<std::size_t>(voxelSize_);
        for (long x = 0; x < nx; ++x) {
            for (long y = 0; y < ny; ++y, slice += voxelSize_)
                std::memcpy(slice, scratch_ + (y * nx + x) * voxelSize_, size);
        }
    }

    char* data_;
    long voxelSize_;
    char* scratch_;
    KpBitfield& visited_;
    std::size_t rowSize_ = 0;
};

// Voxels of four bytes move as an int, so their type does not matter.
bool canPermute(KpPrimType type, long voxelSize)
{
    return voxelSize == 4 || type.isNumber();
}

}  // namespace

bool KpRawData::swapDims(KpTypedPointer data, int* dims, const int* perm, int nDataVar)
{
    if (!isPermutation(perm))
        return false;
    const Perm order{perm[0], perm[1], perm[2]};
    if (order == Perm{0, 1, 2})
        return true;
    const Dims from{dims[0], dims[1], dims[2]}, to = permuted(from, order);
    const auto succeed = [&] {
        std::copy(to.begin(), to.end(), dims);
        return true;
    };
    const bool isEmpty = nDataVar < 1 || *std::min_element(from.begin(), from.end()) < 1;
    if (isEmpty || isConstant(data, static_cast<unsigned long>(from[0] * from[1] * from[2] * nDataVar)))
        return succeed();

    Dims sorted = from;
    std::sort(sorted.begin(), sorted.end());
    const long voxelSize = static_cast<long>(data.type.size()) * nDataVar, mid = sorted[1], big = sorted[2];
    const std::unique_ptr<char, KpFree> scratch(
        static_cast<char*>(std::malloc(static_cast<std::size_t>(voxelSize * big * std::max(mid, 2L)))));
    if (!scratch)
        return false;
    KpBitfield visited;
    try {
        visited.resize(static_cast<unsigned long>(big * mid), KpBitfield::INIT_UNSET);
    } catch (const KpMemoryException&) {
        return false;
    }
    if (!canPermute(data.type, voxelSize)) {
        getTheLogInstance().errorf("Unsupported data type %s in KpRawData::swapDims()\n", data.type.name());
        return false;
    }
    AxisSwap(static_cast<char*>(data.data), voxelSize, scratch.get(), visited).run(from, order);
    return succeed();
}
