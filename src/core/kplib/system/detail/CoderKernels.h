#pragma once

#include <kplib/cpu/KernelPath.h>

#include <cstdint>
#include <span>

namespace kplib::detail {

// Takes the 64-byte `blocks` into the four words of an MD5 state.
void md5Blocks(std::uint32_t* state, const unsigned char* data, long blocks);

// The CRC register after `n` more bytes: polynomial 0x04C11DB7, most significant bit first.
using CrcLoop = std::uint32_t(std::uint32_t crc, const unsigned char* data, long n);

std::span<const KernelPath<CrcLoop>> crcPaths();

// Writes two digits for each of the `n` bytes; the letters begin with `a`, that is 'A' or 'a'.
using HexLoop = void(const unsigned char* data, char* text, long n, char a);

std::span<const KernelPath<HexLoop>> hexPaths();

}  // namespace kplib::detail
