#pragma once

#include <kplib/foundation/KpExport.h>

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <type_traits>

class KpString;

namespace KpLib {

/// An MD5 digest: 16 bytes in the order in which the algorithm gives them, and nothing else. All zero is the null
/// value, which stands for "none". A plain value.
class KPLIB_API MD5 {
public:
    /// Two 64-bit numbers in the machine's byte order.
    using Words = std::array<std::uint64_t, 2>;

    /// Null.
    constexpr MD5() = default;

    /// @{
    /// The 16 bytes.
    constexpr unsigned char* data() { return bytes_.data(); }
    constexpr const unsigned char* data() const { return bytes_.data(); }
    /// @}

    /// The bytes as two numbers.
    constexpr Words words() const { return std::bit_cast<Words>(bytes_); }

    /// Whether all bytes are zero.
    constexpr bool isNull() const { return *this == MD5(); }

    /// 32 upper-case hexadecimal digits, for the null value an empty text.
    void toString(KpString& out) const;
    /// Reads 32 characters, as KpCoder::hexStringToData() does; a text of another length gives the null value.
    void fromString(const KpString& text);

    /// -1, 0 or 1 by the first word and then the second, unsigned; for KpDArray::insertSorted().
    static constexpr int compare(const MD5& a, const MD5& b)
    {
        return a.words() < b.words() ? -1 : b.words() < a.words() ? 1 : 0;
    }

    /// Whether all bytes are equal.
    friend constexpr bool operator==(const MD5& a, const MD5& b) { return a.words() == b.words(); }

private:
    std::array<unsigned char, 16> bytes_{};
};

static_assert(sizeof(MD5) == 16 && std::is_trivially_copyable_v<MD5>);

/// The first four bytes as a number.
constexpr unsigned int kp_hash(const MD5& digest)
{
    return static_cast<unsigned int>(digest.words()[0]);
}

}  // namespace KpLib

using KpLib::kp_hash;  // beside the other hashes, for callers that name the global one

/// The first word.
template <>
struct std::hash<KpLib::MD5> {
    /// The first word.
    std::size_t operator()(const KpLib::MD5& digest) const { return digest.words()[0]; }
};
