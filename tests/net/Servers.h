#pragma once

#include <support/TempFolder.h>

#include <arpa/inet.h>
#include <atomic>
#include <csignal>
#include <fcntl.h>
#include <functional>
#include <netinet/tcp.h>
#include <string>
#include <string_view>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/wait.h>
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

/// nginx on a free port, with a sparse file "volume" of 256 MiB that holds its own offset at each spot.
class Nginx {
public:
    static constexpr long size = 256L << 20;
    static constexpr long spots[] = {0, 65536, (100L << 20) + 12345, size - 8};
    static bool isInstalled() { return access(program, X_OK) == 0; }

    Nginx()
    {
        const int file = open((folder_ / "volume").c_str(), O_CREAT | O_WRONLY, 0644);
        bool made = ftruncate(file, size) == 0;
        for (long spot : spots)
            made = made && pwrite(file, &spot, sizeof(spot), spot) == sizeof(spot);
        close(file);
        std::string temporary;
        for (const char* kind : {"client_body", "proxy", "fastcgi", "uwsgi", "scgi"})
            temporary += std::string(kind) + "_temp_path " + folder_.path + "/" + kind + ";";
        folder_.file("conf", std::string(geteuid() == 0 ? "user root;" : "") + "pid " + folder_.path +
                                 "/pid; daemon off; worker_processes 1; events {} http { access_log off; " + temporary +
                                 "keepalive_requests 100000000; sendfile on; server { listen 127.0.0.1:" +
                                 std::to_string(port) + "; root " + folder_.path + "; } }");
        process_ = made ? fork() : -1;
        if (process_ == 0) {
            prctl(PR_SET_PDEATHSIG, SIGTERM);
            const std::string conf = folder_ / "conf", log = folder_ / "log";
            execl(program, "nginx", "-p", folder_.path.c_str(), "-c", conf.c_str(), "-e", log.c_str(), nullptr);
            _exit(1);
        }
        isRunning = process_ > 0 && answers();
    }
    ~Nginx()
    {
        if (process_ > 0) {
            kill(process_, SIGTERM);
            waitpid(process_, nullptr, 0);
        }
    }
    std::string url(const std::string& name = "volume") const
    {
        return "http://127.0.0.1:" + std::to_string(port) + "/" + name;
    }

    const int port = Listener().port;
    bool isRunning = false;

private:
    static constexpr const char* program = "/usr/sbin/nginx";

    bool answers() const
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_port = htons(static_cast<uint16_t>(port));
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        for (int attempt = 0; attempt < 1000; ++attempt, usleep(10000)) {
            const int probe = socket(AF_INET, SOCK_STREAM, 0);
            const bool connected = connect(probe, reinterpret_cast<sockaddr*>(&address), sizeof(address)) == 0;
            close(probe);
            if (connected || waitpid(process_, nullptr, WNOHANG) != 0)
                return connected;
        }
        return false;
    }

    TempFolder folder_;
    pid_t process_ = -1;
};

}  // namespace kplib::test
