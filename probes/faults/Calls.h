#pragma once

// Which calls of files and sockets fail. This library stands before the C library, whose calls it takes the place of.

namespace kplib::probe {

enum class Fault : int { NoSpace, Input, Interrupted, Again, Short, Count };

const char* nameOf(Fault fault);

/// While one exists, the calls of this process are counted and one of them fails; none if `call` is negative.
class FailingCall {
public:
    FailingCall(long call, Fault fault);
    FailingCall(const FailingCall&) = delete;
    FailingCall& operator=(const FailingCall&) = delete;
    ~FailingCall();

    /// Calls so far.
    static long seen();
    /// The name of the call that failed; null if none did, also since the fault cannot happen to it.
    static const char* failed();
};

/// While one exists, the calls of this thread are not counted and never fail: those of a peer, or of the probe itself.
class Exempt {
public:
    Exempt();
    Exempt(const Exempt&) = delete;
    Exempt& operator=(const Exempt&) = delete;
    ~Exempt();

private:
    bool before_;
};

}  // namespace kplib::probe
