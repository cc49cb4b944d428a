#pragma once

#include <kplib/foundation/KpExport.h>

#include <string>
#include <utility>

// Dates and times of DICOM headers (VR DA "yyyymmdd", TM "hhmmss.ffffff") as texts for people and for sorting. Hooks
// choose the form of dates: process-wide and unlocked, set them before other threads start.

namespace Tmg {

/// Makes the text for a date.
using DateReformatLong = std::string (*)(long yyyymmdd);
/// Reads the date yyyymmdd out of a text.
using DateReformatString = long (*)(const std::string& text);

/// Installs a hook; null stands for the default one.
KPLIB_API void SetFuncDateReformatLong(DateReformatLong function);
/// Installs a hook; null stands for the default one.
KPLIB_API void SetFuncDateReformatString(DateReformatString function);

/// The text for a date, by the hook.
KPLIB_API std::string dateReformat(long yyyymmdd);
/// The date of a text, by the hook.
KPLIB_API long dateReformat(const std::string& text);

/// "2024-MAR-15" for 20240315; "" for a number of fewer than eight characters. Any month but 1 to 11 reads "-DEC-", 0
/// and 13 too.
KPLIB_API std::string dateReformatLong_default(long yyyymmdd);
/// The inverse, in any case of letters: 0 for an unknown month. A text of fewer than nine characters is read as a
/// number.
KPLIB_API long dateReformatString_default(const std::string& text);

/// "hh:mm:ss" from the first six characters, without the fraction. A text that is shorter, or that goes on with
/// something else than a point, comes back as it is; null as "".
KPLIB_API std::string timeReformat(const char* time);

/// A key that sorts like the time `t`, or with `inverted` in reverse: the six digits of the time,
/// a point, the digits of the fraction. Keys that are not inverted begin with a 1 and the six
/// digits, as 1123456123456. for 123456. Intentional: stored keys have that form. A text too short
/// to be a time is returned unchanged, or as "" if it contains a point.
KPLIB_API std::string timeString(const std::string& t, bool inverted);

/// Local date yyyymmdd and time hhmmss of seconds since 1970.
KPLIB_API std::pair<long, long> splitDateTime(long seconds);

/// dateReformat() of the number in front of the first `separator` and timeReformat() of what follows it; two empty
/// texts without one. Throws what std::stol() throws if there is no number.
KPLIB_API std::pair<std::string, std::string> splitAndReformatDateTime(const std::string& s, char separator);

}  // namespace Tmg
