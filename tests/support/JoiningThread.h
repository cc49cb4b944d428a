#pragma once

#include <thread>
#include <utility>

namespace kplib::test {

/// A thread that its destructor joins, as std::jthread, which is missing from libc++ 14.
class JoiningThread {
public:
    JoiningThread() = default;
    template <typename Function, typename... Args>
    explicit JoiningThread(Function&& function, Args&&... args) :
        thread_(std::forward<Function>(function), std::forward<Args>(args)...)
    {
    }
    JoiningThread(JoiningThread&&) = default;
    JoiningThread& operator=(JoiningThread&&) = default;  // to one that does not run
    ~JoiningThread()
    {
        if (thread_.joinable())
            thread_.join();
    }

private:
    std::thread thread_;
};

}  // namespace kplib::test
