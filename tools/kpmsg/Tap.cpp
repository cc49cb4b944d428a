#include "Tap.h"

#include "Values.h"

#include <kplib/foundation/KpString.h>
#include <kplib/net/KpSocket.h>
#include <support/Program.h>

#include <arpa/inet.h>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <exception>
#include <filesystem>
#include <list>
#include <memory>
#include <mutex>
#include <netinet/in.h>
#include <poll.h>
#include <string>
#include <sys/socket.h>
#include <system_error>
#include <thread>
#include <unistd.h>
#include <utility>

namespace {

constexpr int pollMilliseconds = 100;
constexpr const char* toPeer = "to-peer";
constexpr const char* fromPeer = "from-peer";
volatile std::sig_atomic_t isInterrupted = 0;

struct Place {
    std::string host;
    int port;
};

// "HOST:PORT", or a port alone on `usualHost` if that is not empty.
Place placeOf(const std::string& text, const std::string& usualHost)
{
    const auto colon = text.rfind(':');
    const std::string port = colon == std::string::npos ? text : text.substr(colon + 1);
    const std::string host = colon == std::string::npos ? usualHost : text.substr(0, colon);
    const bool isNumber = !port.empty() && port.size() < 6 && port.find_first_not_of("0123456789") == std::string::npos;
    if (!isNumber || std::stoi(port) > 65535 || host.empty())
        throw Failure("'" + text + "' is no place to connect to; give " +
                      (usualHost.empty() ? "HOST:PORT" : "PORT or ADDRESS:PORT"));
    return {host, std::stoi(port)};
}

// Listens at the place, and sets its port to the one that is taken.
int listenAt(Place& place)
{
    constexpr int enable = 1;
    sockaddr_in address{};
    socklen_t length = sizeof address;
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<unsigned short>(place.port));
    if (inet_pton(AF_INET, place.host.c_str(), &address.sin_addr) != 1)
        throw Failure("'" + place.host + "' is no address of this machine; give four numbers such as 127.0.0.1");
    const int listener = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    auto* const any = reinterpret_cast<sockaddr*>(&address);
    setsockopt(listener, SOL_SOCKET, SO_REUSEADDR, &enable, sizeof enable);
    if (listener < 0 || ::bind(listener, any, length) != 0 || ::listen(listener, 16) != 0)
        throw Failure("can't listen at port " + std::to_string(place.port) + ": " + std::strerror(errno));
    getsockname(listener, any, &length);
    place.port = ntohs(address.sin_port);
    return listener;
}

// A file that has its name only once it is complete.
class Recording {
public:
    explicit Recording(std::filesystem::path path) : path_(std::move(path)), part_(path_.string() + ".part")
    {
        file_ = std::fopen(part_.c_str(), "wb");
        if (!file_)
            throw Failure("can't write '" + part_ + "': " + std::strerror(errno));
    }
    Recording(const Recording&) = delete;
    Recording& operator=(const Recording&) = delete;
    ~Recording()
    {
        if (file_)
            std::fclose(file_);
        std::remove(part_.c_str());
    }
    void write(const char* bytes, std::size_t n)
    {
        size_ += n;
        isWritten_ = std::fwrite(bytes, 1, n, file_) == n && isWritten_;
    }
    // The bytes of the file; -1 if they are not all on disk, and then there is no file.
    long finish()
    {
        isWritten_ = std::fclose(file_) == 0 && isWritten_;
        file_ = nullptr;
        isWritten_ = isWritten_ && std::rename(part_.c_str(), path_.c_str()) == 0;
        return isWritten_ ? static_cast<long>(size_) : -1;
    }

private:
    std::filesystem::path path_;
    std::string part_;
    std::FILE* file_;
    std::size_t size_ = 0;
    bool isWritten_ = true;
};

// Passes on what one side sends until it ends; then the other side reads its end.
void passOn(int from, int to, Recording& recording)
{
    char piece[65536];
    for (;;) {
        const ssize_t n = ::recv(from, piece, sizeof piece, 0);
        if (n < 0 && errno == EINTR)
            continue;
        if (n <= 0)
            break;
        recording.write(piece, static_cast<std::size_t>(n));
        if (KpSocket::safeSend(to, piece, static_cast<int>(n)) != n)
            break;
    }
    ::shutdown(to, SHUT_WR);
    ::shutdown(from, SHUT_RD);
}

class Tap {
public:
    explicit Tap(const TapJob& job) : job_(job), peer_(placeOf(job.peer, ""))
    {
        Place place = placeOf(job.listen, "127.0.0.1");
        std::error_code error;
        std::filesystem::create_directories(job.folder, error);
        if (error)
            throw Failure("can't make the folder '" + job.folder + "': " + error.message());
        listener_ = listenAt(place);
        say({{"port", place.port}}, "waiting at port " + std::to_string(place.port));
    }
    Tap(const Tap&) = delete;
    Tap& operator=(const Tap&) = delete;
    ~Tap() { ::close(listener_); }

    bool run()
    {
        int number = 0;
        for (int i = 0; job_.connections == 0 || i < job_.connections; ++i) {
            const int client = accept();
            if (client < 0)
                break;
            removeEnded();
            do {  // files of an earlier run stay
                ++number;
            } while (std::filesystem::exists(pathOf(number, toPeer)) ||
                     std::filesystem::exists(pathOf(number, fromPeer)));
            connections_.push_back(std::make_unique<Connection>());
            Connection& connection = *connections_.back();
            connection.client = client;
            connection.thread = std::thread([this, number, &connection] { serve(number, connection); });
        }
        waitForConnections();
        return !hasFailed_;
    }

private:
    struct Connection {
        int client = -1;
        std::atomic<int> peer = -1;
        std::atomic<bool> isDone = false;
        std::thread thread;

        ~Connection()
        {
            thread.join();
            ::close(client);
            if (peer >= 0)
                ::close(peer);
        }
        // Ends both directions; their threads then complete the files.
        void end() const
        {
            ::shutdown(client, SHUT_RDWR);
            if (peer >= 0)
                ::shutdown(peer, SHUT_RDWR);
        }
    };

    // The next connection; -1 after a signal.
    int accept()
    {
        while (!isInterrupted) {
            pollfd waiting{listener_, POLLIN, 0};
            if (::poll(&waiting, 1, pollMilliseconds) <= 0)
                continue;
            const int client = ::accept4(listener_, nullptr, nullptr, SOCK_CLOEXEC);
            if (client >= 0)
                return client;
        }
        return -1;
    }

    std::filesystem::path pathOf(int number, const char* direction) const
    {
        char name[32];
        std::snprintf(name, sizeof name, "%04d-%s.bin", number, direction);
        return std::filesystem::path(job_.folder) / name;
    }

    void serve(int number, Connection& connection)
    {
        try {
            record(number, connection);
        } catch (const std::exception& e) {
            warn(number, e.what());
        }
        ::shutdown(connection.client, SHUT_RDWR);
        connection.isDone = true;
    }

    void record(int number, Connection& connection)
    {
        const int peer = KpSocket::connect(peer_.host.c_str(), peer_.port, 0, 0, 0);
        if (peer < 0) {
            warn(number, "can't connect to " + job_.peer + ": " + KpSocket::lastError().c_str());
            return;
        }
        connection.peer = peer;
        Recording there(pathOf(number, toPeer));
        Recording back(pathOf(number, fromPeer));
        std::thread backwards([&] { passOn(peer, connection.client, back); });
        passOn(connection.client, peer, there);
        backwards.join();
        const long sent = there.finish();
        const long received = back.finish();
        if (sent < 0 || received < 0)
            warn(number, "can't write all bytes to '" + job_.folder + "'");
        say({{"connection", number}, {"toPeer", sent}, {"fromPeer", received}},
            "connection " + std::to_string(number) + ": " + std::to_string(sent) + " bytes to the peer, " +
                std::to_string(received) + " bytes from it");
    }

    void removeEnded()
    {
        connections_.remove_if([](const auto& connection) { return connection->isDone.load(); });
    }

    void waitForConnections()
    {
        for (removeEnded(); !connections_.empty(); removeEnded()) {
            for (const auto& connection : connections_) {
                if (isInterrupted)
                    connection->end();
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
    }

    void warn(int number, const std::string& what)
    {
        std::fprintf(stderr, "kpmsg: connection %d: %s\n", number, what.c_str());
        hasFailed_ = true;
    }

    void say(const Json& json, const std::string& text)
    {
        const std::lock_guard lock(output_);
        print((job_.isJson ? json.dump() : text) + "\n");
    }

    const TapJob& job_;
    Place peer_;
    int listener_ = -1;
    std::list<std::unique_ptr<Connection>> connections_;
    std::atomic<bool> hasFailed_ = false;
    std::mutex output_;
};

}  // namespace

bool tap(const TapJob& job)
{
    struct sigaction interrupt {};
    interrupt.sa_handler = [](int) { isInterrupted = 1; };
    sigaction(SIGINT, &interrupt, nullptr);
    sigaction(SIGTERM, &interrupt, nullptr);
    return Tap(job).run();
}
