#include <kplib/volume/KpBitfield.h>

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/volume/detail/BitfieldKernels.h>

#include <algorithm>
#include <bit>
#include <cstring>
#include <span>

using namespace kplib::detail;

namespace {

constexpr unsigned long wordsFor(unsigned long nBits)
{
    return nBits == 0 ? 0 : (nBits >> 5) + 1;
}

// The bits below number `nBits` in the word that holds that number.
constexpr BitWord lowBits(unsigned long nBits)
{
    return (1U << (nBits & 31)) - 1;
}

template <typename Op>
void combine(BitWord* a, const BitWord* b, unsigned long n)
{
    static CombineLoop* const run = best(combinePaths<Op>());
    run(a, b, n);
}

// Whether Op gives a set bit among the first `nBits`.
template <typename Op>
bool any(const BitWord* a, const BitWord* b, unsigned long nBits)
{
    static AnyLoop* const run = best(anyPaths<Op>());
    const unsigned long full = nBits >> 5;
    return nBits != 0 && (run(a, b, full) || (Op::of(a[full], b[full]) & lowBits(nBits)) != 0);
}

}  // namespace

KpBitfield::~KpBitfield()
{
    kpfree(bits_);
}

KpBitfield& KpBitfield::operator=(const KpBitfield& other)
{
    resize(other.nBits_, INIT_NONE);
    if (nBits_ != 0 && this != &other)
        std::memcpy(bits_, other.bits_, nWords_ * sizeof(BitWord));
    return *this;
}

void KpBitfield::swap(KpBitfield& other) noexcept
{
    std::swap(nBits_, other.nBits_);
    std::swap(nWords_, other.nWords_);
    std::swap(bits_, other.bits_);
}

void KpBitfield::resize(unsigned long nBits, INIT init)
{
    const unsigned long words = wordsFor(nBits);
    if (words != nWords_)
        bits_ = static_cast<BitWord*>(kprealloc(bits_, words * sizeof(BitWord)));
    const bool fills = init == INIT_SET || init == INIT_UNSET;
    if (fills && words > nWords_)
        std::memset(bits_ + nWords_, init == INIT_SET ? 0xFF : 0, (words - nWords_) * sizeof(BitWord));
    if (fills && nBits > nBits_ && (nBits_ & 31) != 0) {
        BitWord& last = bits_[nBits_ >> 5];
        last = init == INIT_SET ? last | ~lowBits(nBits_) : last & lowBits(nBits_);
    }
    nBits_ = nBits;
    nWords_ = words;
}

void KpBitfield::setAll()
{
    std::fill_n(bits_, nWords_, ~BitWord{0});
}

void KpBitfield::unsetAll()
{
    std::fill_n(bits_, nWords_, BitWord{0});
}

void KpBitfield::toggleAll()
{
    std::transform(bits_, bits_ + nWords_, bits_, [](BitWord word) { return ~word; });
}

void KpBitfield::setRange(unsigned long from, unsigned long to)
{
    if (from > to)
        return;
    KPLIB_CHECK(to < nBits_, "KpBitfield: the range ends outside [0, nBits())");
    const unsigned long first = from >> 5, last = to >> 5;
    const BitWord head = ~lowBits(from), tail = ~BitWord{0} >> (31 - (to & 31));
    if (first == last) {
        bits_[first] |= head & tail;
        return;
    }
    bits_[first] |= head;
    std::fill(bits_ + first + 1, bits_ + last, ~BitWord{0});
    bits_[last] |= tail;
}

KpBitfield& KpBitfield::operator&=(const KpBitfield& other)
{
    combine<BitAnd>(bits_, other.bits_, std::min(nWords_, other.nWords_));
    return *this;
}

KpBitfield& KpBitfield::operator|=(const KpBitfield& other)
{
    combine<BitOr>(bits_, other.bits_, std::min(nWords_, other.nWords_));
    return *this;
}

KpBitfield& KpBitfield::operator^=(const KpBitfield& other)
{
    combine<BitXor>(bits_, other.bits_, std::min(nWords_, other.nWords_));
    return *this;
}

bool KpBitfield::operator==(const KpBitfield& other) const
{
    return nBits_ == other.nBits_ && !any<BitXor>(bits_, other.bits_, nBits_);
}

bool KpBitfield::isSuperset(const KpBitfield& other) const
{
    return !any<BitsMissing>(bits_, other.bits_, std::min(nBits_, other.nBits_));
}

bool KpBitfield::hasIntersection(const KpBitfield& other) const
{
    return any<BitAnd>(bits_, other.bits_, std::min(nBits_, other.nBits_));
}

// The bits after the full words.
std::uint32_t KpBitfield::lastBits() const
{
    return nBits_ == 0 ? 0 : bits_[nBits_ >> 5] & lowBits(nBits_);
}

unsigned long KpBitfield::nSetBits() const
{
    static CountLoop* const run = best(countPaths());
    return run(bits_, nBits_ >> 5) + static_cast<unsigned long>(std::popcount(lastBits()));
}

unsigned long KpBitfield::firstSetBit() const
{
    static FindLoop* const run = best(findFirstPaths());
    const unsigned long full = nBits_ >> 5, i = run(bits_, full, 0);
    const BitWord word = i < full ? bits_[i] : lastBits();
    return word != 0 ? i * 32 + static_cast<unsigned long>(std::countr_zero(word)) : nBits_;
}

unsigned long KpBitfield::firstUnsetBit() const
{
    static FindLoop* const run = best(findFirstPaths());
    const unsigned long full = nBits_ >> 5, i = run(bits_, full, ~BitWord{0});
    const BitWord word = i < full ? bits_[i] : lastBits();
    return std::min(nBits_, i * 32 + static_cast<unsigned long>(std::countr_one(word)));
}

unsigned long KpBitfield::lastSetBit() const
{
    static FindLoop* const run = best(findLastPaths());
    const unsigned long full = nBits_ >> 5;
    if (const BitWord word = lastBits())
        return full * 32 + static_cast<unsigned long>(std::bit_width(word)) - 1;
    const unsigned long i = run(bits_, full, 0);
    return i < full ? i * 32 + static_cast<unsigned long>(std::bit_width(bits_[i])) - 1 : nBits_;
}
