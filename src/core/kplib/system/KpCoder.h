#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

class KpString;

/// An incremental MD5 (RFC 1321), the CRC of the POSIX cksum utility, and conversion to and from
/// hexadecimal digits.
///
/// Call crcMD5Init() to start again, crcMD5Update() for each block of data, crcMD5Final() once,
/// then crcMD5Query(). The digest is unchanged until the next crcMD5Final(). One thread at a time;
/// a copy continues independently.
class KPLIB_API KpCoder {
public:
    /// The checksum that cksum prints for `n` bytes, which includes the length; all bits set for
    /// none.
    static unsigned int crc(const unsigned char* data, unsigned int n);

    /// Ready for the first crcMD5Update(); the digest is zero.
    KpCoder() { crcMD5Init(); }

    /// Starts a new digest.
    void crcMD5Init();
    /// Adds data. The result does not depend on how data are divided into calls. More than 4 GiB
    /// need several calls.
    void crcMD5Update(const unsigned char* data, unsigned int n);
    /// Ends the digest: padding and length are added.
    void crcMD5Final();
    /// Copies the 16 bytes of the digest.
    void crcMD5Query(unsigned char* out) const;

    /// Replaces `out` by two digits for each byte, the higher one first. `data` must not be in
    /// `out`.
    static void dataToHexString(const unsigned char* data, unsigned int n, KpString& out, bool upperCase);
    /// Converts pairs of digits to bytes until the first NUL; a single last digit gives no byte.
    /// `out` must have text.length() / 2 bytes. No character is rejected: other characters give
    /// bytes too.
    static void hexStringToData(unsigned char* out, const KpString& text);

private:
    std::uint32_t bitCount_[2];  // lower word first
    std::uint32_t state_[4];
    unsigned char buffer_[64];
    unsigned char digest_[16] = {};
};
