#pragma once

#include <kplib/foundation/KpExport.h>

#include <string>
#include <utility>

// Dates and times of DICOM headers (VR DA "yyyymmdd", TM "hhmmss.ffffff") as texts for people and for sorting. How
// dates look is up to hooks, process-wide and unlocked, to be set before other threads start.

namespace Tmg {

/// Text for a date, and the date yyyymmdd of a text.
using DateReformatLong = std::string (*)(long yyyymmdd);
using DateReformatString = long (*)(const std::string& text);

/// Installs a hook; null stands for the default one.
KPLIB_API void SetFuncDateReformatLong(DateReformatLong function);
KPLIB_API void SetFuncDateReformatString(DateReformatString function);

/// By the hooks.
KPLIB_API std::string dateReformat(long yyyymmdd);
KPLIB_API long dateReformat(const std::string& text);

/// "2024-MAR-15" for 20240315; "" for a number of fewer than eight characters. Any month but 1 to 11 reads "-DEC-", 0
/// and 13 too, and that is meant.
KPLIB_API std::string dateReformatLong_default(long yyyymmdd);
/// The other way, in any case of letters: 0 for an unknown month. A text of fewer than nine characters is read as a
/// number.
KPLIB_API long dateReformatString_default(const std::string& text);

/// "hh:mm:ss" from the first six characters, without the fraction. A text that is shorter, or that goes on with
/// something else than a point, comes back as it is; null as "".
KPLIB_API std::string timeReformat(const char* time);

/// A key that sorts like the time `t`, or with `inverted` backwards: the six digits of the time, a point, the digits of
/// the fraction. In keys that aren't inverted the six digits with a 1 in front come first, as 1123456123456. for
/// 123456: stored keys have that form, and it stays. A text too short to be a time comes back as it is, or "" with a
/// point in it.
KPLIB_API std::string timeString(const std::string& t, bool inverted);

/// Local date yyyymmdd and time hhmmss of seconds since 1970.
KPLIB_API std::pair<long, long> splitDateTime(long seconds);

/// dateReformat() of the number in front of the first `separator` and timeReformat() of what follows it; two empty
/// texts without one. Throws what std::stol() throws if there is no number.
KPLIB_API std::pair<std::string, std::string> splitAndReformatDateTime(const std::string& s, char separator);

}  // namespace Tmg
