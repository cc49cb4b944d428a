#pragma once

#include <kplib/foundation/KpExport.h>

/// Number conversions of a whole text. White space or anything else after the number is a failure,
/// and so is a null text. A failure returns `defaultValue`. `ok`, if not null, receives whether
/// the conversion succeeded.
namespace StringUtils {

KPLIB_API double toDouble(const char* s, double defaultValue = 0, bool* ok = nullptr);  ///< by strtod
KPLIB_API long toLong(const char* s, long defaultValue = 0, bool* ok = nullptr);  ///< by strtol, 0x and 0 prefixes too
KPLIB_API unsigned long toULong(const char* s, unsigned long defaultValue = 0,
                                bool* ok = nullptr);  ///< by strtoul, likewise

}  // namespace StringUtils

/// Whether `text` matches `pattern` with `*` and `?`, byte by byte. A subset of a glob: matching
/// never goes back in the text, so "aab" does not match "*ab", and a last `?` matches any
/// remaining text as `*` does. O(n).
KPLIB_API bool kpWildMatch(const char* text, const char* pattern);
