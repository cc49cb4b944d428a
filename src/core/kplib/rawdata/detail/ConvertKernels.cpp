#include <kplib/rawdata/detail/ConvertLoops.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {

using namespace convert;

std::span<const KernelPath<ConvertLoops>> convertPaths()
{
    static const KernelTable<ConvertLoops> paths({{"plain", true, convertLoop<Rows<ForAny>>}}, convertX86());
    return paths;
}

std::span<const KernelPath<MapLoops>> mapPaths()
{
    static const KernelTable<MapLoops> paths({{"plain", true, mapLoop<Rows<ForAny>>}}, mapX86());
    return paths;
}

}  // namespace kplib::detail
