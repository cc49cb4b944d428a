// Version numbers in text: of digits and dots exactly the numbers that stand there, of anything else a value that its
// own text gives again.

#include "Fuzz.h"

#include <kplib/system/KpVersion.h>

#include <array>
#include <charconv>

namespace {

/// What a text without blanks and signs means.
KpVersion plainVersion(const std::string& text)
{
    std::array<unsigned, 4> values{};
    const char* place = text.data();
    const char* const end = place + text.size();
    for (unsigned& value : values) {
        const auto [behind, error] = std::from_chars(place, end, value);
        if (error != std::errc())
            return {};
        if (behind == end || &value == &values.back())
            break;
        if (*behind != '.')
            return {};
        place = behind + 1;
    }
    return {values[0], values[1], values[2], values[3]};
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    const KpVersion version(text);
    check(KpVersion(version.toString()) == version);
    if (text.find_first_of("+- \t\n\v\f\r") == std::string::npos)
        check(version == plainVersion(text));
    return 0;
}
