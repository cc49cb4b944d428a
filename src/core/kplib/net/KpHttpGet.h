#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpMutex.h>
#include <kplib/system/KpWatch.h>

#include <atomic>
#include <string>

namespace kplib::detail {
class HttpHead;
}

/// Reads ranges of a file from an HTTP server, one after the other over a connection that stays open.
///
/// Understands http:// only, and responses with a Content-Length; no redirects and no chunked
/// transfer. A response of any status is delivered: check status() where it matters. Only
/// exhausted memory throws, and nothing is logged: errorText() describes a failure. After a
/// failure the next request() connects anew.
///
/// Belongs to one thread, but for cancel().
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

    /// Takes server and path from "http://HOST[:PORT][/PATH]". Closes the connection if the server
    /// is another one. False for another scheme, which closes it too and clears the host.
    /// request() calls this.
    ///
    /// The first colon is taken for the port's, even one in the path: a URL with a colon there is not understood.
    bool setURL(const char* url);

    /// Asks for the whole file; true when the request has gone out.
    bool request(const char* url);
    /// Asks for the bytes from `first` to `last`, both included; for the whole file if `first` > `last`. What is left
    /// of the response before is dropped, with its connection.
    bool request(const char* url, unsigned long first, unsigned long last);

    /// Waits for the next `size` bytes of the body and returns their number, less only at its end;
    /// 0 after the end. A failure is -1, or the number of bytes that came before it (0 if the
    /// server closed), and then -1 in the next call.
    long read(void* buffer, unsigned long size);

    /// Length of the response's body, for which it waits for the head if necessary; 0 if that
    /// fails.
    long long contentLength();
    /// Bytes of the body delivered so far.
    long long bytesRead() const { return bytesReadSoFar_; }

    /// Closes the connection. From another thread this ends a read() that waits, which then fails, and a request(),
    /// which then returns false in the state NotConnected; a request() that is connecting too, once the name of the
    /// host is resolved.
    void cancel();

    /// Waits for the head of the response. False in any state but RequestSent, or on failure. read() calls this.
    bool readResponse();

    /// Closes the connection with `text` for the cause; null stands for the system's text of its
    /// last error.
    void setError(const char* text);

    /// Where the request stands.
    State state() const { return state_; }
    /// The port of setURL(), 80 without one there.
    int port() const { return port_; }
    /// The host of setURL().
    const std::string& host() const { return host_; }
    /// The path of setURL().
    const std::string& path() const { return path_; }
    /// Of the last failure.
    const std::string& errorText() const { return errorText_; }
    /// That of the last response, such as 206; 0 while there is none.
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
