#pragma once

#include <algorithm>

namespace kplib::detail {

// The sum of many sums of equal length, added in pairs like the nodes of a binary tree: its rounding error grows with
// the logarithm of their number, where that of a running sum grows with the number itself. The order depends on the
// number alone. Higham, "The accuracy of floating point summation", SIAM J. Sci. Comput. 14(4), 1993.
//
// `Sums` starts at zero and has an operator+=.
template <typename Sums>
class PairwiseSum {
public:
    void add(Sums sums)
    {
        int level = 0;
        for (; count_ >> level & 1; ++level)  // as a binary counter carries
            sums += levels_[level];
        levels_[level] = sums;
        ++count_;
    }
    Sums total() const
    {
        Sums sums{};
        for (int level = 0; count_ >> level != 0; ++level) {
            if (count_ >> level & 1)
                sums += levels_[level];
        }
        return sums;
    }

private:
    Sums levels_[64];  // [i], if bit i of the count is set: the sum of 2^i of those added
    unsigned long count_ = 0;
};

// The sum over the indices 0 to n - 1, to which add(sums, begin, end) adds those of a short range, in order.
template <typename Sums, typename Add>
Sums pairwiseSum(long n, Add add)
{
    constexpr long block = 32;  // short enough for the accuracy, long enough to cost little
    PairwiseSum<Sums> total;
    for (long begin = 0; begin < n; begin += block) {
        Sums sums{};
        add(sums, begin, std::min(begin + block, n));
        total.add(sums);
    }
    return total.total();
}

}  // namespace kplib::detail
