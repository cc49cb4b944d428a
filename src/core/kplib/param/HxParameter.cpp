#include <kplib/param/HxParameter.h>

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>

#include <climits>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <type_traits>
#include <utility>

namespace {

unsigned long bytesOf(int n, KpPrimType type)
{
    return static_cast<unsigned long>(n) * static_cast<unsigned long>(type.size());
}

void* copyOfText(const char* text)
{
    const size_t size = std::strlen(text) + 1;
    return std::memcpy(kpmalloc(size), text, size);
}

// A block for `n` elements, filled from `data` if there is any.
void* newArray(int n, KpPrimType type, const void* data)
{
    const unsigned long bytes = bytesOf(n, type);
    void* const block = kpmalloc(bytes);
    if (data && bytes > 0)
        std::memcpy(block, data, bytes);
    return block;
}

void* newValue(int n, KpPrimType type, const void* data)
{
    if (type == KpPrimType::String)
        return data ? copyOfText(static_cast<const char*>(data)) : nullptr;
    return n != 0 ? newArray(n, type, data) : nullptr;
}

// Calls `work` with element `i` if that is a number, of complex ones with the real part.
template <typename Work>
void visitNumber(KpPrimType type, const void* values, long i, Work work)
{
    KPLIB_CHECK(values != nullptr && i >= 0, "HxParameter: the index is not in [0, dimension())");
    switch (type) {
    case KpPrimType::Byte:
        return work(static_cast<const std::uint8_t*>(values)[i]);
    case KpPrimType::Short:
        return work(static_cast<const std::int16_t*>(values)[i]);
    case KpPrimType::Int:
        return work(static_cast<const std::int32_t*>(values)[i]);
    case KpPrimType::Float:
        return work(static_cast<const float*>(values)[i]);
    case KpPrimType::Double:
        return work(static_cast<const double*>(values)[i]);
    case KpPrimType::Complex:
        return work(static_cast<const float*>(values)[2 * i]);
    case KpPrimType::UShort:
        return work(static_cast<const std::uint16_t*>(values)[i]);
    case KpPrimType::UInt:
        return work(static_cast<const std::uint32_t*>(values)[i]);
    case KpPrimType::SByte:
        return work(static_cast<const std::int8_t*>(values)[i]);
    case KpPrimType::String:
        return;
    }
}

// Toward zero after adding 0.5, negative values too. Intentional: callers depend on it.
int rounded(double v)
{
    v += 0.5;
    return v > INT_MIN - 1.0 && v < INT_MAX + 1.0 ? static_cast<int>(v) : INT_MIN;
}

template <typename T>
void appendNumber(KpString& out, T v)
{
    char text[40];
    if constexpr (std::is_floating_point_v<T>)
        std::snprintf(text, sizeof(text), sizeof(T) == 4 ? "%.8g" : "%.12g", static_cast<double>(v));
    else
        std::snprintf(text, sizeof(text), "%lld", static_cast<long long>(v));
    out += text;
}

void appendUnquoted(KpString& out, const char* text)
{
    for (; *text; ++text) {
        if (*text != '"')
            out += *text;
    }
}

}  // namespace

HxParameter* HxParameter::create(const char* name, const char* text)
{
    return new HxParameter(name, text);
}

HxParameter::HxParameter(const char* name, const char* text) :
    HxParameter(name, 1, KpPrimType::String, text ? text : "")
{
}

HxParameter::HxParameter(const char* name, int v) : HxParameter(name, 1, KpPrimType::Int, &v) {}

HxParameter::HxParameter(const char* name, double v) : HxParameter(name, 1, KpPrimType::Double, &v) {}

HxParameter::HxParameter(const char* name, int n, const int* values) : HxParameter(name, n, KpPrimType::Int, values) {}

HxParameter::HxParameter(const char* name, int n, const float* values) : HxParameter(name, n, KpPrimType::Float, values)
{
}

HxParameter::HxParameter(const char* name, int n, const double* values) :
    HxParameter(name, n, KpPrimType::Double, values)
{
}

HxParameter::HxParameter(const char* name, int n, KpPrimType type, const void* data) :
    HxParamBase(TypeParameter, name), dimension_(n), primType_(type), value_(newValue(n, type, data))
{
}

HxParameter::HxParameter(const HxParameter& other) :
    HxParamBase(other), dimension_(other.dimension_), primType_(other.primType_),
    value_(other.value_ ? newValue(other.dimension_, other.primType_, other.value_) : nullptr)
{
}

HxParameter::~HxParameter()
{
    kpfree(value_);
}

HxParameter* HxParameter::duplicate() const
{
    return new HxParameter(*this);
}

HxParameter& HxParameter::operator=(const HxParameter& other)
{
    if (this == &other)
        return *this;
    const bool isChange = !(*this == other);
    HxParameter copy(other);
    if (other.value_ && !copy.value_)  // an assigned array has storage even without elements
        copy.value_ = newArray(0, other.primType_, nullptr);
    HxParamBase::operator=(other);
    if (isChange && parent())
        parent()->touch(TouchChildValue);
    dimension_ = copy.dimension_;
    primType_ = copy.primType_;
    std::swap(value_, copy.value_);
    return *this;
}

void HxParameter::set(const char* text)
{
    assign(1, KpPrimType::String, text ? text : "");
}

void HxParameter::set(int n, const int* values)
{
    assign(n, KpPrimType::Int, values);
}

void HxParameter::set(int n, const float* values)
{
    assign(n, KpPrimType::Float, values);
}

void HxParameter::set(int n, const double* values)
{
    assign(n, KpPrimType::Double, values);
}

void HxParameter::assign(int n, KpPrimType type, const void* data)
{
    if (isEqual(n, type, data))
        return;
    void* const fresh = type == KpPrimType::String ? newValue(n, type, data) : newArray(n, type, data);
    touch(TouchValue);
    kpfree(value_);
    value_ = fresh;
    dimension_ = n;
    primType_ = type;
}

const char* HxParameter::numbersAsString() const
{
    static KpString* buffers[4];
    static int currentBuffer = 0;
    KpString*& buffer = buffers[currentBuffer];
    if (!buffer)
        buffer = new (kpmalloc(sizeof(KpString))) KpString(KpString::NoMemory());
    print(*buffer);
    currentBuffer = (currentBuffer + 1) % 4;
    return *buffer;
}

void HxParameter::print(KpString& out, bool append) const
{
    if (!append)
        out = "";
    if (primType_ == KpPrimType::String) {
        if (dimension_ > 0)
            appendUnquoted(out, text());
        return;
    }
    for (int i = 0; i < dimension_; ++i) {
        if (i > 0)
            out += ' ';
        if (primType_ != KpPrimType::Complex)
            visitNumber(primType_, value_, i, [&](auto v) { appendNumber(out, v); });
    }
}

int HxParameter::getNum(int i) const
{
    if (primType_ == KpPrimType::String)
        return std::atoi(text());
    int result = 0;
    visitNumber(primType_, value_, i, [&](auto v) {
        if constexpr (std::is_floating_point_v<decltype(v)>)
            result = rounded(static_cast<double>(v));
        else
            result = static_cast<int>(+v);
    });
    return result;
}

double HxParameter::getReal(int i) const
{
    if (primType_ == KpPrimType::String)
        return std::atof(text());
    double result = 0;
    visitNumber(primType_, value_, i, [&](auto v) { result = static_cast<double>(v); });
    return result;
}

void HxParameter::getNum(int* out) const
{
    for (int i = 0; i < dimension_; ++i)
        out[i] = getNum(i);
}

void HxParameter::getReal(double* out) const
{
    for (int i = 0; i < dimension_; ++i)
        out[i] = getReal(i);
}

unsigned long HxParameter::storedBytes() const
{
    if (!value_)
        return 0;
    return primType_ == KpPrimType::String ? std::strlen(text()) + 1 : bytesOf(dimension_, primType_);
}

bool HxParameter::isEqual(int n, KpPrimType otherType, const void* data) const
{
    if (!data && n != 0)
        return false;
    if (data == value_)
        return true;
    // Intentional: compares with the kind of the node, not its element type, so only Byte passes.
    if (n != dimension_ || static_cast<int>(otherType) != type())
        return false;
    return n == 0 ||
           (static_cast<unsigned long>(n) <= storedBytes() && std::memcmp(value_, data, bytesOf(n, otherType)) == 0);
}

bool HxParameter::operator==(const HxParameter& other) const
{
    return std::strcmp(name(), other.name()) == 0 && isEqual(other.dimension_, other.primType_, other.value_);
}

bool HxParameter::getBundleTagValue(const char*& out) const
{
    const char* const whole = getString();
    const char* const colon =
        !whole || *whole == ':' ? whole : std::strchr(whole, ':');  // setTag() gives no description
    if (!colon || !colon[1])
        return false;
    out = colon + 2;
    return true;
}
