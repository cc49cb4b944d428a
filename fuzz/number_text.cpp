// The checked number conversions: they take what the standard stream of the whole text takes, and nothing else.

#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/foundation/StringUtils.h>

#include <cmath>

namespace {

template <typename Number>
void defaultsTellFailures(Number (*convert)(const char*, Number, bool*), const char* text)
{
    bool ok = false, again = false;
    const Number a = convert(text, Number(1), &ok), b = convert(text, Number(2), &again);
    check(ok == again);
    check(ok ? (a == b || (a != a && b != b)) : (a == Number(1) && b == Number(2)));
    check(!ok || *text != '\0');
    const std::string longer = std::string(text) + " ";
    check((convert(longer.c_str(), Number(1), &again), !again));  // a blank after the number is one too many
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string text = std::string(reinterpret_cast<const char*>(data), size).c_str();
    defaultsTellFailures<double>(StringUtils::toDouble, text.c_str());
    defaultsTellFailures<long>(StringUtils::toLong, text.c_str());
    defaultsTellFailures<unsigned long>(StringUtils::toULong, text.c_str());
    const KpString string(text.c_str());
    bool ok = false;
    if (const int value = string.toInt(ok); !ok)
        check(value == 0);
    if (const float value = string.toFloat(ok); !ok)
        check(value == 0);
    string.toInt64();
    return 0;
}
