#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/foundation/KpTypeList.h>
#include <kplib/system/KpCoder.h>
#include <kplib/system/KpMD5.h>

#include <string>

namespace KpLib {

/// The types that MD5Coder adds as their bytes in memory.
using MD5Images = kplib::detail::ImageValues::With<char, short, unsigned long, KpMat3f>;
template <typename T>
concept MD5Image = MD5Images::contains<T>;

/// An MD5 over values: `MD5Coder() << dims << origin << name`, then md5().
///
/// Values are added as their bytes in memory, so the digest depends on the byte order. One thread
/// at a time.
class KPLIB_API MD5Coder {
public:
    /// Adds the bytes of the value. The caller includes the header of its type.
    template <MD5Image T>
    MD5Coder& operator<<(const T& value)
    {
        feed(&value, sizeof value);
        return *this;
    }
    /// Adds the list's hash().
    MD5Coder& operator<<(const MD5List& list);

    // A text is added after its length in 8 bytes. KpString includes its terminator, std::string
    // does not: the same text gives two digests. Intentional: stored digests depend on it.

    /// @{
    /// Adds the length and the characters.
    MD5Coder& operator<<(const KpString& text);
    MD5Coder& operator<<(const std::string& text);
    /// @}

    /// As a KpString of the same text.
    MD5Coder& operator<<(const char* text);

    /// Adds `n` bytes. For 0 bytes adds the 32-bit number 4711, so that an empty block changes the
    /// digest too.
    MD5Coder& append(const void* data, unsigned long n);

    /// The digest of all data added. Starts a new digest.
    MD5 md5();

private:
    void feed(const void* data, unsigned long n);

    KpCoder coder_;
    bool isOpen_ = true;
};

}  // namespace KpLib
