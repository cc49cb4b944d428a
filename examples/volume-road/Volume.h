#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/foundation/KpString.h>
#include <kplib/log/KpResult.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <array>
#include <cmath>

using Vector = std::array<double, 3>;

/// Voxels of one type in one block, x fastest, and where they lie in the patient: mm, x to the left, y to the back, z
/// to the head. Displayed value = stored value * slope + intercept.
struct Volume {
    std::array<long, 3> dims{};
    Vector spacing{1, 1, 1};
    Vector origin{};
    std::array<Vector, 3> axes{Vector{1, 0, 0}, Vector{0, 1, 0}, Vector{0, 0, 1}};
    bool isPlaced = true;  ///< origin and axes are known, not assumed
    double slope = 1, intercept = 0;
    KpPrimType type = KpPrimType::Short;
    KpDArray<unsigned char> bytes;

    long count() const { return dims[0] * dims[1] * dims[2]; }
    long sliceCount() const { return dims[0] * dims[1]; }
    KpTypedPointer voxels() { return {bytes.data(), type}; }
    KpTypedPointer slice(long z) { return {bytes.data() + z * sliceCount() * type.size(), type}; }
    void allocate() { bytes.resize(count() * type.size()); }
};

inline double dot(const Vector& a, const Vector& b)
{
    return a[0] * b[0] + a[1] * b[1] + a[2] * b[2];
}

inline Vector cross(const Vector& a, const Vector& b)
{
    return {a[1] * b[2] - a[2] * b[1], a[2] * b[0] - a[0] * b[2], a[0] * b[1] - a[1] * b[0]};
}

constexpr double shortestLength = 1e-4, longestLength = 1e6;  // mm; what is beyond is no measure of a patient

inline bool isLength(double mm)
{
    return mm >= shortestLength && mm <= longestLength;
}

/// Whether these are a place and two directions at right angles.
inline bool isPlace(const Vector& position, const Vector& row, const Vector& column)
{
    constexpr double tolerance = 0.01;
    return dot(position, position) <= longestLength * longestLength && std::abs(dot(row, row) - 1) < tolerance &&
           std::abs(dot(column, column) - 1) < tolerance && std::abs(dot(row, column)) < tolerance;
}

/// A failure whose text is one line for the user, formatted as by printf.
template <typename... Arguments>
KpResult badInput(const char* format, Arguments... arguments)
{
    const KpString text(0, format, arguments...);
    return KpResult(KpResult::InvalidArgument, text, nullptr);
}
