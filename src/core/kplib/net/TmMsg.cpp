#include <kplib/net/TmMsg.h>

#include <kplib/foundation/KpMemoryException.h>
#include <kplib/log/KpLogFile.h>

#include <cstdlib>

TmMsg::TmMsg(const TmMsg& other) : readOffset_(other.readOffset_), buffer_(other.buffer_), marks_(other.marks_) {}

TmMsg::~TmMsg()
{
    disown();
}

TmMsg& TmMsg::operator=(const TmMsg& other)
{
    if (this == &other)
        return *this;
    disown();
    buffer_.resize(other.buffer_.size());
    if (other.buffer_.size() > 0)
        std::memcpy(buffer_.data(), other.buffer_.data(), other.size());
    return *this;
}

void TmMsg::take(TmMsg& other)
{
    buffer_.swap(other.buffer_);
    // The ownership of the storage is exchanged with the storage.
    const bool external = externalData_ != 0;
    externalData_ = other.externalData_;
    other.externalData_ = external ? 1 : 0;
}

void TmMsg::setRawData(unsigned long size, unsigned char* data)
{
    buffer_.setStorage(data, static_cast<long>(size), static_cast<long>(size));
    externalData_ = 1;
    readOffset_ = 0;
}

bool TmMsg::operator==(const TmMsg& other) const
{
    return readOffset_ == other.readOffset_ && size() == other.size() &&
           (size() == 0 || std::memcmp(dataPtr(), other.dataPtr(), size()) == 0);
}

void TmMsg::resize(long size)
{
    if (size > buffer_.capacity())
        own();
    buffer_.resize(size);
    if (externalData_)  // no room after the size either: bytes are not appended in the caller's storage
        buffer_.setStorage(buffer_.data(), buffer_.size(), buffer_.size());
}

void TmMsg::reset(long size)
{
    readOffset_ = 0;
    resize(size);
}

void TmMsg::reset(long size, long capacity)
{
    readOffset_ = 0;
    own();
    buffer_.remax(capacity, size);
}

// The message is as it was if there is no memory.
void TmMsg::writeGrowing(unsigned long count, const void* data)
{
    own();
    const auto* const from = static_cast<const unsigned char*>(data);
    const bool isOwn = from >= buffer_.begin() && from < buffer_.end();
    const long index = isOwn ? from - buffer_.begin() : 0;
    const long size = buffer_.size();
    buffer_.resize(count > static_cast<unsigned long>(LONG_MAX - size) ? LONG_MAX : size + static_cast<long>(count));
    std::memcpy(buffer_.data() + size, isOwn ? buffer_.data() + index : from, count);
}

// Becomes `size` bytes of 0. Large storage is fresh pages, so that an announced size takes memory only where it is
// read.
void TmMsg::becomeZeros(unsigned long size)
{
    auto* const zeros = static_cast<unsigned char*>(std::calloc(size, 1));  // kpfree() takes it
    if (!zeros)
        throw KpMemoryException(size);
    reset(0, 0);
    buffer_.setStorage(zeros, static_cast<long>(size), static_cast<long>(size));
}

// Storage of the caller is never reallocated: it is copied before it has to grow.
void TmMsg::own()
{
    if (!externalData_)
        return;
    Buffer copy(buffer_);
    disown();
    buffer_.swap(copy);
}

// Drops storage of the caller.
void TmMsg::disown()
{
    if (externalData_)
        buffer_.forget();
    externalData_ = 0;
}

void TmMsg::setMarked(int mark, bool on)
{
    const int others = marks_ & ~(1 << mark);
    marks_ = static_cast<unsigned char>((others | (on ? 1 << mark : 0)) & 3);
}

void TmMsg::print(const char* title) const
{
    KpLogFile& log = getTheLogInstance();
    if (title)
        log.printf("TmMsg");
    log.printf("TmMsg");
    log.printf("TmMsg");
}
