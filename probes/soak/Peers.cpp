#include "Soak.h"

#include <kplib/net/KpHttpGet.h>
#include <kplib/net/KpSocket.h>
#include <kplib/net/TmMsg.h>

#include <algorithm>
#include <arpa/inet.h>
#include <random>
#include <sys/socket.h>
#include <thread>
#include <vector>

namespace kplib::probe {

namespace {

constexpr std::uint64_t longestRange = 1 << 18;

/// Sends back each message, after its length, on a thread of its own.
class Echo {
public:
    Echo()
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t length = sizeof address;
        bind(listener_, reinterpret_cast<sockaddr*>(&address), length);
        listen(listener_, 1);
        getsockname(listener_, reinterpret_cast<sockaddr*>(&address), &length);
        port_ = ntohs(address.sin_port);
        thread_ = std::thread([this] { serve(); });
    }
    Echo(const Echo&) = delete;
    Echo& operator=(const Echo&) = delete;
    ~Echo()
    {
        shutdown(listener_, SHUT_RDWR);
        thread_.join();
        KpSocket::close(listener_);
    }
    int port() const { return port_; }

private:
    void serve() const
    {
        TmMsg msg;
        for (int peer; (peer = accept(listener_, nullptr, nullptr)) >= 0; KpSocket::close(peer)) {
            KpSocket::setNoDelay(peer, true);
            for (int size; KpSocket::receive(peer, reinterpret_cast<char*>(&size), sizeof size, 0) == sizeof size;) {
                msg.reset(size);
                KpSocket::receive(peer, reinterpret_cast<char*>(msg.dataPtr()), size, 0);
                KpSocket::safeSend(peer, msg.dataPtr(), size);
            }
        }
    }

    int listener_ = socket(AF_INET, SOCK_STREAM, 0);
    int port_ = 0;
    std::thread thread_;
};

void fill(TmMsg& msg, std::mt19937& random)
{
    KpDArray<int> numbers;
    numbers.resize(static_cast<long>(random() % 20000));
    std::generate(numbers.begin(), numbers.end(), [&] { return static_cast<int>(random()); });
    msg.reset(0);
    msg << 1.5 << "a text" << numbers << std::string(random() % 500, 's');
}

bool goesAndComes(int connection, const TmMsg& msg, TmMsg& received)
{
    const int size = static_cast<int>(msg.size());
    received.reset(size);
    return KpSocket::safeSend(connection, &size, sizeof size) == sizeof size &&
           KpSocket::safeSend(connection, msg.dataPtr(), size) == size &&
           KpSocket::receive(connection, reinterpret_cast<char*>(received.dataPtr()), size, 0) == size &&
           received == msg;
}

enum class Answer { Right, Wrong, None };

Answer readRange(KpHttpGet& http, const std::string& url, std::uint64_t first, std::uint64_t count,
                 std::vector<unsigned char>& bytes)
{
    if (!http.request(url.c_str(), first, first + count - 1) || http.contentLength() == 0)
        return Answer::None;
    if (http.status() != 206 || http.read(bytes.data(), count) != static_cast<long>(count))
        return Answer::Wrong;
    for (std::uint64_t i = 0; i < count; ++i) {
        if (bytes[i] != patternAt(first + i))
            return Answer::Wrong;
    }
    return Answer::Right;
}

}  // namespace

void readRanges(const std::string& url, std::uint64_t size, int number, Tally& tally)
{
    std::mt19937 random(static_cast<unsigned>(number));
    std::vector<unsigned char> bytes(longestRange);
    KpHttpGet http;
    for (long i = 0; !tally.isOver; ++i) {
        const std::uint64_t first = random() % size, count = std::min(size - first, 1 + random() % longestRange);
        const bool wasOpen = http.state() == KpHttpGet::Finished;
        Answer answer = readRange(http, url, first, count, bytes);
        if (answer == Answer::None && wasOpen) {  // a server closes a connection after some requests
            http.cancel();
            answer = readRange(http, url, first, count, bytes);
        }
        if (answer != Answer::Right)
            tally.fault("range " + std::to_string(first) + "+" + std::to_string(count) + ": " + http.errorText());
        ++tally.ranges;
        if (i % 50 == 0)
            http.cancel();
    }
}

void exchangeMessages(int number, Tally& tally)
{
    std::mt19937 random(static_cast<unsigned>(number));
    const Echo echo;
    TmMsg msg, received;
    while (!tally.isOver) {
        const int connection = KpSocket::connect("127.0.0.1", echo.port(), 0, 1 << 16, 1 << 16);
        KpSocket::setNoDelay(connection, true);
        for (int i = 0; i < 100 && !tally.isOver; ++i) {
            fill(msg, random);
            if (goesAndComes(connection, msg, received))
                ++tally.messages;
            else
                tally.fault("a message of " + std::to_string(msg.size()) + " bytes did not come back");
        }
        KpSocket::close(connection);
    }
}

}  // namespace kplib::probe
