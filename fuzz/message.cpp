#include <kplib/kplib.h>

#include <algorithm>
#include <array>
#include <string>
#include <vector>

// Any bytes read as any sequence of values: nothing is read beyond the end, and what arrives can be used.

namespace {

volatile unsigned char sink;

void use(const void* data, unsigned long size)
{
    const auto* bytes = static_cast<const unsigned char*>(data);
    for (unsigned long i = 0; i < size; ++i)
        sink = bytes[i];
}

template <typename T>
void readValue(TmMsg& msg)
{
    T value;
    msg >> value;
    use(&value, sizeof value);
}

/// Arrays and inner messages take the memory that their counts ask for, which is tried up to some size only. The count
/// stands `skip` bytes ahead.
bool isModest(TmMsg& msg, unsigned long skip)
{
    if (!msg.holds(skip + sizeof(unsigned int)))
        return true;
    unsigned int count = 0;
    std::memcpy(&count, msg.dataPtr() + msg.readOffset() + skip, sizeof count);
    return count < 1U << 14;
}

template <typename T>
void readArray(TmMsg& msg)
{
    KpDArray<T> array;
    if (isModest(msg, 0))
        msg >> array;
    if (msg.readOffset() <= msg.size())
        use(array.data(), static_cast<unsigned long>(array.size()) * sizeof(T));
}

void readTexts(TmMsg& msg)
{
    char* text = nullptr;
    std::string bytes;
    KpString string;
    KpFilename name;
    KpDArray<char*> texts;
    msg >> text >> bytes >> string >> name >> texts;
    use(text, text ? std::strlen(text) : 0);
    for (const char* each : texts)
        use(each, each ? std::strlen(each) : 0);
}

void readImage(TmMsg& msg)
{
    KpTypedData2D image;
    msg >> image;
    if (image.data())
        use(image.data(), static_cast<unsigned long>(image.rowStride()) * static_cast<unsigned long>(image.dims()[1]));
}

void readField(TmMsg& msg)
{
    KpBitfield field;
    msg >> field;
    sink = static_cast<unsigned char>(field.nSetBits());
}

void readVolume(TmMsg& msg)
{
    TmDataAccess* volume = nullptr;
    msg >> volume;
    const KpHandle<TmDataAccess> handle(volume);
    if (volume && volume->hasData())
        sink = static_cast<unsigned char>(volume->hash().first);
}

void readInner(TmMsg& msg)
{
    TmMsg inner;
    if (isModest(msg, 4 * sizeof(int)))
        msg >> inner;
    if (msg.readOffset() <= msg.size())
        use(inner.dataPtr(), inner.size());
}

void readResult(TmMsg& msg)
{
    KpResult result;
    msg >> result;
    use(result.data(), std::strlen(result.data()));
}

template <typename... T>
constexpr auto valueReaders(KpTypeList<T...>)
{
    return std::array{readValue<T>...};
}
template <typename... T>
constexpr auto arrayReaders(KpTypeList<T...>)
{
    return std::array{readArray<T>...};
}

constexpr auto values = valueReaders(kplib::detail::WireValues());
constexpr auto arrays = arrayReaders(kplib::detail::WireElements());
constexpr std::array composites = {readTexts, readResult, readImage, readField, readVolume, readInner};
constexpr size_t readers = values.size() + arrays.size() + composites.size();

void readOne(size_t kind, TmMsg& msg)
{
    if (kind < values.size())
        values[kind](msg);
    else if (kind < values.size() + arrays.size())
        arrays[kind - values.size()](msg);
    else
        composites[kind - values.size() - arrays.size()](msg);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    const size_t steps = std::min<size_t>(size, size > 0 ? data[0] % 32 : 0);
    std::vector<unsigned char> bytes(data + steps, data + size);
    TmMsg random(bytes.size(), bytes.data());
    TmMsg inTurn(random);
    try {
        for (size_t i = 1; i < steps; ++i)
            readOne(data[i] % readers, random);
        // As a careful caller, who asks what is left before each read.
        for (size_t kind = 0; kind < readers && inTurn.holds(0) && inTurn.bytesAvailable() > 0; ++kind)
            readOne(kind, inTurn);
    } catch (const KpMemoryException&) {
        return 0;  // what a message asks for may be more than there is
    }
    return 0;
}
