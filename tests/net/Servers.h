#pragma once

#include <algorithm>
#include <arpa/inet.h>
#include <atomic>
#include <functional>
#include <netinet/tcp.h>
#include <string>
#include <string_view>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>

namespace kplib::test {

/// A listening socket on a free port of all of this machine's addresses.
class Listener {
public:
    explicit Listener(int backlog = 16)
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        bind(socket, reinterpret_cast<sockaddr*>(&address), sizeof(address));
        listen(socket, backlog);
        socklen_t length = sizeof(address);
        getsockname(socket, reinterpret_cast<sockaddr*>(&address), &length);
        port = ntohs(address.sin_port);
    }
    ~Listener() { close(socket); }
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

    const int socket = ::socket(AF_INET, SOCK_STREAM, 0);
    int port = 0;
};

/// From now on close() resets the connection.
inline void resetAtClose(int socket)
{
    const linger hard{1, 0};
    setsockopt(socket, SOL_SOCKET, SO_LINGER, &hard, sizeof(hard));
}

/// Sends the text in pieces of `step` bytes, each on its way before the next is; false if the peer has gone.
inline bool put(int peer, std::string_view text, size_t step = std::string_view::npos)
{
    const int atOnce = 1;
    setsockopt(peer, IPPROTO_TCP, TCP_NODELAY, &atOnce, sizeof(atOnce));
    for (; !text.empty(); text.remove_prefix(std::min(step, text.size()))) {
        const std::string_view piece = text.substr(0, step);
        if (send(peer, piece.data(), piece.size(), MSG_NOSIGNAL) != static_cast<long>(piece.size()))
            return false;
    }
    return true;
}

/// Runs a script with each connection, one after the other, and then closes it. Lives longer than its clients.
class ScriptedServer {
public:
    explicit ScriptedServer(std::function<void(int peer)> script) :
        thread_([this, script] {
            for (int peer; (peer = accept(listener_.socket, nullptr, nullptr)) >= 0; close(peer)) {
                ++connections;
                script(peer);
            }
        })
    {
    }
    ~ScriptedServer()
    {
        shutdown(listener_.socket, SHUT_RDWR);
        thread_.join();
    }
    std::string url() const { return "http://127.0.0.1:" + std::to_string(listener_.port) + "/file"; }

    /// The text of the next request; empty once the client has gone.
    static std::string requestOf(int peer)
    {
        std::string text;
        for (char c; !text.ends_with("\r\n\r\n") && recv(peer, &c, 1, 0) == 1;)
            text += c;
        return text;
    }

    std::atomic<int> connections = 0;

private:
    Listener listener_;
    std::thread thread_;
};

}  // namespace kplib::test
