#pragma once

#include <kplib/param/HxParamBase.h>

#include <array>
#include <bit>
#include <cstdint>
#include <cstring>

// How the names of nodes are compared.

namespace kplib::detail {

constexpr bool isDigit(char c)
{
    return c >= '0' && c <= '9';
}

// ASCII only: a sorted bundle must stay sorted whatever the locale.
constexpr unsigned char upperCase(char c)
{
    const auto byte = static_cast<unsigned char>(c);
    return c >= 'a' && c <= 'z' ? byte - ('a' - 'A') : byte;
}

// The order of node names, -1, 0 or 1. A blank in `b`, and only there, ends `b`, so that a token inside a text can be
// compared in place. A null `a` is less than any `b`, also a null one; a text is greater than a
// null `b`.
int mystrcasecmp(const char* a, const char* b);

// The value of a hexadecimal digit in either case, 16 for any other character.
constexpr unsigned hexDigit(char c)
{
    const unsigned digit = static_cast<unsigned char>(c) - unsigned{'0'};
    const unsigned letter = (static_cast<unsigned char>(c) | 0x20u) - unsigned{'a'};
    return digit < 10 ? digit : letter < 6 ? letter + 10 : 16;
}

// The number 0xggggeeee of a name "Ggggg-eeee" in either case, else 0. The order of names is that of their numbers.
constexpr std::uint32_t tagNumber(const char* name)
{
    if (*name != 'G' && *name != 'g')
        return 0;
    std::uint32_t number = 0;
    for (int i = 1; i < 10; ++i) {
        const unsigned digit = hexDigit(name[i]);
        if (i == 5 ? name[i] != '-' : digit > 15)
            return 0;
        if (i != 5)
            number = number << 4 | digit;
    }
    return name[10] ? 0 : number;
}

// Bytes that the blocks of nodes' names are a multiple of, so that NameKey can read the first ones in one go.
constexpr unsigned long nameBlock = 8;

// A name to look for among nodes. The names of tags are compared by their numbers, which nodes keep for it, so that a
// lookup in a header reads no texts; others by their first eight characters at once. Refers to the text.
class NameKey {
public:
    enum Form {
        Literal,
        Canonical,  // a leading digit is preceded by the `_` that it has in the name of a node
    };

    constexpr explicit NameKey(const char* name, Form form = Canonical) :
        name_(name), tag_(name ? tagNumber(name) : 0), isPrefixed_(name && form == Canonical && isDigit(*name))
    {
        if (tag_ == 0 && name)
            takeHead();
    }

    // mystrcasecmp(name of the node, key) == 0: a blank ends the key.
    bool matches(const HxParamBase& node) const
    {
        if (tag_ != 0)
            return tag_ == node.tag_;
        return head_ == head(node.name_) && (!rest_ || mystrcasecmp(node.name_ + nameBlock, rest_) == 0) && name_;
    }

    // mystrcasecmp(key, name of the node).
    int order(const HxParamBase& node) const
    {
        if (tag_ != 0 && node.tag_ != 0)
            return tag_ < node.tag_ ? -1 : tag_ > node.tag_;
        return orderOfText(node.name_);
    }

    // mystrcasecmp(key, token) == 0, for a token in any text.
    bool matchesToken(const char* token) const { return orderOfText(token) == 0; }

private:
    constexpr void takeHead()
    {
        std::array<unsigned char, nameBlock> chars{};
        const char* next = name_;
        unsigned long i = 0;
        if (isPrefixed_)
            chars[i++] = '_';
        while (i < nameBlock && *next && *next != ' ')
            chars[i++] = upperCase(*next++);
        head_ = std::bit_cast<std::uint64_t>(chars);
        rest_ = i == nameBlock ? next : nullptr;
    }

    // The first characters of a node's name in upper case. Names hold letters, digits, `-` and `_` only, and of these
    // just the small letters have both 0x20 and 0x40 set.
    static std::uint64_t head(const char* nodeName)
    {
        std::uint64_t chars = 0;
        std::memcpy(&chars, nodeName, sizeof(chars));
        return chars ^ (chars & (chars >> 1) & 0x2020202020202020u);
    }

    int orderOfText(const char* text) const;

    const char* name_;
    const char* rest_ = nullptr;  // what follows the head, null if nothing can
    std::uint64_t head_ = 0;
    std::uint32_t tag_;
    bool isPrefixed_;
};

}  // namespace kplib::detail
