#include <kplib/net/KpHttpGet.h>

#include <kplib/foundation/KpString.h>
#include <kplib/net/KpSocket.h>
#include <kplib/net/detail/HttpHead.h>
#include <kplib/net/detail/SocketCalls.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <string_view>
#include <sys/socket.h>

using kplib::detail::HttpHead;

namespace {

constexpr int bufferSize = 0x40000;

std::string requestText(const std::string& host, const std::string& path, unsigned long first, unsigned long last)
{
    std::string text = "GET " + path + " HTTP/1.1\r\nHost: " + host + "\r\nAccept: */*\r\n";
    if (first <= last)
        text += "Range: bytes=" + std::to_string(first) + "-" + std::to_string(last) + "\r\n";
    return text + "\r\n";
}

}  // namespace

// While an object exists the descriptor stays open, so that no system call uses another file of
// the same number. A connection that is closed meanwhile is shut down, which wakes the call, and
// is closed with the last object.
class KpHttpGet::SocketInUse {
public:
    explicit SocketInUse(KpHttpGet& owner) : owner_(owner)
    {
        const KpScopedLockT<KpMutex> lock(&owner_.closing_);
        owner_.socketInUse_ = true;
        socket_ = owner_.socket_;
    }
    SocketInUse(const SocketInUse&) = delete;
    SocketInUse& operator=(const SocketInUse&) = delete;
    ~SocketInUse()
    {
        const KpScopedLockT<KpMutex> lock(&owner_.closing_);
        owner_.socketInUse_ = false;
        if (socket_ >= 0 && owner_.socket_ < 0)
            KpSocket::close(socket_);
    }

    operator int() const { return socket_; }

private:
    KpHttpGet& owner_;
    int socket_;
};

KpHttpGet::KpHttpGet()
{
    watch_.reset();
}

KpHttpGet::~KpHttpGet()
{
    closeConnection(NotConnected);
}

bool KpHttpGet::setURL(const char* url)
{
    constexpr std::string_view scheme = "http://";
    const std::string_view text(url ? url : "");
    if (!text.starts_with(scheme)) {
        closeConnection(NotConnected);
        host_.clear();
        return false;
    }
    const std::string_view rest = text.substr(scheme.size());
    const size_t colon = rest.find(':');  // intentional: the first colon, even after a slash
    const size_t slash = rest.find('/', colon == std::string_view::npos ? 0 : colon);
    const std::string host(rest.substr(0, std::min(colon, slash)));
    const int port = colon == std::string_view::npos ? 80 : std::atoi(rest.data() + colon + 1);
    path_ = slash == std::string_view::npos ? "/" : rest.substr(slash);
    if (port != port_ || host != host_) {
        closeConnection(NotConnected);
        port_ = port;
        host_ = host;
    }
    return true;
}

bool KpHttpGet::request(const char* url)
{
    return request(url, 1, 0);
}

bool KpHttpGet::request(const char* url, unsigned long first, unsigned long last)
{
    const KpScopedWatch timing(watch_, true);
    {
        const KpScopedLockT<KpMutex> lock(&closing_);
        canceled_ = false;
    }
    status_ = 0;
    bytesReadSoFar_ = contentLength_ = 0;
    if (!setURL(url))
        return false;
    if (state_ == RequestSent || state_ == ReadingBody)
        closeConnection(NotConnected);  // the rest of that response would precede this one
    if (socket_ < 0 && !connect())
        return false;
    const std::string text = requestText(host_, path_, first, last);
    const SocketInUse socket(*this);
    const bool isSent = KpSocket::safeSend(socket, text.data(), static_cast<int>(text.size())) > 0;
    const KpString cause = isSent ? KpString() : KpSocket::lastError();
    {
        const KpScopedLockT<KpMutex> lock(&closing_);
        if (canceled_)
            return false;
        if (isSent) {
            state_ = RequestSent;
            return true;
        }
    }
    setError(cause.c_str());
    return false;
}

bool KpHttpGet::isCanceled()
{
    const KpScopedLockT<KpMutex> lock(&closing_);
    return canceled_;
}

bool KpHttpGet::connect()
{
    using kplib::detail::Connection;
    const int opened = kplib::detail::openSocket(bufferSize, bufferSize);
    if (opened < 0) {
        if (!isCanceled())
            setError(nullptr);
        return false;
    }
    socket_ = opened;
    const SocketInUse socket(*this);
    KpSocket::nonBlocking(socket);
    const Connection connection = kplib::detail::beginConnecting(socket, host_.c_str(), port_);
    // cancel() ends the wait for a connection that is under way. An earlier cancel() is noticed
    // here.
    const bool isMade = connection == Connection::Made ||
                        (connection == Connection::UnderWay && !isCanceled() && kplib::detail::awaitConnection(socket));
    const KpString cause = isMade ? KpString() : KpSocket::lastError();
    if (isCanceled()) {
        closeConnection(NotConnected);
        return false;
    }
    if (!isMade) {
        setError(cause.c_str());
        return false;
    }
    KpSocket::blocking(socket);
    KpSocket::setNoDelay(socket, true);
    return true;
}

bool KpHttpGet::readResponse()
{
    if (state_ != RequestSent)
        return false;
    const KpScopedWatch timing(watch_, false);
    HttpHead head;
    if (!receiveHead(head))
        return false;
    if (!head.hasLength() || head.length() < 0) {
        setError("Content-Length missing");
        return false;
    }
    contentLength_ = head.length();
    status_ = head.status();
    State sent = RequestSent;  // no longer, once cancelled
    state_.compare_exchange_strong(sent, contentLength_ > 0 ? ReadingBody : Finished);
    return true;
}

// Peeks, so that the body stays in the socket and read() stores it in the caller's memory.
bool KpHttpGet::receiveHead(HttpHead& head)
{
    const SocketInUse socket(*this);
    char bytes[2048];
    while (head.state() == HttpHead::State::Open) {
        long n = kplib::detail::receiveSome(socket, bytes, sizeof(bytes), MSG_PEEK), received = 0;
        if (n > 0) {
            const size_t used = head.take({bytes, static_cast<size_t>(n)});
            n = kplib::detail::receiveAll(socket, bytes, static_cast<long>(used), received);
        }
        if (n < 1) {
            if (n == 0)
                errno = ECONNRESET;  // an orderly end too, which leaves errno unset
            setError(nullptr);
            return false;
        }
    }
    if (head.state() == HttpHead::State::Unexpected)
        setError("Unexpected response");
    return head.state() == HttpHead::State::Complete;
}

long KpHttpGet::read(void* buffer, unsigned long size)
{
    if (state_ == Failed)
        return -1;
    if (state_ == NotConnected) {
        errorText_ = "Not connected";
        return -1;
    }
    const KpScopedWatch timing(watch_, false);
    if (state_ == RequestSent && !readResponse())
        return -1;
    if (state_ == Finished) {
        errorText_ = "All data read";
        return 0;
    }
    const auto left = static_cast<unsigned long>(contentLength_ - bytesReadSoFar_);
    const long wanted = static_cast<long>(std::min(size, left));
    const SocketInUse socket(*this);
    long received = 0;
    const long last = kplib::detail::receiveAll(socket, static_cast<char*>(buffer), wanted, received);
    if (received < wanted) {
        setError(last == 0 ? "Socket closed" : nullptr);
        return received > 0 ? received : last;
    }
    bytesReadSoFar_ += received;
    State reading = ReadingBody;
    if (bytesReadSoFar_ == contentLength_)
        state_.compare_exchange_strong(reading, Finished);
    return received;
}

long long KpHttpGet::contentLength()
{
    if (state_ == RequestSent)
        readResponse();
    return contentLength_;
}

void KpHttpGet::cancel()
{
    const KpScopedLockT<KpMutex> lock(&closing_);
    canceled_ = true;
    closeLocked(NotConnected);
}

void KpHttpGet::setError(const char* text)
{
    errorText_ = text ? text : KpSocket::lastError().c_str();
    closeConnection(Failed);
}

// In one step: a connection that another thread opens in between would be taken for one without a response under way.
void KpHttpGet::closeConnection(State next)
{
    const KpScopedLockT<KpMutex> lock(&closing_);
    closeLocked(next);
}

void KpHttpGet::closeLocked(State next)
{
    const int socket = socket_.exchange(-1);
    status_ = 0;
    state_ = next;
    if (socket < 0)
        return;
    if (socketInUse_)
        shutdown(socket, SHUT_RDWR);
    else
        KpSocket::close(socket);
}
