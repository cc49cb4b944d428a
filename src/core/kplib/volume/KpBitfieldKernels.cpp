#include <kplib/volume/detail/KpBitfieldKernels.h>

#include <bit>

namespace kplib::detail {
namespace {

unsigned long countPlain(const BitWord* words, unsigned long n)
{
    unsigned long count = 0;
    for (unsigned long i = 0; i < n; ++i)
        count += static_cast<unsigned long>(std::popcount(words[i]));
    return count;
}

unsigned long findFirstPlain(const BitWord* words, unsigned long n, BitWord skipped)
{
    unsigned long i = 0;
    while (i < n && words[i] == skipped)
        ++i;
    return i;
}

unsigned long findLastPlain(const BitWord* words, unsigned long n, BitWord skipped)
{
    for (unsigned long i = n; i > 0; --i) {
        if (words[i - 1] != skipped)
            return i - 1;
    }
    return n;
}

template <typename Op>
void combinePlain(BitWord* a, const BitWord* b, unsigned long n)
{
    for (unsigned long i = 0; i < n; ++i)
        a[i] = Op::of(a[i], b[i]);
}

template <typename Op>
bool anyPlain(const BitWord* a, const BitWord* b, unsigned long n)
{
    for (unsigned long i = 0; i < n; ++i) {
        if (Op::of(a[i], b[i]) != 0)
            return true;
    }
    return false;
}

}  // namespace

std::span<const KernelPath<CountLoop>> countPaths()
{
    static const KernelPath<CountLoop> paths[] = {{"plain", true, countPlain}};
    return paths;
}

std::span<const KernelPath<FindLoop>> findFirstPaths()
{
    static const KernelPath<FindLoop> paths[] = {{"plain", true, findFirstPlain}};
    return paths;
}

std::span<const KernelPath<FindLoop>> findLastPaths()
{
    static const KernelPath<FindLoop> paths[] = {{"plain", true, findLastPlain}};
    return paths;
}

template <typename Op>
std::span<const KernelPath<CombineLoop>> combinePaths()
{
    static const KernelPath<CombineLoop> paths[] = {{"plain", true, combinePlain<Op>}};
    return paths;
}
template std::span<const KernelPath<CombineLoop>> combinePaths<BitAnd>();
template std::span<const KernelPath<CombineLoop>> combinePaths<BitOr>();
template std::span<const KernelPath<CombineLoop>> combinePaths<BitXor>();

template <typename Op>
std::span<const KernelPath<AnyLoop>> anyPaths()
{
    static const KernelPath<AnyLoop> paths[] = {{"plain", true, anyPlain<Op>}};
    return paths;
}
template std::span<const KernelPath<AnyLoop>> anyPaths<BitAnd>();
template std::span<const KernelPath<AnyLoop>> anyPaths<BitXor>();
template std::span<const KernelPath<AnyLoop>> anyPaths<BitsMissing>();

}  // namespace kplib::detail
