#include <kplib/geometry/KpMat4f.h>

#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/detail/Jacobi.h>

#include <algorithm>
#include <cmath>

namespace {

KpMat4f translationBy(const KpVec3f& translation)
{
    KpMat4f matrix;
    matrix.setTranslate(translation);
    return matrix;
}

KpMat4f scaleBy(const KpVec3f& factors)
{
    KpMat4f matrix;
    matrix.setScale(factors);
    return matrix;
}

KpMat4f rotationBy(const KpRotation& rotation)
{
    KpMat4f matrix;
    matrix.setRotate(rotation);
    return matrix;
}

}  // namespace

void KpMat4f::jacobi3(float (&evalues)[3], float (&evectors)[3][3], int& rotations) const
{
    kplib::detail::Jacobi<double> work(data(), 4, 3, 4);
    work.run();
    std::copy_n(work.evalues, 3, evalues);
    std::copy_n(work.evectors[0], 9, evectors[0]);
    rotations = 3 * work.sweeps;  // the pairs that were visited, rotated or not
}

bool KpMat4f::factor(KpMat4f& r, KpVec3f& s, KpMat4f& u, KpVec3f& t, KpMat4f& proj) const
{
    const KpMat4f m = *this;  // an output may be this matrix
    proj.makeIdentity();
    t = KpVec3f(m[3][0], m[3][1], m[3][2]);
    KpMat4f a;
    a.setValue(KpVec3f(m[0][0], m[0][1], m[0][2]), KpVec3f(m[1][0], m[1][1], m[1][2]),
               KpVec3f(m[2][0], m[2][1], m[2][2]), KpVec3f(0, 0, 0));

    const float det = a.det3();
    const float sign = det < 0 ? -1.0F : 1.0F;
    if (static_cast<double>(det * sign) < 1e-12)
        return false;

    float evalues[3];
    float evectors[3][3];
    int rotations;
    (a * a.transpose()).jacobi3(evalues, evectors, rotations);
    r.setValue(KpVec3f(evectors[0][0], evectors[0][1], evectors[0][2]),
               KpVec3f(evectors[1][0], evectors[1][1], evectors[1][2]),
               KpVec3f(evectors[2][0], evectors[2][1], evectors[2][2]), KpVec3f(0, 0, 0));
    for (int i = 0; i < 3; ++i)
        s[i] = static_cast<float>(std::sqrt(static_cast<double>(evalues[i])) * static_cast<double>(sign));
    u = r * scaleBy(KpVec3f(1, 1, 1) / s) * r.transpose() * a;
    return true;
}

void KpMat4f::getTransform(KpVec3f& translation, KpRotation& rotation, KpVec3f& scaleFactor,
                           KpRotation& scaleOrientation, const KpVec3f& center) const
{
    KpMat4f r = identity(), u = identity(), proj;
    if (center == KpVec3f(0, 0, 0))
        factor(r, scaleFactor, u, translation, proj);
    else
        (translationBy(center) * *this * translationBy(-center)).factor(r, scaleFactor, u, translation, proj);
    scaleOrientation.setValue(r.transpose());
    rotation.setValue(u);
}

void KpMat4f::setTransform(const KpVec3f& translation, const KpRotation& rotation, const KpVec3f& scaleFactor,
                           const KpRotation& scaleOrientation, const KpVec3f& center)
{
    const bool isCentered = !(center == KpVec3f(0, 0, 0));
    makeIdentity();
    // Factors that change nothing are left out, so that they cause no rounding.
    const auto applyBefore = [this](bool isWanted, const auto& matrix) {
        if (isWanted)
            *this = matrix() * *this;
    };
    applyBefore(!(translation == KpVec3f(0, 0, 0)), [&] { return translationBy(translation); });
    applyBefore(isCentered, [&] { return translationBy(center); });
    applyBefore(!(rotation == KpRotation::identity()), [&] { return rotationBy(rotation); });
    if (!(scaleFactor == KpVec3f(1, 1, 1))) {
        const bool isOriented = !(scaleOrientation == KpRotation::identity());
        applyBefore(isOriented, [&] { return rotationBy(scaleOrientation); });
        applyBefore(true, [&] { return scaleBy(scaleFactor); });
        applyBefore(isOriented, [&] { return rotationBy(scaleOrientation.inverse()); });
    }
    applyBefore(isCentered, [&] { return translationBy(-center); });
}
