#include <kplib/foundation/KpException.h>

#include <kplib/foundation/KpMemoryException.h>

#include <cstdarg>

KpException::KpException(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    message_.vprintf(format, args);
    va_end(args);
}

KpException::~KpException() = default;

const char* KpException::what()
{
    return message_;
}

KpException* KpException::doClone()
{
    return new KpException(message_);
}

void KpException::doRaise()
{
    throw KpException(message_);
}

KpMemoryException::KpMemoryException(unsigned long size) : KpException(KpString::NoMemory()), size_(size) {}

KpMemoryException::~KpMemoryException() = default;

const char* KpMemoryException::what()
{
    static const char unsized[] = "could not allocate enough memory";
    try {
        if (size_ != 0)
            message_.printf("could not allocate %lu bytes", size_);
        else
            message_.printf(unsized);
        return message_;
    } catch (const KpMemoryException&) {
        return unsized;  // no memory for the text either
    }
}
