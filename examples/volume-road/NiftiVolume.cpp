#include "NiftiVolume.h"

#include <kplib/rawdata/KpRawData.h>

#include <nifti1_io.h>

#include <cmath>
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
    for (size_t axis = 0; axis < 3; ++axis) {
        Vector& direction = volume.axes[axis];
        for (size_t i = 0; i < 3; ++i)
            direction[i] = (i < 2 ? -1.0 : 1.0) * static_cast<double>(toWorld.m[i][axis]);
        volume.spacing[axis] = std::sqrt(dot(direction, direction));
        for (double& c : direction)
            c /= volume.spacing[axis];
    }
    for (size_t i = 0; i < 3; ++i)
        volume.origin[i] = (i < 2 ? -1.0 : 1.0) * static_cast<double>(toWorld.m[i][3]);
}

/// Turns the volume over along one axis; every voxel keeps its place in the patient.
void turnOver(Volume& volume, size_t axis)
{
    const int dims[] = {static_cast<int>(volume.dims[0]), static_cast<int>(volume.dims[1]),
                        static_cast<int>(volume.dims[2])};
    KpRawData::flip(volume.bytes.data(), volume.type.size(), dims, static_cast<int>(axis));
    const double extent = static_cast<double>(volume.dims[axis] - 1) * volume.spacing[axis];
    for (size_t i = 0; i < 3; ++i) {
        volume.origin[i] += extent * volume.axes[axis][i];
        volume.axes[axis][i] = -volume.axes[axis][i];
    }
}

/// Rows and columns as scanners write them, to the left, the back or the feet of the patient, and slices along their
/// cross product, as a series has to be.
void turnUpright(Volume& volume)
{
    for (size_t axis = 0; axis < 2; ++axis) {
        const Vector& a = volume.axes[axis];
        size_t along = 0;
        for (size_t i = 1; i < 3; ++i)
            along = std::abs(a[i]) > std::abs(a[along]) ? i : along;
        if ((a[along] < 0) != (along == 2))
            turnOver(volume, axis);
    }
    if (dot(cross(volume.axes[0], volume.axes[1]), volume.axes[2]) < 0)
        turnOver(volume, 2);
}

/// To 16 bits: small integers as they are, all else spread over 0 to 4095 with the scale that leads back.
void takeVoxels(KpTypedPointer source, Volume& volume)
{
    const long n = volume.count();
    volume.type = source.type == KpPrimType::Short ? KpPrimType::Short : KpPrimType::UShort;
    volume.allocate();
    if (source.type == KpPrimType::Byte || source.type == KpPrimType::Short || source.type == KpPrimType::UShort) {
        KpRawData::memcpy(volume.voxels(), source, n);
        return;
    }
    float low = 0, high = 0;
    KpRawData::getRange(source, static_cast<unsigned long>(n), low, high);
    const double step = high > low ? (static_cast<double>(high) - low) / 4095 : 1;
    KpRawData::mapLinear(volume.voxels(), source, static_cast<unsigned long>(n), -static_cast<double>(low), 1 / step);
    volume.slope = step;
    volume.intercept = low;
}

}  // namespace

KpResult readNifti(const char* path, Volume& volume)
{
    const Image image(is_nifti_file(path) > 0 ? nifti_image_read(path, 1) : nullptr, nifti_image_free);
    if (!image || !image->data)
        return badInput("'%s' is not a readable NIfTI file", path);
    KpPrimType type;
    if (!primTypeOf(*image, type))
        return badInput("'%s' has an unsupported voxel type: %s", path, nifti_datatype_string(image->datatype));
    volume.dims = {image->nx, image->ny, image->nz > 0 ? image->nz : 1};
    takePlace(*image, volume);
    takeVoxels({image->data, type}, volume);
    if (image->scl_slope != 0) {
        volume.intercept = volume.intercept * image->scl_slope + image->scl_inter;
        volume.slope *= image->scl_slope;
    }
    turnUpright(volume);
    return KpResult();
}
