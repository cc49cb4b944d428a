#include <kplib/volume/detail/BitfieldLoops.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {

using namespace bits;

std::span<const KernelPath<CountLoop>> countPaths()
{
    static const KernelTable<CountLoop> paths({{"plain", true, countPlain}}, countX86());
    return paths;
}

std::span<const KernelPath<FindLoop>> findFirstPaths()
{
    static const KernelTable<FindLoop> paths(
        {{"plain", true, ForAny::run<FindFirstPlain>}, {"blocks", true, ForAny::run<FindFirstByBlocks>}},
        findFirstX86());
    return paths;
}

std::span<const KernelPath<FindLoop>> findLastPaths()
{
    static const KernelTable<FindLoop> paths(
        {{"plain", true, ForAny::run<FindLastPlain>}, {"blocks", true, ForAny::run<FindLastByBlocks>}}, findLastX86());
    return paths;
}

template <typename Op>
std::span<const KernelPath<CombineLoop>> combinePaths()
{
    static const KernelTable<CombineLoop> paths({{"plain", true, ForAny::run<Combine<Op>>}}, combineX86<Op>());
    return paths;
}
template std::span<const KernelPath<CombineLoop>> combinePaths<BitAnd>();
template std::span<const KernelPath<CombineLoop>> combinePaths<BitOr>();
template std::span<const KernelPath<CombineLoop>> combinePaths<BitXor>();

template <typename Op>
std::span<const KernelPath<AnyLoop>> anyPaths()
{
    static const KernelTable<AnyLoop> paths(
        {{"plain", true, ForAny::run<AnyPlain<Op>>}, {"blocks", true, ForAny::run<AnyByBlocks<Op>>}}, anyX86<Op>());
    return paths;
}
template std::span<const KernelPath<AnyLoop>> anyPaths<BitAnd>();
template std::span<const KernelPath<AnyLoop>> anyPaths<BitXor>();
template std::span<const KernelPath<AnyLoop>> anyPaths<BitsMissing>();

}  // namespace kplib::detail
