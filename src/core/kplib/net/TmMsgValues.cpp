#include <kplib/net/TmMsg.h>

#include <kplib/foundation/Kp128.h>
#include <kplib/foundation/KpFrameID.h>
#include <kplib/foundation/KpRemotificationID.h>
#include <kplib/foundation/KpTransferID.h>
#include <kplib/foundation/KpUniqueID.h>
#include <kplib/foundation/TmSessionContextID.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/KpResult.h>
#include <kplib/rawdata/KpTypedData2D.h>
#include <kplib/volume/KpBitfield.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

// The sizes that peers of other builds depend on; those of the geometry are stated with its
// classes.
static_assert(sizeof(bool) == 1 && sizeof(long) == 8 && sizeof(KpPrimType) == 4);
static_assert(sizeof(KpUniqueID) == 8 && sizeof(KpTransferID) == 8 && sizeof(KpFrameID) == 8);
static_assert(sizeof(KpRemotificationID) == 4 && sizeof(TmSessionContextID) == 4);

namespace kplib::detail {

bool readElements(TmMsg& msg, void* elements, unsigned long bytes)
{
    const unsigned long offset = msg.readOffset();
    void* from = nullptr;
    msg.readRawBytes(bytes, from);
    if (from && bytes > 0) {
        std::memcpy(elements, from, bytes);
    } else if (bytes > 0) {
        getTheLogInstance().errorf("Buffer overrun in TmMsg::readKpDArray(), offset=%u, numBytes=%u, size=%u",
                                   static_cast<unsigned int>(offset), static_cast<unsigned int>(bytes),
                                   static_cast<unsigned int>(msg.size()));
    }
    return from != nullptr;
}

void makeBools(unsigned char* bytes, long count)
{
    std::transform(bytes, bytes + count, bytes, [](unsigned char byte) { return byte != 0; });
}

}  // namespace kplib::detail

TmMsg& operator<<(TmMsg& msg, const KpResult& result)
{
    msg << result.codeValue();
    if (result.isBad())
        msg << result.text() << result.data();
    return msg;
}

TmMsg& operator>>(TmMsg& msg, KpResult& result)
{
    int code = 0;
    msg >> code;
    result.clear();
    if (code != KpResult::Ok) {
        char* text = nullptr;
        char* data = nullptr;
        msg >> text >> data;
        result = KpResult(code, text, data);
    }
    return msg;
}

TmMsg& operator<<(TmMsg& msg, const KpBitfield& field)
{
    msg << static_cast<unsigned int>(field.nBits());
    msg.writeRawBytes(field.nWords() * sizeof(std::uint32_t), field.data());
    return msg;
}

TmMsg& operator>>(TmMsg& msg, KpBitfield& field)
{
    unsigned int nBits = 0;
    msg >> nBits;
    const unsigned long bytes = nBits > 0 ? (nBits / 32UL + 1) * sizeof(std::uint32_t) : 0;
    void* words = nullptr;
    msg.readRawBytes(bytes, words);
    field.resize(words ? nBits : 0, KpBitfield::INIT_NONE);  // no memory for bits that are missing
    if (words && bytes > 0)
        std::memcpy(field.data(), words, bytes);
    return msg;
}

TmMsg& operator<<(TmMsg& msg, const KpTypedData2D& image)
{
    const auto* row = static_cast<const unsigned char*>(image.data());
    const int width = row ? image.dims()[0] : 0;
    const int height = row ? image.dims()[1] : 0;
    msg << image.nDataVar() << static_cast<int>(image.primType()) << width << height;
    const unsigned long rowBytes =
        static_cast<unsigned long>(width) * static_cast<unsigned long>(image.bytesPerPixel());
    for (int y = 0; y < height; ++y, row += image.rowStride())
        msg.writeRawBytes(rowBytes, row);
    return msg;
}

TmMsg& operator>>(TmMsg& msg, KpTypedData2D& image)
{
    int nDataVar = 0;
    int type = 0;
    int width = 0;
    int height = 0;
    msg >> nDataVar >> type >> width >> height;
    const KpPrimType primType(type);
    unsigned int bytes = 0;  // in 32 bits, also if peers have more: a larger value is no image
    const bool isCounted = !__builtin_mul_overflow(width, height, &bytes) && width >= 0 &&
                           !__builtin_mul_overflow(bytes, nDataVar, &bytes) &&
                           !__builtin_mul_overflow(bytes, primType.size(), &bytes);
    void* pixels = nullptr;
    msg.readRawBytes(isCounted ? bytes : 0, pixels);
    if (!isCounted || !pixels) {
        image.init(0, 0, KpTypedPointer(nullptr, primType), nDataVar);
    } else if (bytes == 0) {
        image.init(width, height, KpTypedPointer(nullptr, primType), nDataVar);
    } else {
        image.init(width, height, primType, nDataVar);
        if (image.data())
            std::memcpy(image.data(), pixels, bytes);
    }
    return msg;
}

TmMsg& operator<<(TmMsg& msg, const TmMsg& inner)
{
    constexpr int mark = 0x6677;
    const unsigned long size = inner.size();  // before the marks: a message may be appended to itself
    msg << mark << mark << mark << mark << static_cast<unsigned int>(size);
    msg.writeRawBytes(size, inner.dataPtr());
    return msg;
}

TmMsg& operator>>(TmMsg& msg, TmMsg& inner)
{
    void* marks = nullptr;
    msg.readRawBytes(4 * sizeof(int), marks);
    unsigned int count = 0;
    msg >> count;
    inner = TmMsg();  // drops storage of the caller; its own stays
    if (msg.holds(count))
        inner.reset(count);
    else
        inner.becomeZeros(count);
    kplib::detail::readElements(msg, inner.dataPtr(), count);
    return msg;
}
