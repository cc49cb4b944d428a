#pragma once

/// Marks what the shared library shows to others; all else is hidden.
#define KPLIB_API __attribute__((visibility("default")))

/// Has the compiler check a call's arguments against its format, as those of printf() are. Both numbers count from 1,
/// and in members from the object.
#define KPLIB_PRINTF(text, firstArgument) __attribute__((__format__(__printf__, text, firstArgument)))
