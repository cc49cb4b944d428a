#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// TCP over IPv4 on plain descriptors, which the caller owns and closes by close(). All options of
/// connections, error texts and the reading of lines are here.
///
/// Results are those of the system, below 0 for a failure, which errno, lastError() and strerror()
/// describe until the next call. A signal does not interrupt a call. A closed peer is a result,
/// not a SIGPIPE. Any thread may use any descriptor; send() and strerror() share one buffer
/// between all threads.
class KPLIB_API KpSocket {
public:
    /// Call it once before the first socket; connect() does.
    static void initSocketLayer();

    /// Connects to `port` of `host`: a dotted address, a name, or null for this machine by its own
    /// name. Returns the descriptor, in blocking mode, or -1. Takes as long as the system waits
    /// for the peer. A buffer size above 0 requests that many bytes; a refusal is only an error in
    /// the log.
    static int connect(const char* host, int port, int ignored, int receiveBufferSize, int sendBufferSize);
    /// Closes the descriptor.
    static int close(int socket);

    /// Whether the descriptor is in non-blocking mode; false for an invalid one.
    static bool isNonBlocking(int socket);
    /// Sets the mode in which a call returns at once.
    static int nonBlocking(int socket);
    /// Sets the mode in which a call waits.
    static int blocking(int socket);

    /// Sets how long a receiving call waits for data before it fails with EAGAIN; 0 waits without
    /// limit.
    static int setTimeout(int socket, int milliseconds);
    /// Requests a send buffer of `size` bytes.
    static int resizeSendBuffer(int socket, int size);
    /// Sets whether short pieces are sent at once instead of being collected.
    static int setNoDelay(int socket, bool enable);

    /// Reads up to and including the next newline, and nothing after it. Returns the length of
    /// `line`, which includes the newline. A result below 1 is that of the receiving call that
    /// failed, 0 at the end of the stream; `line` then has the bytes received before it. Leaves
    /// the socket in blocking mode.
    static int readLine(int socket, KpString& line);

    /// Reads into `buffer` and leaves the socket in blocking mode.
    ///
    /// With `lineMode` 0, reads exactly `size` bytes and returns `size`, or the result below 1 of
    /// the call that failed, 0 at the end of the stream, even if bytes were received before it.
    ///
    /// Otherwise reads one line of at most `size` bytes, newline included, and appends a NUL: the
    /// buffer must have `size` + 1 bytes. Returns the length, or the result of the call that
    /// failed. A `size` below 2 reads nothing and returns 0.
    static int receive(int socket, char* buffer, int size, int lineMode);

    /// Sends the text formatted as by printf(), of which only the first 4095 characters are sent.
    /// Makes one call of the system, which may accept less, and returns its result.
    static int send(int socket, const char* format, ...) KPLIB_PRINTF(2, 3);

    /// Sends all `size` bytes and returns `size`. Returns the result of the call that failed,
    /// below 0, or the number of bytes sent if the system accepts no more. Returns 0 if `size` is
    /// 0.
    static int safeSend(int socket, const void* data, int size);

    /// The system's text for errno, valid until the next call.
    static const char* strerror();
    /// The same as a string of the caller's.
    static KpString lastError();
    /// The value of errno.
    static int lastErrorCode();
};
