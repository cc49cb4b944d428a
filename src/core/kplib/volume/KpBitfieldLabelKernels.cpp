#include <kplib/volume/detail/KpBitfieldKernels.h>

#include <algorithm>

namespace kplib::detail {
namespace {

bool isZero(const unsigned char* four)
{
    return four[0] == 0 && four[1] == 0 && four[2] == 0 && four[3] == 0;
}

void fromLabelsPlain(BitWord* words, const unsigned char* labels, unsigned long n, unsigned char label)
{
    std::fill_n(words, n / 32 + 1, BitWord{0});
    for (unsigned long i = 0; i < n; ++i) {
        const unsigned long four = i / 4 * 4;
        const bool isSkipped = four + 4 <= n && isZero(labels + four);
        if (labels[i] == label && !isSkipped)
            words[i / 32] |= 1U << i % 32;
    }
}

template <KpBitfield::InsertPolicy policy>
unsigned char merged(bool isSet, unsigned char old, unsigned char label)
{
    switch (policy) {
    case KpBitfield::INSERT_SET:
        return isSet ? label : old;
    case KpBitfield::INSERT_INTO_EMPTY:
        return isSet && old == 0 ? label : old;
    case KpBitfield::INSERT_REPLACE:
        return isSet ? label : 0;
    case KpBitfield::INSERT_OWN:
        return old != 0 && old != label ? old : isSet ? label : 0;
    }
    return old;
}

template <KpBitfield::InsertPolicy policy>
void toLabelsPlain(const BitWord* words, unsigned char* labels, unsigned long n, unsigned char label)
{
    for (unsigned long i = 0; i < n; ++i)
        labels[i] = merged<policy>((words[i / 32] >> i % 32 & 1) != 0, labels[i], label);
}

ToLabelsLoop* toLabelsPlainLoop(KpBitfield::InsertPolicy policy)
{
    switch (policy) {
    case KpBitfield::INSERT_SET:
        return toLabelsPlain<KpBitfield::INSERT_SET>;
    case KpBitfield::INSERT_INTO_EMPTY:
        return toLabelsPlain<KpBitfield::INSERT_INTO_EMPTY>;
    case KpBitfield::INSERT_REPLACE:
        return toLabelsPlain<KpBitfield::INSERT_REPLACE>;
    case KpBitfield::INSERT_OWN:
        return toLabelsPlain<KpBitfield::INSERT_OWN>;
    }
    return nullptr;
}

}  // namespace

std::span<const KernelPath<FromLabelsLoop>> fromLabelsPaths()
{
    static const KernelPath<FromLabelsLoop> paths[] = {{"plain", true, fromLabelsPlain}};
    return paths;
}

std::span<const KernelPath<ToLabelsLoops>> toLabelsPaths()
{
    static const KernelPath<ToLabelsLoops> paths[] = {{"plain", true, toLabelsPlainLoop}};
    return paths;
}

}  // namespace kplib::detail
