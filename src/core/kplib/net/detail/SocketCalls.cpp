#include <kplib/net/detail/SocketCalls.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <sys/socket.h>
#include <sys/time.h>

namespace {

// 0 for none.
double secondsOfTimeout(int socket)
{
    timeval limit{};
    socklen_t length = sizeof(limit);
    if (getsockopt(socket, SOL_SOCKET, SO_RCVTIMEO, &limit, &length) != 0)
        return 0;
    return static_cast<double>(limit.tv_sec) + static_cast<double>(limit.tv_usec) * 1e-6;
}

// Each recv() waits for the whole time-out again: with signals that come faster it would never end.
long receiveDespiteSignals(int socket, char* buffer, long size, int flags)
{
    using Clock = std::chrono::steady_clock;
    const double limit = secondsOfTimeout(socket);
    const Clock::time_point start = Clock::now();
    for (;;) {
        const long n = recv(socket, buffer, static_cast<size_t>(size), flags);
        if (n >= 0 || errno != EINTR)
            return n;
        if (limit > 0 && std::chrono::duration<double>(Clock::now() - start).count() >= limit) {
            errno = EAGAIN;
            return -1;
        }
    }
}

}  // namespace

long kplib::detail::receiveSome(int socket, char* buffer, long size, int flags)
{
    const long n = recv(socket, buffer, static_cast<size_t>(size), flags);
    return n < 0 && errno == EINTR ? receiveDespiteSignals(socket, buffer, size, flags) : n;
}

long kplib::detail::receiveAll(int socket, char* buffer, long size, long& received)
{
    long n = 0;
    int flags = 0;
    for (received = 0; received < size; received += n) {
        n = receiveSome(socket, buffer + received, size - received, flags);
        if (n < 1)
            break;
        // A call that waits for all bytes returns some of them at the end of a time-out; the next one would wait for
        // the whole time-out again.
        if (received == 0 && n < size && secondsOfTimeout(socket) == 0)
            flags = MSG_WAITALL;
    }
    return n;
}

long kplib::detail::receiveToNewline(int socket, char* buffer, long size)
{
    // A look ahead and one call for what belongs to the line, instead of a call for each byte.
    char ahead[512];
    const long n = receiveSome(socket, ahead, std::min<long>(size, sizeof(ahead)), MSG_PEEK);
    if (n < 1)
        return n;
    const void* const newline = std::memchr(ahead, '\n', static_cast<size_t>(n));
    return receiveSome(socket, buffer, newline ? static_cast<const char*>(newline) - ahead + 1 : n, 0);
}
