#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

class KpString;

/// A running MD5 (RFC 1321), and beside it the CRC of the POSIX cksum utility and hexadecimal digits.
///
/// crcMD5Init() to start again, crcMD5Update() as often as there is data, crcMD5Final() once, then
/// crcMD5Query(). The digest stays as it is until the next crcMD5Final(). One thread at a time; a
/// copy continues on its own.
class KPLIB_API KpCoder {
public:
    /// The checksum that cksum prints for `n` bytes, which takes in the length too; all ones for none.
    static unsigned int crc(const unsigned char* data, unsigned int n);

    /// Ready for the first crcMD5Update(); the digest is zero.
    KpCoder() { crcMD5Init(); }

    /// Starts a new digest.
    void crcMD5Init();
    /// In pieces of any size: only their sequence counts. More than 4 GiB come in several.
    void crcMD5Update(const unsigned char* data, unsigned int n);
    /// Ends the digest: padding and length are added.
    void crcMD5Final();
    /// Copies the 16 bytes of the digest.
    void crcMD5Query(unsigned char* out) const;

    /// Replaces `out`, in which `data` must not lie, by two digits a byte, the higher one first.
    static void dataToHexString(const unsigned char* data, unsigned int n, KpString& out, bool upperCase);
    /// Two digits a byte until the first NUL; a single digit before it gives no byte. `out` has
    /// room for text.length() / 2 bytes. No character is rejected: characters that are no digits
    /// give bytes, too.
    static void hexStringToData(unsigned char* out, const KpString& text);

private:
    std::uint32_t bitCount_[2];  // lower word first
    std::uint32_t state_[4];
    unsigned char buffer_[64];
    unsigned char digest_[16] = {};
};
