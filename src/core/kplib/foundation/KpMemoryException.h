#pragma once

#include <kplib/foundation/KpException.h>

/// Exhausted memory. Constructing, throwing and reading it needs no free memory.
class KPLIB_API KpMemoryException : public KpException {
public:
    /// `size`: the requested number of bytes, 0 if unknown.
    explicit KpMemoryException(unsigned long size = 0);
    /// @{
    /// Copies the size.
    KpMemoryException(const KpMemoryException&) = default;
    KpMemoryException& operator=(const KpMemoryException&) = default;
    /// @}

    ~KpMemoryException() override;

    using KpException::what;
    /// "could not allocate N bytes", or "could not allocate enough memory" when the size is unknown or there is no
    /// memory for the text. Writes into this object: one thread at a time.
    const char* what() override;

    /// The requested number of bytes, 0 if unknown.
    unsigned long size() const { return size_; }

private:
    unsigned long size_;
};
