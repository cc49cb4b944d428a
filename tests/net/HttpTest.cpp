#include "net/Nginx.h"
#include "net/Servers.h"
#include "support/TempFolder.h"

#include <kplib/net/KpHttpGet.h>
#include <kplib/net/KpSocket.h>

#include <chrono>
#include <climits>
#include <cstring>
#include <gtest/gtest.h>
#include <vector>

using namespace kplib::test;

TEST(KpHttpGet, takesUrlsApart)
{
    const std::tuple<const char*, const char*, int, const char*> cases[] = {
        {"http://h/p", "h", 80, "/p"},   {"http://h:8080/p/q?r", "h", 8080, "/p/q?r"},
        {"http://h", "h", 80, "/"},      {"http://h:8080", "h", 8080, "/"},
        {"http://h/a:b", "h/a", 0, "/"}, {"http://h/a:7/b:c", "h/a", 7, "/b:c"},
    };
    KpHttpGet get;
    for (const auto& [url, host, port, path] : cases) {
        EXPECT_TRUE(get.setURL(url)) << url;
        EXPECT_EQ(std::tuple(get.host(), get.port(), get.path()), std::tuple(host, port, path)) << url;
    }
    for (const char* url : {"ftp://h/p", "HTTP://h/p", "", static_cast<const char*>(nullptr)}) {
        EXPECT_TRUE(get.setURL("http://h"));
        EXPECT_FALSE(get.request(url));
        EXPECT_EQ(std::tuple(get.host().empty(), get.state()), std::tuple(true, KpHttpGet::NotConnected));
    }
}

TEST(KpHttpGet, sendsOneRequestAConnectionUnlessAllWasRead)
{
    std::vector<std::string> requests;
    ScriptedServer server([&](int peer) {
        for (std::string text; !(text = ScriptedServer::requestOf(peer)).empty();) {
            requests.push_back(text);
            put(peer, "HTTP/1.1 200 OK\r\nContent-Length: 4\r\n\r\nbody");
        }
    });
    const std::string head = "GET /file HTTP/1.1\r\nHost: 127.0.0.1\r\nAccept: */*\r\n", url = server.url();
    char buffer[8] = "";
    {
        KpHttpGet get;
        EXPECT_EQ(get.read(buffer, 4), -1);
        EXPECT_EQ(get.errorText(), "Not connected");
        const auto all = [&] { return get.read(buffer, 3) == 3 && get.read(buffer + 3, 5) == 1; };
        EXPECT_TRUE(get.request(url.c_str()));
        EXPECT_TRUE(all());
        EXPECT_STREQ(buffer, "body");
        EXPECT_TRUE(get.request(url.c_str(), 0, 99));
        EXPECT_EQ(get.status(), 0);
        EXPECT_TRUE(all());
        EXPECT_TRUE(get.request(url.c_str(), 5, 5));
        EXPECT_EQ(get.read(buffer, 2), 2);
        EXPECT_EQ(std::tuple(get.status(), server.connections.load()), std::tuple(200, 1));
        EXPECT_TRUE(get.request(url.c_str()));  // after a part of a body
        EXPECT_EQ(get.contentLength(), 4);
        EXPECT_EQ(get.state(), KpHttpGet::ReadingBody);
        EXPECT_TRUE(get.request(url.c_str()));
        EXPECT_EQ(get.status(), 0);  // after a head
        EXPECT_TRUE(get.request(url.c_str(), ULONG_MAX, ULONG_MAX));
        EXPECT_TRUE(all());  // after neither
        EXPECT_EQ(std::tuple(server.connections.load(), get.bytesRead()), std::tuple(4, 4));
        EXPECT_GT(get.elapsedTime(), 0);
        get.cancel();
        EXPECT_EQ(std::tuple(get.state(), get.status()), std::tuple(KpHttpGet::NotConnected, 0));
    }
    requests.erase(std::remove(requests.begin(), requests.end(), head + "\r\n"), requests.end());
    ASSERT_GE(requests.size(), 3U);
    EXPECT_EQ(requests[0], head + "Range: bytes=0-99\r\n\r\n");
    EXPECT_EQ(requests[1], head + "Range: bytes=5-5\r\n\r\n");
    EXPECT_EQ(requests[2], head + "Range: bytes=18446744073709551615-18446744073709551615\r\n\r\n");
}

TEST(KpHttpGet, takesWhatServersSend)
{
    const std::string ok = "HTTP/1.1 200 OK\r\n", ten = "Content-Length: 10\r\n", body = "0123456789";
    const std::string gone = "Connection reset by peer", missing = "Content-Length missing",
                      odd = "Unexpected response";
    constexpr bool reset = true;
    std::string fields;
    while (fields.size() < 2 << 20)
        fields += "X: y\r\n";
    const struct {
        const char* what;
        std::string response;
        long first;  // result of the first read() of up to 100 bytes
        std::string error = "";
        int status = 0;
        bool isReset = false;
    } cases[] = {
        {"lower case, blanks, bare newlines", "HTTP/1.0 404\ncontent-length:\t 10 \n \n" + body, 10, "", 404},
        {"no status", "HTTP\r\n" + ten + "\r\n" + body, 10, "", 0},
        {"the last length counts", ok + "Content-Length: 3\r\n" + ten + "\r\n" + body, 10, "", 200},
        {"more than the length", ok + ten + "\r\n" + body + "more", 10, "", 200},
        {"length 0", ok + "Content-Length: 0\r\n\r\n", 0, "All data read", 200},
        {"many fields", ok + fields.substr(0, 6000) + ten + "\r\n" + body, 10, "", 200},
        {"no length", ok + "Date: 10:10\r\nContent-Length\r\n\r\n" + body, -1, missing},
        {"blank in the name", ok + "Content-Length : 10\r\n\r\n" + body, -1, missing},
        {"negative length", ok + "Content-Length: -10\r\n\r\n" + body, -1, missing},
        {"end in the body", ok + ten + "\r\n012", 3, "Socket closed"},
        {"longest length", ok + "Content-Length: 99999999999999999999\r\n\r\n012", 3, "Socket closed"},
        {"end in the head", ok + ten, -1, gone},
        {"reset in the body", ok + ten + "\r\n012", 3, gone, 0, reset},
        {"reset before the body", ok + ten + "\r\n", -1, gone, 0, reset},
        {"reset in the head", ok, -1, gone, 0, reset},
        {"other first line", "ICY 200 OK\r\n" + ten + "\r\n" + body, -1, odd},
        {"empty first line", "\r\n" + ok + ten + "\r\n" + body, -1, odd},
        {"endless line", ok + "X: " + std::string(2 << 20, 'x'), -1, odd},
        {"endless head", ok + fields, -1, odd},
    };
    for (const auto& c : cases) {
        for (size_t step : {size_t{1} << 20, size_t{1}, size_t{7}}) {
            if (c.response.size() > 1000 && step < 1000)
                continue;
            SCOPED_TRACE(std::string(c.what) + ", in pieces of " + std::to_string(step));
            std::atomic<bool> isRead = false;
            ScriptedServer server([&](int peer) {
                ScriptedServer::requestOf(peer);
                put(peer, c.response, step);
                if (c.isReset) {
                    for (int i = 0; i < 100 && !isRead; ++i)  // the reset must not overtake the bytes
                        usleep(1000);
                    resetAtClose(peer);
                }
            });
            KpHttpGet get;
            char buffer[100] = "";
            ASSERT_TRUE(get.request(server.url().c_str()));
            EXPECT_GE(get.contentLength(), 0);
            isRead = true;
            EXPECT_EQ(get.read(buffer, sizeof(buffer)), c.first);
            EXPECT_EQ(std::string_view(buffer), body.substr(0, static_cast<size_t>(std::max(c.first, 0L))));
            EXPECT_EQ(get.errorText(), c.error);
            const bool good = c.error.empty() || c.error == "All data read";
            EXPECT_EQ(std::tuple(get.status(), get.state(), get.bytesRead()),
                      std::tuple(c.status, good ? KpHttpGet::Finished : KpHttpGet::Failed, good ? c.first : 0));
            EXPECT_EQ(get.read(buffer, sizeof(buffer)), good ? 0 : -1);
            EXPECT_EQ(get.errorText(), good ? "All data read" : c.error);
        }
    }
}

static thread_local bool stopsBehindMutexes = false;

extern "C" {
int __real_pthread_mutex_unlock(pthread_mutex_t*);
int __wrap_pthread_mutex_unlock(pthread_mutex_t* mutex);

int __wrap_pthread_mutex_unlock(pthread_mutex_t* mutex)
{
    const int result = __real_pthread_mutex_unlock(mutex);
    if (stopsBehindMutexes)
        usleep(100);
    return result;
}
}

TEST(KpHttpGet, readsRangesFromNginx)
{
    if (!kplib::test::Nginx::isInstalled())
        GTEST_SKIP() << "nginx is not installed";
    const kplib::test::Nginx nginx;
    ASSERT_TRUE(nginx.isRunning);
    KpHttpGet get;
    std::vector<char> buffer(1 << 20);
    for (const long spot : nginx.spots) {
        const auto first = static_cast<unsigned long>(spot);
        const long wanted = std::min(nginx.size - spot, static_cast<long>(buffer.size()));
        ASSERT_TRUE(get.request(nginx.url().c_str(), first, first + buffer.size() - 1));
        EXPECT_EQ(get.read(buffer.data(), ULONG_MAX), wanted);
        EXPECT_EQ(get.status(), 206);
        EXPECT_EQ(std::memcmp(buffer.data(), &spot, sizeof(spot)), 0);
    }
    ASSERT_TRUE(get.request(nginx.url().c_str()));
    while (get.read(buffer.data(), buffer.size()) > 0) {
    }
    EXPECT_EQ(get.bytesRead(), nginx.size);
    EXPECT_TRUE(get.request(nginx.url().c_str(), nginx.size, nginx.size + 1));
    EXPECT_GT(get.contentLength(), 0);
    EXPECT_EQ(get.status(), 416);
}

TEST(KpHttpGetThreads, cancelEndsAConnectionThatNothingAnswers)
{
    const Listener full(0);
    const int first = KpSocket::connect("127.0.0.1", full.port, 0, 0, 0);  // fills the queue
    KpHttpGet get;
    std::atomic<bool> isDone = false;
    std::thread other([&] {
        for (; !isDone; usleep(10'000))
            get.cancel();
    });
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_FALSE(get.request(("http://127.0.0.1:" + std::to_string(full.port)).c_str()));
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
    EXPECT_EQ(get.state(), KpHttpGet::NotConnected);
    isDone = true;
    other.join();
    KpSocket::close(first);
}

TEST(KpHttpGetThreads, cancelEndsAReadThatWaitsAndMixesNoResponses)
{
    ScriptedServer server([](int peer) {  // sends the start of the range, of which there may be only a part
        for (std::string text; !(text = ScriptedServer::requestOf(peer)).empty();) {
            const std::string number = text.substr(text.find('=') + 1, 4);
            put(peer, "HTTP/1.1 200 OK\r\nContent-Length: 4\r\n\r\n" + number.substr(number.back() == '0'));
        }
    });
    const std::string url = server.url();
    const size_t descriptors = namesIn("/proc/self/fd").size();
    KpHttpGet get;
    std::atomic<bool> isDone = false;
    std::thread other([&] {
        for (stopsBehindMutexes = true; !isDone; usleep(50))
            get.cancel();
    });
    for (unsigned long i = 1000; i < 4000; ++i) {
        char buffer[5] = "";
        if (!get.request(url.c_str(), i, i))
            continue;
        usleep(static_cast<useconds_t>(i % 7 * 30));
        EXPECT_TRUE(get.read(buffer, 4) != 4 || buffer == std::to_string(i)) << i << " got " << buffer;
    }
    isDone = true;
    other.join();
    get.cancel();
    for (int i = 0; i < 1000 && namesIn("/proc/self/fd").size() > descriptors; ++i)
        usleep(1000);  // the server's end closes a little later
    EXPECT_EQ(namesIn("/proc/self/fd").size(), descriptors);
}
