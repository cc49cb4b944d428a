#pragma once

#include <kplib/system/detail/CoderKernels.h>

namespace kplib::detail {

KPLIB_X86_ROWS(HexLoop, hexX86);

// Without a table, so that the compiler vectorises it.
struct WriteDigits {
    KPLIB_KERNEL_BODY static char digit(unsigned char value, unsigned char toLetter)
    {
        return static_cast<char>(value + '0' + (value > 9 ? toLetter : 0));
    }

    KPLIB_KERNEL_BODY static void run(const unsigned char* __restrict data, char* __restrict text, long n, char a)
    {
        const auto toLetter = static_cast<unsigned char>(a - '0' - 10);
        for (long i = 0; i < n; ++i) {
            text[2 * i] = digit(data[i] >> 4, toLetter);
            text[2 * i + 1] = digit(data[i] & 15, toLetter);
        }
    }
};

}  // namespace kplib::detail
