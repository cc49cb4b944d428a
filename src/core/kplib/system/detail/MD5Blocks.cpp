#include <kplib/system/KpCoder.h>

#include <kplib/system/detail/CoderKernels.h>

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>
#include <utility>

namespace kplib::detail {
namespace {

constexpr std::uint32_t sines[64] = {
    0xd76aa478, 0xe8c7b756, 0x242070db, 0xc1bdceee, 0xf57c0faf, 0x4787c62a, 0xa8304613, 0xfd469501,
    0x698098d8, 0x8b44f7af, 0xffff5bb1, 0x895cd7be, 0x6b901122, 0xfd987193, 0xa679438e, 0x49b40821,
    0xf61e2562, 0xc040b340, 0x265e5a51, 0xe9b6c7aa, 0xd62f105d, 0x02441453, 0xd8a1e681, 0xe7d3fbc8,
    0x21e1cde6, 0xc33707d6, 0xf4d50d87, 0x455a14ed, 0xa9e3e905, 0xfcefa3f8, 0x676f02d9, 0x8d2a4c8a,
    0xfffa3942, 0x8771f681, 0x6d9d6122, 0xfde5380c, 0xa4beea44, 0x4bdecfa9, 0xf6bb4b60, 0xbebfbc70,
    0x289b7ec6, 0xeaa127fa, 0xd4ef3085, 0x04881d05, 0xd9d4d039, 0xe6db99e5, 0x1fa27cf8, 0xc4ac5665,
    0xf4292244, 0x432aff97, 0xab9423a7, 0xfc93a039, 0x655b59c3, 0x8f0ccc92, 0xffeff47d, 0x85845dd1,
    0x6fa87e4f, 0xfe2ce6e0, 0xa3014314, 0x4e0811a1, 0xf7537e82, 0xbd3af235, 0x2ad7d2bb, 0xeb86d391,
};
constexpr int rotations[4][4] = {{7, 12, 17, 22}, {5, 9, 14, 20}, {4, 11, 16, 23}, {6, 10, 15, 21}};

// Forces `value` to be computed as written: compilers reorder sums, with more steps after the
// newest term.
[[gnu::always_inline]] inline void settle(std::uint32_t& value)
{
    asm("" : "+r"(value));
}

// Step I of the 64. The chain from b, the result of the step before, takes all the time. So each
// round adds to `sum` the terms without b, and as few operations as possible depend on b:
// otherwise clang takes a third longer.
template <int I>
[[gnu::always_inline]] inline void step(std::uint32_t (&words)[4], const unsigned char* block)
{
    constexpr int round = I / 16;
    constexpr int source = (round == 0 ? I : round == 1 ? 5 * I + 1 : round == 2 ? 3 * I + 5 : 7 * I) % 16;
    std::uint32_t& a = words[(64 - I) % 4];
    const std::uint32_t b = words[(65 - I) % 4], c = words[(66 - I) % 4], d = words[(67 - I) % 4];
    std::uint32_t word;
    std::memcpy(&word, block + 4 * source, 4);
    std::uint32_t sum = a + word + sines[I];
    if constexpr (round == 0) {
        settle(sum);
        sum += ((c ^ d) & b) ^ d;
    } else if constexpr (round == 1) {
        sum += ~d & c;  // has no bit in common with d & b, so addition equals or
        settle(sum);
        sum += d & b;
    } else if constexpr (round == 2) {
        settle(sum);
        std::uint32_t known = c ^ d;
        settle(known);
        sum += known ^ b;
    } else {
        settle(sum);
        sum += (b | ~d) ^ c;
    }
    a = std::rotl(sum, rotations[round][I % 4]) + b;
}

template <int... I>
[[gnu::always_inline]] inline void allSteps(std::uint32_t (&words)[4], const unsigned char* block,
                                            std::integer_sequence<int, I...>)
{
    (step<I>(words, block), ...);
}

}  // namespace

void md5Blocks(std::uint32_t* state, const unsigned char* data, long blocks)
{
    std::uint32_t words[4] = {state[0], state[1], state[2], state[3]};
    for (; blocks > 0; --blocks, data += 64) {
        const std::uint32_t before[4] = {words[0], words[1], words[2], words[3]};
        allSteps(words, data, std::make_integer_sequence<int, 64>());
        for (int i = 0; i < 4; ++i)
            words[i] += before[i];
    }
    std::copy_n(words, 4, state);
}

}  // namespace kplib::detail

void KpCoder::crcMD5Init()
{
    bitCount_[0] = bitCount_[1] = 0;
    state_[0] = 0x67452301;
    state_[1] = 0xefcdab89;
    state_[2] = 0x98badcfe;
    state_[3] = 0x10325476;
}

void KpCoder::crcMD5Update(const unsigned char* data, unsigned int n)
{
    const unsigned int used = bitCount_[0] / 8 % 64;
    bitCount_[0] += n << 3;
    bitCount_[1] += (n >> 29) + (bitCount_[0] < n << 3);
    if (used > 0) {
        const unsigned int first = std::min(n, 64 - used);
        std::copy_n(data, first, buffer_ + used);
        if (used + first < 64)
            return;
        kplib::detail::md5Blocks(state_, buffer_, 1);
        data += first;
        n -= first;
    }
    kplib::detail::md5Blocks(state_, data, n / 64);
    std::copy_n(data + n / 64 * 64, n % 64, buffer_);
}

void KpCoder::crcMD5Final()
{
    static constexpr unsigned char padding[64] = {0x80};
    unsigned char bitCount[8];
    std::memcpy(bitCount, bitCount_, 8);
    const unsigned int used = bitCount_[0] / 8 % 64;
    crcMD5Update(padding, used < 56 ? 56 - used : 120 - used);
    crcMD5Update(bitCount, 8);
    std::memcpy(digest_, state_, 16);
}

void KpCoder::crcMD5Query(unsigned char* out) const
{
    std::copy_n(digest_, 16, out);
}
