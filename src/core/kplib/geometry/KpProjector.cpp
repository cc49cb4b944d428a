#include <kplib/geometry/KpProjector.h>

KpProjector::~KpProjector() = default;

void KpProjector::setViewVolume(const KpViewVolume& viewVolume)
{
    viewVolume_ = viewVolume;
}

void KpProjector::setWorkingSpace(const KpMat4f& workingToWorld)
{
    workingToWorld_ = workingToWorld;
    worldToWorking_ = workingToWorld_.inverse();
}

KpLine KpProjector::getWorkingLine(const KpVec2f& point) const
{
    return toWorkingSpace(viewVolume_.projectPointToLine(point));
}

KpLine KpProjector::toWorkingSpace(const KpLine& worldLine) const
{
    KpLine line;
    line.setPosDir(worldToWorking_.multVecMatrix(worldLine.position()),
                   worldToWorking_.multDirMatrix(worldLine.direction()));
    return line;
}
