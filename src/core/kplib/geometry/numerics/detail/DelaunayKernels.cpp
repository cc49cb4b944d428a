#include <kplib/geometry/numerics/detail/DelaunayLoops.h>

#include <cstdint>
#include <span>

namespace kplib::detail::delaunay {
namespace {

template <int Size>
long scanPlain(const double* const* columns, long n, const double* point, std::int32_t* hits)
{
    return scanFrom<Size>(0, 0, columns, n, point, hits);
}

}  // namespace

template <int Size>
std::span<const KernelPath<CircleScan>> circleScanPaths()
{
    static const KernelTable<CircleScan> paths({{"plain", true, scanPlain<Size>}}, circleScanX86<Size>());
    return paths;
}

template std::span<const KernelPath<CircleScan>> circleScanPaths<2>();
template std::span<const KernelPath<CircleScan>> circleScanPaths<3>();

}  // namespace kplib::detail::delaunay
