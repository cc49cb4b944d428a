#include "Digest.h"

int main()
{
    kplib::test::digestsOfKernels();
    kplib::test::digestsOfGeometry();
    kplib::test::digestsOfNumerics();
}
