#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/foundation/KpTypeList.h>

#include <cstring>
#include <string>
#include <type_traits>

class TmMsg;
KPLIB_API TmMsg& operator>>(TmMsg& msg, TmMsg& inner);

namespace kplib::detail {

/// The values of fixed size that a message takes: as many bytes as the value has in memory.
using WireValues = ImageValues::With<bool, double, KpVec4i, KpColor, KpRotation, KpLine, KpBox2f, KpPrimType,
                                     KpTransferID, KpFrameID, KpRemotificationID, TmSessionContextID>;
template <typename T>
concept WireValue = WireValues::contains<T>;

/// The elements of the arrays that a message takes as one block.
using WireElements = KpTypeList<unsigned char, bool, int, float, double, long, long long, KpVec2f, KpVec3i, KpVec3f,
                                KpVec4f, KpPlane, KpLine, KpMat4f>;
template <typename T>
concept WireElement = WireElements::contains<T>;

/// Reads `bytes` bytes of array elements at the read offset, or logs that the message does not
/// contain them.
KPLIB_API bool readElements(TmMsg& msg, void* elements, unsigned long bytes);

/// Sets each byte that is not 0 to 1: a message never yields a bool of another value.
KPLIB_API void makeBools(unsigned char* bytes, long count);

}  // namespace kplib::detail

/// The byte buffer of the client/server protocol: written by appending with `<<`, read by moving an offset with `>>`.
///
///     TmMsg message;
///     message << 30 << 0.5F;
///     int slices = 0;
///     float spacing = 0;
///     message >> slices >> spacing;
///     std::printf("%d %g, %lu bytes left\n", slices, double(spacing), message.bytesAvailable());
///     // prints: 30 0.5, 0 bytes left
///
/// A message is a plain memory image: packed, in the host's byte order (little-endian), without
/// tags, version or length. The reader must read the same types in the order in which they were
/// written. Writing and reading are independent: reading may follow writing. Counts in a message
/// have 32 bits; larger ones lose their upper bits.
///
/// Errors: a truncated message is not reported, but no read leaves the message: past its end
/// values are zero, texts are null or empty, and fields and views are empty. Check
/// bytesAvailable() before reading data from an untrusted peer. Exhausted memory throws
/// KpMemoryException.
///
/// Threads: one thread at a time.
class KPLIB_API TmMsg {
public:
    /// Empty; takes no memory.
    TmMsg() = default;
    /// A message for reading `size` bytes, which the caller owns and which must outlive the
    /// message.
    TmMsg(unsigned long size, unsigned char* data) { setRawData(size, data); }
    /// Owns a copy of the bytes; the read offset is that of `other`.
    TmMsg(const TmMsg& other);
    ~TmMsg();

    /// Copies the bytes only; the read offset stays.
    TmMsg& operator=(const TmMsg& other);

    /// Exchanges the storage of two messages, without copying; the read offsets stay.
    void take(TmMsg& other);

    /// Makes this a message over bytes that the caller owns, as the constructor does. Bytes that
    /// the message owned are not freed: the caller, which has their address from dataPtr(), owns
    /// them from then on. Appending does not change the caller's bytes: the message continues with
    /// its own copy.
    void setRawData(unsigned long size, unsigned char* data);

    /// Whether bytes and read offset are equal.
    bool operator==(const TmMsg& other) const;

    /// @{
    /// The bytes of the message, valid until it is written to; null if it has none.
    unsigned char* dataPtr() { return buffer_.data(); }
    const unsigned char* dataPtr() const { return buffer_.data(); }
    /// @}

    /// Number of bytes.
    unsigned long size() const { return static_cast<unsigned long>(buffer_.size()); }
    /// The offset of the next byte to read. After a failed read of an array it may be past the
    /// end.
    unsigned long readOffset() const { return readOffset_; }
    /// size() less readOffset(). Wraps to a very large number if the offset is past the end.
    unsigned long bytesAvailable() const { return size() - readOffset_; }

    /// Sets the size; bytes that are added are not initialised.
    void resize(long size);
    /// Resets the message to `size` bytes; the storage stays. 0 makes it empty.
    void reset(long size);
    /// The same, with storage for `capacity` bytes.
    void reset(long size, long capacity);

    /// Appends `count` bytes.
    void writeRawBytes(unsigned long count, const void* data)
    {
        const auto size = buffer_.size();
        if (static_cast<unsigned long>(buffer_.capacity() - size) < count) [[unlikely]] {
            writeGrowing(count, data);
            return;
        }
        if (count > 0)
            std::memcpy(buffer_.data() + size, data, count);
        buffer_.setSize(size + static_cast<long>(count));
    }

    /// Sets `data` to the address of the next `count` bytes in the message itself, valid until it
    /// is written to, and advances by `count`. Null if the message does not contain them.
    void readRawBytes(unsigned long count, void*& data)
    {
        data = holds(count) ? buffer_.data() + readOffset_ : nullptr;
        readOffset_ += count;
    }

    /// Whether `count` more bytes can be read.
    bool holds(unsigned long count) const { return readOffset_ <= size() && count <= size() - readOffset_; }

    /// Two marks, 0 and 1, for the protocol that uses the message. They are unset at first, and
    /// only the copy constructor copies them. This class does not interpret them.
    bool isMarked(int mark) const { return (marks_ >> mark & 1) != 0; }
    /// Sets or clears a mark.
    void setMarked(int mark, bool on);

    /// Writes "TmMsg" to the log three times if there is a title, else twice. Neither the title
    /// nor the bytes are written.
    void print(const char* title) const;

private:
    /// An array whose storage may be owned elsewhere.
    struct Buffer : KpDArray<unsigned char> {
        using KpDArray::setSize;
        using KpDArray::setStorage;
        void forget() { setStorage(nullptr, 0, 0); }
    };

    friend TmMsg& operator>>(TmMsg& msg, TmMsg& inner);
    void becomeZeros(unsigned long size);
    void writeGrowing(unsigned long count, const void* data);
    void own();
    void disown();

    unsigned long readOffset_ = 0;
    Buffer buffer_;
    unsigned char marks_ : 2 = 0;
    unsigned char externalData_ : 1 = 0;  // the storage is owned elsewhere
};

static_assert(sizeof(TmMsg) == 40);

// Each operator appends or reads one value and returns the message. Types that are not listed do
// not compile.

/// The bytes of the value.
template <kplib::detail::WireValue T>
TmMsg& operator<<(TmMsg& msg, const T& value)
{
    msg.writeRawBytes(sizeof(T), &value);
    return msg;
}

/// Reads that form.
template <kplib::detail::WireValue T>
TmMsg& operator>>(TmMsg& msg, T& value)
{
    void* bytes = nullptr;
    msg.readRawBytes(sizeof(T), bytes);
    if constexpr (std::is_same_v<T, bool>)
        value = bytes && *static_cast<const unsigned char*>(bytes) != 0;
    else if (bytes)
        std::memcpy(static_cast<void*>(&value), bytes, sizeof(T));
    else
        std::memset(static_cast<void*>(&value), 0, sizeof(T));
    return msg;
}

/// The count in 32 bits, and the elements as one block.
template <kplib::detail::WireElement T>
TmMsg& operator<<(TmMsg& msg, const KpDArray<T>& array)
{
    msg << static_cast<unsigned int>(array.size());
    msg.writeRawBytes(static_cast<unsigned long>(array.size()) * sizeof(T), array.data());
    return msg;
}

/// Sets the size of the array to the count in the message. If the message does not contain that
/// many elements, logs one error, leaves their values and advances the offset by all of them.
template <kplib::detail::WireElement T>
TmMsg& operator>>(TmMsg& msg, KpDArray<T>& array)
{
    unsigned int count = 0;
    msg >> count;
    array.resize(count);
    const bool isRead = kplib::detail::readElements(msg, array.data(), count * sizeof(T));
    if constexpr (std::is_same_v<T, bool>) {
        if (isRead)
            kplib::detail::makeBools(reinterpret_cast<unsigned char*>(array.data()), array.size());
    }
    return msg;
}

/// Numbers of other types have no form: convert them to one that has.
template <typename T>
requires(std::is_arithmetic_v<T> && !kplib::detail::WireValue<T>) TmMsg& operator<<(TmMsg& msg,
                                                                                    const T& value) = delete;

/// The length including the NUL in 32 bits (0 for null), and the bytes with the NUL. Reading
/// returns an address in the message itself, or null, valid until the message is written to. A
/// text of the message itself may be written to it.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const char* text);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, char*& text);

/// The length in 32 bits, and as many bytes, without a NUL.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const std::string& text);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, std::string& text);

/// The bytes up to the first NUL, included, without a length.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const KpString& text);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, KpString& text);

/// As KpString.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const KpFilename& name);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, KpFilename& name);

/// The count in 32 bits, and each text in the form of `const char*`. The array that is read owns
/// none of its texts. A negative count means no texts.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const KpDArray<char*>& texts);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, KpDArray<char*>& texts);

/// The code, and for a failure text and data in the form of `const char*`. File and line are not
/// sent. Reading a failure constructs a new one, with its line in the log; empty data becomes the
/// text of the code.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const KpResult& result);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, KpResult& result);

/// The number of bits in 32 bits, and all words, the spare one too.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const KpBitfield& field);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, KpBitfield& field);

/// Components, type, width and height in 32 bits each, and the pixels without gaps between the
/// rows. Precondition: the pixels of a row have no gaps. Without data, width and height are sent
/// as 0. The view that is read owns its pixels; its data is null if there are none.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const KpTypedData2D& image);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, KpTypedData2D& image);

/// A bool, true for null and then nothing else; otherwise sizes, components, type and all voxels
/// without gaps. The voxels of an object without data are sent as 0.
KPLIB_API TmMsg& operator<<(TmMsg& msg, TmDataAccess const* const& object);

/// Sets `object` to a new, contiguous object that frees with free(), with a reference count of 0.
/// It has no data if memory runs out. Sets `object` to null if null was sent, if the message
/// contains fewer bytes than announced, or if the sizes are impossible; no memory is allocated
/// then.
KPLIB_API TmMsg& operator>>(TmMsg& msg, TmDataAccess*& object);

/// Sixteen bytes that are ignored when they are read, and all bytes of `inner` as an array. The
/// read offset of `inner` is not sent: reading starts at its first byte. If the message contains
/// fewer bytes than announced, logs one error, and `inner` has the announced size with bytes of 0.
KPLIB_API TmMsg& operator<<(TmMsg& msg, const TmMsg& inner);
/// Reads that form.
KPLIB_API TmMsg& operator>>(TmMsg& msg, TmMsg& inner);
