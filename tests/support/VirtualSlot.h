#pragma once

#include <cstring>

namespace kplib::test {

/// Position of a virtual operation in its class's table, which other modules are compiled against; each destructor
/// takes two. By the C++ ABI of gcc and clang.
template <typename Function>
int slotOf(Function member)
{
    long word = 0;
    std::memcpy(&word, &member, sizeof word);
    return static_cast<int>(word / static_cast<long>(sizeof(void*)));
}

}  // namespace kplib::test
