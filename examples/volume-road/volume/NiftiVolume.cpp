#include "NiftiVolume.h"

#include <kplib/rawdata/KpRawData.h>

#include <array>
#include <cstdlib>
#include <nifti1_io.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <memory>

namespace {

using Image = std::unique_ptr<nifti_image, decltype(&nifti_image_free)>;

bool primTypeOf(const nifti_image& image, KpPrimType& type)
{
    switch (image.datatype) {
    case DT_UINT8:
        type = KpPrimType::Byte;
        return true;
    case DT_INT16:
        type = KpPrimType::Short;
        return true;
    case DT_UINT16:
        type = KpPrimType::UShort;
        return true;
    case DT_INT32:
        type = KpPrimType::Int;
        return true;
    case DT_FLOAT32:
        type = KpPrimType::Float;
        return true;
    case DT_FLOAT64:
        type = KpPrimType::Double;
        return true;
    default:
        return false;
    }
}

/// NIfTI's world has x to the right and y to the front; DICOM's has both the other way round.
void takePlace(const nifti_image& image, Volume& volume)
{
    const mat44 toWorld = image.sform_code > 0 ? image.sto_xyz : image.qto_xyz;
    for (int axis = 0; axis < 3; ++axis) {
        KpVec3d& direction = volume.axes[static_cast<size_t>(axis)];
        for (int i = 0; i < 3; ++i)
            direction[i] = (i < 2 ? -1.0 : 1.0) * static_cast<double>(toWorld.m[i][axis]);
        volume.spacing[axis] = direction.normalize();
    }
    for (int i = 0; i < 3; ++i)
        volume.origin[i] = (i < 2 ? -1.0 : 1.0) * static_cast<double>(toWorld.m[i][3]);
}

/// Whether the axes are at right angles, as far as slices of a series have to be.
bool isUpright(const Volume& volume)
{
    constexpr double tolerance = 1e-3;
    const auto& [x, y, z] = volume.axes;
    return std::abs(x.dot(y)) < tolerance && std::abs(y.dot(z)) < tolerance && std::abs(z.dot(x)) < tolerance;
}

/// Turns the volume over along one axis; every voxel keeps its place in the patient.
void turnOver(Volume& volume, int axis)
{
    const int dims[] = {static_cast<int>(volume.dims[0]), static_cast<int>(volume.dims[1]),
                        static_cast<int>(volume.dims[2])};
    KpRawData::flip(volume.bytes.data(), volume.type.size(), dims, axis);
    KpVec3d& direction = volume.axes[static_cast<size_t>(axis)];
    volume.origin += direction * (static_cast<double>(dims[axis] - 1) * volume.spacing[axis]);
    direction = -direction;
}

/// Rows and columns as scanners write them, to the left, the back or the feet of the patient, and slices along their
/// cross product, as a series has to be.
void turnUpright(Volume& volume)
{
    for (int axis = 0; axis < 2; ++axis) {
        const KpVec3d& a = volume.axes[static_cast<size_t>(axis)];
        int along = 0;
        for (int i = 1; i < 3; ++i)
            along = std::abs(a[i]) > std::abs(a[along]) ? i : along;
        if ((a[along] < 0) != (along == 2))
            turnOver(volume, axis);
    }
    if (volume.axes[0].cross(volume.axes[1]).dot(volume.axes[2]) < 0)
        turnOver(volume, 2);
}

/// Rounds to the nearest of `count` steps from `low` on; the middle of the last is the highest value.
void spread(const KpDArray<double>& values, double low, double step, unsigned short* to)
{
    for (long i = 0; i < values.size(); ++i) {
        const double v = std::isfinite(values[i]) ? (values[i] - low) / step : 0;
        to[i] = static_cast<unsigned short>(std::lround(std::clamp(v, 0.0, 65535.0)));
    }
}

/// To 16 bits: small integers as they are, all else spread over them with the scale that leads back. Whole numbers in a
/// range of 65536 stay exact.
void takeVoxels(KpTypedPointer source, Volume& volume)
{
    const long n = volume.count();
    volume.type = source.type == KpPrimType::Short ? KpPrimType::Short : KpPrimType::UShort;
    volume.allocate();
    if (source.type == KpPrimType::Byte || source.type == KpPrimType::Short || source.type == KpPrimType::UShort) {
        KpRawData::memcpy(volume.voxels(), source, n);
        return;
    }
    KpDArray<double> values;
    values.resize(n);
    KpRawData::memcpy({values.data(), KpPrimType::Double}, source, n);
    double low = HUGE_VAL, high = -HUGE_VAL;
    bool isWhole = true;
    for (const double v : values) {
        if (!std::isfinite(v))
            continue;
        low = std::min(low, v);
        high = std::max(high, v);
        isWhole = isWhole && v == std::floor(v);
    }
    if (low > high)
        low = high = 0;
    volume.slope = isWhole && high - low <= 65535 ? 1 : high > low ? (high - low) / 65535 : 1;
    volume.intercept = low;
    // What the file will hold, so that the values are those that a reader computes.
    volume.slope = std::strtod(KpString(0, "%.10g", volume.slope), nullptr);
    volume.intercept = std::strtod(KpString(0, "%.10g", volume.intercept), nullptr);
    spread(values, volume.intercept, volume.slope, static_cast<unsigned short*>(volume.voxels().data));
}

/// The voxels of one volume of a file in which several follow each other.
KpResult pickVolume(const char* path, const nifti_image& image, int number, KpTypedPointer& voxels,
                    std::vector<std::string>& warnings)
{
    const auto slice = static_cast<size_t>(image.nx) * static_cast<size_t>(image.ny);
    const size_t count = slice * static_cast<size_t>(std::max<int>(1, static_cast<int>(image.nz)));
    const auto volumes = static_cast<int>(static_cast<size_t>(image.nvox) / count);
    if (number < 1 || number > volumes)
        return badInput("'%s' has %d volume(s), not %d", path, volumes, number);
    if (volumes > 1)
        warnings.emplace_back(
            KpString(0, "'%s' has %d volumes; number %d is taken (--volume N takes another)", path, volumes, number));
    voxels.data = static_cast<unsigned char*>(image.data) +
                  static_cast<size_t>(number - 1) * count * static_cast<size_t>(image.nbyper);
    return KpResult();
}

}  // namespace

KpResult readNifti(const char* path, int number, Volume& volume, std::vector<std::string>& warnings)
{
    if (FILE* const file = std::fopen(path, "rb"))
        std::fclose(file);
    else
        return badInput("can't open '%s': %s", path, std::strerror(errno));
    const Image image(is_nifti_file(path) > 0 ? nifti_image_read(path, 1) : nullptr, nifti_image_free);
    if (!image || !image->data)
        return badInput("'%s' is not a readable NIfTI file", path);
    KpPrimType type;
    if (!primTypeOf(*image, type))
        return badInput("'%s' has an unsupported voxel type: %s", path, nifti_datatype_string(image->datatype));
    volume.dims = {image->nx, image->ny, image->nz > 0 ? image->nz : 1};
    KpTypedPointer voxels{image->data, type};
    if (KpResult picked = pickVolume(path, *image, number, voxels, warnings); picked.isBad())
        return picked;
    takePlace(*image, volume);
    if (!isUpright(volume))
        return badInput("'%s' is sheared: its axes are not at right angles, and slices cannot be written for it", path);
    takeVoxels(voxels, volume);
    if (image->scl_slope != 0 && std::isfinite(image->scl_slope)) {
        const double slope = static_cast<double>(image->scl_slope);
        volume.intercept = volume.intercept * slope + static_cast<double>(image->scl_inter);
        volume.slope *= slope;
    }
    turnUpright(volume);
    return KpResult();
}
