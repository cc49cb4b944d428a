#pragma once

// Steps of a connection, and receiving calls; all go on after a signal.

namespace kplib::detail {

// A socket with the options of KpSocket::connect(); -1 on failure.
int openSocket(int receiveBufferSize, int sendBufferSize);

// Resolves the name and calls connect(). The connection is under way on a non-blocking socket, and after a signal,
// since an interrupted connect() continues by itself and cannot be called again.
enum class Connection { Failed, UnderWay, Made };
Connection beginConnecting(int socket, const char* host, int port);

// Waits for the end of what is under way; a shutdown() by another thread ends the wait. False with the cause
// in errno.
bool awaitConnection(int socket);

// As recv(). A time-out of the socket also holds under repeated signals, to within a factor of
// two.
long receiveSome(int socket, char* buffer, long size, int flags);

// Receives until `size` bytes are read, and counts them in `received`. The result of the last
// recv():
// on failure below 1, 0 at the end of the stream.
long receiveAll(int socket, char* buffer, long size, long& received);

// Receives at most `size` bytes, none of them after a newline, and returns their number, or the
// result below 1 of
// recv(). Touches the buffer for these bytes only.
long receiveToNewline(int socket, char* buffer, long size);

}  // namespace kplib::detail
