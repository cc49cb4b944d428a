#include <kplib/system/detail/CoderKernels.h>

namespace kplib::detail {
namespace {

// The reference.
void writeDigitsPlain(const unsigned char* data, char* text, long n, char a)
{
    const char* const digits = a == 'A' ? "0123456789ABCDEF" : "0123456789abcdef";
    for (long i = 0; i < n; ++i) {
        text[2 * i] = digits[data[i] >> 4];
        text[2 * i + 1] = digits[data[i] & 15];
    }
}

/// Without a table, so that it is done in vectors.
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

}  // namespace

std::span<const KernelPath<HexLoop>> hexPaths()
{
    static const KernelPath<HexLoop> paths[] = {
        {"plain", true, writeDigitsPlain},
        {"vectors", true, ForAny::run<WriteDigits>},
        {"avx2", hasAvx2(), ForAvx2::run<WriteDigits>},
        {"avx512", hasAvx512(), ForAvx512::run<WriteDigits>},
    };
    return paths;
}

}  // namespace kplib::detail
