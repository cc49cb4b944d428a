#pragma once

#include <support/TempFolder.h>

#include <kplib/net/KpSocket.h>

#include <arpa/inet.h>
#include <atomic>
#include <csignal>
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
        const std::string volume = folder_.file("volume", "");
        std::filesystem::resize_file(volume, size);
        std::fstream file(volume);
        for (long spot : spots)
            file.seekp(spot).write(reinterpret_cast<const char*>(&spot), sizeof(spot));
        file.close();
        std::string conf = geteuid() == 0 ? "user root;" : "";  // the folder is this user's alone
        conf += "daemon off; worker_processes 1; pid pid; events {} http { access_log off; sendfile on; "
                "keepalive_requests 100000000; server { root .; listen 127.0.0.1:" +
                std::to_string(port) + "; }";
        for (const char* kind : {"client_body", "proxy", "fastcgi", "uwsgi", "scgi"})
            conf += std::string(kind) + "_temp_path temporary;";
        conf = folder_.file("conf", conf + "}");
        process_ = fork();
        if (process_ == 0) {
            prctl(PR_SET_PDEATHSIG, SIGTERM);
            execl(program, "nginx", "-p", folder_.path.c_str(), "-c", conf.c_str(), "-e", "log", nullptr);
            _exit(1);
        }
        for (int attempt = 0; attempt < 1000 && !isRunning && waitpid(process_, nullptr, WNOHANG) == 0; ++attempt) {
            usleep(10000);
            isRunning = KpSocket::close(KpSocket::connect("127.0.0.1", port, 0, 0, 0)) == 0;
        }
    }
    ~Nginx()
    {
        if (isRunning && kill(process_, SIGTERM) == 0)
            waitpid(process_, nullptr, 0);
    }
    std::string url(const std::string& name = "volume") const
    {
        return "http://127.0.0.1:" + std::to_string(port) + "/" + name;
    }

    const int port = Listener().port;
    bool isRunning = false;

private:
    static constexpr const char* program = "/usr/sbin/nginx";

    TempFolder folder_;
    pid_t process_ = -1;
};

}  // namespace kplib::test
