#include <kplib/rawdata/KpTypedData2D.h>

void KpTypedData2D::init(int w, int h, KpPrimType type, int nDataVar)
{
    KpRawData2D::init(w, h, setElements(type, nDataVar));
}

void KpTypedData2D::init(int w, int h, KpTypedPointer p, int nDataVar)
{
    KpRawData2D::init(w, h, setElements(p.type, nDataVar), p.data);
}

void KpTypedData2D::init(int w, int h, int /*ignored*/, int rowStride, KpTypedPointer p, int nDataVar)
{
    KpRawData2D::init(w, h, setElements(p.type, nDataVar), rowStride, p.data);
}

// Gives the size of a pixel.
int KpTypedData2D::setElements(KpPrimType type, int nDataVar)
{
    primType_ = type;
    nDataVar_ = nDataVar;
    return static_cast<int>(std::int64_t{type.size()} * nDataVar);
}
