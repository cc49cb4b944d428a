#pragma once

#include <kplib/foundation/KpString.h>

/// Base of the library's exceptions: a message. With doClone() and doRaise() a handler stores an
/// exception and raises it later, for example on another thread. A derived class that does not
/// override them, such as KpMemoryException, is raised as a plain KpException with the text that
/// it had when it was cloned.
class KPLIB_API KpException {
public:
    KpException() = default;
    /// With that message.
    KpException(const KpString& message) : message_(message) {}
    /// With a message formatted as by printf().
    KpException(const char* format, ...) KPLIB_PRINTF(2, 3);
    /// @{
    /// Copies the message.
    KpException(const KpException&) = default;
    KpException& operator=(const KpException&) = default;
    /// @}

    virtual ~KpException();

    /// The message; valid as long as this object, and until its next what().
    virtual const char* what();

    /// A plain KpException of the same text on the heap, which the caller deletes.
    virtual KpException* doClone();

    /// Throws a copy of this as KpException.
    [[noreturn]] virtual void doRaise();

    /// As above, for handlers that catch by const reference.
    const char* what() const { return const_cast<KpException*>(this)->what(); }

protected:
    /// A message that holds no memory yet.
    explicit KpException(KpString::NoMemory none) : message_(none) {}

    /// What what() returns.
    KpString message_;
};
