#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/system/KpMD5.h>

namespace KpLib {

/// Digests in the order of insertion, or in ascending order, and a digest of them all. One thread at a time, hash()
/// included.
class KPLIB_API MD5List {
public:
    /// With `sorted`, two lists of the same digests have the same hash, however they were filled.
    explicit MD5List(bool sorted = false) : sorted_(sorted) {}

    /// Appends, or inserts the digest after the last one that is not greater.
    void insert(const MD5& digest);

    /// MD5 over the digests from the last to the first, a direction that is part of the result; computed once after
    /// each change.
    MD5 hash() const;

    /// Whether insert() keeps the order.
    bool isSorted() const { return sorted_; }
    /// The digests.
    const KpDArray<MD5>& items() const { return items_; }

private:
    bool sorted_;
    KpDArray<MD5> items_;
    mutable MD5 cachedHash_;  // null: not computed
};

}  // namespace KpLib
