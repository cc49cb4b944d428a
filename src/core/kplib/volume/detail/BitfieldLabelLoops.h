#pragma once

#include <kplib/volume/detail/BitfieldKernels.h>

namespace kplib::detail {

KPLIB_X86_ROWS(FromLabelsLoop, fromLabelsX86);
KPLIB_X86_ROWS(ToLabelsLoops, toLabelsX86);

namespace labels {

using Policy = KpBitfield::InsertPolicy;

FromLabelsLoop fromLabelsPlain;

template <Policy policy>
unsigned char merged(bool isSet, unsigned char old, unsigned char label)
{
    switch (policy) {
    case Policy::INSERT_SET:
        return isSet ? label : old;
    case Policy::INSERT_INTO_EMPTY:
        return isSet && old == 0 ? label : old;
    case Policy::INSERT_REPLACE:
        return isSet ? label : 0;
    case Policy::INSERT_OWN:
        return old != 0 && old != label ? old : isSet ? label : 0;
    }
    return old;
}

template <Policy policy>
void toLabelsPlain(const BitWord* words, unsigned char* labels, unsigned long n, unsigned char label)
{
    for (unsigned long i = 0; i < n; ++i)
        labels[i] = merged<policy>((words[i / 32] >> i % 32 & 1) != 0, labels[i], label);
}

// The loop of a row for each policy.
template <typename Row>
ToLabelsLoop* loopOf(Policy policy)
{
    switch (policy) {
    case Policy::INSERT_SET:
        return Row::template run<Policy::INSERT_SET>;
    case Policy::INSERT_INTO_EMPTY:
        return Row::template run<Policy::INSERT_INTO_EMPTY>;
    case Policy::INSERT_REPLACE:
        return Row::template run<Policy::INSERT_REPLACE>;
    case Policy::INSERT_OWN:
        return Row::template run<Policy::INSERT_OWN>;
    }
    return nullptr;
}

}  // namespace labels
}  // namespace kplib::detail
