#pragma once

#include <kplib/rawdata/KpRawData2D.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <cstdint>

/// A KpRawData2D whose pixels are a number of components of one element type. The size of a pixel follows from the two.
class KPLIB_API KpTypedData2D : public KpRawData2D {
public:
    /// Empty: no components, of bytes.
    KpTypedData2D() = default;

    // Each constructor does what init() does with the same arguments.

    /// @{
    /// As init().
    KpTypedData2D(int w, int h, KpPrimType type, int nDataVar) { init(w, h, type, nDataVar); }
    KpTypedData2D(int w, int h, KpTypedPointer p, int nDataVar) { init(w, h, p, nDataVar); }
    KpTypedData2D(const int* dims, KpTypedPointer p, int nDataVar) { init(dims, p, nDataVar); }
    KpTypedData2D(int w, int h, int ignored, int rowStride, KpTypedPointer p, int nDataVar)
    {
        init(w, h, ignored, rowStride, p, nDataVar);
    }
    /// @}

    /// As the assignment.
    KpTypedData2D(const KpTypedData2D& other) = default;

    /// As that of KpRawData2D.
    KpTypedData2D& operator=(const KpTypedData2D& other) = default;

    /// An owner of pixels that are not set to anything.
    void init(int w, int h, KpPrimType type, int nDataVar);
    /// A view on pixels without gaps.
    void init(int w, int h, KpTypedPointer p, int nDataVar);
    /// As above, with width and height in an array.
    void init(const int* dims, KpTypedPointer p, int nDataVar) { init(dims[0], dims[1], p, nDataVar); }
    /// A view with gaps between rows, `rowStride` in bytes. The third number is ignored: the size
    /// of a pixel always follows from type and components.
    void init(int w, int h, int ignored, int rowStride, KpTypedPointer p, int nDataVar);

    /// Components a pixel.
    int nDataVar() const { return nDataVar_; }
    /// Type of the components.
    KpPrimType primType() const { return primType_; }

private:
    friend class KpTypedData3D;  // which makes its slices
    int setElements(KpPrimType type, int nDataVar);

    std::int32_t nDataVar_ = 0;
    KpPrimType primType_;
};
