#include <net/Servers.h>
#include <support/Bench.h>

#include <kplib/net/KpSocket.h>

#include <thread>
#include <vector>

// Blocks of 1 MiB over the loopback, sent to a peer that drops them or received from one that always has more, beside
// the bare calls of the system.

namespace {

constexpr int blockSize = 1 << 20;

bool bareSend(int socket, const char* data)
{
    for (long sent = 0, n = 0; sent < blockSize; sent += n) {
        n = send(socket, data + sent, static_cast<size_t>(blockSize - sent), MSG_NOSIGNAL);
        if (n < 1)
            return false;
    }
    return true;
}

bool bareReceive(int socket, char* data)
{
    for (long received = 0, n = 0; received < blockSize; received += n) {
        n = recv(socket, data + received, static_cast<size_t>(blockSize - received), 0);
        if (n < 1)
            return false;
    }
    return true;
}

bool safeSend(int socket, const char* data)
{
    return KpSocket::safeSend(socket, data, blockSize) == blockSize;
}

bool receive(int socket, char* data)
{
    return KpSocket::receive(socket, data, blockSize, 0) == blockSize;
}

/// `mine` here, `theirs` at the other end, each with a block of its own.
template <typename Mine, typename Theirs>
void exchange(benchmark::State& state, Mine mine, Theirs theirs, const char* baseline, double limit)
{
    const kplib::test::Listener listener;
    const int socket = KpSocket::connect("127.0.0.1", listener.port, 0, 0, 0);
    const int peer = accept(listener.socket, nullptr, nullptr);
    std::thread other([&] {
        std::vector<char> block(blockSize);
        while (theirs(peer, block.data())) {
        }
    });
    std::vector<char> block(blockSize);
    for (auto _ : state) {
        if (!mine(socket, block.data()))
            state.SkipWithError("the connection broke");
    }
    close(socket);  // which wakes the other end, even one that sends into a full window; shutdown() doesn't
    other.join();
    close(peer);
    kplib::bench::report(state, 1, blockSize, baseline, limit);
}

}  // namespace

BENCHMARK_CAPTURE(exchange, send, bareSend, bareReceive, "", 0)->Name("send")->UseRealTime()->MinTime(0.3);
BENCHMARK_CAPTURE(exchange, safeSend, safeSend, bareReceive, "send", 1.05)
    ->Name("KpSocket/safeSend")
    ->UseRealTime()
    ->MinTime(0.3);
BENCHMARK_CAPTURE(exchange, recv, bareReceive, bareSend, "", 0)->Name("recv")->UseRealTime()->MinTime(0.3);
BENCHMARK_CAPTURE(exchange, receive, receive, bareSend, "recv", 1.05)
    ->Name("KpSocket/receive")
    ->UseRealTime()
    ->MinTime(0.3);
