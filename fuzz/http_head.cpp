// Heads of HTTP responses: the same from one piece as from many, and what a plain reader of lines finds in them.

#include "Fuzz.h"

#include <kplib/net/detail/HttpHead.h>

#include <cctype>
#include <strings.h>

using kplib::detail::HttpHead;

namespace {

struct Plain {
    HttpHead::State state = HttpHead::State::Open;
    bool hasLength = false;
    long long length = 0;
    size_t used = 0;
};

Plain plainHead(const std::string& text)
{
    Plain head;
    while (head.state == HttpHead::State::Open && text.find('\n', head.used) != std::string::npos) {
        const bool isFirst = head.used == 0;
        const size_t newline = text.find('\n', head.used);
        std::string line = text.substr(head.used, newline - head.used);
        head.used = newline + 1;
        while (!line.empty() && std::isspace(static_cast<unsigned char>(line.back())))
            line.pop_back();
        if (isFirst && line.compare(0, 4, "HTTP") != 0)
            head.state = HttpHead::State::Unexpected;
        else if (line.empty())
            head.state = HttpHead::State::Complete;
        else if (line.size() > 14 && line[14] == ':' && strncasecmp(line.c_str(), "Content-Length", 14) == 0) {
            head.hasLength = true;
            head.length = std::strtoll(line.c_str() + 15, nullptr, 10);
        }
    }
    if (head.state == HttpHead::State::Open)
        head.used = text.size();
    return head;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    const Plain expected = plainHead(text);
    for (size_t step : {size + 1, size_t{1}, size_t{7}}) {
        HttpHead head;
        size_t used = 0;
        for (size_t start = 0; start < size && head.state() == HttpHead::State::Open; start += step)
            used += head.take(std::string_view(text).substr(start, step));
        check(head.state() == expected.state && used == expected.used);
        check(head.hasLength() == expected.hasLength && head.length() == expected.length);
    }
    return 0;
}
