#include "Calls.h"
#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/net/KpHttpGet.h>
#include <kplib/net/KpSocket.h>
#include <kplib/net/KpSocketTools.h>
#include <kplib/net/TmMsg.h>

#include <arpa/inet.h>
#include <functional>
#include <string>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>
#include <vector>

namespace kplib::probe {

namespace {

/// A peer that runs `serve` with each connection; its port.
int peer(std::function<void(int)> serve)
{
    const Exempt exempt;
    const int listener = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    socklen_t length = sizeof address;
    bind(listener, reinterpret_cast<sockaddr*>(&address), length);
    listen(listener, 64);
    getsockname(listener, reinterpret_cast<sockaddr*>(&address), &length);
    std::thread([listener, serve] {
        const Exempt also;
        for (int client; (client = accept(listener, nullptr, nullptr)) >= 0; close(client))
            serve(client);
    }).detach();
    return ntohs(address.sin_port);
}

void sendAll(int client, const std::string& bytes)
{
    for (size_t at = 0; at < bytes.size();) {
        const ssize_t n = send(client, bytes.data() + at, bytes.size() - at, MSG_NOSIGNAL);
        if (n <= 0)
            return;
        at += static_cast<size_t>(n);
    }
}

constexpr int rangeSize = 100000;

/// Answers each request with the same range.
void serveRanges(int client)
{
    const std::string body(rangeSize, 'b');
    const std::string answer =
        "HTTP/1.1 206 Partial Content\r\nContent-Length: " + std::to_string(rangeSize) + "\r\n\r\n" + body;
    std::string request;
    for (char c; recv(client, &c, 1, 0) == 1;) {
        request += c;
        if (request.ends_with("\r\n\r\n")) {
            sendAll(client, answer);
            request.clear();
        }
    }
}

/// Sends back what comes.
void echo(int client)
{
    std::vector<char> bytes(1 << 16);
    for (ssize_t n; (n = recv(client, bytes.data(), bytes.size(), 0)) > 0;)
        sendAll(client, std::string(bytes.data(), static_cast<size_t>(n)));
}

/// Closes the connection of an operation at its end.
class Connection {
public:
    explicit Connection(int port) : socket_(KpSocket::connect("127.0.0.1", port, 0, 1 << 16, 1 << 16)) {}
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;
    ~Connection()
    {
        if (socket_ >= 0)
            KpSocket::close(socket_);
    }
    operator int() const { return socket_; }

private:
    int socket_;
};

int echoPort()
{
    static const int port = peer(echo);
    return port;
}

Outcome ranges()
{
    static const int port = peer(serveRanges);
    const std::string url = "http://127.0.0.1:" + std::to_string(port) + "/file";
    KpHttpGet http;
    Digest digest;
    std::vector<char> bytes(rangeSize);
    for (int i = 0; i < 2; ++i) {
        if (!http.request(url.c_str(), 0, rangeSize - 1) || http.read(bytes.data(), rangeSize) != rangeSize)
            return {};
        digest.add(bytes.data(), bytes.size()) << http.status();
    }
    return digest;
}

Outcome messages()
{
    TmMsg msg, received;
    for (int i = 0; i < 20000; ++i)
        msg << i;
    const Connection connection(echoPort());
    const int size = static_cast<int>(msg.size());
    received.resize(size);
    if (connection < 0 || KpSocket::safeSend(connection, msg.dataPtr(), size) != size ||
        KpSocket::receive(connection, reinterpret_cast<char*>(received.dataPtr()), size, 0) != size)
        return {};
    return Digest() << (received == msg);
}

Outcome lines()
{
    const Connection connection(echoPort());
    KpString line;
    if (connection < 0 || KpSocket::send(connection, "%s\n", "a line") != 7 || KpSocket::readLine(connection, line) < 1)
        return {};
    char buffer[20];
    if (KpSocket::send(connection, "%s\n", "another") != 8 || KpSocket::receive(connection, buffer, 19, 1) != 8)
        return {};
    return Digest() << line << buffer;
}

Outcome options()
{
    const Connection connection(echoPort());
    if (connection < 0 || KpSocket::nonBlocking(connection) < 0 || !KpSocket::isNonBlocking(connection) ||
        KpSocket::blocking(connection) < 0 || KpSocket::setNoDelay(connection, true) < 0 ||
        KpSocket::setTimeout(connection, 1000) < 0)
        return {};
    return Digest() << KpSocket::isNonBlocking(connection);
}

Outcome names()
{
    const KpString name = KpSocketTools::getHostName();
    if (name.isEmpty())
        return {};
    return Digest() << name;
}

}  // namespace

Operations peerOperations()
{
    static constexpr Operation list[] = {
        {"ranges over HTTP", ranges},     {"messages over a socket", messages}, {"lines over a socket", lines},
        {"options of a socket", options}, {"the name of this machine", names},
    };
    return list;
}

}  // namespace kplib::probe
