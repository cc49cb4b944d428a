#include <kplib/net/detail/HttpHead.h>

#include <algorithm>
#include <cstdlib>
#include <strings.h>

// Plan
//
// A response of HTTP/1.1, RFC 9112. Its head arrives in pieces of any size:
//
//     HTTP/1.1 206 Partial Content CR LF      the status line, which starts with "HTTP"
//     Content-Length: 4096 CR LF              a field; all other fields are ignored
//     CR LF                                   the empty line: Complete
//     body                                    not taken
//
// take() appends to line_ up to the next LF and evaluates the line there. White space at the end
// of a line is removed: LF without CR ends a line too, and a line of white space ends the head.
//
//     Open -- empty line --> Complete
//     Open -- other first line, or 1 MiB without an empty line --> Unexpected
//
// Once the state is not Open, take() takes no more bytes, so the body stays with the caller.

namespace {

constexpr std::string_view whiteSpace = " \t\n\v\f\r";

// Far more than any valid head: a head without an end must not exhaust the memory.
constexpr size_t longestHead = 1 << 20;

}  // namespace

size_t kplib::detail::HttpHead::take(std::string_view bytes)
{
    size_t used = 0;
    while (state_ == State::Open && used < bytes.size()) {
        const size_t newline = bytes.find('\n', used);
        const size_t end = std::min(newline, bytes.size() - 1) + 1;
        line_ += bytes.substr(used, end - used);
        taken_ += end - used;
        used = end;
        if (newline != std::string_view::npos) {
            line_.erase(line_.find_last_not_of(whiteSpace) + 1);
            state_ = stateAfterLine();
            line_.clear();
        }
        if (state_ == State::Open && taken_ >= longestHead)
            state_ = State::Unexpected;
    }
    return used;
}

kplib::detail::HttpHead::State kplib::detail::HttpHead::stateAfterLine()
{
    if (isFirstLine_) {
        isFirstLine_ = false;
        const size_t blank = line_.find(' ');
        if (blank != std::string::npos)
            status_ = std::atoi(line_.c_str() + blank + 1);
        return line_.starts_with("HTTP") ? State::Open : State::Unexpected;
    }
    if (line_.empty())
        return State::Complete;
    takeField();
    return State::Open;
}

void kplib::detail::HttpHead::takeField()
{
    const size_t colon = line_.find(':');
    constexpr std::string_view name = "Content-Length";
    if (colon != name.size() || strncasecmp(line_.c_str(), name.data(), colon) != 0)
        return;
    hasLength_ = true;
    length_ = std::atoll(line_.c_str() + colon + 1);  // skips leading white space
}
