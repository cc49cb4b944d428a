#include <kplib/geometry/KpAbstractCoordinateSystem.h>

#include <kplib/geometry/KpCoordinateSystem.h>

KpHandle<KpCoordinateSystem> KpAbstractCoordinateSystem::createChildSystem() const
{
    KpHandle<KpCoordinateSystem> child(new KpCoordinateSystem);
    child->setParent(this);
    return child;
}
