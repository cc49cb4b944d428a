#include <kplib/volume/KpBitfield.h>

#include <kplib/volume/detail/BitfieldKernels.h>

#include <span>

using namespace kplib::detail;

void KpBitfield::fromLabels(unsigned long n, const unsigned char* labels, unsigned char label)
{
    static FromLabelsLoop* const run = best(fromLabelsPaths());
    resize(n, INIT_NONE);
    if (n != 0)
        run(bits_, labels, n, label);
}

void KpBitfield::toLabels(unsigned long n, unsigned char* labels, unsigned char label, InsertPolicy policy) const
{
    static ToLabelsLoops* const loops = best(toLabelsPaths());
    ToLabelsLoop* const run = loops(policy);
    if (run && n <= nBits_)
        run(bits_, labels, n, label);
}
