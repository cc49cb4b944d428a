// Compiled with the strictest warnings about numbers: users who turn these on must be able to include every header, and
// to instantiate every template.

#include <kplib/kplib.h>

#include <unordered_set>

template class KpDArray<int>;
template class KpDArray<KpString>;
template class KpDArray<KpConnectedComponents::Component>;
template class KpHandle<KpHandable>;
template class KpThreadLocalStorage<int>;
template class KpScopedLockT<KpMutex>;
template class KpID<long long, -1>;
template class KpBox3Base<KpBox3i, KpVec3i>;
template class KpDMatrix<float>;
template class KpDMatrix<double>;

template <typename... Vectors>
long useVectors(Vectors... vectors)
{
    const auto use = [](auto v) {
        v -= (v + v) * v[0] / v.dot(v);
        if constexpr (requires { v.normalize(); })
            v.normalize();
        return static_cast<long>(v == -v ? v.x() : v.squaredLength());
    };
    return (use(vectors) + ...);
}

long useTemplates(TmMsg& msg)
{
    KpVec3i cell(KpVec3f(1, 2, 3));
    KpDArray<bool> flags;
    msg << cell << flags << KpMat4f();
    msg >> cell >> flags;
    return useVectors(KpVec2f(1, 2), KpVec4f(1, 2, 3, 4), KpVec3d(1, 2, 3), cell, KpVec3l(1, 2, 3)) +
           static_cast<long>(kp_hash(cell) + std::unordered_set<KpUniqueID>({KpUniqueID()}).size());
}
