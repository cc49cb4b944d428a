#pragma once

#include <kplib/log/KpResult.h>
#include <kplib/threads/KpProgressInterface.h>

#include <optional>
#include <string>

/// The main job: reads the series in `folder` (that of `uid`, if given), reduces, segments and shows it, and writes
/// pictures, header, report and log into `target`, all or nothing. A failure's text is one line for the user; a
/// cancelled job is code Interrupted. `threshold`: the displayed value from which on voxels belong to the object.
KpResult runRoad(const char* folder, const std::string& uid, std::optional<double> threshold, const std::string& target,
                 KpProgressInterface& progress);
