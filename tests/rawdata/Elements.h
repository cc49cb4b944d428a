#pragma once

#include <kplib/rawdata/detail/KpPrimTypeVisit.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <type_traits>
#include <vector>

namespace kplib::test {

using kplib::detail::ElementTag;

inline constexpr KpPrimType::Type numberTypes[] = {KpPrimType::Byte,  KpPrimType::Short,  KpPrimType::Int,
                                                   KpPrimType::Float, KpPrimType::Double, KpPrimType::UShort};

/// Elements of T at any address, in a buffer of exact size, so that a step over its end shows.
template <typename T>
class Elements {
public:
    explicit Elements(long n, long start = 0) : start_(start), n_(n), bytes_(start + n * long(sizeof(T))) {}
    Elements(const std::vector<T>& values, long start) : Elements(long(values.size()), start)
    {
        if (n_ > 0)
            std::memcpy(data(), values.data(), values.size() * sizeof(T));
    }
    void* data() { return bytes_.data() + start_; }
    KpTypedPointer typed() { return {data(), KpTypedPointer(static_cast<T*>(nullptr)).type}; }
    T operator[](long i) const
    {
        T value;
        std::memcpy(&value, bytes_.data() + start_ + i * long(sizeof(T)), sizeof(T));
        return value;
    }
    long size() const { return n_; }
    bool operator==(const std::vector<T>& values) const
    {
        return n_ == long(values.size()) && (n_ == 0 || !std::memcmp(bytes_.data() + start_, values.data(), n_ * sizeof(T)));
    }

private:
    long start_, n_;
    std::vector<unsigned char> bytes_;
};

/// Random values of all magnitudes, with those mixed in at which conversions change their mind.
template <typename T>
std::vector<T> someValues(long n, unsigned seed)
{
    const double edges[] = {0.0,          -0.0,         0.5,          -0.5,          1.0,           -1.9,
                            254.9,        255.0,        255.5,        256.0,         300.7,         32767.0,
                            32767.5,      32768.0,      -32768.0,     -32769.0,      65535.0,       65535.9,
                            65536.0,      2147483520.0, 2147483646.5, 2147483647.0,  2147483648.0,  3e9,
                            -2147483645.5, -2147483646.0, -2147483647.0, -2147483648.0, -2147483904.0, -3e9,
                            1e30,         -1e30,        1e-40,        -1e-40,        16777217.0,
                            std::numeric_limits<double>::infinity(), -std::numeric_limits<double>::infinity(),
                            std::numeric_limits<double>::quiet_NaN()};
    std::mt19937 random(seed);
    std::vector<T> values(n);
    for (T& v : values) {
        if constexpr (std::is_integral_v<T>)
            v = static_cast<T>(static_cast<std::int32_t>(random()) >> random() % 32);
        else if (random() % 3 == 0)
            v = static_cast<T>(edges[random() % std::size(edges)]);
        else
            v = static_cast<T>(std::ldexp(static_cast<double>(random()) - 2147483648.0, -static_cast<int>(random() % 40)));
    }
    return values;
}

/// Calls `work` with the tag of each element type.
template <typename Work>
void eachType(Work work)
{
    for (KpPrimType::Type type : numberTypes)
        kplib::detail::visitNumberType(type, work);
}

}  // namespace kplib::test
