#include <kplib/volume/KpScanConvert.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstddef>
#include <functional>
#include <limits>
#include <new>
#include <numeric>
#include <vector>

namespace {

thread_local const KpScanConvert* current = nullptr;  // what renders on this thread

// An edge that the scanline crosses.
struct Active {
    float x;   // of the crossing
    float dx;  // from one scanline to the next
    int i;     // from vertex i to the next
};

// NaN after all numbers, so that the order is total.
float sortKey(float value)
{
    return std::isnan(value) ? std::numeric_limits<float>::infinity() : value;
}

bool compare_active(const Active& a, const Active& b)
{
    return sortKey(a.x) < sortKey(b.x);
}

// A float as an integer between two bounds; NaN becomes the lower one.
int clampedTo(double value, int low, int high)
{
    return !(value > low) ? low : value < high ? static_cast<int>(value) : high;
}

// Memory of a scan, freed at its end: from a buffer, and from the heap when the buffer is used up.
// As in std::pmr, which is missing from libc++ 14.
class Arena {
public:
    void* take(std::size_t bytes)
    {
        bytes = (bytes + alignof(std::max_align_t) - 1) / alignof(std::max_align_t) * alignof(std::max_align_t);
        if (bytes > sizeof buffer_ - used_)
            return ::operator new(bytes);
        used_ += bytes;
        return buffer_ + used_ - bytes;
    }
    void give(void* memory)
    {
        if (std::less<>()(memory, buffer_) || !std::less<>()(memory, buffer_ + sizeof buffer_))
            ::operator delete(memory);
    }

private:
    std::size_t used_ = 0;
    alignas(std::max_align_t) std::byte buffer_[16384];
};

template <typename T>
struct ArenaAllocator {
    using value_type = T;
    Arena* arena;

    ArenaAllocator(Arena* a) : arena(a) {}
    template <typename Other>
    ArenaAllocator(const ArenaAllocator<Other>& other) : arena(other.arena)
    {
    }
    T* allocate(std::size_t n) { return static_cast<T*>(arena->take(n * sizeof(T))); }
    void deallocate(T* memory, std::size_t) { arena->give(memory); }
    bool operator==(const ArenaAllocator&) const = default;
};

class Scan {
public:
    Scan(int n, const KpVec2f* points, const int* window) :
        n_(n), points_(points), window_(window), order_(static_cast<std::size_t>(n), &memory_), active_(&memory_)
    {
        active_.reserve(static_cast<std::size_t>(n));
        std::iota(order_.begin(), order_.end(), 0);
        std::sort(order_.begin(), order_.end(), [points](int a, int b) {  // compare_ind
            return sortKey(points[a].y()) < sortKey(points[b].y());
        });
    }

    // Calls `span` with y, xLeft and xRight of each span.
    template <typename Span>
    void concave(Span span)
    {
        const auto lowest = static_cast<double>(points_[order_.front()].y());
        const auto highest = static_cast<double>(sortKey(points_[order_.back()].y()));
        const int first = clampedTo(std::ceil(lowest - 0.5), window_[1], INT_MAX);
        const int last = clampedTo(std::floor(highest - 0.5), INT_MIN, window_[3]);
        for (long y = first; y <= last; ++y) {
            meetVertices(static_cast<int>(y));
            sortActive();
            for (std::size_t j = 0; j + 1 < active_.size(); j += 2)
                reportBetween(active_[j], active_[j + 1], static_cast<int>(y), span);
        }
    }

private:
    int before(int i) const { return i > 0 ? i - 1 : n_ - 1; }
    int behind(int i) const { return i < n_ - 1 ? i + 1 : 0; }

    // Processes the vertices up to the middle of the scanline: each starts, ends or continues its
    // two edges.
    void meetVertices(int y)
    {
        const auto isMet = [&](int i) { return static_cast<double>(points_[i].y()) <= y + 0.5; };
        for (; next_ < n_ && isMet(order_[static_cast<std::size_t>(next_)]); ++next_) {
            const int i = order_[static_cast<std::size_t>(next_)];
            meetEdge(before(i), before(i), y);
            meetEdge(i, behind(i), y);
        }
    }
    void meetEdge(int edge, int otherEnd, int y)
    {
        const auto other = static_cast<double>(points_[otherEnd].y());
        if (other <= y - 0.5)
            cdelete(edge);
        else if (other > y + 0.5)
            cinsert(edge, y);
    }
    void cinsert(int i, int y)
    {
        const int j = behind(i);
        const bool isRising = points_[i].y() < points_[j].y();
        const KpVec2f &p = points_[isRising ? i : j], &q = points_[isRising ? j : i];
        const float dx = (q.x() - p.x()) / (q.y() - p.y());
        active_.push_back({dx * (static_cast<float>(y) + 0.5F - p.y()) + p.x(), dx, i});
    }
    void cdelete(int i)
    {
        const auto found =
            std::find_if(active_.begin(), active_.end(), [i](const Active& active) { return active.i == i; });
        if (found != active_.end())
            active_.erase(found);
    }
    // The list is nearly sorted, except for the edges just added.
    void sortActive()
    {
        if (!std::is_sorted(active_.begin(), active_.end(), compare_active))
            std::sort(active_.begin(), active_.end(), compare_active);
    }
    template <typename Span>
    void reportBetween(Active& left, Active& right, int y, Span span) const
    {
        const auto first = static_cast<double>(std::ceil(left.x - 0.5F));
        const auto last = static_cast<double>(std::floor(right.x - 0.5F));
        if (first <= last) {
            const int xLeft = clampedTo(first, window_[0], INT_MAX), xRight = clampedTo(last, INT_MIN, window_[2]);
            if (xLeft <= xRight)
                span(y, xLeft, xRight);
        }
        left.x += left.dx;
        right.x += right.dx;
    }

    int n_;
    const KpVec2f* points_;
    const int* window_;
    int next_ = 0;  // of order_: the first vertex above the scanline
    Arena memory_;
    std::vector<int, ArenaAllocator<int>> order_;  // the vertices by y
    std::vector<Active, ArenaAllocator<Active>> active_;
};

}  // namespace

void KpScanConvert::render(int n, const KpVec2f* points)
{
    if (n < 3)
        return;
    struct Current {
        explicit Current(const KpScanConvert* object) { current = object; }
        ~Current() { current = outer; }
        const KpScanConvert* outer = current;
    };
    const Current here(this);
    Scan(n, points, window_).concave(concaveCB);
}

void KpScanConvert::concaveCB(int y, int xLeft, int xRight)
{
    if (current)
        current->spanCB_(current->userData_, xLeft, xRight, y);
}

void KpScanConvert::defaultSpanCB(void* userData, int xLeft, int xRight, int y)
{
    if (!current || !current->pixelCB_)
        return;
    for (long x = xLeft; x <= xRight; ++x)
        current->pixelCB_(userData, static_cast<int>(x), y);
}
