#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <string>

// Patterns and multi-valued texts of DICOM queries.

namespace Tmg {

/// Whether a text matches a pattern as a whole: `anyRun` matches any characters, `anyOne` one or
/// none (but not at the end of the text), other characters themselves. Only the first character of
/// the pattern is compared with `anyRun` and `anyOne`; after it they are always `*` and `?`. Null
/// counts as "". O(pattern * text).
KPLIB_API bool match(const char* pattern, const char* text, char anyRun, char anyOne);

/// Whether one of `texts` matches one of `patterns` by match() with `*` and `?`, ignoring case.
/// Both are lists at `separators` as KpStdStringTokenizer reads them. Returns false if either is
/// null.
KPLIB_API bool matchSet(const char* patterns, const char* texts, const char* separators);

/// Appends those values of `additions` that `target` lacks, and returns whether there were any.
/// Values are what KpStringTokenizerGeneral finds between `separators`. A new one is set off by
/// the separator that `target` used last, else by the first of `separators`.
KPLIB_API bool addToMultiValueString(KpString& target, const KpString& additions, const char* separators);

/// The local form of a network path: on this platform the path itself.
KPLIB_API std::string networkToLocalPath(const std::string& path);

}  // namespace Tmg
