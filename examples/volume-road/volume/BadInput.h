#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/log/KpResult.h>

/// A failure whose text is one line for the user, formatted as by printf.
KpResult badInput(const char* format, ...) KPLIB_PRINTF(1, 2);
