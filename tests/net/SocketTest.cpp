#include "net/Servers.h"
#include "support/LogCapture.h"
#include "support/SteadySignal.h"
#include "support/TempFolder.h"

#include <kplib/net/KpHttpGet.h>
#include <kplib/net/KpSocket.h>
#include <kplib/net/KpSocketTools.h>
#include <kplib/net/detail/SocketCalls.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <gtest/gtest.h>
#include <vector>

using namespace kplib::test;

namespace {

std::vector<int> refusedOptions;  // of SOL_SOCKET

/// Two connected sockets: mine, and that of a peer which may hang up.
struct Pair {
    Pair() { EXPECT_EQ(socketpair(AF_UNIX, SOCK_STREAM, 0, ends), 0); }
    ~Pair() { close(mine); }
    void hangUp() const { close(peer); }
    int ends[2] = {-1, -1};
    const int &mine = ends[0], &peer = ends[1];
};

template <typename T = int>
T option(int socket, int level, int name)
{
    T value{};
    socklen_t length = sizeof(value);
    getsockopt(socket, level, name, &value, &length);
    return value;
}

}  // namespace

extern "C" {
int __real_setsockopt(int, int, int, const void*, socklen_t);
int __wrap_setsockopt(int socket, int level, int name, const void* value, socklen_t length);

int __wrap_setsockopt(int socket, int level, int name, const void* value, socklen_t length)
{
    if (level != SOL_SOCKET || std::count(refusedOptions.begin(), refusedOptions.end(), name) == 0)
        return __real_setsockopt(socket, level, name, value, length);
    errno = ENOBUFS;
    return -1;
}
}

TEST(KpSocket, connectsByAddressByNameAndToThisMachine)
{
    const Listener listener;
    const char* const ownName = KpSocketTools::getIPV4Address() ? nullptr : "localhost";
    for (const char* host : {"127.0.0.1", "localhost", ownName}) {
        const int socket = KpSocket::connect(host, listener.port, 0, 20000, 30000);
        ASSERT_GE(socket, 0) << KpSocket::strerror();
        EXPECT_EQ(option(socket, SOL_SOCKET, SO_RCVBUF), 40000);  // Linux doubles both
        EXPECT_EQ(option(socket, SOL_SOCKET, SO_SNDBUF), 60000);
        EXPECT_FALSE(KpSocket::isNonBlocking(socket));
        KpSocket::setTimeout(socket, 2500);
        const timeval timeout = option<timeval>(socket, SOL_SOCKET, SO_RCVTIMEO);
        EXPECT_EQ(std::tuple(timeout.tv_sec, timeout.tv_usec), std::tuple(2L, 500000L));
        KpSocket::setNoDelay(socket, true);
        EXPECT_EQ(option(socket, IPPROTO_TCP, TCP_NODELAY), 1);
        EXPECT_EQ(KpSocket::close(socket), 0);
    }
}

TEST(KpSocket, tellsWhyThereIsNoConnection)
{
    const int freePort = Listener().port, descriptors = static_cast<int>(namesIn("/proc/self/fd").size());
    EXPECT_EQ(KpSocket::connect("127.0.0.1", freePort, 0, 0, 0), -1);
    EXPECT_EQ(KpSocket::lastErrorCode(), ECONNREFUSED);
    EXPECT_STREQ(KpSocket::strerror(), "Connection refused");
    EXPECT_EQ(KpSocket::connect("nowhere.invalid", freePort, 0, 0, 0), -1);
    EXPECT_EQ(KpSocket::lastErrorCode(), EHOSTUNREACH);

    const Listener listener;
    const LogCapture log;
    refusedOptions = {SO_RCVBUF, SO_SNDBUF};
    EXPECT_EQ(KpSocket::close(KpSocket::connect("127.0.0.1", listener.port, 0, 1, 1)), 0);
    EXPECT_EQ(LogCapture::lines(), (Lines{"E [] Could not set TCP receive buffer size: No buffer space available",
                                          "E [] Could not set TCP send buffer size: No buffer space available"}));
    refusedOptions = {SO_REUSEADDR};
    EXPECT_EQ(KpSocket::connect("127.0.0.1", listener.port, 0, 0, 0), -1);
    EXPECT_EQ(KpSocket::lastError(), "No buffer space available");
    KpHttpGet get;
    EXPECT_FALSE(get.request("http://127.0.0.1"));
    EXPECT_EQ(get.errorText(), "No buffer space available");
    refusedOptions.clear();
    EXPECT_EQ(static_cast<int>(namesIn("/proc/self/fd").size()), descriptors + 1);  // the listener

    const Listener other;
    const int broken = KpSocket::connect("127.0.0.1", other.port, 0, 0, 0);
    const int peer = accept(other.socket, nullptr, nullptr);
    resetAtClose(peer);
    close(peer);
    EXPECT_FALSE(kplib::detail::awaitConnection(broken));
    EXPECT_EQ(KpSocket::lastErrorCode(), ECONNRESET);
    close(broken);
}

TEST(KpSocket, readsLinesAndNothingBehindThem)
{
    const std::string longLine(5000, 'x'), text = "a\r\n\n" + longLine + "\nab" + std::string("\0c\nrest", 7);
    for (size_t step : {text.size(), size_t{1}, size_t{513}}) {
        Pair pair;
        for (const auto& [socket, result] : {std::pair(pair.mine, 0), {pair.mine, 0}, {-1, -1}})
            EXPECT_EQ(KpSocket::nonBlocking(socket), result);
        EXPECT_TRUE(KpSocket::isNonBlocking(pair.mine));
        std::thread writer([&] {
            usleep(10000);  // so that a socket that isn't blocking would show
            put(pair.peer, text, step);
            pair.hangUp();
        });
        KpString line("old");
        for (const std::string& expected :
             {std::string("a\r\n"), std::string("\n"), longLine + "\n", std::string("ab\0c\n", 5)}) {
            EXPECT_EQ(KpSocket::readLine(pair.mine, line), static_cast<long>(expected.size()));
            EXPECT_EQ(std::memcmp(line.c_str(), expected.c_str(), expected.size() + 1), 0) << line;
            EXPECT_FALSE(KpSocket::isNonBlocking(pair.mine));
        }
        EXPECT_EQ(KpSocket::readLine(pair.mine, line), 0);
        EXPECT_EQ(line, "rest");
        writer.join();
    }
}

TEST(KpSocket, receivesAsManyBytesAsAskedForOrALine)
{
    // Size, line mode, result; the buffer afterwards ('.' is untouched, '0' a NUL); what is left to receive.
    const std::tuple<int, int, int, const char*, const char*> cases[] = {
        {6, 0, 6, "abc\nde..", ""},   {7, 0, 0, "abc\nde..", ""},    {0, 0, 0, "........", "abc\nde"},
        {7, 1, 4, "abc\n0...", "de"}, {3, 1, 3, "abc0....", "\nde"}, {1, 1, 0, "........", "abc\nde"},
    };
    for (const auto& [size, lineMode, result, expected, rest] : cases) {
        for (size_t step : {1, 6}) {
            Pair pair;
            put(pair.peer, "abc\nde", step);
            pair.hangUp();
            std::string buffer(8, '.');
            EXPECT_EQ(KpSocket::receive(pair.mine, buffer.data(), size, lineMode), result);
            std::replace(buffer.begin(), buffer.end(), '\0', '0');
            EXPECT_EQ(buffer, expected) << size;
            char left[8] = "";
            recv(pair.mine, left, sizeof(left), 0);
            EXPECT_STREQ(left, rest);
        }
    }
}

TEST(KpSocket, goesOnThroughSignalsAndStillTimesOut)
{
    Pair pair;
    const Listener busy(0);
    const int first = KpSocket::connect("127.0.0.1", busy.port, 0, 0, 0);  // fills the queue, so that the next waits
    std::thread peer([&] {
        SteadySignal::block();
        for (int i = 0; i < 20; ++i, usleep(2000))
            put(pair.peer, "x");
        usleep(50000);  // the second connection waits by then
        close(accept(busy.socket, nullptr, nullptr));
    });
    const SteadySignal signal;
    char received[20] = "";
    EXPECT_EQ(KpSocket::receive(pair.mine, received, 20, 0), 20);
    const int second = KpSocket::connect("127.0.0.1", busy.port, 0, 0, 0);
    EXPECT_EQ(option<tcp_info>(second, IPPROTO_TCP, TCP_INFO).tcpi_state, TCP_ESTABLISHED) << KpSocket::strerror();
    peer.join();
    KpSocket::setTimeout(pair.mine, 50);
    put(pair.peer, "part");
    KpString line;
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(KpSocket::readLine(pair.mine, line), -1);
    EXPECT_EQ(std::tuple(KpSocket::lastErrorCode(), line), std::tuple(EAGAIN, "part"));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(40));
    for (int socket : {first, second, pair.peer})
        KpSocket::close(socket);
}

TEST(KpSocket, waitsOneTimeoutForTheRest)
{
    Pair pair;
    char received[20];
    KpSocket::setTimeout(pair.mine, 300);
    put(pair.peer, "part");
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(KpSocket::receive(pair.mine, received, 20, 0), -1);
    const std::chrono::duration<double> waited = std::chrono::steady_clock::now() - start;
    EXPECT_NEAR(waited.count(), 0.375, 0.125);
    KpSocket::close(pair.peer);
}

TEST(KpSocket, sendsAllToASlowPeerAndSurvivesOneThatHasGone)
{
    Pair pair;
    std::string data(1 << 20, ' '), received(data.size(), '-');
    for (size_t i = 0; i < data.size(); ++i)
        data[i] = static_cast<char>(i * 7 >> 3);
    std::thread reader([&] {
        SteadySignal::block();
        for (size_t i = 0; i < received.size(); usleep(3000))
            i += static_cast<size_t>(recv(pair.peer, received.data() + i, received.size() - i, 0));
        pair.hangUp();
    });
    {
        const SteadySignal signal;
        EXPECT_EQ(KpSocket::safeSend(pair.mine, data.data(), 1 << 20), 1 << 20);
        reader.join();
    }
    EXPECT_TRUE(received == data);
    EXPECT_EQ(KpSocket::safeSend(pair.mine, "x", 1), -1);
    EXPECT_EQ(KpSocket::send(pair.mine, "x"), -1);
    EXPECT_EQ(KpSocket::safeSend(pair.mine, "x", 0), 0);

    const Pair fresh;
    EXPECT_EQ(KpSocket::send(fresh.mine, "%s %d\n", "GET", 7), 6);
    EXPECT_EQ(KpSocket::send(fresh.mine, "%s", std::string(5000, 'x').c_str()), 4095);
    fresh.hangUp();
}

TEST(KpSocketTools, findsAddresses)
{
    EXPECT_EQ(KpSocketTools::getIPV4AddressString("192.0.2.213"), "192.0.2.213");
    EXPECT_EQ(KpSocketTools::getIPV4AddressString("nowhere.invalid"), "0.0.0.0");
    EXPECT_EQ(KpSocketTools::getIPV4AddressString(),
              KpSocketTools::getIPV4AddressString(KpSocketTools::getHostName().c_str()));
}
