#include <kplib/system/KpMD5Coder.h>

#include <kplib/foundation/KpString.h>
#include <kplib/system/KpMD5List.h>

#include <algorithm>

namespace KpLib {

MD5Coder& MD5Coder::operator<<(const MD5List& list)
{
    return *this << list.hash();
}

MD5Coder& MD5Coder::operator<<(const KpString& text)
{
    *this << text.size();
    feed(text.data(), static_cast<unsigned long>(text.size()));
    return *this;
}

MD5Coder& MD5Coder::operator<<(const std::string& text)
{
    *this << text.size();
    feed(text.data(), text.size());
    return *this;
}

MD5Coder& MD5Coder::operator<<(const char* text)
{
    return *this << KpString(text);
}

MD5Coder& MD5Coder::append(const void* data, unsigned long n)
{
    if (n == 0)
        return *this << 4711;
    feed(data, n);
    return *this;
}

MD5 MD5Coder::md5()
{
    if (isOpen_)
        coder_.crcMD5Final();
    isOpen_ = false;
    MD5 digest;
    coder_.crcMD5Query(digest.data());
    return digest;
}

void MD5Coder::feed(const void* data, unsigned long n)
{
    constexpr unsigned long piece = 1UL << 30;  // what crcMD5Update() can count
    if (!isOpen_)
        coder_.crcMD5Init();
    isOpen_ = true;
    for (auto* bytes = static_cast<const unsigned char*>(data); n > 0;) {
        const unsigned long count = std::min(n, piece);
        coder_.crcMD5Update(bytes, static_cast<unsigned int>(count));
        bytes += count;
        n -= count;
    }
}

}  // namespace KpLib
