#pragma once

#include <string>
#include <string_view>

/// Bytes in one line of a listing.
constexpr unsigned long bytesPerLine = 16;

/// "0a ff": two digits a byte, with `gap` between them.
std::string hexOf(std::string_view bytes, const char* gap = "");

/// The line of a listing for up to bytesPerLine bytes at `offset`: offset, hexadecimal digits, printable characters.
std::string hexLine(unsigned long offset, std::string_view bytes);

/// Lines for all bytes, of which the first is at `offset`.
std::string hexLines(unsigned long offset, std::string_view bytes);
