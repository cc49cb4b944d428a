#pragma once

#include <array>
#include <bit>
#include <compare>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <iosfwd>
#include <type_traits>

/// An identifier that is stored and sent as a number of type T. `empty` is the number of the empty
/// identifier.
///
/// Each kind of identifier is a separate type, so that kinds cannot be mixed up. A plain value of
/// the size of T.
template <typename T, T empty>
class KpID {
public:
    /// What a derived identifier is an instance of.
    using IDType = KpID;

    /// The empty identifier.
    constexpr KpID() = default;
    /// The identifier with that number.
    constexpr explicit KpID(const T& value) : value_(value) {}

    /// The number.
    constexpr const T& value() const { return value_; }
    /// Replaces the number.
    constexpr void valueSet(const T& value) { value_ = value; }

    /// Whether this is the empty identifier.
    constexpr bool isEmpty() const { return value_ == empty; }
    /// Whether this is not the empty identifier.
    constexpr bool isNotEmpty() const { return value_ != empty; }
    /// Makes this the empty identifier.
    constexpr void makeEmpty() { value_ = empty; }

    /// Compares the numbers. The empty identifier is ordered by its number.
    friend constexpr auto operator<=>(const KpID& a, const KpID& b) = default;

    /// Prints the number.
    template <typename Traits>
    friend std::basic_ostream<char, Traits>& operator<<(std::basic_ostream<char, Traits>& out, const KpID& id)
    {
        return out << id.value_;
    }

private:
    T value_ = empty;
};

/// An identifier that is a class of two 64-bit words, such as Kp128. It is not valid if both words
/// are zero.
template <typename T>
class KpID_C {
public:
    /// Not valid.
    constexpr KpID_C() = default;
    /// The id of that value.
    constexpr explicit KpID_C(const T& value) : value_(value) {}

    /// The value.
    constexpr const T& value() const { return value_; }
    /// Replaces the value.
    constexpr void valueSet(const T& value) { value_ = value; }

    /// Whether a bit of it is set.
    constexpr bool isValid() const { return words() != Words{}; }

    /// Whether all bits are equal.
    friend constexpr bool operator==(const KpID_C& a, const KpID_C& b) { return a.words() == b.words(); }
    /// The first word decides, then the second, both unsigned and in the machine's byte order.
    friend constexpr std::strong_ordering operator<=>(const KpID_C& a, const KpID_C& b)
    {
        const Words left = a.words(), right = b.words();  // libc++ 14 does not order arrays
        return left[0] != right[0] ? left[0] <=> right[0] : left[1] <=> right[1];
    }

private:
    using Words = std::array<std::uint64_t, 2>;
    friend struct std::hash<KpID_C>;

    static_assert(sizeof(T) == sizeof(Words) && std::is_trivially_copyable_v<T>);
    constexpr Words words() const { return std::bit_cast<Words>(value_); }

    T value_{};
};

/// For KpID and all that derives from one.
template <typename ID>
requires std::derived_from<ID, typename ID::IDType>
struct std::hash<ID> {
    /// The number itself.
    std::size_t operator()(const ID& id) const { return static_cast<std::size_t>(id.value()); }
};

/// The words of an id, combined.
template <typename T>
struct std::hash<KpID_C<T>> {
    /// Exclusive or of the words.
    std::size_t operator()(const KpID_C<T>& id) const { return id.words()[0] ^ id.words()[1]; }
};
