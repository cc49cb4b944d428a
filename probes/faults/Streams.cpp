// fopen() in place of the C library's: its streams come from fopencookie(), whose reads and writes are calls that may
// fail. So the buffers of stdio meet the failures of descriptors.

#include "Fail.h"

#include <array>
#include <atomic>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

using namespace kplib::probe;

namespace {

int descriptorOf(void* cookie)
{
    return static_cast<int>(reinterpret_cast<std::intptr_t>(cookie));
}

ssize_t readStream(void* cookie, char* to, size_t size)
{
    return ::read(descriptorOf(cookie), to, size);
}

/// Goes on after a short count, as stdio does with files of its own.
ssize_t writeStream(void* cookie, const char* from, size_t size)
{
    size_t done = 0;
    while (done < size) {
        const ssize_t n = ::write(descriptorOf(cookie), from + done, size - done);
        if (n < 0)
            break;
        done += static_cast<size_t>(n);
    }
    return static_cast<ssize_t>(done);
}

int seekStream(void* cookie, off64_t* offset, int whence)
{
    const off64_t at = lseek64(descriptorOf(cookie), *offset, whence);
    if (at < 0)
        return -1;
    *offset = at;
    return 0;
}

int closeStream(void* cookie)
{
    return ::close(descriptorOf(cookie));
}

/// The streams that are open, for fileno().
struct Open {
    std::atomic<FILE*> stream;
    int descriptor;
};
std::array<Open, 64> streams;

void remember(FILE* stream, int descriptor)
{
    for (Open& open : streams) {
        FILE* none = nullptr;
        if (open.stream.compare_exchange_strong(none, stream)) {
            open.descriptor = descriptor;
            return;
        }
    }
}

int flagsOf(const char* mode)
{
    const int access = std::strchr(mode, '+') ? O_RDWR : *mode == 'r' ? O_RDONLY : O_WRONLY;
    const int how = *mode == 'w' ? O_CREAT | O_TRUNC : *mode == 'a' ? O_CREAT | O_APPEND : 0;
    return access | how | (std::strchr(mode, 'e') ? O_CLOEXEC : 0);
}

}  // namespace

extern "C" FILE* fopen(const char* path, const char* mode)
{
    const int descriptor = ::open(path, flagsOf(mode), 0666);
    if (descriptor < 0)
        return nullptr;
    void* const cookie = reinterpret_cast<void*>(std::intptr_t{descriptor});
    FILE* const stream = fopencookie(cookie, mode, {readStream, writeStream, seekStream, closeStream});
    if (stream)
        remember(stream, descriptor);
    return stream;
}

extern "C" FILE* fopen64(const char* path, const char* mode)
{
    return fopen(path, mode);
}

extern "C" int fileno(FILE* stream) noexcept
{
    static auto* const call = real<int(FILE*)>("fileno");
    for (const Open& open : streams) {
        if (open.stream == stream)
            return open.descriptor;
    }
    return call(stream);
}

extern "C" int fclose(FILE* stream)
{
    static auto* const call = real<int(FILE*)>("fclose");
    for (Open& open : streams) {
        FILE* found = stream;
        open.stream.compare_exchange_strong(found, nullptr);
    }
    return call(stream);
}

extern "C" FILE* popen(const char* command, const char* mode)
{
    static auto* const call = real<FILE*(const char*, const char*)>("popen");
    return fails("popen", Kind::Read) ? nullptr : call(command, mode);
}
