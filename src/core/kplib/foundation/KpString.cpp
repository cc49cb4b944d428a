#include <kplib/foundation/KpString.h>

#include <kplib/foundation/KpCheck.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <ostream>

namespace {

constexpr long initialCapacity = 16;  // keeps short texts from growing
constexpr long formatCapacity = 64;   // likewise for what printf() makes

bool isAsciiDigit(char c)
{
    return c >= '0' && c <= '9';
}

bool isAsciiLetter(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

template <typename Predicate>
bool holdsForAll(std::string_view text, Predicate holds)
{
    for (char c : text) {
        if (!holds(c))
            return false;
    }
    return true;
}

}  // namespace

KpString::KpString()
{
    remax(initialCapacity, 0);
    KpDArray<char>::append('\0');
}

KpString::KpString(const char* s) : KpString(NoMemory())
{
    if (!s)
        s = "";
    remax(initialCapacity, 0);
    insert(0, static_cast<long>(std::strlen(s)) + 1, s);
}

KpString::KpString(const char* s, int start, int count) : KpString(NoMemory())
{
    remax(static_cast<long>(count) + 1, 0);
    insert(0, count, s + start);
    KpDArray<char>::append('\0');
}

KpString::KpString(int /*ignored*/, const char* format, ...) : KpString(NoMemory())
{
    remax(initialCapacity, 0);
    va_list args;
    va_start(args, format);
    vprintf(format, args);
    va_end(args);
}

KpString::KpString(std::string_view text) : KpString()
{
    append(text.data(), static_cast<long>(text.size()));
}

KpString& KpString::operator=(const char* s)
{
    if (!s)
        s = "";
    const long count = static_cast<long>(std::strlen(s)) + 1;
    if (count > capacity())
        remax(count, size());  // never for a text of this string, so that one survives in place
    resize(0);
    insert(0, count, s);
    return *this;
}

KpString& KpString::operator+=(const char* s)
{
    if (s)
        append(s, static_cast<long>(std::strlen(s)));
    return *this;
}

void KpString::append(const char* s, long count)
{
    const long end = size() > 0 ? size() - 1 : 0;  // length() is an int
    const long needed = end + count + 1;
    const bool isOwn = s >= data() && s <= data() + end;
    const long index = isOwn ? s - data() : 0;
    if (needed > capacity())
        remax(std::max(static_cast<long>(static_cast<double>(end) * 1.5), needed), size());
    if (count > 0)
        std::memmove(data() + end, isOwn ? data() + index : s, static_cast<size_t>(count));
    data()[needed - 1] = '\0';
    resize(needed);
}

void KpString::growForOne()
{
    if (size() == 0)
        KpDArray<char>::append('\0');
    const long needed = size() + 1;
    if (needed > capacity())
        remax(std::max(static_cast<long>(static_cast<double>(size()) * 1.5), needed), size());
}

KpString operator+(const KpString& a, const char* b)
{
    KpString result(a);
    result += b;
    return result;
}

bool KpString::operator==(const KpString& other) const
{
    return size() == other.size() && std::strcmp(c_str(), other.c_str()) == 0;
}

bool KpString::operator!=(const char* s) const
{
    if (!s)
        return size() == 0;
    return static_cast<size_t>(size()) != std::strlen(s) + 1 || std::strcmp(c_str(), s) != 0;
}

std::ostream& operator<<(std::ostream& out, const KpString& text)
{
    return out << static_cast<std::string_view>(text);
}

char* KpString::printf(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    char* const text = vprintf(format, args);
    va_end(args);
    return text;
}

char* KpString::vprintf(const char* format, va_list args)
{
    if (size() < 2)
        resize(formatCapacity);
    va_list again;
    va_copy(again, args);
    const long n = std::vsnprintf(data(), static_cast<size_t>(capacity()), format, args);
    if (n < capacity()) {
        resize(n + 1);
    } else {
        data()[size() - 1] = '\0';  // a whole text again, for the case that there is no memory
        remax(n + 1, n + 1);
        std::vsnprintf(data(), static_cast<size_t>(size()), format, again);
    }
    va_end(again);
    return data();
}

void KpString::setInt64(long long v)
{
    printf("%lld", v);
}

KpString KpString::fromInt64(long long v)
{
    KpString text;
    text.setInt64(v);
    return text;
}

long long KpString::toInt64(const char* s)
{
    long long v = 0;
    std::sscanf(s, "%lld", &v);
    return v;
}

long long KpString::toInt64() const
{
    return isEmpty() ? 0 : toInt64(c_str());
}

float KpString::toFloat(bool& ok) const
{
    float v = 0;
    ok = std::sscanf(c_str(), "%f", &v) == 1;
    return v;
}

int KpString::toInt(bool& ok) const
{
    int v = 0;
    ok = std::sscanf(c_str(), "%d", &v) == 1;
    return v;
}

bool KpString::isAlnum() const
{
    return holdsForAll(*this, [](char c) { return isAsciiLetter(c) || isAsciiDigit(c); });
}

bool KpString::isAlpha() const
{
    return holdsForAll(*this, isAsciiLetter);
}

bool KpString::isDigit() const
{
    return holdsForAll(*this, isAsciiDigit);
}

KpString KpString::substr(unsigned from, unsigned to) const
{
    return KpString(c_str() + from, 0, static_cast<int>(to - from + 1));
}

void KpString::replaceSubStr(const char* from, const char* to)
{
    if (!from || !*from)
        return;
    const std::string_view pattern = from;
    KpString result;
    for (std::string_view rest = *this; !rest.empty();) {
        const bool matches = rest.starts_with(pattern);
        if (matches)
            result += to;
        else
            result += rest.front();
        rest.remove_prefix(matches ? pattern.size() : 1);
    }
    *this = result;
}

void KpString::explode(char separator, KpDArray<KpString>& out) const
{
    KPLIB_CHECK(this < out.begin() || this >= out.end(), "KpString: the pieces would replace the string itself");
    out.clear();
    const std::string_view text = *this;
    for (size_t begin = 0;;) {
        const size_t end = text.find(separator, begin);
        out.append(KpString(text.substr(begin, end - begin)));
        if (end == std::string_view::npos)
            return;
        begin = end + 1;
    }
}

KpString KpString::protect(bool force) const
{
    const std::string_view text = *this;
    const bool quoted =
        force || text.empty() || !holdsForAll(text, [](char c) { return !std::isspace(static_cast<signed char>(c)); });
    KpString result;
    if (quoted)
        result += '"';
    for (char c : text) {
        if (c == '"' || c == '\\')
            result += '\\';
        result += c;
    }
    if (quoted)
        result += '"';
    return result;
}
