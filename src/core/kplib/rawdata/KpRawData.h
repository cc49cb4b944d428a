#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <cstdio>

/// Operations on arrays of elements whose type is known at run time only, and on dense 3D blocks
/// of them.
///
///     short voxels[] = {-1000, 0, 1000, 3000};
///     unsigned char shown[4];
///     KpRawData::mapLinear(shown, voxels, 4, 1000, 255.0 / 4000);  // (voxel + offset) * scale
///     std::printf("%d %d %d %d\n", shown[0], shown[1], shown[2], shown[3]);
///     // prints: 0 63 127 255
///
/// The numeric types are byte, short, int, float, double and ushort. Complex elements are
/// supported only where stated. Counts are counts of elements of the buffer's own type; an element
/// of complex is a pair of floats. Elements are packed, x fastest, then y, then z, and interleaved
/// components are adjacent. Addresses need no alignment. The host is little-endian.
///
/// Errors: nothing throws. A failure is a line in the log, and the target stays unchanged.
///
/// Threads: no state is kept; any number of threads may work on distinct buffers.
///
/// Results are the same to the bit on all processors. The loop for the element type and the
/// processor is selected once a call.
class KPLIB_API KpRawData {
public:
    KpRawData() = delete;

    /// @name Conversion and mapping
    /// Source and target may be one buffer, or overlap with the target first, if target elements are no larger.
    /// @{

    /// Copies `n` elements into the type of `dst`; none if `n` is below 1. Equal types, of any kind, are copied as
    /// bytes.
    ///
    /// Values are clamped to the target's range, then truncated toward zero, never rounded: 254.9
    /// is 254 as a byte, 300 is 255. NaN becomes 0, and the smallest value as an int. Intentional,
    /// since peers depend on it: ushort to short keeps the bits (40000 is -25536), floats of
    /// 2147483648 and more are -2147483648 as an int, and doubles stop at -2147483646. If one type
    /// is complex or the target is not numeric, an error is logged and nothing is written; a
    /// source that is not numeric is ignored silently.
    static void memcpy(KpTypedPointer dst, KpTypedPointer src, long n);

    /// Converts (element + offset) * scale as memcpy() does, and limits ushort to short and equal types too.
    ///
    /// The sum and the product are rounded in single precision, to which element, offset and scale are brought first;
    /// for double targets, and for int and float targets of a double source, in double precision. Complex maps to
    /// complex only, real and imaginary parts alike. Errors as in memcpy().
    static void mapLinear(KpTypedPointer dst, KpTypedPointer src, unsigned long n, double offset, double scale);

    /// Sets `n` elements to `value`; integers take its low bits. An error is logged if the type is
    /// not numeric.
    static void memset(KpTypedPointer dst, int value, long n);

    /// The same, rounded half up for integers: 2.5 is 3, -2.5 is -2. Not clamped: 300 becomes 44
    /// in a byte. A value outside the range of int counts as the smallest int, whose low bits are
    /// 0.
    static void memset(KpTypedPointer dst, double value, long n);
    /// @}

    /// @name Questions
    /// @{

    /// Smallest and largest of `n` elements, rounded to float; the first one is always read. The parts of complex
    /// numbers share one range. NaN is skipped, but stays in both results if it comes first. For other types the
    /// results are left as they were.
    static void getRange(KpTypedPointer data, unsigned long n, float& min, float& max);

    /// Whether no element, and no part of a complex one, is less or greater than the first; true
    /// if `n` is 0. If the first is NaN the result is false; later NaN is skipped. False for other
    /// types. Stops at the first difference.
    static bool isConstant(KpTypedPointer data, unsigned long n);
    /// @}

    /// @name Byte order, in place
    /// @{

    /// Reverses the bytes of each element. The two halves of complex numbers and of string
    /// references are reversed separately.
    static void swapBytes(KpTypedPointer data, unsigned long n);

    /// Reverses the bytes of `n` words of that many bytes.
    static void swapBytesWord2(void* data, unsigned long n);
    static void swapBytesWord4(void* data, unsigned long n);
    static void swapBytesWord8(void* data, unsigned long n);
    /// @}

    /// @name Files
    /// @{

    /// Reads or writes `count` items of `size` bytes, at least 1, in blocks of 1 MiB until the
    /// first short one. Returns the number of whole items transferred.
    static unsigned long fread(void* data, unsigned long size, unsigned long count, FILE* f);
    static unsigned long fwrite(const void* data, unsigned long size, unsigned long count, FILE* f);

    /// Reads or writes elements in the named byte order. Returns the number of whole elements
    /// transferred. readBigEndian() swaps all `n` elements in memory, even if it read fewer.
    /// writeBigEndian() swaps the caller's buffer during the call: no other thread may read it
    /// meanwhile.
    static long readBigEndian(KpTypedPointer data, unsigned long n, FILE* f);
    static long writeBigEndian(KpTypedPointer data, unsigned long n, FILE* f);
    static long readLittleEndian(KpTypedPointer data, unsigned long n, FILE* f);
    static long writeLittleEndian(KpTypedPointer data, unsigned long n, FILE* f);

    /// Reads from a descriptor until `size` bytes are read or it ends, with calls of 4 MiB at most
    /// if `limitChunkSize` is set. Returns the number of bytes read. A failure, an interrupted
    /// call included, is logged and ends reading.
    static long long read(int fd, void* data, long long size, bool limitChunkSize);

    /// Writes all `size` bytes to a descriptor and returns their number; all bits set at the first failure.
    static unsigned long write(int fd, const void* data, unsigned long size);
    /// @}

    /// @name Blocks in memory
    /// @{

    /// Mirrors a block of `dims` voxels in place along `axis`, 0 to 2. Returns false and changes
    /// nothing for another axis, an empty block, null, or if memory is exhausted.
    static bool flip(void* data, int bytesPerVoxel, const int* dims, int axis);

    /// Crops or extends a block to the box from `min` to `max`, both inclusive. `data`, a block of
    /// malloc, and `dims` then describe the new block; addresses in the old one are invalid.
    /// Voxels outside the old block are copies of `fillValue`, or of the nearest voxel if that is
    /// null. Returns false and changes nothing for an empty box or block, null, or if memory is
    /// exhausted.
    static bool crop(void*& data, int bytesPerVoxel, int* dims, const int* min, const int* max, const void* fillValue);

    /// Permutes the axes in place: axis i becomes the former axis perm[i], and `dims` receives the
    /// new sizes. A voxel has `nDataVar` elements, which stay together. If isConstant() holds for
    /// all of them, only the sizes change. Uses memory for one slice of the two largest sizes and
    /// one bit for each row. Returns false and changes nothing if `perm` is not a permutation of
    /// 0, 1, 2, if memory is exhausted, or, with a line in the log, if the type is not numeric
    /// (except for voxels of four bytes). F. Gustavson, L. Karlsson and B. Kagstrom, "Parallel and
    /// cache-efficient in-place matrix storage format conversion", 2012.
    static bool swapDims(KpTypedPointer data, int* dims, const int* perm, int nDataVar);
    /// @}

    /// @name Down-sampling by whole factors
    /// A block of fx * fy * fz voxels of the source becomes one voxel of the target, which has the
    /// same type and dx / fx by dy / fy by dz / fz voxels and is owned by the caller. The
    /// remainder at the far edges is never read. Factors and `nDataVar` must be at least 1;
    /// nothing is written for others, or for factors above their sizes.
    ///
    /// `progress` may be null. It receives a scope of `dz` steps, closed on return, and the step
    /// reached after each layer of voxels. If it is cancelled, the rest of the target is left
    /// unchanged. An error is logged if the type is not numeric.
    /// @{

    /// The mean of each block, truncated toward zero for integers. Sums run along x, then y, then
    /// z. Sums of real numbers have the precision of the element and depend on that order.
    static void downSample3D(void* dst, KpTypedPointer src, unsigned long dx, unsigned long dy, unsigned long dz,
                             int fx, int fy, int fz, KpProgressInterface* progress);

    /// The mean of each of `nDataVar` components.
    static void downSample3DN(void* dst, KpTypedPointer src, unsigned long dx, unsigned long dy, unsigned long dz,
                              int fx, int fy, int fz, int nDataVar, KpProgressInterface* progress);

    /// The largest value of each of `nDataVar` components, which may come from different voxels.
    /// NaN counts only in the first voxel of a block, and then is the result.
    static void downSampleMaxFilterComponents3DN(void* dst, KpTypedPointer src, unsigned long dx, unsigned long dy,
                                                 unsigned long dz, int fx, int fy, int fz, int nDataVar,
                                                 KpProgressInterface* progress);

    /// The first voxel of each block: labels must not be mixed.
    ///
    /// For ushort, `b` is the source and `a` the target; for all other types `a` is the source and `b` the target.
    /// Intentional: existing callers depend on it.
    static void downSampleLabels3D(void* a, KpTypedPointer b, unsigned long dx, unsigned long dy, unsigned long dz,
                                   int fx, int fy, int fz, KpProgressInterface* progress);
    /// @}
};
