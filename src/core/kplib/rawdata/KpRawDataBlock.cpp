#include <kplib/rawdata/KpRawData.h>

#include <kplib/rawdata/detail/RawDataKernels.h>

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <span>
#include <utility>

namespace {

using namespace kplib::detail;

// Storage of malloc, freed at the end of its scope unless it is released.
class Storage {
public:
    explicit Storage(unsigned long size) : data_(static_cast<char*>(std::malloc(size))) {}
    Storage(const Storage&) = delete;
    Storage& operator=(const Storage&) = delete;
    ~Storage() { std::free(data_); }
    char* get() const { return data_; }
    char* release() { return std::exchange(data_, nullptr); }

private:
    char* data_;
};

constexpr unsigned long exchangeSize = 16384;  // of a piece that is exchanged through the first cache

// Large items, in pieces that stay in registers.
void exchange(char* a, char* b, unsigned long bytes)
{
    constexpr unsigned long piece = 64;
    for (; bytes >= piece; bytes -= piece, a += piece, b += piece) {
        char fromA[piece], fromB[piece];
        std::memcpy(fromA, a, piece);
        std::memcpy(fromB, b, piece);
        std::memcpy(a, fromB, piece);
        std::memcpy(b, fromA, piece);
    }
    std::swap_ranges(a, a + bytes, b);
}

// Small items, through the first cache. The items at the end are read downwards, which the
// processor does not predict, so the next one is prefetched.
void exchange(char* a, char* b, unsigned long bytes, char* buffer)
{
    for (unsigned long line = 0; line < bytes; line += 64)
        __builtin_prefetch(b - bytes + line, 1);
    std::memcpy(buffer, a, bytes);
    std::memcpy(a, b, bytes);
    std::memcpy(b, buffer, bytes);
}

// Mirrors `count` items of `size` bytes by exchanging the first with the last, moving inward.
void flipItems(char* items, long count, unsigned long size, char* buffer)
{
    char* last = items + static_cast<unsigned long>(count - 1) * size;
    for (char* first = items; first < last; first += size, last -= size) {
        if (size > exchangeSize)
            exchange(first, last, size);
        else
            exchange(first, last, size, buffer);
    }
}

// The same in pieces: the reversed end goes to the front, the reversed front to the end. What fits into the buffer is
// copied there and comes back reversed: memory is then read and written upwards only, as the processor foresees it.
void flipWords(char* words, long count, long size, ReverseLoop* reverse, char* buffer)
{
    const long pieces = static_cast<long>(exchangeSize) / size;
    while (count > pieces) {
        const long n = std::min(pieces, count / 2);
        char* const end = words + (count - n) * size;
        reverse(buffer, words, n);
        reverse(words, end, n);
        std::memcpy(end, buffer, static_cast<unsigned long>(n * size));
        words += n * size;
        count -= 2 * n;
    }
    std::memcpy(buffer, words, static_cast<unsigned long>(count * size));
    reverse(words, buffer, count);
}

struct Box {
    long size[3];  // of the block
    long first[3], count[3];

    bool isInside() const
    {
        for (int i = 0; i < 3; ++i) {
            if (first[i] < 0 || first[i] + count[i] > size[i])
                return false;
        }
        return true;
    }

    // Bytes of the box, all there are if that is more.
    unsigned long bytes(long voxel) const
    {
        unsigned long result = static_cast<unsigned long>(voxel);
        for (long n : count) {
            if (__builtin_mul_overflow(result, static_cast<unsigned long>(n), &result))
                return ULONG_MAX;
        }
        return result;
    }

    long row(long y, long z) const { return (z * size[1] + y) * size[0]; }
};

// Rows are packed towards the head; a row may overlap its own target, but not the target of a
// later row.
void packRows(char* data, long voxel, const Box& box)
{
    char* to = data;
    const long bytes = box.count[0] * voxel;
    for (long z = 0; z < box.count[2]; ++z) {
        for (long y = 0; y < box.count[1]; ++y, to += bytes) {
            const long from = box.row(box.first[1] + y, box.first[2] + z) + box.first[0];
            std::memmove(to, data + from * voxel, static_cast<unsigned long>(bytes));
        }
    }
}

char* repeat(char* to, const void* value, long voxel, long n)
{
    for (long i = 0; i < n; ++i, to += voxel)
        std::memcpy(to, value, static_cast<unsigned long>(voxel));
    return to;
}

// One row of the box, from the row of the block at its place or the nearest one.
char* extendRow(char* to, const char* row, long voxel, const Box& box, const void* fillValue)
{
    const long end = box.first[0] + box.count[0];
    const long before = std::clamp(-box.first[0], 0L, box.count[0]);
    const long behind = std::clamp(end - box.size[0], 0L, box.count[0]);
    const long inside = box.count[0] - before - behind;
    const char* const last = row + (box.size[0] - 1) * voxel;
    to = repeat(to, fillValue ? fillValue : row, voxel, before);
    const long from = std::clamp(box.first[0] + before, 0L, box.size[0] - 1);  // stays in the row if nothing is inside
    std::memcpy(to, row + from * voxel, static_cast<unsigned long>(inside * voxel));
    return repeat(to + inside * voxel, fillValue ? fillValue : last, voxel, behind);
}

void extendRows(char* to, const char* data, long voxel, const Box& box, const void* fillValue)
{
    for (long z = box.first[2]; z < box.first[2] + box.count[2]; ++z) {
        for (long y = box.first[1]; y < box.first[1] + box.count[1]; ++y) {
            const long nearestY = std::clamp(y, 0L, box.size[1] - 1), nearestZ = std::clamp(z, 0L, box.size[2] - 1);
            if (fillValue && (y != nearestY || z != nearestZ))
                to = repeat(to, fillValue, voxel, box.count[0]);
            else
                to = extendRow(to, data + box.row(nearestY, nearestZ) * voxel, voxel, box, fillValue);
        }
    }
}

}  // namespace

bool KpRawData::flip(void* data, int bytesPerVoxel, const int* dims, int axis)
{
    static ReverseLoops* const loops = best(reversePaths());
    if (axis < 0 || axis > 2 || dims[0] < 1 || dims[1] < 1 || dims[2] < 1 || !data || bytesPerVoxel < 0)
        return false;
    if (dims[axis] == 1)
        return true;
    unsigned long item = static_cast<unsigned long>(bytesPerVoxel);
    for (int i = 0; i < axis; ++i)
        item *= static_cast<unsigned long>(dims[i]);
    ReverseLoop* const reverse = axis == 0 ? loops(bytesPerVoxel) : nullptr;
    const Storage buffer(reverse ? exchangeSize : std::min(item, exchangeSize));
    if (!buffer.get())
        return false;
    long runs = 1;
    for (int i = axis + 1; i < 3; ++i)
        runs *= dims[i];
    const unsigned long run = item * static_cast<unsigned long>(dims[axis]);
    char* items = static_cast<char*>(data);
    for (long i = 0; i < runs; ++i, items += run) {
        if (reverse)
            flipWords(items, dims[axis], bytesPerVoxel, reverse, buffer.get());
        else
            flipItems(items, dims[axis], item, buffer.get());
    }
    return true;
}

bool KpRawData::crop(void*& data, int bytesPerVoxel, int* dims, const int* min, const int* max, const void* fillValue)
{
    if (!data || bytesPerVoxel < 1)
        return false;
    Box box{};
    bool isSame = true;
    for (int i = 0; i < 3; ++i) {
        box.size[i] = dims[i];
        box.first[i] = min[i];
        box.count[i] = static_cast<long>(max[i]) - min[i] + 1;
        if (dims[i] < 1 || box.count[i] < 1 || box.count[i] > INT_MAX)
            return false;
        isSame = isSame && min[i] == 0 && box.count[i] == dims[i];
    }
    if (isSame)
        return true;
    const unsigned long bytes = box.bytes(bytesPerVoxel);
    if (box.isInside()) {
        packRows(static_cast<char*>(data), bytesPerVoxel, box);
        if (void* const shrunk = std::realloc(data, bytes))
            data = shrunk;
    } else {
        Storage extended(bytes);
        if (!extended.get())
            return false;
        extendRows(extended.get(), static_cast<const char*>(data), bytesPerVoxel, box, fillValue);
        std::free(data);
        data = extended.release();
    }
    for (int i = 0; i < 3; ++i)
        dims[i] = static_cast<int>(box.count[i]);
    return true;
}
