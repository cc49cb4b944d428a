#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace kplib::detail {

// The head of an HTTP response, read as it comes in: what its status line and its length say.
class HttpHead {
public:
    enum class State {
        Open,        // more has to come
        Complete,    // the empty line was there
        Unexpected,  // no response at all, or one whose head doesn't end
    };

    // Takes what belongs to the head and is not yet Complete or Unexpected, from the start of `bytes`; the number of
    // bytes that it took.
    size_t take(std::string_view bytes);

    State state() const { return state_; }
    // False without a Content-Length; of several the last counts. Text that is no number is 0.
    bool hasLength() const { return hasLength_; }
    long long length() const { return length_; }
    // 0 for a status line without one.
    int status() const { return status_; }

private:
    State stateAfterLine();
    void takeField();

    State state_ = State::Open;
    bool isFirstLine_ = true, hasLength_ = false;
    int status_ = 0;
    long long length_ = 0;
    size_t taken_ = 0;
    std::string line_;  // as far as it has come
};

}  // namespace kplib::detail
