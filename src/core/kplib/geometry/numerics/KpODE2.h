#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/numerics/KpODEBase.h>

template <>
KPLIB_API int KpODEBase<KpVec2f>::defaultRightHandSide(const KpVec2f& x, KpVec2f& derivative, void* userData);
extern template class KpODEBase<KpVec2f>;

/// Traces curves in a vector field in the plane; see KpODEBase.
class KPLIB_API KpODE2 : public KpODEBase<KpVec2f> {};
