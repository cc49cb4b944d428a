#include <kplib/system/KpMD5.h>

#include <kplib/foundation/KpString.h>
#include <kplib/system/KpCoder.h>

namespace KpLib {

void MD5::toString(KpString& out) const
{
    KpCoder::dataToHexString(data(), isNull() ? 0 : sizeof(MD5), out, true);
}

void MD5::fromString(const KpString& text)
{
    *this = MD5();
    if (text.length() == 32)
        KpCoder::hexStringToData(data(), text);
}

}  // namespace KpLib
