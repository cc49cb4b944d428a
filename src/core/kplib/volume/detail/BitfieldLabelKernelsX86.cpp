#include <kplib/cpu/KernelPathX86.h>
#include <kplib/volume/detail/BitfieldLabelLoops.h>

#include <cstring>
#include <immintrin.h>

namespace kplib::detail {

using namespace labels;

namespace {

// Without the aligned groups of four set bits.
template <typename Bits>
KPLIB_KERNEL_BODY Bits withoutFours(Bits bits)
{
    constexpr Bits lowest = static_cast<Bits>(0x1111111111111111);
    const Bits pairs = bits & bits >> 1;
    return bits & ~((pairs & pairs >> 2 & lowest) * 15);
}

// A register of labels and as many bits, with intrinsics: the compiler does not vectorise bits to
// bytes and back.

KPLIB_TARGET_AVX2 void fromLabelsAvx2(BitWord* words, const unsigned char* labels, unsigned long n, unsigned char label)
{
    const __m256i wanted = _mm256_set1_epi8(static_cast<char>(label));
    unsigned long i = 0;
    for (; i + 32 <= n; i += 32) {
        const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(labels + i));
        const auto bits = static_cast<BitWord>(_mm256_movemask_epi8(_mm256_cmpeq_epi8(v, wanted)));
        words[i / 32] = label == 0 ? withoutFours(bits) : bits;
    }
    fromLabelsPlain(words + i / 32, labels + i, n - i, label);
}

KPLIB_TARGET_AVX512 void fromLabelsAvx512(BitWord* words, const unsigned char* labels, unsigned long n,
                                          unsigned char label)
{
    const __m512i wanted = _mm512_set1_epi8(static_cast<char>(label));
    unsigned long i = 0;
    for (; i + 64 <= n; i += 64) {
        std::uint64_t bits = _mm512_cmpeq_epi8_mask(_mm512_loadu_si512(labels + i), wanted);
        bits = label == 0 ? withoutFours(bits) : bits;
        std::memcpy(words + i / 32, &bits, sizeof bits);
    }
    fromLabelsPlain(words + i / 32, labels + i, n - i, label);
}

typedef unsigned char Labels32 __attribute__((vector_size(32)));
typedef unsigned char Labels64 __attribute__((vector_size(64)));

// A register of labels merged with `ones`, which holds all ones where the bit is set.
template <Policy policy, typename Labels>
KPLIB_KERNEL_BODY void merge(unsigned char* labels, const Labels& ones, const Labels& label)
{
    Labels old;
    const Labels wanted = ones & label;
    std::memcpy(&old, labels, sizeof old);
    if constexpr (policy == Policy::INSERT_SET)
        old = wanted | (old & ~ones);
    else if constexpr (policy == Policy::INSERT_INTO_EMPTY)
        old = old == 0 ? wanted : old;
    else if constexpr (policy == Policy::INSERT_REPLACE)
        old = wanted;
    else {  // the smaller of two is 0 where one is: gcc goes byte by byte if it has to join two comparisons
        const Labels other = old ^ label;
        old = (old < other ? old : other) == 0 ? wanted : old;
    }
    std::memcpy(labels, &old, sizeof old);
}

// Whether labels without a set bit stay unchanged and need not be read.
template <Policy policy>
constexpr bool needsBits = policy == Policy::INSERT_SET || policy == Policy::INSERT_INTO_EMPTY;

template <Policy policy>
KPLIB_TARGET_AVX2 void toLabelsAvx2(const BitWord* words, unsigned char* labels, unsigned long n, unsigned char label)
{
    const Labels32 all = label - Labels32{};
    const __m256i byteOf = _mm256_setr_epi64x(0, 0x0101010101010101, 0x0202020202020202, 0x0303030303030303);
    const __m256i bitOf = _mm256_set1_epi64x(static_cast<long long>(0x8040201008040201));
    unsigned long i = 0;
    for (; i + 32 <= n; i += 32) {
        const BitWord bits = words[i / 32];
        if (needsBits<policy> && bits == 0)
            continue;
        const __m256i bytes = _mm256_shuffle_epi8(_mm256_set1_epi32(static_cast<int>(bits)), byteOf);
        const auto ones = reinterpret_cast<Labels32>(_mm256_cmpeq_epi8(_mm256_and_si256(bytes, bitOf), bitOf));
        merge<policy>(labels + i, ones, all);
    }
    toLabelsPlain<policy>(words + i / 32, labels + i, n - i, label);
}

template <Policy policy>
KPLIB_TARGET_AVX512 void toLabelsAvx512(const BitWord* words, unsigned char* labels, unsigned long n,
                                        unsigned char label)
{
    const Labels64 all = label - Labels64{};
    unsigned long i = 0;
    for (; i + 64 <= n; i += 64) {
        std::uint64_t bits;
        std::memcpy(&bits, words + i / 32, sizeof bits);
        if (needsBits<policy> && bits == 0)
            continue;
        merge<policy>(labels + i, reinterpret_cast<Labels64>(_mm512_movm_epi8(bits)), all);
    }
    toLabelsPlain<policy>(words + i / 32, labels + i, n - i, label);
}

struct Avx2 {
    template <Policy policy>
    static constexpr ToLabelsLoop* run = toLabelsAvx2<policy>;
};
struct Avx512 {
    template <Policy policy>
    static constexpr ToLabelsLoop* run = toLabelsAvx512<policy>;
};

}  // namespace

std::span<const KernelPath<FromLabelsLoop>> fromLabelsX86()
{
    static const KernelPath<FromLabelsLoop> paths[] = {{"avx2", hasAvx2(), fromLabelsAvx2},
                                                       {"avx512", hasAvx512(), fromLabelsAvx512}};
    return paths;
}

std::span<const KernelPath<ToLabelsLoops>> toLabelsX86()
{
    static const KernelPath<ToLabelsLoops> paths[] = {{"avx2", hasAvx2(), loopOf<Avx2>},
                                                      {"avx512", hasAvx512(), loopOf<Avx512>}};
    return paths;
}

}  // namespace kplib::detail
