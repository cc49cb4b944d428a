#pragma once

// Receiving calls that go on after a signal.

namespace kplib::detail {

// As recv(). A time-out of the socket holds under a steady row of signals too, if only to within a factor of two.
long receiveSome(int socket, char* buffer, long size, int flags);

// Receives until `size` bytes have come, and counts them in `received`. The result of the last recv():
// on failure below 1, 0 at the end of the stream.
long receiveAll(int socket, char* buffer, long size, long& received);

// Receives at most `size` bytes, none of them behind a newline, and gives their number, or the result below 1 of
// recv(). Touches the buffer for these bytes only.
long receiveToNewline(int socket, char* buffer, long size);

}  // namespace kplib::detail
