#include <kplib/rawdata/KpRawData.h>

#include <kplib/cpu/Blockwise.h>
#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <cmath>
#include <limits>
#include <span>
#include <type_traits>

namespace {

using namespace kplib::detail;

template <typename T>
void fill(Loose<T>* to, long n, T value)
{
    for (long i = 0; i < n; ++i)
        to[i].value = value;
}

template <typename T>
void fillAll(void* dst, T value, long n)
{
    constexpr long perBlock = 4096 / long{sizeof(T)};
    auto* to = static_cast<Loose<T>*>(dst);
    if (sizeof(T) == 1) {
        std::memset(dst, static_cast<int>(value), static_cast<unsigned long>(n));
    } else if (!isStreamed(dst, n, sizeof(T))) {
        fill(to, n, value);
    } else {
        Loose<T> block[4096 / sizeof(T)];
        fill(block, perBlock, value);
        const long head = toCacheLine(dst, sizeof(T));
        fill(to, head, value);
        to += head;
        for (n -= head; n >= perBlock; n -= perBlock, to += perBlock)
            streamCopy(to, block, sizeof block);
        fill(to, n, value);
        streamFence();
    }
}

// What `n` counts in floats for complex numbers, which are walked as such.
KpTypedPointer asNumbers(KpTypedPointer data, unsigned long& n)
{
    if (data.type != KpPrimType::Complex)
        return data;
    n *= 2;
    return {data.data, KpPrimType::Float};
}

// Bytes of the words that an element consists of, 0 for an unknown type; a complex number is two words.
int wordSize(KpPrimType type)
{
    switch (type) {
    case KpPrimType::Byte:
    case KpPrimType::SByte:
        return 1;
    case KpPrimType::Short:
    case KpPrimType::UShort:
        return 2;
    case KpPrimType::Int:
    case KpPrimType::UInt:
    case KpPrimType::Float:
    case KpPrimType::Complex:
    case KpPrimType::String:  // Intentional: as two words, which the callers of other builds count on.
        return 4;
    case KpPrimType::Double:
        return 8;
    }
    return 0;
}

void swapWords(void* data, unsigned long n, int width)
{
    static SwapLoops* const loops = best(swapPaths());
    loops(width)(data, static_cast<long>(n));
}

}  // namespace

void KpRawData::memset(KpTypedPointer dst, int value, long n)
{
    const bool isDone = kpVisitNumberType(dst.type, [&]<typename T>(KpElementTag<T>) {
        if (n > 0)
            fillAll(dst.data, static_cast<T>(value), n);
    });
    if (!isDone)
        getTheLogInstance().errorf("Unsupported data type %s in KpRawData::memset()\n", dst.type.name());
}

void KpRawData::memset(KpTypedPointer dst, double value, long n)
{
    if (dst.type == KpPrimType::Float || dst.type == KpPrimType::Double) {
        kpVisitNumberType(dst.type, [&]<typename T>(KpElementTag<T>) {
            if (n > 0)
                fillAll(dst.data, static_cast<T>(value), n);
        });
        return;
    }
    const double rounded = std::floor(value + 0.5);
    const bool fits = rounded >= -2147483648.0 && rounded < 2147483648.0;
    memset(dst, fits ? static_cast<int>(rounded) : std::numeric_limits<int>::min(), n);
}

void KpRawData::getRange(KpTypedPointer data, unsigned long n, float& min, float& max)
{
    static RangeLoops* const loops = best(rangePaths());
    const KpTypedPointer numbers = asNumbers(data, n);
    kpVisitNumberType(numbers.type, [&]<typename T>(KpElementTag<T>) {
        T low = *static_cast<const Loose<T>*>(numbers.data);
        T high = low;
        loops(numbers.type)(numbers.data, static_cast<long>(n), &low, &high);
        min = static_cast<float>(low);
        max = static_cast<float>(high);
    });
}

bool KpRawData::isConstant(KpTypedPointer data, unsigned long n)
{
    static DiffersLoops* const loops = best(differsPaths());
    const KpTypedPointer numbers = asNumbers(data, n);
    bool isOneValue = false;
    kpVisitNumberType(numbers.type, [&]<typename T>(KpElementTag<T>) {
        if (n < 1) {
            isOneValue = true;
            return;
        }
        const T head = *static_cast<const Loose<T>*>(numbers.data);
        isOneValue = !std::isnan(head) && !loops(numbers.type)(numbers.data, static_cast<long>(n), &head);
    });
    return isOneValue;
}

void KpRawData::swapBytes(KpTypedPointer data, unsigned long n)
{
    const int width = wordSize(data.type);
    if (width == 0)
        getTheLogInstance().warnf("Swapping of %d-byte words not supported.", data.type.size());
    else if (width > 1)
        swapWords(data.data, n * static_cast<unsigned long>(data.type.size() / width), width);
}

void KpRawData::swapBytesWord2(void* data, unsigned long n)
{
    swapWords(data, n, 2);
}

void KpRawData::swapBytesWord4(void* data, unsigned long n)
{
    swapWords(data, n, 4);
}

void KpRawData::swapBytesWord8(void* data, unsigned long n)
{
    swapWords(data, n, 8);
}
