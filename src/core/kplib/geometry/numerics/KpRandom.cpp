#include <kplib/geometry/numerics/KpRandom.h>

#include <algorithm>
#include <ctime>
#include <iterator>

namespace {

constexpr std::int64_t modulus = 2147483647;  // every state is below it, whatever the seed, after six steps
constexpr std::int64_t entryWidth = 67108864;

// Threads may share a generator without a lock. A lost step is harmless noise, but it has to be defined behaviour.
// These compile to plain loads and stores; std::atomic_ref is missing from libc++ 14.
std::int64_t get(std::int64_t& word)
{
    return __atomic_load_n(&word, __ATOMIC_RELAXED);
}

void put(std::int64_t& word, std::int64_t value)
{
    __atomic_store_n(&word, value, __ATOMIC_RELAXED);
}

}  // namespace

// Schrage's way to multiply without exceeding the modulus.
std::int64_t KpRandom::step()
{
    const std::int64_t old = get(idum_);
    const std::int64_t k = old / 127773;
    std::int64_t next = 16807 * (old - k * 127773) - 2836 * k;
    if (next < 0)
        next += modulus;
    put(idum_, next);
    return next;
}

void KpRandom::initialize(std::int64_t seed)
{
    put(idum_, seed == 0 ? 1 : seed);
    for (int i = 0; i < 8; ++i)
        step();
    for (long j = std::ssize(iv_) - 1; j >= 0; --j)
        put(iv_[j], step());
    put(iy_, get(iv_[0]));
}

double KpRandom::next()
{
    std::int64_t& entry = iv_[get(iy_) / entryWidth];
    const std::int64_t drawn = get(entry);
    put(iy_, drawn);
    put(entry, step());
    return std::min(static_cast<double>(drawn) * 4.656612875245797e-10, 0.99999988);
}

double KpRandom::rand()
{
    static KpRandom* const generator = new KpRandom(std::time(nullptr));  // never freed: destructors may draw too
    return generator->next();
}
