#include <kplib/net/KpSocket.h>

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/net/KpSocketTools.h>
#include <kplib/net/detail/SocketCalls.h>

#include <algorithm>
#include <arpa/inet.h>
#include <atomic>
#include <cerrno>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/time.h>
#include <unistd.h>

namespace {

std::atomic<int> socketLayerInitialized = 0;

template <typename T>
int setOption(int socket, int level, int option, const T& value)
{
    return setsockopt(socket, level, option, &value, sizeof(value));
}

// Sets or clears O_NONBLOCK, without a call if it is as required.
int setNonBlocking(int socket, bool enable)
{
    const int flags = fcntl(socket, F_GETFL);
    const int wanted = enable ? flags | O_NONBLOCK : flags & ~O_NONBLOCK;
    return flags == -1 || flags == wanted ? std::min(flags, 0) : fcntl(socket, F_SETFL, wanted);
}

bool resolve(const char* host, in_addr_t& address)
{
    char name[256] = "";
    if (!host) {
        gethostname(name, sizeof(name) - 1);
        host = name;
    }
    address = inet_addr(host);
    if (address != INADDR_NONE)
        return true;
    address = KpSocketTools::getIPV4Address(host);
    if (address == 0)
        errno = EHOSTUNREACH;  // the resolver has its own error codes and may leave any errno
    return address != 0;
}

// Closes a socket that is not needed; errno keeps the cause of the failure.
int closeFailed(int socket)
{
    const int cause = errno;
    close(socket);
    errno = cause;
    return -1;
}

long sendSome(int socket, const char* data, size_t size)
{
    for (;;) {
        const long n = ::send(socket, data, size, MSG_NOSIGNAL);
        if (n >= 0 || errno != EINTR)
            return n;
    }
}

}  // namespace

void KpSocket::initSocketLayer()
{
    socketLayerInitialized = 1;
}

int kplib::detail::openSocket(int receiveBufferSize, int sendBufferSize)
{
    if (!socketLayerInitialized)
        KpSocket::initSocketLayer();
    const int socket = ::socket(AF_INET, SOCK_STREAM, IPPROTO_TCP);
    if (socket < 0)
        return -1;
    if (setOption(socket, SOL_SOCKET, SO_REUSEADDR, 1) != 0)
        return closeFailed(socket);
    if (receiveBufferSize > 0 && setOption(socket, SOL_SOCKET, SO_RCVBUF, receiveBufferSize) != 0)
        getTheLogInstance().errorf("Could not set TCP receive buffer size: %s", KpSocket::lastError().c_str());
    if (sendBufferSize > 0 && KpSocket::resizeSendBuffer(socket, sendBufferSize) != 0)
        getTheLogInstance().errorf("Could not set TCP send buffer size: %s", KpSocket::lastError().c_str());
    return socket;
}

kplib::detail::Connection kplib::detail::beginConnecting(int socket, const char* host, int port)
{
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<std::uint16_t>(port));
    if (!resolve(host, address.sin_addr.s_addr))
        return Connection::Failed;
    if (::connect(socket, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0)
        return Connection::Made;
    return errno == EINTR || errno == EINPROGRESS ? Connection::UnderWay : Connection::Failed;
}

bool kplib::detail::awaitConnection(int socket)
{
    pollfd connected{socket, POLLOUT, 0};
    while (poll(&connected, 1, -1) < 0 && errno == EINTR) {
    }
    int error = 0;
    socklen_t length = sizeof(error);
    getsockopt(socket, SOL_SOCKET, SO_ERROR, &error, &length);
    errno = error;
    return error == 0;
}

int KpSocket::connect(const char* host, int port, int /*ignored*/, int receiveBufferSize, int sendBufferSize)
{
    using kplib::detail::Connection;
    const int socket = kplib::detail::openSocket(receiveBufferSize, sendBufferSize);
    if (socket < 0)
        return -1;
    const Connection connection = kplib::detail::beginConnecting(socket, host, port);
    const bool isMade = connection == Connection::Made ||
                        (connection == Connection::UnderWay && kplib::detail::awaitConnection(socket));
    return isMade ? socket : closeFailed(socket);
}

int KpSocket::close(int socket)
{
    return ::close(socket);  // never twice: an interrupted close() has closed, and the number may be in use again
}

bool KpSocket::isNonBlocking(int socket)
{
    const int flags = fcntl(socket, F_GETFL);
    return flags != -1 && (flags & O_NONBLOCK) != 0;
}

int KpSocket::nonBlocking(int socket)
{
    return setNonBlocking(socket, true);
}

int KpSocket::blocking(int socket)
{
    return setNonBlocking(socket, false);
}

int KpSocket::setTimeout(int socket, int milliseconds)
{
    return setOption(socket, SOL_SOCKET, SO_RCVTIMEO, timeval{milliseconds / 1000, milliseconds % 1000 * 1000});
}

int KpSocket::resizeSendBuffer(int socket, int size)
{
    return setOption(socket, SOL_SOCKET, SO_SNDBUF, size);
}

int KpSocket::setNoDelay(int socket, bool enable)
{
    return setOption(socket, IPPROTO_TCP, TCP_NODELAY, enable ? 1 : 0);
}

int KpSocket::readLine(int socket, KpString& line)
{
    blocking(socket);
    line = "";
    char piece[512];
    long n = 0;
    do {
        n = kplib::detail::receiveToNewline(socket, piece, sizeof(piece));
        if (n < 1)
            return static_cast<int>(n);
        for (long i = 0; i < n; ++i)
            line += piece[i];
    } while (piece[n - 1] != '\n');
    return line.length();
}

int KpSocket::receive(int socket, char* buffer, int size, int lineMode)
{
    blocking(socket);
    if (size < (lineMode ? 2 : 1))
        return 0;
    if (!lineMode) {
        long received = 0;
        const long last = kplib::detail::receiveAll(socket, buffer, size, received);
        return last < 1 ? static_cast<int>(last) : size;
    }
    long count = 0;
    do {
        const long n = kplib::detail::receiveToNewline(socket, buffer + count, size - count);
        if (n < 1)
            return static_cast<int>(n);
        count += n;
    } while (count < size && buffer[count - 1] != '\n');
    buffer[count] = '\0';  // at index `size` in the longest case, for which callers have room
    return static_cast<int>(count);
}

int KpSocket::send(int socket, const char* format, ...)
{
    static char msg[4096];
    va_list args;
    va_start(args, format);
    const int length = vsnprintf(msg, sizeof(msg), format, args);
    va_end(args);
    return length < 0 ? -1 : static_cast<int>(sendSome(socket, msg, std::strlen(msg)));
}

int KpSocket::safeSend(int socket, const void* data, int size)
{
    const char* const bytes = static_cast<const char*>(data);
    int sent = 0;
    while (sent < size) {
        const long n = sendSome(socket, bytes + sent, static_cast<size_t>(size - sent));
        if (n < 0)
            return static_cast<int>(n);
        if (n == 0)
            break;
        sent += static_cast<int>(n);
    }
    return sent;
}

const char* KpSocket::strerror()
{
    static KpString msg;
    msg = lastError();
    return msg.c_str();
}

KpString KpSocket::lastError()
{
    char buffer[256];
    return strerror_r(errno, buffer, sizeof(buffer));
}

int KpSocket::lastErrorCode()
{
    return errno;
}
