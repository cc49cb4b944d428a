#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <type_traits>

/// A random identifier of 128 bits: 16 bytes and nothing else, all zero when not set. A plain
/// value; KpID_C<KpUUID> is an identifier made of it, with isValid().
class KPLIB_API KpUUID {
public:
    /// Zero.
    constexpr KpUUID() = default;

    /// 16 bytes of "/dev/urandom", with no bits set for a version or variant; zero if they cannot
    /// be read. Safe from any thread.
    static KpUUID generateUUID();

    /// @{
    /// The 16 bytes.
    constexpr unsigned char* data() { return bytes_.data(); }
    constexpr const unsigned char* data() const { return bytes_.data(); }
    /// @}

    /// 32 upper-case hexadecimal digits.
    KpString toString() const;
    /// Reads 32 characters, as KpCoder::hexStringToData() does; a text of another length gives zero.
    void fromString(const KpString& text);

    /// {01234567-89AB-CDEF-0123-456789ABCDEF}
    KpString toFormattedString() const;
    /// Reads what toFormattedString() writes; zero unless length, braces and hyphens are in place. The digits between
    /// them are not checked.
    void fromFormattedString(const KpString& text);

    /// Whether all bytes are equal.
    friend constexpr bool operator==(const KpUUID& a, const KpUUID& b) = default;

private:
    std::array<unsigned char, 16> bytes_{};
};

static_assert(sizeof(KpUUID) == 16 && std::is_trivially_copyable_v<KpUUID>);

/// The last four bytes as a number.
constexpr unsigned int kp_hash(const KpUUID& uuid)
{
    return std::bit_cast<std::array<std::uint32_t, 4>>(uuid)[3];
}

/// The second half of the bytes.
template <>
struct std::hash<KpUUID> {
    /// The second half of the bytes as a number.
    std::size_t operator()(const KpUUID& uuid) const { return std::bit_cast<std::array<std::size_t, 2>>(uuid)[1]; }
};
