// Calls with descriptors and paths in place of the C library's.

#include "Fail.h"

#include <cerrno>
#include <cstdarg>
#include <dirent.h>
#include <fcntl.h>
#include <netdb.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <sys/uio.h>
#include <unistd.h>

using namespace kplib::probe;

// A call that only passes its arguments on; `failure` is what it gives when it fails.
#define PASS_ON(kind, result, name, failure, parameters, arguments)                                                    \
    extern "C" result name parameters                                                                                  \
    {                                                                                                                  \
        static auto* const call = real<result parameters>(#name);                                                      \
        return fails(#name, Kind::kind) ? failure : call arguments;                                                    \
    }
// A call that carries `size` bytes.
#define CARRY(kind, name, parameters, arguments)                                                                       \
    extern "C" ssize_t name parameters                                                                                 \
    {                                                                                                                  \
        static auto* const call = real<ssize_t parameters>(#name);                                                     \
        return transferFails(#name, Kind::kind, size) ? -1 : call arguments;                                           \
    }

CARRY(Receive, read, (int fd, void* to, size_t size), (fd, to, size))
CARRY(Send, write, (int fd, const void* from, size_t size), (fd, from, size))
CARRY(Receive, pread, (int fd, void* to, size_t size, off_t at), (fd, to, size, at))
CARRY(Send, pwrite, (int fd, const void* from, size_t size, off_t at), (fd, from, size, at))
CARRY(Receive, recv, (int fd, void* to, size_t size, int flags), (fd, to, size, flags))
CARRY(Send, send, (int fd, const void* from, size_t size, int flags), (fd, from, size, flags))

extern "C" ssize_t writev(int fd, const iovec* pieces, int count)
{
    static auto* const call = real<ssize_t(int, const iovec*, int)>("writev");
    size_t size = count > 0 ? pieces[0].iov_len : 0;
    const size_t whole = size;
    if (transferFails("writev", Kind::Send, size))
        return -1;
    const iovec part{count > 0 ? pieces[0].iov_base : nullptr, size};
    return size < whole ? call(fd, &part, 1) : call(fd, pieces, count);
}

PASS_ON(Change, int, creat, -1, (const char* path, mode_t mode), (path, mode))
PASS_ON(Change, int, mkdir, -1, (const char* path, mode_t mode), (path, mode))
PASS_ON(Change, int, rmdir, -1, (const char* path) noexcept, (path))
PASS_ON(Change, int, unlink, -1, (const char* path) noexcept, (path))
PASS_ON(Change, int, rename, -1, (const char* from, const char* to) noexcept, (from, to))
PASS_ON(Change, int, symlink, -1, (const char* text, const char* path) noexcept, (text, path))
PASS_ON(Change, int, chmod, -1, (const char* path, mode_t mode) noexcept, (path, mode))
PASS_ON(Change, int, fchmod, -1, (int fd, mode_t mode) noexcept, (fd, mode))
PASS_ON(Change, int, fsync, -1, (int fd), (fd))
PASS_ON(Read, int, stat, -1, (const char* path, struct stat* out) noexcept, (path, out))
PASS_ON(Read, int, lstat, -1, (const char* path, struct stat* out) noexcept, (path, out))
PASS_ON(Read, int, fstat, -1, (int fd, struct stat* out) noexcept, (fd, out))
PASS_ON(Read, int, fstatat, -1, (int fd, const char* path, struct stat* out, int flags) noexcept,
        (fd, path, out, flags))
PASS_ON(Read, int, statvfs, -1, (const char* path, struct statvfs* out) noexcept, (path, out))
PASS_ON(Read, int, access, -1, (const char* path, int mode) noexcept, (path, mode))
PASS_ON(Read, ssize_t, readlink, -1, (const char* path, char* out, size_t size) noexcept, (path, out, size))
PASS_ON(Read, DIR*, opendir, nullptr, (const char* path), (path))
PASS_ON(Read, dirent*, readdir, nullptr, (DIR * folder), (folder))
PASS_ON(Change, int, socket, -1, (int domain, int type, int protocol) noexcept, (domain, type, protocol))
PASS_ON(Read, int, setsockopt, -1, (int fd, int level, int name, const void* value, socklen_t size) noexcept,
        (fd, level, name, value, size))
PASS_ON(Read, int, getsockopt, -1, (int fd, int level, int name, void* value, socklen_t* size) noexcept,
        (fd, level, name, value, size))
PASS_ON(Read, int, poll, -1, (pollfd * fds, nfds_t count, int timeout), (fds, count, timeout))
PASS_ON(Read, int, accept, -1, (int fd, sockaddr* address, socklen_t* size), (fd, address, size))
PASS_ON(Read, int, gethostname, -1, (char* name, size_t size) noexcept, (name, size))

/// Also after a failure the descriptor is closed, as Linux does it.
extern "C" int close(int fd)
{
    static auto* const call = real<int(int)>("close");
    const bool isFailure = fails("close", Kind::Change);
    const int failure = errno, result = call(fd);
    errno = isFailure ? failure : errno;
    return isFailure ? -1 : result;
}

/// An interrupted call goes on by itself.
extern "C" int connect(int fd, const sockaddr* address, socklen_t size)
{
    static auto* const call = real<int(int, const sockaddr*, socklen_t)>("connect");
    if (!fails("connect", Kind::Change))
        return call(fd, address, size);
    if (const int failure = errno; failure == EINTR) {
        call(fd, address, size);
        errno = failure;
    }
    return -1;
}

extern "C" int open(const char* path, int flags, ...)
{
    static auto* const call = real<int(const char*, int, ...)>("open");
    va_list rest;
    va_start(rest, flags);
    const mode_t mode = va_arg(rest, mode_t);
    va_end(rest);
    return fails("open", flags & O_CREAT ? Kind::Change : Kind::Read) ? -1 : call(path, flags, mode);
}

extern "C" int fcntl(int fd, int command, ...)
{
    static auto* const call = real<int(int, int, ...)>("fcntl");
    va_list rest;
    va_start(rest, command);
    const long argument = va_arg(rest, long);
    va_end(rest);
    return fails("fcntl", Kind::Read) ? -1 : call(fd, command, argument);
}
