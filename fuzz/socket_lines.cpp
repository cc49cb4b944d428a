// Lines and blocks from a peer that sends any bytes: what comes out is what a plain reader finds.

#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/net/KpSocket.h>

#include <sys/socket.h>
#include <unistd.h>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    int ends[2];
    if (size < 2 || socketpair(AF_UNIX, SOCK_STREAM, 0, ends) != 0)
        return 0;
    Input input(data, size);
    const bool byLines = input.number<std::uint8_t>() % 2 != 0;
    const int block = input.number<std::uint8_t>();
    const std::string sent = input.rest();
    check(KpSocket::safeSend(ends[0], sent.data(), static_cast<int>(sent.size())) == static_cast<int>(sent.size()));
    close(ends[0]);

    std::size_t at = 0;
    while (at < sent.size()) {
        const std::size_t newline = sent.find('\n', at);
        const std::size_t end = newline == std::string::npos ? sent.size() : newline + 1;
        if (byLines) {
            KpString line;
            const int n = KpSocket::readLine(ends[1], line);
            check(n > 0 ? n == static_cast<int>(end - at) : newline == std::string::npos);
            check(std::memcmp(line.data(), sent.data() + at, end - at) == 0);
            at = end;
        } else if (block > 1) {
            std::vector<char> buffer(static_cast<std::size_t>(block) + 1);
            const int n = KpSocket::receive(ends[1], buffer.data(), block, 1);
            const std::size_t expected = std::min(end - at, static_cast<std::size_t>(block));
            check(n <= 0 || static_cast<std::size_t>(n) == expected);
            check(std::memcmp(buffer.data(), sent.data() + at, expected) == 0);
            at += expected;
        } else {
            break;
        }
    }
    close(ends[1]);
    return 0;
}
