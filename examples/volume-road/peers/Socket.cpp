#include "Socket.h"

#include "../volume/Volume.h"

#include <kplib/threads/ProgressScope.h>

#include <algorithm>
#include <arpa/inet.h>
#include <cstdio>
#include <netinet/in.h>
#include <sys/socket.h>

namespace {

constexpr unsigned long longestMessage = 1UL << 33;
constexpr unsigned long pieceSize = 1UL << 20;

}  // namespace

KpResult sendMessage(int socket, const TmMsg& msg, KpProgressInterface& progress, Silence& silence)
{
    unsigned long size = msg.size();
    bool isSent = KpSocket::safeSend(socket, &size, sizeof size) == sizeof size;
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(size / pieceSize + 1), "");
    for (unsigned long at = 0; isSent && at < size && !progress.isCanceled(); at += pieceSize) {
        const int piece = static_cast<int>(std::min(pieceSize, size - at));
        isSent = KpSocket::safeSend(socket, msg.dataPtr() + at, piece) == piece;
        progress.nextStep();
        silence.heard();
    }
    return isSent ? KpResult() : badInput("the peer doesn't take the message: %s", KpSocket::strerror());
}

KpResult receiveMessage(int socket, TmMsg& msg, Silence& silence)
{
    unsigned long size = 0;
    if (KpSocket::receive(socket, reinterpret_cast<char*>(&size), sizeof size, 0) != sizeof size)
        return badInput("the peer sends nothing");
    if (size > longestMessage)
        return badInput("the peer announces %lu bytes; that is no message", size);
    for (unsigned long at = 0; at < size; at += pieceSize) {
        const int piece = static_cast<int>(std::min(pieceSize, size - at));
        msg.resize(static_cast<long>(at) + piece);  // memory grows with what arrives, not with what is announced
        if (KpSocket::receive(socket, reinterpret_cast<char*>(msg.dataPtr() + at), piece, 0) != piece)
            return badInput("the peer went away after %lu of %lu bytes", at, size);
        silence.heard();
    }
    return KpResult();
}

KpResult confirm(int socket, const std::string& hash)
{
    const std::string line = hash + '\n';
    const int size = static_cast<int>(line.size());
    if (KpSocket::safeSend(socket, line.data(), size) != size)
        return badInput("the peer doesn't take the confirmation: %s", KpSocket::strerror());
    return KpResult();
}

KpResult awaitConfirmation(int socket, const std::string& hash)
{
    std::string line(hash.size() + 1, '\0');  // of known size: a line of a hostile peer may never end
    const int size = static_cast<int>(line.size());
    if (KpSocket::receive(socket, line.data(), size, 0) != size)
        return badInput("the peer doesn't confirm the message");
    if (line != hash + '\n')
        return badInput("the peer has other voxels than those that were sent");
    return KpResult();
}

KpResult listenAt(const std::string& text, int port, int listener)
{
    constexpr int enable = 1;
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<unsigned short>(port));
    if (inet_pton(AF_INET, text.c_str(), &address.sin_addr) != 1)
        return badInput("'%s' is not an address of this machine; give four numbers such as 127.0.0.1", text.c_str());
    socklen_t length = sizeof address;
    auto* const where = reinterpret_cast<sockaddr*>(&address);
    if (listener < 0 || setsockopt(listener, SOL_SOCKET, SO_REUSEADDR, &enable, sizeof enable) != 0 ||
        bind(listener, where, length) != 0 || listen(listener, 1) != 0 || getsockname(listener, where, &length) != 0)
        return badInput("can't listen at %s, port %d: %s", text.c_str(), port, KpSocket::strerror());
    std::printf("waiting at port %d\n", ntohs(address.sin_port));
    std::fflush(stdout);
    return KpResult();
}
