#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

/// A rectangle of pixels, either an owner of its memory or a view on memory that is owned
/// elsewhere.
///
/// Pixels are opaque bytes of a given size. Pixel (x, y) is at data() + x * pixelStride() + y *
/// rowStride(), strides in bytes. A view is valid as long as its memory. Owned memory comes from
/// malloc; if it is exhausted, the object holds a null pointer. Sizes are not checked, but strides
/// have 32 bits: pixels without gaps whose rows have 2^31 bytes or more are refused with an error
/// in the log, and the object holds a null pointer. A plain value: one thread may change it, or
/// any number read it.
class KPLIB_API KpRawData2D {
public:
    /// Empty: sizes, strides and pointers are 0.
    KpRawData2D() = default;

    // Each constructor does what init() does with the same arguments.

    /// @{
    /// As init().
    KpRawData2D(int w, int h, int bytesPerPixel) { init(w, h, bytesPerPixel); }
    KpRawData2D(int w, int h, int bytesPerPixel, void* data) { init(w, h, bytesPerPixel, data); }
    KpRawData2D(int w, int h, int bytesPerPixel, int rowStride, void* data)
    {
        init(w, h, bytesPerPixel, rowStride, data);
    }
    KpRawData2D(int w, int h, int bytesPerPixel, int pixelStride, int rowStride, void* data)
    {
        init(w, h, bytesPerPixel, pixelStride, rowStride, data);
    }
    /// @}

    /// As the assignment.
    KpRawData2D(const KpRawData2D& other) { *this = other; }
    ~KpRawData2D() { cleanup(); }

    /// A copy of an owner owns a copy of its block, without gaps; a copy of a view is one more view on the same memory.
    KpRawData2D& operator=(const KpRawData2D& other);

    /// Makes this the owner of `w` * `h` pixels without gaps, not initialised. For a size of 0
    /// nothing is allocated, and data() keeps its value, even if that block is freed.
    void init(int w, int h, int bytesPerPixel);
    /// A view on pixels without gaps, or with gaps between rows, or between pixels too.
    void init(int w, int h, int bytesPerPixel, void* data);
    /// @{
    /// As above; strides are in bytes.
    void init(int w, int h, int bytesPerPixel, int rowStride, void* data);
    void init(int w, int h, int bytesPerPixel, int pixelStride, int rowStride, void* data);
    /// @}

    /// Frees the block of an owner. data() keeps its value and must not be used.
    void cleanup();

    /// Makes this the owner of `data`, a block of malloc with the pixels without gaps. A block
    /// that is refused is freed.
    void commit(int w, int h, int bytesPerPixel, void* data);

    /// Copies the pixels of `from`, whatever the strides; false and nothing copied if the sizes are not the same.
    bool copyData(const KpRawData2D& from);

    /// Makes a view an owner of a copy without gaps; does nothing to an owner.
    void makeLocal();

    /// Fills all pixels with zeros; the gaps stay.
    void clear();

    /// Pixels in a row, rows.
    const std::int32_t* dims() const { return dims_; }
    /// Size of a pixel.
    int bytesPerPixel() const { return bytesPerPixel_; }
    /// Bytes from a pixel to the next one in its row.
    int pixelStride() const { return pixelStride_; }
    /// Bytes from a row to the next one.
    int rowStride() const { return rowStride_; }
    /// Whether there are no gaps between pixels and between rows.
    bool isContiguous() const
    {
        return rowStride_ == std::int64_t{dims_[0]} * pixelStride_ && pixelStride_ == bytesPerPixel_;
    }

    /// The first pixel; a view hands out its memory for writing, too.
    void* data() const { return data_; }
    /// The block of an owner, null for a view.
    void* ownedData() const { return ownedData_; }

private:
    bool setDenseShape(int w, int h, int bytesPerPixel);

    std::int32_t dims_[2] = {0, 0};
    std::int32_t bytesPerPixel_ = 0;
    std::int32_t pixelStride_ = 0;
    std::int32_t rowStride_ = 0;
    void* data_ = nullptr;
    void* ownedData_ = nullptr;  // null or data_
};
