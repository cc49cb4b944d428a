#pragma once

#include <cstring>
#include <vector>

namespace kplib::test {

/// Positions of virtual operations in their classes' tables, which other modules are compiled against; each destructor
/// takes two. By the C++ ABI of gcc and clang.
template <typename... Functions>
std::vector<long> slotsOf(Functions... members)
{
    const auto slot = [](auto member) {
        long word = 0;
        std::memcpy(&word, &member, sizeof word);
        return word / static_cast<long>(sizeof(void*));
    };
    return {slot(members)...};
}

}  // namespace kplib::test
