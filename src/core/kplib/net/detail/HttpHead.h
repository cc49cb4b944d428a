#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace kplib::detail {

// Reads the head of an HTTP response in pieces, for its status and the length of its body.
class HttpHead {
public:
    enum class State {
        Open,        // needs more bytes
        Complete,    // the empty line was read
        Unexpected,  // no HTTP response, or one whose head is too long
    };

    // Takes bytes from the start of `bytes` while the state is Open, and returns their number.
    size_t take(std::string_view bytes);

    State state() const { return state_; }
    // False without a Content-Length. Of several the last one counts. Text that is not a number is
    // 0.
    bool hasLength() const { return hasLength_; }
    long long length() const { return length_; }
    // 0 if the status line has none.
    int status() const { return status_; }

private:
    State stateAfterLine();
    void takeField();

    State state_ = State::Open;
    bool isFirstLine_ = true, hasLength_ = false;
    int status_ = 0;
    long long length_ = 0;
    size_t taken_ = 0;
    std::string line_;  // the bytes of the current line so far
};

}  // namespace kplib::detail
