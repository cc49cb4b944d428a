#pragma once

#include "../commands/Abort.h"

#include <kplib/log/KpResult.h>
#include <kplib/net/KpSocket.h>
#include <kplib/net/TmMsg.h>
#include <kplib/threads/KpProgressInterface.h>

#include <string>

/// A descriptor that is closed at the end of its scope.
class Socket {
public:
    explicit Socket(int descriptor) : descriptor_(descriptor) {}
    Socket(const Socket&) = delete;
    Socket& operator=(const Socket&) = delete;
    ~Socket()
    {
        if (descriptor_ >= 0)
            KpSocket::close(descriptor_);
    }
    operator int() const { return descriptor_; }

private:
    int descriptor_;
};

// Messages between peers: eight bytes of length, then the message.

KpResult sendMessage(int socket, const TmMsg& msg, KpProgressInterface& progress, Silence& silence);
KpResult receiveMessage(int socket, TmMsg& msg, Silence& silence);

/// The receiver confirms a message by a line with the digest of its voxels.
KpResult confirm(int socket, const std::string& hash);
KpResult awaitConfirmation(int socket, const std::string& hash);

/// Listens at a numeric address of this machine; prints the port.
KpResult listenAt(const std::string& address, int port, int listener);
