#include <kplib/system/detail/CrcLoops.h>

#include <array>
#include <bit>
#include <cstdint>
#include <cstring>
#include <initializer_list>
#include <span>

// Plan
//
// The data are a polynomial D over GF(2), the most significant bit of each byte first. The
// register, which starts at 0, is the remainder of D * x^32 modulo the polynomial of CrcLoops.h.
// KpCoder appends the length and inverts the result.
//
//     plain    one byte a step: crc = crc << 8 ^ tables[0][crc >> 24 ^ byte]
//     slicing  eight bytes a step, with a table for each distance from the end of the eight:
//              M. Kounavis and F. Berry, "A Systematic Approach to Building High Performance
//              Software-Based CRC Generators", ISCC 2005
//     pclmul, vpclmul  folding by carry-less products (CrcKernelsX86.cpp)
//
//     bytes of a step   b0    b1    b2    b3    b4    b5    b6    b7
//                        ^     ^     ^     ^
//     register          crc, 4 bytes, is added to the first four
//     table              7     6     5     4     3     2     1     0
//
// The remainder is linear in the bits, so a table entry is the sum of the entries of its bits, and
// the new register is the sum of eight look-ups that do not wait for each other.

namespace kplib::detail {

using namespace crc;

namespace {

// Entry [k][b]: the register after byte b and k zero bytes, from a register of 0.
using Tables = std::array<std::array<std::uint32_t, 256>, 8>;

constexpr Tables makeTables()
{
    Tables tables{};
    for (std::size_t k = 0; k < 8; ++k) {
        for (std::uint32_t b = 1; b < 256; ++b) {
            const std::uint32_t top = b & (b - 1);  // b without its lowest bit; the entry is linear in its bits
            tables[k][b] =
                tables[k][top] ^ (top ? tables[k][b ^ top] : power(32 + 8 * static_cast<int>(k) + std::countr_zero(b)));
        }
    }
    return tables;
}

constexpr Tables tables = makeTables();

// The reference.
std::uint32_t crcPlain(std::uint32_t crc, const unsigned char* data, long n)
{
    for (long i = 0; i < n; ++i)
        crc = crc << 8 ^ tables[0][crc >> 24 ^ data[i]];
    return crc;
}

}  // namespace

std::uint32_t crc::crcSlicing(std::uint32_t crc, const unsigned char* data, long n)
{
    for (; n >= 8; n -= 8, data += 8) {
        std::uint64_t bytes;
        std::memcpy(&bytes, data, 8);
        bytes = __builtin_bswap64(bytes) ^ static_cast<std::uint64_t>(crc) << 32;
        crc = 0;
        for (std::size_t k = 0; k < 8; ++k)
            crc ^= tables[k][bytes >> 8 * k & 0xFF];
    }
    return crcPlain(crc, data, n);
}

std::span<const KernelPath<CrcLoop>> crcPaths()
{
    static const KernelTable<CrcLoop> paths({{"plain", true, crcPlain}, {"slicing", true, crcSlicing}}, crcX86());
    return paths;
}

}  // namespace kplib::detail
