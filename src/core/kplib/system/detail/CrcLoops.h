#pragma once

#include <kplib/system/detail/CoderKernels.h>

#include <cstdint>

namespace kplib::detail {

KPLIB_X86_ROWS(CrcLoop, crcX86);

namespace crc {

constexpr std::uint32_t polynomial = 0x04C11DB7;

// x^n modulo the polynomial: the remainder of a bit n places above the last one.
constexpr std::uint32_t power(int n)
{
    std::uint32_t remainder = 1;
    for (; n > 0; --n)
        remainder = remainder << 1 ^ (remainder >> 31 ? polynomial : 0);
    return remainder;
}

// Eight bytes a step.
CrcLoop crcSlicing;

}  // namespace crc
}  // namespace kplib::detail
