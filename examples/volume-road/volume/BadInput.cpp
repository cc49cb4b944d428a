#include "BadInput.h"

#include <kplib/foundation/KpString.h>

#include <cstdarg>

KpResult badInput(const char* format, ...)
{
    KpString text;
    va_list args;
    va_start(args, format);
    text.vprintf(format, args);
    va_end(args);
    return KpResult(KpResult::InvalidArgument, text, nullptr);
}
