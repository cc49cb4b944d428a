#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpFrameOfReference.h>

#include <algorithm>
#include <limits>
#include <vector>

namespace {

using Path = std::vector<const KpAbstractCoordinateSystem*>;

// Visits `start`, its parent and so on while `visit` returns true. Takes handles to parents only,
// which their children hold: the only handle to `start` would delete it at the end.
template <typename Visit>
void walkUp(const KpAbstractCoordinateSystem& start, Visit visit)
{
    KpHandle<const KpAbstractCoordinateSystem> held;
    for (const KpAbstractCoordinateSystem* system = &start; system && visit(*system); system = held.get())
        held = system->parent();
}

Path pathOf(const KpAbstractCoordinateSystem& start)
{
    Path path;
    walkUp(start, [&](const KpAbstractCoordinateSystem& system) {
        path.push_back(&system);
        return true;
    });
    return path;
}

// The product of the matrices from `start` to `last`, or to the root if `last` is not an ancestor.
KpMat4f chain(const KpAbstractCoordinateSystem& start, const KpAbstractCoordinateSystem* last)
{
    KpMat4f matrix = KpMat4f::identity();
    walkUp(start, [&](const KpAbstractCoordinateSystem& system) {
        matrix *= system.asTransformation();
        return &system != last;
    });
    return matrix;
}

KpMat4f transformation(const KpAbstractCoordinateSystem& from, const KpAbstractCoordinateSystem& to)
{
    return from.asTransformationToFrameOfReference() * to.asTransformationToFrameOfReference().inverse();
}

KpMat4f nanMatrix()
{
    KpMat4f matrix;
    std::fill_n(matrix[0], 16, std::numeric_limits<float>::quiet_NaN());
    return matrix;
}

}  // namespace

KpHandle<const KpFrameOfReference> KpCoordinateSystem::frameOfReference() const
{
    return parent_ ? parent_->frameOfReference() : nullptr;
}

KpHandle<const KpAbstractCoordinateSystem> KpCoordinateSystem::parent() const
{
    return parent_;
}

KpMat4f KpCoordinateSystem::asTransformationToFrameOfReference() const
{
    return chain(*this, nullptr);
}

KpMat4f KpCoordinateSystem::asTransformationUpTo(const KpAbstractCoordinateSystem& ancestor) const
{
    return chain(*this, &ancestor);
}

std::vector<const KpAbstractCoordinateSystem*> KpCoordinateSystem::path() const
{
    return pathOf(*this);
}

bool KpCoordinateSystem::isCompatibleWith(const KpAbstractCoordinateSystem& other) const
{
    const KpHandle<const KpFrameOfReference> frame = frameOfReference();
    if (!frame)
        return false;
    // A frame is not asked for its frame: of one that no handle holds, the handle it gives is the last.
    if (const auto* otherFrame = dynamic_cast<const KpFrameOfReference*>(&other))
        return *frame == *otherFrame;
    const KpHandle<const KpFrameOfReference> otherFrame = other.frameOfReference();
    return otherFrame && *frame == *otherFrame;
}

bool KpCoordinateSystem::transformationTo(const KpAbstractCoordinateSystem& other, KpMat4f& result) const
{
    if (!isCompatibleWith(other))
        return false;
    result = transformation(*this, other);
    return true;
}

bool KpCoordinateSystem::transformationFrom(const KpAbstractCoordinateSystem& other, KpMat4f& result) const
{
    if (!isCompatibleWith(other))
        return false;
    result = transformation(other, *this);
    return true;
}

KpMat4f KpCoordinateSystem::transformationTo(const KpAbstractCoordinateSystem& other) const
{
    KpMat4f result = nanMatrix();
    transformationTo(other, result);
    return result;
}

KpMat4f KpCoordinateSystem::transformationFrom(const KpAbstractCoordinateSystem& other) const
{
    KpMat4f result = nanMatrix();
    transformationFrom(other, result);
    return result;
}

KpHandle<const KpAbstractCoordinateSystem>
KpCoordinateSystem::commonAncestor(const KpAbstractCoordinateSystem& other) const
{
    if (!isCompatibleWith(other))
        return nullptr;
    const Path mine = path(), others = pathOf(other);
    const auto common = std::find_first_of(mine.begin(), mine.end(), others.begin(), others.end());
    return common == mine.end() ? nullptr : *common;
}

KpHandle<KpCoordinateSystem> KpCoordinateSystem::mergedWithParent() const
{
    if (!parent_)
        return new KpCoordinateSystem(*this);
    KpHandle<KpCoordinateSystem> merged(new KpCoordinateSystem(asTransformation() * parent_->asTransformation()));
    merged->parent_ = parent_->parent();
    return merged;
}

KpHandle<KpCoordinateSystem> KpCoordinateSystem::asChildOf(const KpAbstractCoordinateSystem& other) const
{
    KpHandle<KpCoordinateSystem> child(new KpCoordinateSystem);
    KpMat4f matrix;
    if (transformationTo(other, matrix)) {
        child->setByMatrix(matrix);
        child->setParent(&other);
    }
    return child;
}
