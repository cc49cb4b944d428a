#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpExport.h>

#include <cstdint>
#include <utility>

class KpString;

/// A resizable array of bits, one a voxel: the mask of morphology and flood fill, or one label of a label volume.
///
///     KpBitfield mask(100, KpBitfield::INIT_UNSET);
///     mask.setRange(10, 19);
///     mask.unset(10);
///     std::printf("%lu bits from %lu\n", mask.nSetBits(), mask.firstSetBit());
///     // prints: 9 bits from 11
///
/// Bit i is bit i & 31, from the least significant, of the 32-bit word i >> 5. There is always one
/// word more than there are full ones: 32 bits take two. That spare word is part of the layout:
/// fills and the digest include it, functions that count or find bits do not. Operations on many
/// bits work on whole words. Bit numbers are not checked.
///
/// Errors: exhausted memory throws KpMemoryException and leaves the field unchanged.
///
/// Threads: one thread may change a field, or any number read it.
class KPLIB_API KpBitfield {
public:
    /// Initial value of added words. Any other value leaves them uninitialised, as INIT_NONE does.
    enum INIT : int {
        INIT_SET = 0,    ///< all bits set
        INIT_UNSET = 1,  ///< all bits clear
        INIT_NONE = 2,   ///< not initialised
    };

    /// How toLabels() merges bits into labels.
    enum InsertPolicy : int {
        INSERT_SET = 1,         ///< the label where the bit is set; all else stays
        INSERT_INTO_EMPTY = 2,  ///< the label where the bit is set and the array holds 0; all else stays
        INSERT_REPLACE = 3,     ///< the label where the bit is set and 0 elsewhere
        INSERT_OWN = 4,         ///< as INSERT_REPLACE where the array holds 0 or the label; other labels stay
    };

    /// Empty, without storage.
    KpBitfield() = default;
    /// As resize() of an empty field.
    KpBitfield(unsigned long nBits, INIT init) { resize(nBits, init); }
    /// Copies all words, the spare one too.
    KpBitfield(const KpBitfield& other) { *this = other; }
    /// Takes the words; `other` is left empty.
    KpBitfield(KpBitfield&& other) noexcept { swap(other); }
    ~KpBitfield();

    /// Copies all words, the spare one too.
    KpBitfield& operator=(const KpBitfield& other);
    /// Frees the old words and takes those of `other`.
    KpBitfield& operator=(KpBitfield&& other) noexcept
    {
        KpBitfield(std::move(other)).swap(*this);
        return *this;
    }
    /// Exchanges the words.
    void swap(KpBitfield& other) noexcept;

    /// Size in bits, and in 32-bit words: nBits / 32 + 1, or 0 without bits.
    unsigned long nBits() const { return nBits_; }
    /// As above.
    unsigned long nWords() const { return nWords_; }
    /// The words; null without bits.
    std::uint32_t* data() { return bits_; }
    /// As above.
    const std::uint32_t* data() const { return bits_; }

    /// Sets a bit.
    void set(unsigned long i)
    {
        KPLIB_CHECK(i >> 5 < nWords_, "KpBitfield: the bit lies outside the words of the field");
        bits_[i >> 5] |= 1U << (i & 31);
    }
    /// Clears a bit.
    void unset(unsigned long i)
    {
        KPLIB_CHECK(i >> 5 < nWords_, "KpBitfield: the bit lies outside the words of the field");
        bits_[i >> 5] &= ~(1U << (i & 31));
    }
    /// Whether a bit is set.
    bool test(unsigned long i) const
    {
        KPLIB_CHECK(i >> 5 < nWords_, "KpBitfield: the bit lies outside the words of the field");
        return (bits_[i >> 5] >> (i & 31) & 1) != 0;
    }

    /// Keeps the bits below both sizes. Added words, and the added bits of a last word that was in
    /// use, become what `init` says. A spare word without bits keeps its value, also when it comes
    /// into use.
    void resize(unsigned long nBits, INIT init);

    /// All words, the spare one too.
    void setAll();
    /// @{
    /// As above.
    void unsetAll();
    void toggleAll();
    /// @}

    /// Sets `from` to `to`, both inclusive.
    void setRange(unsigned long from, unsigned long to);

    /// Word by word over the words of the shorter field; the rest of this one stays.
    KpBitfield& operator&=(const KpBitfield& other);
    /// @{
    /// As above.
    KpBitfield& operator|=(const KpBitfield& other);
    KpBitfield& operator^=(const KpBitfield& other);
    /// @}

    /// Equal sizes and equal bits; two empty fields are equal.
    bool operator==(const KpBitfield& other) const;

    /// Number of bits that are set.
    unsigned long nSetBits() const;
    /// Number of the lowest, or highest, bit of its kind; nBits() if there is none.
    unsigned long firstSetBit() const;
    /// As above.
    unsigned long firstUnsetBit() const;
    /// As above.
    unsigned long lastSetBit() const;
    /// @{
    /// Whether there is such a bit.
    bool isAnyBitSet() const { return firstSetBit() < nBits_; }
    bool isAnyBitUnset() const { return firstUnsetBit() < nBits_; }
    /// @}

    // Fields of different sizes are compared over the bits that both have.

    /// Whether each bit set in `other` is set here; true if this field is empty.
    bool isSuperset(const KpBitfield& other) const;
    /// Whether each bit set here is set in `other`.
    bool isSubset(const KpBitfield& other) const { return other.isSuperset(*this); }
    /// Whether some bit is set in both.
    bool hasIntersection(const KpBitfield& other) const;

    /// Replaces `out` by a character 0 or 1 a bit, bit 0 first.
    void print(KpString& out) const;

    /// Becomes `n` bits, set where `labels` holds `label`. Labels go by fours: four zeros give no
    /// bits, even for label 0, which otherwise matches a zero beside other labels and each of the
    /// last n % 4. Intentional: label 0 differs from the background.
    void fromLabels(unsigned long n, const unsigned char* labels, unsigned char label);
    /// Merges the first `n` bits into as many labels. Does nothing if there are fewer bits, or for an unknown policy.
    void toLabels(unsigned long n, unsigned char* labels, unsigned char label, InsertPolicy policy) const;

    /// Writes the (nBits + 7) / 8 bytes of the bits as they are in memory: bit i in byte i / 8,
    /// least significant first, and no size. False if the file cannot be opened or not all bytes
    /// can be written.
    bool save(const KpString& file) const;
    /// Becomes `nBits` bits as save() wrote them. False if the file cannot be opened or is too
    /// short; bits that are not in it are unset.
    bool load(const KpString& file, unsigned long nBits);

    /// MD5 over the first quarter of the full words and the used bits of the last word (over the
    /// whole spare word if no word is partly used). Intentional: this is not a digest of all bits,
    /// but stored digests depend on it. An empty field has the digest of no bytes.
    void md5(unsigned char* digest) const;
    /// As 32 upper-case hexadecimal digits.
    void md5(KpString& text) const;

private:
    std::uint32_t lastBits() const;

    unsigned long nBits_ = 0;
    unsigned long nWords_ = 0;
    std::uint32_t* bits_ = nullptr;  // by kpmalloc
};
