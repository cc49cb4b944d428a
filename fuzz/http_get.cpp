// A server that answers with any bytes, in pieces: the client ends, delivers nothing beyond what was sent, and works
// again.

#include "Fuzz.h"

#include <kplib/log/KpLogFile.h>
#include <kplib/net/KpHttpGet.h>

#include <arpa/inet.h>
#include <csignal>
#include <netinet/in.h>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>

namespace {

class Server {
public:
    Server() : socket_(::socket(AF_INET, SOCK_STREAM, 0))
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        check(bind(socket_, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0 && listen(socket_, 8) == 0);
        socklen_t size = sizeof address;
        getsockname(socket_, reinterpret_cast<sockaddr*>(&address), &size);
        url_ = "http://127.0.0.1:" + std::to_string(ntohs(address.sin_port)) + "/f";
    }

    const std::string& url() const { return url_; }

    // Answers one connection: the bytes in pieces of `step`, each after a request or the piece before.
    void answer(const std::string& bytes, std::size_t step) const
    {
        const int peer = accept(socket_, nullptr, nullptr);
        char request[4096];
        if (recv(peer, request, sizeof request, 0) > 0) {
            for (std::size_t at = 0; at < bytes.size(); at += step) {
                if (::send(peer, bytes.data() + at, std::min(step, bytes.size() - at), MSG_NOSIGNAL) <= 0)
                    break;
            }
        }
        close(peer);
    }

private:
    int socket_;
    std::string url_;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    static const Server server;
    getTheLogInstance().setLogLevel(KpLogOff);
    std::signal(SIGPIPE, SIG_IGN);
    Input input(data, size);
    const std::size_t step = 1 + input.number<std::uint16_t>() % 700;
    const unsigned long first = input.number<std::uint8_t>(), last = input.number<std::uint8_t>();
    const std::string answer = input.rest();
    std::thread peer([&] { server.answer(answer, step); });
    KpHttpGet get;
    long delivered = 0;
    if (get.request(server.url().c_str(), first, last)) {
        char buffer[300];
        for (int i = 0; i < 20; ++i) {
            const long n = get.read(buffer, i % 2 ? 1 : sizeof buffer);
            check(n <= static_cast<long>(sizeof buffer));
            if (n <= 0)
                break;
            delivered += n;
        }
        check(delivered <= static_cast<long>(answer.size()));
        check(get.bytesRead() <= static_cast<long long>(answer.size()));
        get.contentLength();
    }
    get.cancel();
    peer.join();
    return 0;
}
