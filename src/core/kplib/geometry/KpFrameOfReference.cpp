#include <kplib/geometry/KpFrameOfReference.h>

KpHandle<const KpFrameOfReference> KpFrameOfReference::frameOfReference() const
{
    return this;
}

KpHandle<const KpAbstractCoordinateSystem> KpFrameOfReference::parent() const
{
    return nullptr;
}

KpMat4f KpFrameOfReference::asTransformation() const
{
    return KpMat4f::identity();
}

KpMat4f KpFrameOfReference::asTransformationToFrameOfReference() const
{
    return asTransformation();
}

std::string KpFrameOfReference::dump() const
{
    return R"("FrameOfReference":{"id":")" + id_ + R"(","parent": {}})";
}
