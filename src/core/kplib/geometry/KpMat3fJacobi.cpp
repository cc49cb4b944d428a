#include <kplib/geometry/KpMat3f.h>

#include <kplib/geometry/detail/Jacobi.h>
#include <kplib/log/KpLogFile.h>

#include <algorithm>

void KpMat3f::jacobi(float (&evalues)[3], KpVec3f (&evectors)[3], int& rotations) const
{
    kplib::detail::Jacobi<float> work(data(), 3, 4, 5);
    const bool converged = work.run();
    std::copy_n(work.evalues, 3, evalues);
    rotations = work.rotations;
    if (!converged) {
        getTheLogInstance().warnf("Too many iterations in routine jacobi\n");
        return;
    }
    for (int j = 0; j < 3; ++j)
        evectors[j] = KpVec3f(work.evectors[0][j], work.evectors[1][j], work.evectors[2][j]);
}
