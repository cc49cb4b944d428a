#include <kplib/rawdata/KpPackedIndexing.h>

#include <kplib/cpu/FlagBits.h>
#include <kplib/volume/KpBitfield.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <cstring>

using kplib::detail::bitsOfFlags;

namespace {

constexpr std::uint64_t eachByte = 0x0101010101010101;

// The results of eight positions with these flags, a byte each: all ones if flagged, and the
// number of flags before it.
struct Eight {
    std::uint64_t isFlagged = 0;
    std::uint64_t rank = 0;
};

constexpr std::array<Eight, 256> makeEights()
{
    std::array<Eight, 256> eights{};
    for (unsigned bits = 0; bits < 256; ++bits) {
        for (unsigned i = 0; i < 8; ++i) {
            const unsigned before = bits & ((1U << i) - 1);
            if (bits >> i & 1) {
                eights[bits].isFlagged |= std::uint64_t{0xFF} << 8 * i;
                eights[bits].rank |= static_cast<std::uint64_t>(std::popcount(before)) << 8 * i;
            }
        }
    }
    return eights;
}

constexpr std::array<Eight, 256> eights = makeEights();

}  // namespace

// `eightFlags(i, count)` gives the flags of `count` positions from i on as bits; 8, but for the end.
template <typename EightFlags>
void KpPackedIndexing::build(long n, EightFlags eightFlags)
{
    offsets_.resize(n);
    blockBase_.resize((offsets_.size() + blockSize - 1) / blockSize);
    unsigned char* const offsets = offsets_.data();
    int count = 0, base = 0;
    for (long i = 0; i < n; i += 8) {
        if (i % blockSize == 0)
            blockBase_[i / blockSize] = base = count;
        const long here = std::min(8L, n - i);
        const unsigned flags = eightFlags(i, here);
        const Eight& eight = eights[flags];
        const std::uint64_t eightOffsets =
            eight.rank + (eight.isFlagged & static_cast<std::uint64_t>(count - base) * eachByte);
        std::memcpy(offsets + i, &eightOffsets, static_cast<std::size_t>(here));
        count += std::popcount(flags);
    }
    count_ = count;
}

KpPackedIndexing::KpPackedIndexing(const unsigned char* flags, int n)
{
    build(n, [flags](long i, long count) { return static_cast<unsigned>(bitsOfFlags(flags + i, count)); });
}

KpPackedIndexing::KpPackedIndexing(const KpBitfield& bits)
{
    auto* bytes = reinterpret_cast<const unsigned char*>(bits.data());
    build(static_cast<long>(bits.nBits()), [bytes](long i, long count) { return bytes[i / 8] & ((1U << count) - 1); });
}
