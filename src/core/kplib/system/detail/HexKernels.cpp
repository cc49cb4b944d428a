#include <kplib/system/detail/HexLoops.h>

#include <initializer_list>
#include <span>

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

}  // namespace

std::span<const KernelPath<HexLoop>> hexPaths()
{
    static const KernelTable<HexLoop> paths(
        {{"plain", true, writeDigitsPlain}, {"vectors", true, ForAny::run<WriteDigits>}}, hexX86());
    return paths;
}

}  // namespace kplib::detail
