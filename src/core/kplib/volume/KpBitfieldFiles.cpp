#include <kplib/volume/KpBitfield.h>

#include <kplib/foundation/KpString.h>
#include <kplib/system/KpCoder.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <memory>

namespace {

struct Close {
    void operator()(FILE* f) const { std::fclose(f); }
};
using File = std::unique_ptr<FILE, Close>;

constexpr unsigned long bytesFor(unsigned long nBits)
{
    return (nBits >> 3) + ((nBits & 7) != 0);
}

}  // namespace

void KpBitfield::print(KpString& out) const
{
    out.resize(static_cast<long>(nBits_) + 1);
    char* const text = out.data();
    for (unsigned long i = 0; i < nBits_; ++i)
        text[i] = test(i) ? '1' : '0';
    text[nBits_] = '\0';
}

bool KpBitfield::save(const KpString& file) const
{
    const File f(std::fopen(file.c_str(), "wb"));
    return f && std::fwrite(bits_, 1, bytesFor(nBits_), f.get()) == bytesFor(nBits_) && std::fflush(f.get()) == 0;
}

bool KpBitfield::load(const KpString& file, unsigned long nBits)
{
    resize(nBits, INIT_NONE);
    unsetAll();
    const File f(std::fopen(file.c_str(), "rb"));
    return f && std::fread(bits_, 1, bytesFor(nBits), f.get()) == bytesFor(nBits);
}

void KpBitfield::md5(unsigned char* digest) const
{
    KpCoder coder;
    if (nBits_ != 0) {
        auto* bytes = reinterpret_cast<const unsigned char*>(bits_);
        constexpr unsigned long most = 1UL << 30;  // the coder counts in 32 bits
        for (unsigned long left = nBits_ >> 5, n; left > 0; left -= n, bytes += n) {
            n = std::min(left, most);
            coder.crcMD5Update(bytes, static_cast<unsigned>(n));
        }
        const std::uint32_t last = (nBits_ & 31) != 0 ? lastBits() : bits_[nBits_ >> 5];
        coder.crcMD5Update(reinterpret_cast<const unsigned char*>(&last), sizeof last);
    }
    coder.crcMD5Final();
    coder.crcMD5Query(digest);
}

void KpBitfield::md5(KpString& text) const
{
    unsigned char digest[16];
    md5(digest);
    KpCoder::dataToHexString(digest, sizeof digest, text, true);
}
