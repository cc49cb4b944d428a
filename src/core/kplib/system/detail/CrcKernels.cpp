#include <kplib/system/detail/CrcLoops.h>

#include <array>
#include <bit>
#include <cstdint>
#include <cstring>
#include <initializer_list>
#include <span>

namespace kplib::detail {

using namespace crc;

namespace {

// Entry [k][b]: what byte b, followed by k zero bytes, makes of a register of zero.
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
