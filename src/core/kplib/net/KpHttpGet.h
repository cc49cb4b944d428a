#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpMutex.h>
#include <kplib/system/KpWatch.h>

#include <atomic>
#include <string>

namespace kplib::detail {
class HttpHead;
}

/// Reads ranges of a file from an HTTP server, one after the other over a connection that is kept
/// open.
///
/// Supported: http:// URLs and responses with a Content-Length. Redirects and chunked transfer are
/// not supported.
///
/// Errors: a response of any status is delivered: check status() where it matters. Only exhausted
/// memory throws, and nothing is logged: errorText() describes a failure. After a failure the next
/// request() opens a new connection.
///
/// Threads: one thread at a time, except for cancel().
class KPLIB_API KpHttpGet {
public:
    /// Where the request stands.
    enum State : int {
        NotConnected = 0,  ///< no request under way
        Failed = 1,        ///< the last operation failed
        RequestSent = 2,   ///< the head of the response is unread
        ReadingBody = 3,   ///< the head is read, and bytes of the body remain
        Finished = 4,      ///< the body is delivered; the connection is open for the next request
    };

    KpHttpGet();
    KpHttpGet(const KpHttpGet&) = delete;
    KpHttpGet& operator=(const KpHttpGet&) = delete;
    ~KpHttpGet();

    /// Sets server and path from "http://HOST[:PORT][/PATH]". Closes the connection if the server
    /// is another one. Returns false for another scheme, which also closes the connection and
    /// clears the host. request() calls this.
    ///
    /// The first colon is taken as that of the port, even in the path: a URL with a colon in its
    /// path is not supported.
    bool setURL(const char* url);

    /// Requests the whole file. Returns true when the request is sent.
    bool request(const char* url);
    /// Requests the bytes from `first` to `last`, both included, or the whole file if `first` >
    /// `last`. The unread rest of the previous response is discarded with its connection.
    bool request(const char* url, unsigned long first, unsigned long last);

    /// Waits for the next `size` bytes of the body and returns their number, which is smaller only
    /// at the end of the body, and 0 after it. On a failure returns the number of bytes that
    /// arrived before it (0 if the server closed the connection) and -1 in the next call, or -1 at
    /// once.
    long read(void* buffer, unsigned long size);

    /// The length of the body of the response. Waits for the head if necessary; 0 if that fails.
    long long contentLength();
    /// Bytes of the body delivered so far.
    long long bytesRead() const { return bytesReadSoFar_; }

    /// Closes the connection. Called from another thread, it ends a waiting read(), which then
    /// fails, and a waiting request(), which then returns false in the state NotConnected; a
    /// request() that is connecting ends once the name of the host is resolved.
    void cancel();

    /// Waits for the head of the response. Returns false in any state but RequestSent, or on a
    /// failure. read() calls this.
    bool readResponse();

    /// Closes the connection and sets errorText() to `text`. Null stands for the system's text of
    /// its last error.
    void setError(const char* text);

    /// Where the request stands.
    State state() const { return state_; }
    /// The port of setURL(), or 80 if the URL has none.
    int port() const { return port_; }
    /// The host of setURL().
    const std::string& host() const { return host_; }
    /// The path of setURL().
    const std::string& path() const { return path_; }
    /// The text of the last failure.
    const std::string& errorText() const { return errorText_; }
    /// The status of the last response, such as 206; 0 if there is none.
    int status() const { return status_; }
    /// Seconds spent on the network for this request.
    double elapsedTime() const { return watch_.getTime2(); }

private:
    class SocketInUse;

    bool connect();
    bool isCanceled();
    bool receiveHead(kplib::detail::HttpHead& head);
    void closeConnection(State next);
    void closeLocked(State next);

    int port_ = 0;
    std::string host_, path_, errorText_;
    long long contentLength_ = 0, bytesReadSoFar_ = 0;
    std::atomic<State> state_ = NotConnected;  // atomic what cancel() changes
    std::atomic<int> status_ = 0;
    std::atomic<int> socket_ = -1;
    KpWatch watch_{true};
    KpMutex closing_{false};    // held while the connection is opened, closed or taken into use
    bool socketInUse_ = false;  // guarded by it, as the next
    bool canceled_ = false;     // cancel() was called since request() began
};
