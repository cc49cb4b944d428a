#pragma once

#include <climits>
#include <initializer_list>

namespace kplib::detail {

// The product of `factors`, or, if it is out of range, the largest number, which no allocator can
// serve.
constexpr long byteCount(std::initializer_list<long> factors)
{
    long product = 1;
    bool isOutOfRange = false;
    for (const long factor : factors) {
        if (factor == 0)
            return 0;
        isOutOfRange |= __builtin_mul_overflow(product, factor, &product);
    }
    return isOutOfRange ? LONG_MAX : product;
}

}  // namespace kplib::detail
