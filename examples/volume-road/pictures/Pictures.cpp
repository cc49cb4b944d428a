#include "Pictures.h"

#include "Letters.h"

#include <kplib/geometry/KpMat4f.h>

#include <algorithm>
#include <cmath>

namespace {

PatientAxis reversed(PatientAxis along)
{
    along.isReversed = !along.isReversed;
    along.direction = -along.direction;
    return along;
}

/// The place of the middles of all voxels, seen along two directions from `middle`.
KpBox2f extentAlong(const Volume& volume, const KpVec3d& middle, const KpVec3d& right, const KpVec3d& down)
{
    KpBox2f extent;
    for (int corner = 0; corner < 8; ++corner) {
        const auto last = [&](int axis) { return corner >> axis & 1 ? volume.dims[static_cast<size_t>(axis)] - 1 : 0; };
        const KpVec3d at = volume.slicePosition(last(2)) +
                           volume.axes[0] * (volume.spacing[0] * static_cast<double>(last(0))) +
                           volume.axes[1] * (volume.spacing[1] * static_cast<double>(last(1))) - middle;
        extent.extendBy(KpVec2f(static_cast<float>(at.dot(right)), static_cast<float>(at.dot(down))));
    }
    return extent;
}

/// A plane through the middle voxel that shows one axis to the right and one downward.
Picture cut(const Volume& shown, const Space& space, const KpBitfield& outline, const PatientAxis& right,
            const PatientAxis& down)
{
    const auto half = [&](int axis) {
        const auto middleVoxel = shown.dims[static_cast<size_t>(axis)] / 2;
        return static_cast<double>(middleVoxel);
    };
    const KpVec3d middle = shown.slicePosition(shown.dims[2] / 2) + shown.axes[0] * (shown.spacing[0] * half(0)) +
                           shown.axes[1] * (shown.spacing[1] * half(1));
    const KpBox2f extent = extentAlong(shown, middle, right.direction, down.direction);
    KpHandle<KpCoordinateSystem> plane = space.patient->createChildSystem();
    plane->setOrigin(KpVec3f(middle));
    plane->setAxes({KpVec3f(right.direction), KpVec3f(down.direction), KpVec3f(right.direction.cross(down.direction))});
    const double finest =
        std::min(shown.spacing[static_cast<int>(right.axis)], shown.spacing[static_cast<int>(down.axis)]);
    const double pixel =
        pixelSize(finest, static_cast<double>(extent.size().x()), static_cast<double>(extent.size().y()));
    return cutByPlane(shown, space, outline, *plane, extent, pixel);
}

}  // namespace

std::array<PatientAxis, 3> patientAxes(const Volume& volume)
{
    std::array<KpVec3d, 3> upright = volume.axes;
    upright[2] = volume.axes[0].cross(volume.axes[1]);
    std::array<size_t, 3> best{0, 1, 2}, order = best;
    double most = -1;
    do {
        double sum = 0;
        for (int p = 0; p < 3; ++p)
            sum += std::abs(upright[order[static_cast<size_t>(p)]][p]);
        if (sum > most) {
            most = sum;
            best = order;
        }
    } while (std::next_permutation(order.begin(), order.end()));
    std::array<PatientAxis, 3> along{};
    for (int p = 0; p < 3; ++p) {
        const size_t axis = best[static_cast<size_t>(p)];
        KpVec3d direction = upright[axis];
        direction.normalize();
        along[static_cast<size_t>(p)] = {axis, direction[p] < 0, direction[p] < 0 ? -direction : direction};
    }
    return along;
}

KpResult writePlanes(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out)
{
    const auto [left, back, up] = patientAxes(shown);
    KpResult result = writeAxial(shown, space, outline, out, "axial.png");
    result << writePng(cut(shown, space, outline, left, reversed(up)), out, "coronal.png");
    result << writePng(cut(shown, space, outline, back, reversed(up)), out, "sagittal.png");
    return result;
}

KpResult writeAxial(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out,
                    const char* name)
{
    const auto [left, back, up] = patientAxes(shown);
    return writePng(cut(shown, space, outline, left, back), out, name);
}

KpResult writeOverview(Volume& shown, const OutputFolder& out, const char* name)
{
    const auto [width, height, count] = shown.dims;
    constexpr long widest = 16384;  // pixels a side: of a long series every n-th slice is shown
    const long step = count * height * width / (widest * widest) + 1, slices = (count + step - 1) / step;
    const double square = std::sqrt(static_cast<double>(slices * height) / static_cast<double>(width));
    const long across = std::clamp(std::lround(std::ceil(square)), 1L, slices);
    Picture picture(across * width, (slices + across - 1) / across * height);
    for (long tile = 0; tile < slices; ++tile) {
        const unsigned char* from = static_cast<const unsigned char*>(shown.slice(tile * step).data);
        for (long y = 0; y < height; ++y) {
            unsigned char* to = picture.at(tile % across * width, tile / across * height + y);
            for (long i = 0; i < width * 3; ++i)
                to[i] = shown.components == 3 ? from[i] : from[i / 3];
            from += width * shown.components;
        }
    }
    drawLetters(picture, lettersOf(shown, KpVec3f(shown.axes[0]), KpVec3f(shown.axes[1])));
    return writePng(picture, out, name);
}
