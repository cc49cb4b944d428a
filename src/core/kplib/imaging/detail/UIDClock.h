#pragma once

#include <ctime>

namespace kplib::detail {

// Where new UIDs take the time from; tests set it back and let it stand still.
extern std::time_t (*uidClock)();

// The five digits at the end of a UID that stand for a process.
int uidProcessPart(int processId);

}  // namespace kplib::detail
