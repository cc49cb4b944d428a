#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/system/KpCoder.h>
#include <kplib/system/KpMD5.h>
#include <kplib/system/KpUUID.h>

#include <cctype>
#include <string_view>
#include <vector>

// Digests, UUIDs and digits from any text: what is read is written again the same way.

namespace {

void readsDigits(const KpString& text)
{
    std::vector<unsigned char> bytes(static_cast<size_t>(text.length() / 2));  // exactly what may be written
    KpCoder::hexStringToData(bytes.data(), text);
    KpString digits;
    KpCoder::dataToHexString(bytes.data(), static_cast<unsigned int>(bytes.size()), digits, true);
    std::string upper{std::string_view(text)};
    for (char& c : upper) {
        if (!std::isxdigit(static_cast<unsigned char>(c)))
            return;
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    check(digits == upper.substr(0, upper.size() / 2 * 2).c_str());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const KpString text(std::string_view(reinterpret_cast<const char*>(data), size));
    readsDigits(text);

    KpLib::MD5 digest, digestAgain;
    digest.fromString(text);
    KpString written;
    digest.toString(written);
    digestAgain.fromString(written);
    check(digest == digestAgain && (size == 32 || digest.isNull()));

    KpUUID uuid, again;
    uuid.fromString(text);
    again.fromFormattedString(uuid.toFormattedString());
    check(uuid == again && (size == 32 || uuid == KpUUID()));
    uuid.fromFormattedString(text);
    again.fromString(uuid.toString());
    check(uuid == again && (size == 38 || uuid == KpUUID()));
    return 0;
}
