#include "Calls.h"

#include "Fail.h"

#include <atomic>
#include <cerrno>

namespace {

using kplib::probe::Fault;

std::atomic<bool> active = false;
std::atomic<long> count = 0;
long chosen = -1;
Fault fault = Fault::Input;
std::atomic<const char*> failedName = nullptr;
thread_local bool isExempt = false;

constexpr int errorOf[] = {ENOSPC, EIO, EINTR, EAGAIN, 0};

}  // namespace

namespace kplib::probe {

/// Whether a fault can happen to a call.
bool isPossible(Kind kind)
{
    const bool isTransfer = kind == Kind::Receive || kind == Kind::Send;
    const bool isReading = kind == Kind::Read || kind == Kind::Receive;
    switch (fault) {
    case Fault::NoSpace:
        return !isReading;
    case Fault::Again:
        return isTransfer;
    default:
        return fault != Fault::Short;
    }
}

bool fails(const char* name, Kind kind)
{
    if (!active || isExempt || count++ != chosen || !isPossible(kind))
        return false;
    failedName = name;
    errno = errorOf[static_cast<int>(fault)];
    return true;
}

bool transferFails(const char* name, Kind kind, unsigned long& size)
{
    if (active && !isExempt && count == chosen && fault == Fault::Short && size > 1) {
        failedName = name;
        size /= 2;
    }
    return fails(name, kind);
}

const char* nameOf(Fault f)
{
    static constexpr const char* names[] = {"ENOSPC", "EIO", "EINTR", "EAGAIN", "short count"};
    return names[static_cast<int>(f)];
}

FailingCall::FailingCall(long call, Fault what)
{
    chosen = call;
    fault = what;
    count = 0;
    failedName = nullptr;
    active = true;
}

FailingCall::~FailingCall()
{
    active = false;
}

long FailingCall::seen()
{
    return count;
}

const char* FailingCall::failed()
{
    return failedName;
}

Exempt::Exempt() : before_(isExempt)
{
    isExempt = true;
}

Exempt::~Exempt()
{
    isExempt = before_;
}

}  // namespace kplib::probe
