#include <kplib/threads/KpCallable.h>

KpCallable::~KpCallable() = default;
