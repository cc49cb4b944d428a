#include <kplib/system/KpCoder.h>

#include <kplib/foundation/KpString.h>
#include <kplib/system/detail/CoderKernels.h>

#include <span>

using namespace kplib::detail;

unsigned int KpCoder::crc(const unsigned char* data, unsigned int n)
{
    static CrcLoop* const run = best(crcPaths());
    std::uint32_t crc = run(0, data, n);
    for (; n != 0; n >>= 8) {
        const unsigned char lowest = n & 0xFF;
        crc = run(crc, &lowest, 1);
    }
    return ~crc;
}

void KpCoder::dataToHexString(const unsigned char* data, unsigned int n, KpString& out, bool upperCase)
{
    static HexLoop* const run = best(hexPaths());
    const long length = 2 * static_cast<long>(n);
    out.resize(length + 1);
    run(data, out.data(), n, upperCase ? 'A' : 'a');
    out[length] = '\0';
}

namespace {

int hexValue(char c)
{
    return c < 'A' ? c - '0' : c < 'a' ? c - 'A' + 10 : c - 'a' + 10;
}

}  // namespace

void KpCoder::hexStringToData(unsigned char* out, const KpString& text)
{
    for (const char* digits = text.c_str(); digits[0] != '\0' && digits[1] != '\0'; digits += 2)
        *out++ = static_cast<unsigned char>(16 * hexValue(digits[0]) + hexValue(digits[1]));
}
