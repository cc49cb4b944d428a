#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

#include <compare>
#include <concepts>
#include <cstdarg>
#include <cstddef>
#include <cstring>
#include <iosfwd>
#include <string_view>

/// The library's string: an array of char whose last element is the NUL, so size() is length() + 1.
///
///     KpString name(0, "slice%02d.raw", 7);  // the int selects the constructor that formats
///     name.replaceSubStr(".raw", ".mask");
///     std::printf("%s %d\n", name.c_str(), name.length());  // prints: slice07.mask 12
///
/// Text is a sequence of bytes in any encoding. Raw array operations, moving from a string and a
/// format that the platform rejects leave a string without its NUL (an array of size 0), which
/// reads as "". No other operation does. Positions are not checked. One thread at a time.
class KPLIB_API KpString : public KpDArray<char> {
public:
    /// Selects the constructor that takes no memory.
    struct NoMemory {};

    /// Empty, with room for 16 characters.
    KpString();
    /// A copy of the text; null gives an empty string.
    KpString(const char* s);
    /// The `count` bytes from `s + start`; the length of `s` is not checked.
    KpString(const char* s, int start, int count);
    /// Formatted as by printf(); the leading int only selects this constructor.
    KpString(int ignored, const char* format, ...) KPLIB_PRINTF(3, 4);
    /// A copy of the text, NUL characters included.
    explicit KpString(std::string_view text);
    /// An array of size 0, for code that must not allocate.
    explicit KpString(NoMemory) noexcept {}

    /// @{
    /// Copies the text.
    KpString(const KpString&) = default;
    KpString(KpString&&) noexcept = default;
    /// @}

    /// Copy and move as for arrays; a string that was moved from reads as "".
    KpString& operator=(const KpString&) = default;
    /// As above.
    KpString& operator=(KpString&&) noexcept = default;
    /// A copy of the text, which may lie in this string; null makes the string empty.
    KpString& operator=(const char* s);

    /// Number of characters.
    int length() const noexcept { return size() > 0 ? static_cast<int>(size() - 1) : 0; }
    /// Whether there are no characters.
    bool isEmpty() const noexcept { return size() < 2; }
    /// The text, never null; valid until the string changes.
    const char* c_str() const noexcept { return size() > 0 ? data() : ""; }
    /// @{
    /// The text without a copy; valid until the string changes.
    operator const char*() const noexcept { return c_str(); }
    operator std::string_view() const noexcept { return view(); }
    /// @}
    /// The characters without the NUL that size() counts, for loops and spans; valid until the string changes.
    std::string_view view() const noexcept { return {c_str(), size() > 0 ? static_cast<std::size_t>(size() - 1) : 0}; }

    /// Appends; null is ignored. `s` may lie in this string.
    KpString& operator+=(const char* s);
    /// Appends one character.
    KpString& operator+=(char c)
    {
        append(c);
        return *this;
    }
    /// Appends one character, in constant time on average.
    void append(char c)
    {
        if (size() == 0 || size() >= capacity()) [[unlikely]]
            growForOne();
        char* const text = data();
        const long end =
            size();  // read once: a store through a char pointer may change anything, for all a compiler knows
        text[end - 1] = c;
        text[end] = '\0';
        setSize(end + 1);
    }

    /// Equality of length and of the text up to the first NUL.
    bool operator==(const KpString& other) const;
    /// The negation of operator!=.
    bool operator==(const char* s) const { return !(*this != s); }
    /// Whether the texts differ. A string without a NUL differs from every text, "" included. A
    /// null `s` differs only from a string without a NUL. Intentional: existing callers depend on
    /// it.
    bool operator!=(const char* s) const;
    /// @{
    /// As above, for other kinds of null and text.
    bool operator!=(char* s) const { return *this != static_cast<const char*>(s); }
    bool operator!=(std::nullptr_t) const { return *this != static_cast<const char*>(nullptr); }
    friend bool operator==(const char* s, const KpString& text) { return text == s; }
    /// @}

    /// Compares by strcmp(). The addresses of the texts are never compared.
    std::weak_ordering operator<=>(const KpString& other) const { return *this <=> other.c_str(); }
    /// As above; `s` is not null.
    std::weak_ordering operator<=>(const char* s) const { return std::strcmp(c_str(), s) <=> 0; }

    /// Replaces the content by the formatted text and returns it. The string itself must not be
    /// among the arguments. If memory is exhausted, the content is undefined text.
    char* printf(const char* format, ...) KPLIB_PRINTF(2, 3);
    /// As printf(), with the arguments in `args`, which is undefined afterwards.
    char* vprintf(const char* format, va_list args) KPLIB_PRINTF(2, 0);

    /// Replaces the content by the number in decimal.
    void setInt64(long long v);
    /// The number in decimal.
    static KpString fromInt64(long long v);
    /// The decimal number at the start of the text, or 0 if there is none.
    static long long toInt64(const char* s);
    /// As above, of this text.
    long long toInt64() const;
    /// The number at the start of the text, read by sscanf with "%f". If there is none, returns 0
    /// and sets `ok` to false.
    float toFloat(bool& ok) const;
    /// As above, with "%d".
    int toInt(bool& ok) const;

    /// Whether all characters are ASCII letters or digits; true for an empty string.
    bool isAlnum() const;
    /// @{
    /// As isAlnum(), for letters or for digits alone.
    bool isAlpha() const;
    bool isDigit() const;
    /// @}

    /// The characters `from` to `to`, both inclusive; `to` = `from` - 1 gives an empty string.
    KpString substr(unsigned from, unsigned to) const;

    /// Replaces each occurrence of `from`, left to right; inserted text is not searched again. An
    /// empty or null `from` changes nothing.
    void replaceSubStr(const char* from, const char* to);

    /// Splits at each separator, empty pieces included: `out` receives one piece more than there
    /// are separators. `out` is emptied first and must not contain this string.
    void explode(char separator, KpDArray<KpString>& out) const;

    /// The text as a token: a backslash before each " and \, and quotes around all when it is empty, holds white space,
    /// or `force` asks for them.
    KpString protect(bool force = false) const;

private:
    void growForOne();
    void append(const char* s, long count);
};

/// `a` followed by `b`; a null `b` adds nothing.
KPLIB_API KpString operator+(const KpString& a, const char* b);
/// `a` followed by the character. Of exactly char, so that `a + 1` stays the address of the second character.
template <std::same_as<char> Char>
KpString operator+(const KpString& a, Char c)
{
    KpString result(a);
    result += c;
    return result;
}

/// Writes the characters.
KPLIB_API std::ostream& operator<<(std::ostream& out, const KpString& text);

/// For KpString and all that derives from it.
template <std::derived_from<KpString> String>
struct std::hash<String> {
    /// That of the text up to its first NUL, as far as == compares it.
    std::size_t operator()(const String& text) const
    {
        return std::hash<std::string_view>()(std::string_view(text.c_str()));
    }
};
