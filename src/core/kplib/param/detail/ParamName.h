#pragma once

#include <bit>
#include <cstdint>
#include <cstring>

// Node names: how they are stored and compared.

namespace kplib::detail {

/// Bytes that the block of a name is a multiple of, filled up with zeros, so that NameKey can read it by words.
constexpr unsigned long nameBlock = 16;

constexpr bool isDigit(char c)
{
    return c >= '0' && c <= '9';
}

/// ASCII only: a sorted bundle must stay sorted whatever the locale.
constexpr unsigned char upperCase(char c)
{
    const auto byte = static_cast<unsigned char>(c);
    return c >= 'a' && c <= 'z' ? byte - ('a' - 'A') : byte;
}

/// The order of node names, -1, 0 or 1. A blank in `b`, and only there, ends `b`, so that a token inside a text can be
/// compared where it stands. A null `a` comes first, then a null `b`.
constexpr int mystrcasecmp(const char* a, const char* b)
{
    if (!a || !b)
        return a ? 1 : -1;
    for (;; ++a, ++b) {
        const unsigned char left = upperCase(*a), right = *b == ' ' ? 0 : upperCase(*b);
        if (left != right)
            return left < right ? -1 : 1;
        if (left == 0)
            return 0;
    }
}

/// A name to look for, made ready for many comparisons: upper-cased once, and compared eight bytes at a time with the
/// names of nodes, about three times as fast as mystrcasecmp() in a binary search. Refers to the text.
class NameKey {
public:
    enum Form {
        Literal,
        Canonical,  ///< a leading digit gets the `_` in front that it has in the name of a node
    };

    constexpr explicit NameKey(const char* name, Form form = Canonical) :
        name_(name), isPrefixed_(name && form == Canonical && isDigit(*name))
    {
        long i = 0;
        if (isPrefixed_)
            put(i++, '_');
        for (; name && *name && *name != ' ' && i < 16; ++name)
            put(i++, upperCase(*name));
        hasBlank_ = name && *name == ' ' && i < 16;
        rest_ = i == 16 ? name : nullptr;
    }

    /// mystrcasecmp(nodeName, key) == 0: a blank ends the key.
    bool matches(const char* nodeName) const
    {
        return name_ && word(nodeName) == words_[0] && word(nodeName + 8) == words_[1] &&
               (!rest_ || mystrcasecmp(nodeName + 16, rest_) == 0);
    }

    /// mystrcasecmp(key, nodeName).
    int order(const char* nodeName) const
    {
        if (!name_ || hasBlank_) [[unlikely]]
            return orderOfText(nodeName);
        const std::uint64_t first = word(nodeName);
        if (first != words_[0])
            return words_[0] < first ? -1 : 1;
        const std::uint64_t second = word(nodeName + 8);
        if (second != words_[1])
            return words_[1] < second ? -1 : 1;
        return rest_ ? mystrcasecmp(rest_, nodeName + 16) : 0;
    }

    /// mystrcasecmp(key, token) == 0, for a token in any text.
    bool matchesToken(const char* token) const
    {
        if (isPrefixed_ && *token++ != '_')
            return false;
        return mystrcasecmp(name_, token) == 0;
    }

private:
    constexpr void put(long i, unsigned char c) { words_[i / 8] |= static_cast<std::uint64_t>(c) << (56 - i % 8 * 8); }

    /// Eight characters of a node's name in upper case, the first one in the highest bits. Names hold letters, digits,
    /// `-` and `_` only, and of these just the small letters have both 0x20 and 0x40 set.
    static std::uint64_t word(const char* nodeName)
    {
        std::uint64_t chars = 0;
        std::memcpy(&chars, nodeName, sizeof(chars));
        chars ^= chars & (chars >> 1) & 0x2020202020202020u;
        return std::endian::native == std::endian::little ? __builtin_bswap64(chars) : chars;
    }

    int orderOfText(const char* nodeName) const
    {
        if (isPrefixed_) {
            if (*nodeName != '_')
                return '_' < upperCase(*nodeName) ? -1 : 1;
            ++nodeName;
        }
        return mystrcasecmp(name_, nodeName);
    }

    std::uint64_t words_[2] = {};
    const char* name_;
    const char* rest_ = nullptr;  // what follows the first 16 characters, null if nothing can
    bool isPrefixed_;
    bool hasBlank_ = false;  // among the first 16 characters
};

}  // namespace kplib::detail
