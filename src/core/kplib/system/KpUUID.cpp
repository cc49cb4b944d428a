#include <kplib/system/KpUUID.h>

#include <kplib/system/KpCoder.h>

#include <cerrno>
#include <fcntl.h>
#include <unistd.h>

namespace {

constexpr const char* form = "{00000000-0000-0000-0000-000000000000}";  // 0: a digit

// Fills all `n` bytes, though a signal may cut a read short.
bool readFully(int file, unsigned char* out, size_t n)
{
    while (n > 0) {
        const ssize_t count = read(file, out, n);
        if (count == 0 || (count < 0 && errno != EINTR))
            return false;
        if (count > 0) {
            out += count;
            n -= static_cast<size_t>(count);
        }
    }
    return true;
}

}  // namespace

KpUUID KpUUID::generateUUID()
{
    KpUUID uuid;
    const int file = open("/dev/urandom", O_RDONLY | O_CLOEXEC);
    if (file < 0)
        return uuid;
    const bool isRead = readFully(file, uuid.data(), sizeof uuid);
    close(file);
    return isRead ? uuid : KpUUID();
}

KpString KpUUID::toString() const
{
    KpString text;
    KpCoder::dataToHexString(data(), sizeof(KpUUID), text, true);
    return text;
}

void KpUUID::fromString(const KpString& text)
{
    *this = KpUUID();
    if (text.length() == 32)
        KpCoder::hexStringToData(data(), text);
}

KpString KpUUID::toFormattedString() const
{
    const KpString digits = toString();
    const char* digit = digits.c_str();
    KpString text(form);
    for (char* place = text.data(); *place != '\0'; ++place) {
        if (*place == '0')
            *place = *digit++;
    }
    return text;
}

void KpUUID::fromFormattedString(const KpString& text)
{
    *this = KpUUID();
    if (text.length() != 38)
        return;
    char digits[33] = {};
    char* digit = digits;
    for (int i = 0; i < 38; ++i) {
        if (form[i] == '0')
            *digit++ = text[i];
        else if (text[i] != form[i])
            return;
    }
    KpCoder::hexStringToData(data(), digits);
}
