#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/system/KpMD5.h>

namespace KpLib {

/// A list of digests in the order of insertion or in ascending order, with a digest of them all.
/// One thread at a time, hash() included.
class KPLIB_API MD5List {
public:
    /// With `sorted`, lists of the same digests have the same hash, independent of the order of
    /// insertion.
    explicit MD5List(bool sorted = false) : sorted_(sorted) {}

    /// Appends, or inserts the digest after the last one that is not greater.
    void insert(const MD5& digest);

    /// MD5 over the digests from the last to the first. Intentional: stored hashes depend on the
    /// direction. Computed once after each change.
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
