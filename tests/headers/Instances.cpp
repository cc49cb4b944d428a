// Compiled with the strictest warnings about numbers: users who turn these on must be able to include every header, and
// to instantiate every template.

#include <kplib/kplib.h>

#include <string>
#include <unordered_set>

template class KpDArray<int>;
template class KpDArray<KpString>;
template class KpDArray<std::string>;
template class KpDArray<KpVec3f>;
template class KpDArray<KpConnectedComponents::Component>;
template class KpHandle<KpHandable>;
template class KpHandle<const KpCoordinateSystem>;
template class KpThreadLocalStorage<int>;
template class KpScopedLockT<KpMutex>;
template class KpID<int, 0>;
template class KpID<long long, -1>;
template class KpBox3Base<KpBox3f, KpVec3f>;
template class KpBox3Base<KpBox3i, KpVec3i>;
template class KpODEBase<KpVec3f>;
template class KpDMatrix<float>;
template class KpDMatrix<double>;

template <typename Vector>
auto useVector(Vector v)
{
    v += v;
    v -= v * v[0];
    v /= v.dot(v);
    if constexpr (requires { v.normalize(); })
        v.normalize();
    return v == -v ? v.x() : v.squaredLength();
}

// What functions and operators make of their arguments.
long useTemplates(TmMsg& msg)
{
    int number = 0;
    bool flag = false;
    KpVec3f point(1, 2, 3);
    KpDArray<bool> flags;
    KpDArray<KpVec3f> points;
    msg << number << flag << point << flags << points << KpPrimType(KpPrimType::Int) << KpMat4f();
    msg >> number >> flag >> point >> flags >> points;
    const KpVec3i cell(KpVec3f(1, 2, 3));
    std::unordered_set<KpUniqueID> ids;
    ids.insert(KpUniqueID());
    useVector(KpVec2f(1, 2));
    useVector(KpVec3f(1, 2, 3));
    useVector(KpVec4f(1, 2, 3, 4));
    useVector(KpVec3d(1, 2, 3));
    useVector(KpVec2i(1, 2));
    useVector(KpVec3i(1, 2, 3));
    useVector(KpVec3l(1, 2, 3));
    return static_cast<long>(kp_hash(cell)) + static_cast<long>(ids.size()) +
           (2.0F * point + point / 2.0F == KpVec3f(KpVec3d(point)) ? 1 : 0);
}
