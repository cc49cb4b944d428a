#include <kplib/volume/KpNeighborIterator33.h>

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>
#include <initializer_list>
#include <numeric>
#include <span>

namespace {

struct Delta {
    std::int8_t x, y, z;
};
using Group = std::span<const Delta>;

constexpr Delta corners[] = {{-1, -1, -1}, {1, -1, -1}, {-1, 1, -1}, {1, 1, -1},
                             {-1, -1, 1},  {1, -1, 1},  {-1, 1, 1},  {1, 1, 1}};
constexpr Delta edgesOutOfPlane[] = {{0, -1, -1}, {-1, 0, -1}, {1, 0, -1}, {0, 1, -1},
                                     {0, -1, 1},  {-1, 0, 1},  {1, 0, 1},  {0, 1, 1}};
constexpr Delta edgesInPlane[] = {{-1, -1, 0}, {1, -1, 0}, {-1, 1, 0}, {1, 1, 0}};
constexpr Delta faces[] = {{0, 0, -1}, {0, -1, 0}, {-1, 0, 0}, {0, 0, 1}, {0, 1, 0}, {1, 0, 0}};
constexpr Delta facesInPlane[] = {{0, -1, 0}, {-1, 0, 0}, {0, 1, 0}, {1, 0, 0}};

// Calls `visit` with each neighbour in the table's order; does nothing for an unknown number of
// neighbours.
template <typename Visit>
void forEachNeighbor(int count, Visit visit)
{
    const auto visitAll = [&](std::initializer_list<Group> groups) {
        for (const Group group : groups)
            std::for_each(group.begin(), group.end(), visit);
    };
    switch (count) {
    case 4:
        return visitAll({facesInPlane});
    case 6:
        return visitAll({faces});
    case 8:
        return visitAll({edgesInPlane, facesInPlane});
    case 10:
        return visitAll({edgesInPlane, faces});
    case 18:
        return visitAll({edgesOutOfPlane, edgesInPlane, faces});
    case 26:
        return visitAll({corners, edgesOutOfPlane, edgesInPlane, faces});
    default:
        return;
    }
}

unsigned char borderOf(const Delta& d)
{
    const auto bit = [](int delta, int shift) { return delta == 0 ? 0 : (delta < 0 ? 1 : 2) << shift; };
    return static_cast<unsigned char>(bit(d.x, 0) | bit(d.y, 2) | bit(d.z, 4));
}

template <typename T>
void rearrange(T (&values)[26], const int* order, int count)
{
    T old[26];
    std::copy_n(values, count, old);
    for (int i = 0; i < count; ++i)
        values[i] = old[order[i]];
}

void rearrange(std::int8_t (&values)[26][3], const int* order, int count)
{
    std::int8_t old[26][3];
    std::copy_n(values[0], 3 * count, old[0]);
    for (int i = 0; i < count; ++i)
        std::copy_n(old[order[i]], 3, values[i]);
}

}  // namespace

KpNeighborIterator33::KpNeighborIterator33(int nNeighbors, const int* dims) :
    nNeighbors_(nNeighbors), dims_{dims[0], dims[1], dims[2]}
{
    int i = 0;
    forEachNeighbor(nNeighbors, [&](const Delta& d) {
        offsets_[i] = static_cast<int>(d.x + long{dims_[0]} * (d.y + long{dims_[1]} * d.z));
        deltas_[i][0] = d.x;
        deltas_[i][1] = d.y;
        deltas_[i][2] = d.z;
        borders_[i] = borderOf(d);
        ++i;
    });
}

bool KpNeighborIterator33::isFilled() const
{
    int count = 0;
    forEachNeighbor(nNeighbors_, [&](const Delta&) { ++count; });
    return count > 0;
}

void KpNeighborIterator33::setWeights(const char* w, int sort)
{
    setIntegers(reinterpret_cast<const signed char*>(w), sort);
}

void KpNeighborIterator33::setWeights(const short* w, int sort)
{
    setIntegers(w, sort);
}

void KpNeighborIterator33::setWeights(const int* w, int sort)
{
    setIntegers(w, sort);
}

void KpNeighborIterator33::setWeights(const float* w, int sort)
{
    if (!isFilled())
        return;
    for (int i = 0; i < nNeighbors_; ++i)
        fweights_[i] = w[13 + deltas_[i][0] + 3 * deltas_[i][1] + 9 * deltas_[i][2]];
    if (sort != 0)
        sort_fweights();
    KpRawData::memcpy({iweights_, KpPrimType::Int}, {fweights_, KpPrimType::Float}, nNeighbors_);
}

template <typename Weight>
void KpNeighborIterator33::setIntegers(const Weight* w, int sort)
{
    if (!isFilled())
        return;
    for (int i = 0; i < nNeighbors_; ++i)
        // NOLINTNEXTLINE(bugprone-signed-char-misuse): intentional: small weights below 0
        iweights_[i] = w[13 + deltas_[i][0] + 3 * deltas_[i][1] + 9 * deltas_[i][2]];
    if (sort != 0)
        sort_iweights();
    KpRawData::memcpy({fweights_, KpPrimType::Float}, {iweights_, KpPrimType::Int}, nNeighbors_);
}

int KpNeighborIterator33::sort_iweights()
{
    return sortBy(iweights_);
}

int KpNeighborIterator33::sort_fweights()
{
    return sortBy(fweights_);
}

template <typename Weight>
int KpNeighborIterator33::sortBy(const Weight* weights)
{
    if (!isFilled())
        return maxNeighbors;
    int order[maxNeighbors];
    std::iota(order, order + nNeighbors_, 0);
    std::stable_sort(order, order + nNeighbors_,
                     [&](int a, int b) { return static_cast<float>(weights[a]) < static_cast<float>(weights[b]); });
    rearrange(fweights_, order, nNeighbors_);
    rearrange(iweights_, order, nNeighbors_);
    rearrange(offsets_, order, nNeighbors_);
    rearrange(deltas_, order, nNeighbors_);
    rearrange(borders_, order, nNeighbors_);
    const auto* const first = std::find_if(weights, weights + nNeighbors_, [](Weight weight) { return weight > 0; });
    return first == weights + nNeighbors_ ? maxNeighbors : static_cast<int>(first - weights);
}
