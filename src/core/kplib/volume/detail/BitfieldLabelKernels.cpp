#include <kplib/volume/detail/BitfieldLabelLoops.h>

#include <algorithm>
#include <initializer_list>
#include <span>

namespace kplib::detail {

using namespace labels;

namespace {

bool isZero(const unsigned char* four)
{
    return four[0] == 0 && four[1] == 0 && four[2] == 0 && four[3] == 0;
}

struct Plain {
    template <Policy policy>
    static constexpr ToLabelsLoop* run = toLabelsPlain<policy>;
};

}  // namespace

void labels::fromLabelsPlain(BitWord* words, const unsigned char* labels, unsigned long n, unsigned char label)
{
    std::fill_n(words, n / 32 + 1, BitWord{0});
    for (unsigned long i = 0; i < n; ++i) {
        const unsigned long four = i / 4 * 4;
        const bool isSkipped = four + 4 <= n && isZero(labels + four);
        if (labels[i] == label && !isSkipped)
            words[i / 32] |= 1U << i % 32;
    }
}

std::span<const KernelPath<FromLabelsLoop>> fromLabelsPaths()
{
    static const KernelTable<FromLabelsLoop> paths({{"plain", true, fromLabelsPlain}}, fromLabelsX86());
    return paths;
}

std::span<const KernelPath<ToLabelsLoops>> toLabelsPaths()
{
    static const KernelTable<ToLabelsLoops> paths({{"plain", true, loopOf<Plain>}}, toLabelsX86());
    return paths;
}

}  // namespace kplib::detail
