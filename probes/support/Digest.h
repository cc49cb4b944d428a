#pragma once

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

class KpString;

namespace kplib::probe {

/// What an operation gives: a digest of its result, or nothing if the library reported a failure by its result.
using Outcome = std::optional<std::uint64_t>;

/// A digest of what an operation has computed: FNV-1a, which needs no memory.
class Digest {
public:
    Digest& add(const void* data, std::size_t size);
    template <typename Number>
    requires std::integral<Number> || std::floating_point<Number> Digest& operator<<(Number value)
    {
        return add(&value, sizeof value);
    }
    Digest& operator<<(std::string_view text) { return add(text.data(), text.size()) << text.size(); }
    Digest& operator<<(const KpString& text);
    Digest& operator<<(const char* text) { return *this << std::string_view(text); }

    operator Outcome() const { return value_; }
    std::uint64_t value() const { return value_; }

private:
    std::uint64_t value_ = 14695981039346656037U;
};

}  // namespace kplib::probe
