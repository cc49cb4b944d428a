#include <kplib/rawdata/KpRawData.h>

#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>

#include <unistd.h>

namespace {

constexpr unsigned long streamChunk = 1UL << 20;
constexpr long long limitedRead = 4LL << 20;
constexpr long long unlimitedRead = 0xFFFFFFFFLL;

unsigned long sizeOf(KpTypedPointer data)
{
    return static_cast<unsigned long>(data.type.size());
}

// Has `pass(done, chunk)` pass on the bytes piece by piece until it passes fewer than it is asked to.
template <typename Pass>
unsigned long wholeItems(unsigned long size, unsigned long count, Pass pass)
{
    if (size == 0)
        return 0;
    const unsigned long bytes = size * count;
    unsigned long done = 0;
    while (done < bytes) {
        const unsigned long chunk = std::min(bytes - done, streamChunk);
        const unsigned long passed = pass(done, chunk);
        done += passed;
        if (passed < chunk)
            break;
    }
    return done / size;
}

}  // namespace

unsigned long KpRawData::fread(void* data, unsigned long size, unsigned long count, FILE* f)
{
    return wholeItems(size, count, [=](unsigned long done, unsigned long chunk) {
        return std::fread(static_cast<char*>(data) + done, 1, chunk, f);
    });
}

unsigned long KpRawData::fwrite(const void* data, unsigned long size, unsigned long count, FILE* f)
{
    return wholeItems(size, count, [=](unsigned long done, unsigned long chunk) {
        return std::fwrite(static_cast<const char*>(data) + done, 1, chunk, f);
    });
}

long KpRawData::readBigEndian(KpTypedPointer data, unsigned long n, FILE* f)
{
    const long result = readLittleEndian(data, n, f);
    swapBytes(data, n);
    return result;
}

long KpRawData::writeBigEndian(KpTypedPointer data, unsigned long n, FILE* f)
{
    swapBytes(data, n);
    const long result = writeLittleEndian(data, n, f);
    swapBytes(data, n);
    return result;
}

long KpRawData::readLittleEndian(KpTypedPointer data, unsigned long n, FILE* f)
{
    return static_cast<long>(fread(data.data, sizeOf(data), n, f));
}

long KpRawData::writeLittleEndian(KpTypedPointer data, unsigned long n, FILE* f)
{
    return static_cast<long>(fwrite(data.data, sizeOf(data), n, f));
}

long long KpRawData::read(int fd, void* data, long long size, bool limitChunkSize)
{
    const long long limit = limitChunkSize ? limitedRead : unlimitedRead;
    long long done = 0;
    while (done < size) {
        const long long chunk = std::min(size - done, limit);
        const long long got = ::read(fd, static_cast<char*>(data) + done, static_cast<size_t>(chunk));
        if (got < 0) {
            const int error = errno;
            getTheLogInstance().errorf("KpRawData::read() failed, ret=%lld, size=%lld, errno=%d (%s)", got, chunk,
                                       error, std::strerror(error));
        }
        if (got <= 0)
            break;
        done += got;
    }
    return done;
}

unsigned long KpRawData::write(int fd, const void* data, unsigned long size)
{
    unsigned long done = 0;
    while (done < size) {
        const ssize_t put = ::write(fd, static_cast<const char*>(data) + done, size - done);
        if (put <= 0)  // 0 bytes written is a failure too: the loop would not end
            return ~0UL;
        done += static_cast<unsigned long>(put);
    }
    return done;
}
