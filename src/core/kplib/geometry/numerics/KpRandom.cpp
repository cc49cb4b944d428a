#include <kplib/geometry/numerics/KpRandom.h>

#include <algorithm>
#include <atomic>
#include <ctime>
#include <iterator>

namespace {

constexpr std::int64_t modulus = 2147483647;  // every state is below it, whatever the seed, after six steps
constexpr std::int64_t entryWidth = 67108864;

// Threads may share a generator without a lock. A lost step is harmless noise, but it has to be defined behaviour; on
// this processor these are plain loads and stores.
std::int64_t get(std::int64_t& word)
{
    return std::atomic_ref(word).load(std::memory_order_relaxed);
}

void put(std::int64_t& word, std::int64_t value)
{
    std::atomic_ref(word).store(value, std::memory_order_relaxed);
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
