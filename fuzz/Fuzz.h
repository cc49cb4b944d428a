#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

/// Ends the run with a finding unless the condition holds.
inline void check(bool holds)
{
    if (!holds)
        std::abort();
}

/// The input, taken piece by piece from its front; zeros and empty texts follow its end.
class Input {
public:
    Input(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}

    std::size_t size() const { return size_; }
    const std::uint8_t* data() const { return data_; }

    template <typename T>
    T number()
    {
        T value{};
        std::memcpy(&value, data_, std::min(sizeof value, size_));
        skip(sizeof value);
        return value;
    }

    /// The bytes up to the next line end, which is dropped, or all that is left.
    std::string line()
    {
        const void* const end = size_ > 0 ? std::memchr(data_, '\n', size_) : nullptr;
        const std::size_t length =
            end ? static_cast<std::size_t>(static_cast<const std::uint8_t*>(end) - data_) : size_;
        std::string text(reinterpret_cast<const char*>(data_), length);
        skip(length + 1);
        return text;
    }

    std::string rest() { return {reinterpret_cast<const char*>(data_), size_}; }

private:
    void skip(std::size_t n)
    {
        n = std::min(n, size_);
        data_ += n;
        size_ -= n;
    }

    const std::uint8_t* data_;
    std::size_t size_;
};
