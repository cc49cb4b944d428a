#pragma once

#include <kplib/foundation/KpExport.h>

/// Number conversions that take the whole text or nothing: white space or anything else after the
/// number is a failure, as is a null text. On failure they give `defaultValue`. `ok`, if not null,
/// receives the success.
namespace StringUtils {

KPLIB_API double toDouble(const char* s, double defaultValue = 0, bool* ok = nullptr);  ///< by strtod
KPLIB_API long toLong(const char* s, long defaultValue = 0, bool* ok = nullptr);  ///< by strtol, 0x and 0 prefixes too
KPLIB_API unsigned long toULong(const char* s, unsigned long defaultValue = 0,
                                bool* ok = nullptr);  ///< by strtoul, likewise

}  // namespace StringUtils

/// Whether `text` matches `pattern` with `*` and `?`, byte by byte. Less than a full glob: the
/// text never goes back after a mismatch, so "aab" doesn't match "*ab", and a last `?` accepts any
/// remaining text as `*` does. O(n).
KPLIB_API bool kpWildMatch(const char* text, const char* pattern);
