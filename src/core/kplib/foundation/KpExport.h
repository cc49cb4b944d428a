#pragma once

/// Marks what the shared library shows to others; all else is hidden.
#define KPLIB_API __attribute__((visibility("default")))
