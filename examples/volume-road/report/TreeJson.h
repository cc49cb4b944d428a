#pragma once

#include <kplib/log/KpResult.h>

#include <string>

/// The header of a file as JSON: an object with an entry for each tag ("G0010-0010") that has its VR, its keyword or
/// its private creator, and its value or its items. Numbers are exact.
KpResult readHeaderAsJson(const char* path, std::string& json);
