#include "net/Servers.h"
#include "support/LogCapture.h"

#include <kplib/net/KpSocket.h>
#include <kplib/net/KpSocketTools.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <gtest/gtest.h>
#include <sys/time.h>
#include <vector>

using namespace kplib::test;

namespace {

std::vector<int> refusedOptions;  // of SOL_SOCKET

/// Two connected sockets; first() is the tested one.
struct Pair {
    Pair() { EXPECT_EQ(socketpair(AF_UNIX, SOCK_STREAM, 0, ends), 0); }
    ~Pair()
    {
        close(ends[0]);
        hangUp();
    }
    void hangUp()
    {
        if (ends[1] >= 0)
            KpSocket::close(ends[1]);
        ends[1] = -1;
    }
    int ends[2];
};

/// SIGALRM to this thread every millisecond, with a handler that lets calls be interrupted.
class SteadySignal {
public:
    SteadySignal()
    {
        struct sigaction action {};
        action.sa_handler = [](int) { count = count + 1; };
        sigaction(SIGALRM, &action, nullptr);
        set(1000);
    }
    ~SteadySignal()
    {
        set(0);
        EXPECT_GT(count, 10);
    }
    /// To be called by other threads, first of all.
    static void block()
    {
        sigset_t set;
        sigemptyset(&set);
        sigaddset(&set, SIGALRM);
        pthread_sigmask(SIG_BLOCK, &set, nullptr);
    }

private:
    static void set(int microseconds)
    {
        const itimerval interval{{0, microseconds}, {0, microseconds}};
        setitimer(ITIMER_REAL, &interval, nullptr);
    }
    static volatile sig_atomic_t count;
};
volatile sig_atomic_t SteadySignal::count = 0;

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
    errno = ENOBUFS;
    const bool refused = std::count(refusedOptions.begin(), refusedOptions.end(), name) > 0 && level == SOL_SOCKET;
    return refused ? -1 : __real_setsockopt(socket, level, name, value, length);
}
}

TEST(KpSocket, connectsByAddressByNameAndToThisMachine)
{
    const Listener listener;
    const char* const ownName = KpSocketTools::getIPV4Address() ? nullptr : "localhost";
    for (const char* host : {"127.0.0.1", "localhost", ownName}) {
        const int socket = KpSocket::connect(host, listener.port, 0, 20000, 30000);
        ASSERT_GE(socket, 0) << KpSocket::strerror();
        EXPECT_EQ(option(socket, SOL_SOCKET, SO_REUSEADDR), 1);
        EXPECT_EQ(option(socket, SOL_SOCKET, SO_RCVBUF), 40000);  // Linux doubles both
        EXPECT_EQ(option(socket, SOL_SOCKET, SO_SNDBUF), 60000);
        EXPECT_FALSE(KpSocket::isNonBlocking(socket));
        KpSocket::setTimeout(socket, 2500);
        const timeval timeout = option<timeval>(socket, SOL_SOCKET, SO_RCVTIMEO);
        EXPECT_TRUE(timeout.tv_sec == 2 && timeout.tv_usec == 500000);
        for (bool enable : {true, false}) {
            KpSocket::setNoDelay(socket, enable);
            EXPECT_EQ(option(socket, IPPROTO_TCP, TCP_NODELAY), enable);
        }
        EXPECT_EQ(KpSocket::close(socket), 0);
    }
    EXPECT_FALSE(KpSocket::isNonBlocking(-1));
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
    refusedOptions.clear();
    EXPECT_EQ(static_cast<int>(namesIn("/proc/self/fd").size()), descriptors + 1);  // the listener
}

TEST(KpSocket, readsLinesAndNothingBehindThem)
{
    const std::string longLine(5000, 'x'), text = "a\r\n\n" + longLine + "\nab" + std::string("\0c\nrest", 7);
    for (size_t step : {text.size(), size_t{1}, size_t{513}}) {
        Pair pair;
        KpSocket::nonBlocking(pair.ends[0]);
        std::thread writer([&] {
            usleep(10000);  // so that a socket that isn't blocking would show
            put(pair.ends[1], text, step);
            pair.hangUp();
        });
        KpString line("old");
        EXPECT_EQ(KpSocket::readLine(pair.ends[0], line), 3);
        EXPECT_EQ(line, "a\r\n");
        EXPECT_FALSE(KpSocket::isNonBlocking(pair.ends[0]));
        EXPECT_EQ(KpSocket::readLine(pair.ends[0], line), 1);
        EXPECT_EQ(KpSocket::readLine(pair.ends[0], line), 5001);
        EXPECT_EQ(line, (longLine + "\n").c_str());
        char byte = 0;
        EXPECT_EQ(KpSocket::receive(pair.ends[0], &byte, 1, 0), 1);
        EXPECT_EQ(byte, 'a');
        EXPECT_EQ(KpSocket::readLine(pair.ends[0], line), 4);
        EXPECT_EQ(std::memcmp(line.c_str(), "b\0c\n", 5), 0);
        EXPECT_EQ(KpSocket::readLine(pair.ends[0], line), 0);
        EXPECT_EQ(line, "rest");
        writer.join();
    }
    KpString line;
    EXPECT_EQ(KpSocket::readLine(-1, line), -1);
}

TEST(KpSocket, receivesAsManyBytesAsAskedForOrALine)
{
    const struct {
        const char* what;
        int size, lineMode, result;
        const char* buffer;  // afterwards; '.' is untouched, '0' a NUL
        const char* left;
    } cases[] = {
        {"all", 6, 0, 6, "abc\nde..", ""},
        {"too few", 7, 0, 0, "abc\nde..", ""},
        {"nothing", 0, 0, 0, "........", "abc\nde"},
        {"less than nothing", -1, 0, 0, "........", "abc\nde"},
        {"a line", 7, 1, 4, "abc\n0...", "de"},
        {"a line that just fits", 4, 1, 4, "abc\n0...", "de"},
        {"a longer line", 3, 1, 3, "abc0....", "\nde"},
        {"no room", 1, 1, 0, "........", "abc\nde"},
    };
    for (const auto& c : cases) {
        for (size_t step : {1, 6}) {
            SCOPED_TRACE(c.what);
            Pair pair;
            put(pair.ends[1], "abc\nde", step);
            pair.hangUp();
            std::string buffer(8, '.');
            EXPECT_EQ(KpSocket::receive(pair.ends[0], buffer.data(), c.size, c.lineMode), c.result);
            std::replace(buffer.begin(), buffer.end(), '\0', '0');
            EXPECT_EQ(buffer, c.buffer);
            char left[8] = "";
            EXPECT_EQ(recv(pair.ends[0], left, sizeof(left), 0), static_cast<long>(std::strlen(c.left)));
            EXPECT_STREQ(left, c.left);
        }
    }
}

TEST(KpSocket, goesOnThroughSignalsAndStillTimesOut)
{
    Pair pair;
    const std::string text(100, 'x');
    const Listener busy(0);
    const int first = KpSocket::connect("127.0.0.1", busy.port, 0, 0, 0);  // fills the queue, so that the next waits
    std::thread peer([&] {
        SteadySignal::block();
        for (size_t i = 0; i < text.size(); ++i, usleep(2000))
            put(pair.ends[1], "x");
        close(accept(busy.socket, nullptr, nullptr));
    });
    const SteadySignal signal;
    std::string received(text.size(), ' ');
    EXPECT_EQ(KpSocket::receive(pair.ends[0], received.data(), 100, 0), 100);
    EXPECT_EQ(received, text);
    const int second = KpSocket::connect("127.0.0.1", busy.port, 0, 0, 0);
    EXPECT_GE(second, 0) << KpSocket::strerror();
    peer.join();
    KpSocket::setTimeout(pair.ends[0], 50);
    EXPECT_EQ(KpSocket::receive(pair.ends[0], received.data(), 1, 0), -1);
    EXPECT_EQ(KpSocket::lastErrorCode(), EAGAIN);
    KpSocket::close(first);
    KpSocket::close(second);
}

TEST(KpSocket, sendsAllToASlowPeerAndSurvivesOneThatHasGone)
{
    const Listener listener;
    const int socket = KpSocket::connect("127.0.0.1", listener.port, 0, 0, 4096);
    const int peer = accept(listener.socket, nullptr, nullptr);
    std::string data(1 << 20, ' '), received(data.size(), '-');
    for (size_t i = 0; i < data.size(); ++i)
        data[i] = static_cast<char>(i * 7 >> 3);
    std::thread reader([&] {
        SteadySignal::block();
        for (size_t i = 0; i < received.size();)
            i += static_cast<size_t>(recv(peer, received.data() + i, std::min<size_t>(100000, received.size() - i), 0));
        usleep(20000);
    });
    {
        const SteadySignal signal;
        EXPECT_EQ(KpSocket::safeSend(socket, data.data(), static_cast<int>(data.size())), 1 << 20);
        reader.join();
    }
    EXPECT_TRUE(received == data);

    EXPECT_EQ(KpSocket::safeSend(-1, data.data(), 0), 0);
    EXPECT_EQ(KpSocket::safeSend(-1, data.data(), 1), -1);
    EXPECT_EQ(KpSocket::send(socket, "%s %d\n", "GET", 7), 6);
    EXPECT_EQ(KpSocket::send(socket, "%s", std::string(5000, 'x').c_str()), 4095);

    resetAtClose(peer);
    close(peer);
    for (int result :
         {KpSocket::safeSend(socket, "x", 1), KpSocket::send(socket, "x"), KpSocket::safeSend(socket, "x", 1)})
        EXPECT_EQ(result, -1) << KpSocket::strerror();
    KpSocket::close(socket);
}

TEST(KpSocketTools, findsAddresses)
{
    char name[300] = "";
    gethostname(name, sizeof(name));
    EXPECT_EQ(KpSocketTools::getHostName(), name);
    EXPECT_EQ(KpSocketTools::getIPV4Address("127.0.0.1"), htonl(0x7f000001));
    EXPECT_EQ(KpSocketTools::getIPV4AddressString("192.0.2.213"), "192.0.2.213");
    EXPECT_EQ(KpSocketTools::getIPV4AddressString("nowhere.invalid"), "0.0.0.0");
    EXPECT_EQ(KpSocketTools::getIPV4Address(static_cast<const char*>(nullptr)), 0U);
    EXPECT_EQ(KpSocketTools::getIPV4Address(), KpSocketTools::getIPV4Address(name));
    EXPECT_EQ(KpSocketTools::getIPV4AddressString(), KpSocketTools::getIPV4AddressString(name));
}
