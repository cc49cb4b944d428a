#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/foundation/KpTypeList.h>
#include <kplib/system/KpCoder.h>
#include <kplib/system/KpMD5.h>

#include <string>

namespace KpLib {

/// The types whose memory image MD5Coder takes as it is.
using MD5Images = kplib::detail::ImageValues::With<char, short, unsigned long, KpMat3f>;
template <typename T>
concept MD5Image = MD5Images::contains<T>;

/// An MD5 over values: `MD5Coder() << dims << origin << name`, then md5().
///
/// Values count with their bytes in memory, so the digest is not portable between byte orders. One thread at a time.
class KPLIB_API MD5Coder {
public:
    /// Takes the bytes of the value. Its header is the caller's to include.
    template <MD5Image T>
    MD5Coder& operator<<(const T& value)
    {
        feed(&value, sizeof value);
        return *this;
    }
    /// The list's hash().
    MD5Coder& operator<<(const MD5List& list);

    // A text is led by its length in 8 bytes. KpString counts its terminator and feeds it,
    // std::string does not: so the same text gives two digests. Stored digests depend on this.

    /// @{
    /// Takes the length and the characters.
    MD5Coder& operator<<(const KpString& text);
    MD5Coder& operator<<(const std::string& text);
    /// @}

    /// As the KpString made of it.
    MD5Coder& operator<<(const char* text);

    /// Takes `n` bytes; for none the 32-bit number 4711, so that an empty block changes the digest too.
    MD5Coder& append(const void* data, unsigned long n);

    /// The digest of all that was taken. It ends this run; what comes next begins another one.
    MD5 md5();

private:
    void feed(const void* data, unsigned long n);

    KpCoder coder_;
    bool isOpen_ = true;
};

}  // namespace KpLib
