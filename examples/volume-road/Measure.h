#pragma once

#include "RunRoad.h"

/// Measures the largest region of a series and writes measure.png, the middle slice with what was measured drawn over
/// it, and measures.txt into `target`, all or nothing.
KpResult measureRoad(const Job& job, const std::string& target, KpProgressInterface& progress);
