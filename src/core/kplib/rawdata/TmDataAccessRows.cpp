#include <kplib/rawdata/TmDataAccess.h>

#include <kplib/cpu/ElementConvert.h>
#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <cstdint>
#include <span>

using namespace kplib::detail;

namespace {

struct Line {
    int axis;
    long offset;  // bytes from the first voxel of the object to that of the line
};

Line lineAt(long x, long y, long z, const KpVec3l& strides)
{
    const int axis = x == -1 ? 0 : y == -1 ? 1 : 2;
    const long at[] = {x, y, z};
    Line line{axis, 0};
    for (int i = 0; i < 3; ++i) {
        if (i != axis)
            line.offset += at[i] * strides[i];
    }
    return line;
}

// Elements without gaps, by the conversion of KpRawData; its bounds are those of a line.
void convertDense(void* dst, KpPrimType to, const void* src, KpPrimType from, long n)
{
    static ConvertLoops* const loops = best(convertPaths());
    loops(to, from)(dst, src, n);
}

// Calls `each(element, i)` for each of `n` elements that lie `step` bytes apart.
template <typename T, typename Each>
void eachElement(void* first, long step, long n, Each each)
{
    auto* const bytes = static_cast<char*>(first);
    for (long i = 0; i < n; ++i)
        each(*reinterpret_cast<Loose<T>*>(bytes + i * step), i);
}

}  // namespace

// A message may announce a volume without voxels that is long on one axis; its lines have no
// memory.
bool TmDataAccess::hasVoxels() const
{
    return hasData() && nDataVar_ > 0 && dims_[0] > 0 && dims_[1] > 0 && dims_[2] > 0;
}

KpResult TmDataAccess::row(long x, long y, long z, float* out) const
{
    const Line line = lineAt(x, y, z, strides_);
    if (hasVoxels()) {
        kpVisitNumberType(primType_, [&]<typename T>(KpElementTag<T>) { rowImpl<T>(line.offset, line.axis, out); });
    }
    return {};
}

KpResult TmDataAccess::putRow(long x, long y, long z, const float* in) const
{
    const Line line = lineAt(x, y, z, strides_);
    if (hasVoxels()) {
        kpVisitNumberType(primType_, [&]<typename T>(KpElementTag<T>) {
            if constexpr (std::is_integral_v<T>)
                putRowImpl<T>(line.offset, line.axis, in, RealBounds<T, float>::low, RealBounds<T, float>::high);
            else
                putRowImplF<T>(line.offset, line.axis, in);
        });
    }
    return {};
}

// A line is read and written as floats, through a 32-bit integer.
template <typename T>
constexpr bool fitsIntoLine = std::is_floating_point_v<T> || sizeof(T) <= sizeof(std::int32_t);

template <typename T>
void TmDataAccess::rowImpl(long offset, int axis, float* out) const
{
    char* const first = static_cast<char*>(dataPtrs_[0]) + offset;
    if (strides_[axis] == sizeof(T))
        convertDense(out, KpPrimType::Float, first, primType_, dims_[axis]);
    else
        eachElement<T>(first, strides_[axis], dims_[axis],
                       [=](const Loose<T>& element, long i) { out[i] = converted<float>(element.value); });
}

template <typename T>
void TmDataAccess::putRowImpl(long offset, int axis, const float* in, float low, float high) const
{
    static_assert(fitsIntoLine<T>,
                  "integers of more than 32 bits would lose their upper bits here: convert them otherwise");
    char* const first = static_cast<char*>(dataPtrs_[0]) + offset;
    if (strides_[axis] == sizeof(T))
        convertDense(first, primType_, in, KpPrimType::Float, dims_[axis]);
    else
        eachElement<T>(first, strides_[axis], dims_[axis], [=](Loose<T>& element, long i) {
            element.value = static_cast<T>(truncatedToInt(clamped(in[i], low, high)));
        });
}

template <typename T>
void TmDataAccess::putRowImplF(long offset, int axis, const float* in) const
{
    char* const first = static_cast<char*>(dataPtrs_[0]) + offset;
    if (strides_[axis] == sizeof(T))
        convertDense(first, primType_, in, KpPrimType::Float, dims_[axis]);
    else
        eachElement<T>(first, strides_[axis], dims_[axis],
                       [=](Loose<T>& element, long i) { element.value = converted<T>(in[i]); });
}
