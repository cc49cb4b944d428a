// A plug-in for SharedObjectTest.cpp, which puts copies of it under other names. A function answers with its arguments
// read as the digits of a number, so that one too few or in the wrong place shows.

#include <cstdint>

namespace {

int starts = 0;
std::intptr_t told = -1;

template <typename... Pointers>
std::intptr_t number(Pointers... pointers)
{
    told = static_cast<std::intptr_t>(sizeof...(pointers));
    ((told = told * 10 + *static_cast<int*>(pointers)), ...);
    return told;
}

}  // namespace

extern "C" {

void orlinpackage_sample_init()
{
    ++starts;
}
int sampleStarts()
{
    return starts;
}
int sampleTold()
{
    return static_cast<int>(told);
}
int _sampleUnderscored()
{
    return 77;
}

using P = void*;

// clang-format off
int sampleInt0() { return static_cast<int>(number()); }
int sampleInt1(P a) { return static_cast<int>(number(a)); }
int sampleInt2(P a, P b) { return static_cast<int>(number(a, b)); }
int sampleInt3(P a, P b, P c) { return static_cast<int>(number(a, b, c)); }
int sampleInt4(P a, P b, P c, P d) { return static_cast<int>(number(a, b, c, d)); }
int sampleInt5(P a, P b, P c, P d, P e) { return static_cast<int>(number(a, b, c, d, e)); }

void sampleVoid0() { number(); }
void sampleVoid5(P a, P b, P c, P d, P e) { number(a, b, c, d, e); }

P samplePointer0() { return &starts; }
P samplePointer5(P, P, P, P, P e) { return e; }
// clang-format on
}
