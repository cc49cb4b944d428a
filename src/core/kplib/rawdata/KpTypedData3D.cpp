#include <kplib/rawdata/KpTypedData3D.h>

#include <kplib/rawdata/KpTypedData2D.h>

void KpTypedData3D::init(int nx, int ny, int nz, KpPrimType type, int nDataVar)
{
    KpRawData3D::init(nx, ny, nz, setElements(type, nDataVar));
}

void KpTypedData3D::init(int nx, int ny, int nz, KpTypedPointer p, int nDataVar)
{
    KpRawData3D::init(nx, ny, nz, setElements(p.type, nDataVar), p.data);
}

void KpTypedData3D::getSlice(int orientation, int k, KpTypedData2D& out, int copy) const
{
    KpRawData3D::getSlice(orientation, k, out, copy);
    out.setElements(primType_, nDataVar_);
}

// Gives the size of a voxel.
int KpTypedData3D::setElements(KpPrimType type, int nDataVar)
{
    primType_ = type;
    nDataVar_ = nDataVar;
    return static_cast<int>(std::int64_t{type.size()} * nDataVar);
}
