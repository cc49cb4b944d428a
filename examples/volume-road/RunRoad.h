#pragma once

#include <kplib/log/KpResult.h>
#include <kplib/threads/KpProgressInterface.h>

#include <string>

/// The main job: reads the series in `folder` (that of `uid`, if given), reduces and shows it, and writes pictures,
/// header, report and log into `target`, all or nothing. A failure's text is one line for the user; a cancelled job is
/// code Interrupted.
KpResult runRoad(const char* folder, const std::string& uid, const std::string& target, KpProgressInterface& progress);
