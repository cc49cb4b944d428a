#pragma once

/// Exports a symbol from the shared library. All other symbols are hidden.
#define KPLIB_API __attribute__((visibility("default")))

/// Makes the compiler check the arguments of a call against its format, as for printf(). Both
/// positions count from 1. In a member function the object is position 1.
#define KPLIB_PRINTF(text, firstArgument) __attribute__((__format__(__printf__, text, firstArgument)))
