#include <kplib/geometry/detail/Mat4fLoops.h>

#include <kplib/geometry/KpMat4f.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {

std::span<const KernelPath<TransformLoop>> transformPaths()
{
    static const KernelTable<TransformLoop> paths({{"plain", true, ForAny::run<TransformEach>}}, transformX86());
    return paths;
}

}  // namespace kplib::detail

void KpMat4f::multVecMatrix(std::span<const KpVec3f> points, KpVec3f* results) const
{
    static kplib::detail::TransformLoop* const run = best(kplib::detail::transformPaths());
    if (!points.empty())
        run(data(), points.data()->data(), results->data(), static_cast<long>(points.size()));
}
