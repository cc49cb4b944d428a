#include <net/Nginx.h>
#include <support/Bench.h>

#include <kplib/net/KpHttpGet.h>
#include <kplib/net/KpSocket.h>

#include <curl/curl.h>
#include <string>
#include <vector>

// Ranges of a file from nginx on this machine, over one connection: beside the least that a program can do, which is to
// send the same request and to receive into one buffer, and beside libcurl.

namespace {

using kplib::test::Nginx;

const Nginx& nginx()
{
    static const Nginx server;
    return server;
}

/// The next range of `size` bytes each time.
class Ranges {
public:
    explicit Ranges(long size) : size_(size) {}
    unsigned long first() const { return static_cast<unsigned long>(first_); }
    unsigned long last() const { return static_cast<unsigned long>(first_ + size_ - 1); }
    std::string text() const { return std::to_string(first()) + "-" + std::to_string(last()); }
    void next() { first_ = (first_ + size_) % (64L << 20); }

private:
    long size_, first_ = 0;
};

template <typename Fetch>
void run(benchmark::State& state, Fetch fetch, const std::string& baseline = "", double limit = 0)
{
    Ranges ranges(state.range(0));
    for (auto _ : state) {
        if (!fetch(ranges)) {
            state.SkipWithError("a range didn't come");
            break;
        }
        ranges.next();
    }
    const auto size = static_cast<double>(state.range(0));
    kplib::bench::report(state, 1, size, baseline.empty() ? "" : baseline + "/" + std::to_string(state.range(0)),
                         limit);
}

/// The body of the response; head and body in as few calls as they come.
bool rawFetch(int socket, const Ranges& ranges, std::vector<char>& buffer, long size)
{
    const std::string request =
        "GET /volume HTTP/1.1\r\nHost: 127.0.0.1\r\nAccept: */*\r\nRange: bytes=" + ranges.text() + "\r\n\r\n";
    if (send(socket, request.data(), request.size(), MSG_NOSIGNAL) < 0)
        return false;
    long received = 0, wanted = -1;
    while (wanted < 0 || received < wanted) {
        const long room = (wanted < 0 ? static_cast<long>(buffer.size()) : wanted) - received;
        const long n = recv(socket, buffer.data() + received, static_cast<size_t>(room), 0);
        if (n < 1)
            return false;
        received += n;
        const size_t end = wanted < 0 ? std::string_view(buffer.data(), static_cast<size_t>(received)).find("\r\n\r\n")
                                      : std::string_view::npos;
        if (end != std::string_view::npos)
            wanted = static_cast<long>(end) + 4 + size;
    }
    return true;
}

void raw(benchmark::State& state, int bufferSize)
{
    const int socket = KpSocket::connect("127.0.0.1", nginx().port, 0, bufferSize, bufferSize);
    KpSocket::setNoDelay(socket, true);
    std::vector<char> buffer(static_cast<size_t>(state.range(0)) + 4096);
    run(state, [&](const Ranges& ranges) { return rawFetch(socket, ranges, buffer, state.range(0)); });
    KpSocket::close(socket);
}

void httpGet(benchmark::State& state, double limit)
{
    const std::string url = nginx().url();
    KpHttpGet get;
    std::vector<char> buffer(static_cast<size_t>(state.range(0)));
    const auto fetch = [&](const Ranges& ranges) {
        return get.request(url.c_str(), ranges.first(), ranges.last()) &&
               get.read(buffer.data(), buffer.size()) == state.range(0);
    };
    run(state, fetch, "raw", limit);
}

size_t append(char* data, size_t, size_t size, void* target)
{
    auto& [begin, end] = *static_cast<std::pair<char*, char*>*>(target);
    begin = size <= static_cast<size_t>(end - begin) ? std::copy_n(data, size, begin) : end;
    return size;
}

void curl(benchmark::State& state)
{
    const std::string url = nginx().url();
    std::vector<char> buffer(static_cast<size_t>(state.range(0)));
    std::pair<char*, char*> target;
    CURL* const handle = curl_easy_init();
    curl_easy_setopt(handle, CURLOPT_URL, url.c_str());
    curl_easy_setopt(handle, CURLOPT_BUFFERSIZE, 256L << 10);
    curl_easy_setopt(handle, CURLOPT_WRITEFUNCTION, append);
    curl_easy_setopt(handle, CURLOPT_WRITEDATA, &target);
    const auto fetch = [&](const Ranges& ranges) {
        curl_easy_setopt(handle, CURLOPT_RANGE, ranges.text().c_str());
        target = {buffer.data(), buffer.data() + buffer.size()};
        return curl_easy_perform(handle) == CURLE_OK && target.first == target.second;
    };
    run(state, fetch, "raw");
    curl_easy_cleanup(handle);
}

}  // namespace

BENCHMARK_CAPTURE(raw, raw, 0x40000)->Name("raw")->Arg(64 << 10)->Arg(1 << 20)->UseRealTime()->MinTime(0.2);
BENCHMARK_CAPTURE(raw, system, 0)
    ->Name("raw, buffers of the system's size")
    ->Arg(64 << 10)
    ->Arg(1 << 20)
    ->UseRealTime()
    ->MinTime(0.2);
BENCHMARK_CAPTURE(httpGet, small, 1.2)->Name("KpHttpGet/read")->Arg(64 << 10)->UseRealTime()->MinTime(0.2);
BENCHMARK_CAPTURE(httpGet, large, 1.1)->Name("KpHttpGet/read")->Arg(1 << 20)->UseRealTime()->MinTime(0.2);
BENCHMARK(curl)->Name("libcurl")->Arg(64 << 10)->Arg(1 << 20)->UseRealTime()->MinTime(0.2);
