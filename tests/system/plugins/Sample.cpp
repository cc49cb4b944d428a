// A plug-in for SharedObjectTest.cpp, which puts copies of it under other names.

namespace {

int starts = 0, told = 0;

int digit(void* number)
{
    return *static_cast<int*>(number);
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
    return told;
}
int _sampleUnderscored()
{
    return 77;
}
int sampleTwo(void* a, void* b)
{
    return 10 * digit(a) + digit(b);
}
void sampleTell(void* a, void* b, void* c, void* d, void* e)
{
    told = 1000 * sampleTwo(a, b) + 10 * sampleTwo(c, d) + digit(e);
}
void* sampleLast(void* /*a*/, void* /*b*/, void* /*c*/, void* /*d*/, void* e)
{
    return e;
}
}
