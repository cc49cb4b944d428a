#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/numerics/detail/DelaunayCircle.h>

#include <algorithm>

namespace kplib::detail::delaunay {

// The faces between a cavity and the simplices around it, as a list with a hash table over it. The
// order of the list decides the slots of the new simplices.
template <int Size>
class CavityRim {
public:
    static constexpr int limit = Size == 2 ? 1025 : 16385;

    CavityRim()
    {
        faces_.resize(limit);
        next_.resize(limit);
        heads_.resize(buckets);
        std::fill(heads_.begin(), heads_.end(), none);
    }

    // Removes `face` if the list has it, and moves the last one to its place; otherwise appends
    // it. Returns false if the list is full. Intentional: a list of one or two faces is not
    // searched, so simplices with the same corners leave a face twice.
    bool flip(const Face<Size>& face)
    {
        const Index at = count_ > 2 ? find(face) : none;
        if (at != none)
            remove(at);
        else if (count_ < limit)
            link(count_++, face);
        else
            return false;
        return true;
    }

    void clear()
    {
        for (const Face<Size>& face : *this)
            heads_[bucketOf(face)] = none;
        count_ = 0;
    }

    int size() const { return count_; }
    const Face<Size>* begin() const { return faces_.data(); }
    const Face<Size>* end() const { return faces_.data() + count_; }

private:
    using Index = std::int16_t;
    static constexpr Index none = -1;
    static constexpr int bits = Size == 2 ? 9 : 12, buckets = 1 << bits;

    static std::uint32_t bucketOf(const Face<Size>& face)
    {
        std::uint32_t sum = 0;
        for (const std::int32_t corner : face)
            sum = (sum + static_cast<std::uint32_t>(corner)) * 0x9E3779B1U;
        return sum >> (32 - bits);
    }

    // The first equal face in the list, which may not be the first in its bucket.
    Index find(const Face<Size>& face) const
    {
        Index first = none;
        for (Index i = heads_[bucketOf(face)]; i != none; i = next_[i])
            if (faces_[i] == face && (first == none || i < first))
                first = i;
        return first;
    }

    void link(Index at, const Face<Size>& face)
    {
        Index& head = heads_[bucketOf(face)];
        faces_[at] = face;
        next_[at] = head;
        head = at;
    }

    void unlink(Index at)
    {
        Index* from = &heads_[bucketOf(faces_[at])];
        while (*from != at)
            from = &next_[*from];
        *from = next_[at];
    }

    void remove(Index at)
    {
        unlink(at);
        const Index last = --count_;
        if (at == last)
            return;
        unlink(last);
        link(at, faces_[last]);
    }

    KpDArray<Face<Size>> faces_;
    KpDArray<Index> next_, heads_;
    Index count_ = 0;
};

}  // namespace kplib::detail::delaunay
