#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/numerics/KpODEBase.h>

template <>
KPLIB_API int KpODEBase<KpVec3f>::defaultRightHandSide(const KpVec3f& x, KpVec3f& derivative, void* userData);
extern template class KpODEBase<KpVec3f>;

/// Traces curves in a vector field in space; see KpODEBase.
class KPLIB_API KpODE3 : public KpODEBase<KpVec3f> {};
