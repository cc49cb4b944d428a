#include "Abort.h"

#include <atomic>
#include <chrono>
#include <compare>
#include <condition_variable>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <mutex>
#include <set>
#include <system_error>
#include <thread>
#include <unistd.h>

namespace fs = std::filesystem;
using std::chrono::steady_clock;

namespace {

constexpr int exitBadInput = 2;
constexpr auto patience = std::chrono::milliseconds(100);  // for work that polls the progress

std::atomic<int> received = 0;
bool isPublished = false;  // guarded by the mutex of publishing

// Never destroyed: the watching thread outlives main().
std::mutex& mutexOfPaths()
{
    static auto& mutex = *new std::mutex;
    return mutex;
}
std::set<std::string>& unfinishedPaths()
{
    static auto& paths = *new std::set<std::string>;
    return paths;
}
std::recursive_mutex& mutexOfPublishing()
{
    static auto& mutex = *new std::recursive_mutex;
    return mutex;
}

/// Removes what is unfinished while other threads may still write into it: under a new name they do not find it.
void removeUnfinished()
{
    for (const std::string& path : unfinishedPaths()) {
        std::error_code ignored;
        const std::string moved = path + ".removed";
        fs::rename(path, moved, ignored);
        fs::remove_all(ignored ? path : moved, ignored);
    }
}

/// Prints the message and ends the program, unless its results are published: then it ends by itself, with success.
void endProgram(int code, const std::string& message)
{
    const std::scoped_lock lock(mutexOfPublishing(), mutexOfPaths());
    if (isPublished)
        return;
    removeUnfinished();
    std::fprintf(stderr, "volume-road: %s\n", message.c_str());
    std::fflush(nullptr);
    _exit(code);
}

void waitForSignal(sigset_t signals)
{
    int signal = 0;
    sigwait(&signals, &signal);
    received = signal;
    std::this_thread::sleep_for(patience);
    endProgram(128 + signal, "cancelled, nothing was written");
}

}  // namespace

void Unfinished::remember(const std::string& path)
{
    forget();
    const std::scoped_lock lock(mutexOfPaths());
    path_ = path;
    unfinishedPaths().insert(path);
}

void Unfinished::forget()
{
    const std::scoped_lock lock(mutexOfPaths());
    unfinishedPaths().erase(path_);
    path_.clear();
}

Publishing::Publishing()
{
    mutexOfPublishing().lock();
}

Publishing::~Publishing()
{
    isPublished = true;
    mutexOfPublishing().unlock();
}

void watchSignals()
{
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGTERM);
    std::signal(SIGINT, SIG_DFL);  // background jobs of a shell inherit that it is ignored
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    std::thread(waitForSignal, signals).detach();
}

int signalReceived()
{
    return received;
}

int exitCodeOfSignal()
{
    return 128 + (received != 0 ? received.load() : SIGINT);
}

struct Silence::Watch {
    std::mutex mutex;
    std::condition_variable changed;
    bool ends = false;
    steady_clock::time_point last = steady_clock::now();
    std::thread thread;
};

Silence::Silence(int seconds, const std::string& message) : watch_(seconds > 0 ? new Watch : nullptr)
{
    if (!watch_)
        return;
    watch_->thread = std::thread([this, seconds, message] {
        std::unique_lock lock(watch_->mutex);
        while (!watch_->ends) {
            const auto end = watch_->last + std::chrono::seconds(seconds);
            if (steady_clock::now() >= end) {
                endProgram(exitBadInput, message);
                return;
            }
            watch_->changed.wait_until(lock, end);
        }
    });
}

Silence::~Silence()
{
    if (!watch_)
        return;
    {
        const std::scoped_lock lock(watch_->mutex);
        watch_->ends = true;
    }
    watch_->changed.notify_one();
    watch_->thread.join();
    delete watch_;
}

void Silence::heard()
{
    if (!watch_)
        return;
    const std::scoped_lock lock(watch_->mutex);
    watch_->last = steady_clock::now();
}
