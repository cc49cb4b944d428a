#pragma once

#include <kplib/geometry/numerics/detail/DelaunayGrid.h>
#include <kplib/geometry/numerics/detail/DelaunayRim.h>

#include <algorithm>
#include <numeric>
#include <optional>

namespace kplib::detail::delaunay {

// How the simplices around a point are found: by a scan of all, or by a grid once `gridFrom` slots
// are used.
struct Finder {
    CircleScan* scan;
    long gridFrom;
};

// The simplices of the points inserted so far, in numbered slots. The results depend on the
// numbers: the simplices of a cavity are removed in the order of their slots, and a new simplex
// takes the slot that was freed last, or the next unused one if none is free.
template <int Size>
class Mesh {
public:
    // Starts with the simplex of the Size + 1 points after the first `n`, and a circle with the
    // squared radius FLT_MAX around the origin for it. The points have to outlive the mesh.
    Mesh(const Point<Size>* points, int n, float range, const Finder& finder) :
        points_(points), finder_(finder), expected_(n), range_(range)
    {
        reserve(1);
        Simplex<Size> corners;
        std::iota(corners.begin(), corners.end(), n);
        take(corners, {{}, static_cast<double>(std::numeric_limits<float>::max())});
    }

    // Inserts point `i`. Returns false if its cavity has too many faces; the mesh is then
    // unusable.
    bool insert(int i)
    {
        rim_.clear();
        const std::int32_t* const hits = hits_.data();
        for (long k = 0, n = findHits(i); k < n; ++k)
            if (isAlive(hits[k]) && !release(hits[k]))
                return false;
        reserve(rim_.size());
        for (const Face<Size>& face : rim_) {
            Simplex<Size> simplex;
            std::copy_n(face.begin(), Size, simplex.begin());
            simplex[Size] = i;
            take(simplex, circleThrough<Size>(points_, face, i));
        }
        return true;
    }

    // Number of slots in use or free.
    std::int32_t slots() const { return used_; }
    bool isAlive(std::int32_t slot) const { return simplices_[slot][0] >= 0; }
    const Simplex<Size>& operator[](std::int32_t slot) const { return simplices_[slot]; }

private:
    static constexpr int perPoint = Size == 2 ? 2 : 7;  // simplices per point of a large set
    static constexpr long worthIt = 16;                 // a test in the grid costs as much as this many of the scan

    // Makes room for `more` simplices, and for as many hits: a NaN is in every circle.
    void reserve(long more)
    {
        const long needed = used_ + more;
        if (needed <= simplices_.size())
            return;
        simplices_.resize(needed);
        const long room = simplices_.capacity();
        simplices_.resize(room);
        circles_.resize(room);
        hits_.resize(room + room / worthIt);  // the grid may find a circle more than once
        free_.resize(room);
    }

    void take(const Simplex<Size>& simplex, const Circle<Size>& circle)
    {
        const std::int32_t slot = freeCount_ > 0 ? free_[--freeCount_] : used_++;
        simplices_[slot] = simplex;
        circles_.set(slot, circle);
        if (grid_)
            grid_->insert(slot, circle);
    }

    bool release(std::int32_t slot)
    {
        const Simplex<Size> simplex = simplices_[slot];
        for (int left = 0; left <= Size; ++left) {
            Face<Size> face;
            std::copy_n(simplex.begin(), left, face.begin());
            std::copy(simplex.begin() + left + 1, simplex.end(), face.begin() + left);
            if (!rim_.flip(face))
                return false;
        }
        free_[freeCount_++] = slot;
        simplices_[slot][0] = -1;
        circles_.set(slot, {{}, -1});  // contains no finite point, so the scan needs no other test
        if (grid_)
            grid_->remove(slot);
        return true;
    }

    // Fills hits_ with the slots whose circles contain point `i`, ascending, and returns their
    // number. Free slots and repetitions may be among them.
    long findHits(int i)
    {
        Position<Size> point;
        std::copy_n(points_[i].begin(), Size, point.begin());
        if (!grid_ && used_ >= finder_.gridFrom)
            buildGrid();
        const long found = grid_ ? grid_->find(point, used_ / worthIt, hits_.data()) : -1;
        if (found >= 0) {
            std::sort(hits_.begin(), hits_.begin() + found);
            return found;
        }
        return circles_.scan(finder_.scan, used_, point, hits_.data());
    }

    void buildGrid()
    {
        grid_.emplace(static_cast<long>(expected_) * perPoint, range_, finder_.scan);
        for (std::int32_t slot = 0; slot < used_; ++slot)
            if (isAlive(slot))
                grid_->insert(slot, circles_[slot]);
    }

    const Point<Size>* points_;
    Finder finder_;
    int expected_;
    float range_;
    std::int32_t used_ = 0;
    long freeCount_ = 0;
    KpDArray<Simplex<Size>> simplices_;  // one for each slot, as the circles
    CircleColumns<Size> circles_;
    KpDArray<std::int32_t> free_, hits_;
    CavityRim<Size> rim_;
    std::optional<CircleGrid<Size>> grid_;
};

}  // namespace kplib::detail::delaunay
