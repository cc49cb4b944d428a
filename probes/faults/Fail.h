#pragma once

#include <dlfcn.h>

namespace kplib::probe {

/// What a call does, which decides what faults it knows: it asks, changes something, or carries bytes.
enum class Kind { Read, Change, Receive, Send };

/// Counts the call, and sets errno if it is the one that fails.
bool fails(const char* name, Kind kind);
/// The same for one that carries `size` bytes, which a short count halves.
bool transferFails(const char* name, Kind kind, unsigned long& size);

/// The C library's function of that name.
template <typename Function>
Function* real(const char* name)
{
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace kplib::probe
