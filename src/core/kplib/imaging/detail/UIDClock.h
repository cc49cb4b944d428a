#pragma once

#include <ctime>

namespace kplib::detail {

// The source of time for new UIDs; tests set it back and stop it.
extern std::time_t (*uidClock)();

// The five digits at the end of a UID that identify a process.
int uidProcessPart(int processId);

}  // namespace kplib::detail
