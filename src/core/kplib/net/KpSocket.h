#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// TCP over IPv4 on plain descriptors, which are the caller's: close() ends them. The one place for the options of
/// connections, for error texts and for the reading of lines.
///
/// Results are the system's, below 0 for a failure, which errno, lastError() and strerror()
/// describe until the next call. A signal interrupts no call, and a closed peer is a result, never
/// a SIGPIPE. Any thread may use any descriptor; send() and strerror() have one buffer for all
/// threads.
class KPLIB_API KpSocket {
public:
    /// Call it once before the first socket; connect() does.
    static void initSocketLayer();

    /// A connection to `port` of `host`, a dotted address or a name, or null for this machine by its own name. The
    /// descriptor, in blocking mode, or -1. Takes as long as the system waits for the peer. A buffer size above 0 asks
    /// for that many bytes; a refusal is an error in the log, and no more.
    static int connect(const char* host, int port, int ignored, int receiveBufferSize, int sendBufferSize);
    /// Closes the descriptor.
    static int close(int socket);

    /// Whether the descriptor is in non-blocking mode; false for an invalid one.
    static bool isNonBlocking(int socket);
    /// Sets the mode in which a call returns at once.
    static int nonBlocking(int socket);
    /// Sets the mode in which a call waits.
    static int blocking(int socket);

    /// How long a receiving call waits for data before it fails with EAGAIN; 0 for ever.
    static int setTimeout(int socket, int milliseconds);
    /// Asks for a send buffer of `size` bytes.
    static int resizeSendBuffer(int socket, int size);
    /// Whether short pieces go out at once instead of being gathered.
    static int setNoDelay(int socket, bool enable);

    /// Reads up to and including the next newline, and nothing after it; the length of `line`, in
    /// which the newline stays. A result below 1 is that of the receiving call that failed, 0 at
    /// the end of the stream; `line` then has what came until there. Leaves the socket in blocking
    /// mode.
    static int readLine(int socket, KpString& line);

    /// Reads into `buffer`, with the socket in blocking mode from then on.
    ///
    /// With `lineMode` 0 exactly `size` bytes: gives `size`, or the result below 1 of the call that failed, 0 at the
    /// end of the stream, even where bytes came before it.
    ///
    /// Else one line, newline included, of at most `size` bytes, and a NUL after it, for which the
    /// buffer needs room in addition: `size` + 1 bytes. Gives the length, or what the call that
    /// failed gave. A `size` below 2 reads nothing and gives 0.
    static int receive(int socket, char* buffer, int size, int lineMode);

    /// Sends the text that printf() would make of it, of which only the first 4095 characters go out. One call of the
    /// system's, which may take less than all; gives its result.
    static int send(int socket, const char* format, ...) KPLIB_PRINTF(2, 3);

    /// Sends all `size` bytes and gives `size`; what the call that failed gave, below 0; or, where the system takes
    /// nothing more, the bytes sent so far. Nothing to send gives 0.
    static int safeSend(int socket, const void* data, int size);

    /// The system's text for errno, valid until the next call.
    static const char* strerror();
    /// The same as a string of the caller's.
    static KpString lastError();
    /// The value of errno.
    static int lastErrorCode();
};
