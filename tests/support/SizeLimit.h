#pragma once

#include <csignal>
#include <sys/resource.h>

namespace kplib::test {

/// Files that this process writes fail to grow beyond `bytes`, as on a full disk, until the limit is RLIM_INFINITY.
inline void setSizeLimit(rlim_t bytes)
{
    std::signal(SIGXFSZ, SIG_IGN);
    const rlimit limit{bytes, RLIM_INFINITY};
    setrlimit(RLIMIT_FSIZE, &limit);
}

}  // namespace kplib::test
