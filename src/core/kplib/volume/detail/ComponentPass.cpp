#include <kplib/volume/detail/ComponentTable.h>
#include <kplib/volume/detail/FloatSums.h>
#include <kplib/volume/detail/LabelPlainly.h>
#include <kplib/volume/detail/RowBits.h>

#include <algorithm>
#include <cstring>
#include <limits>

namespace kplib::detail {
namespace {

// The neighbours that a voxel has, by their offsets in elements.
struct Steps {
    int n = 0;
    long offsets[13];
};

// A previous row, of which a voxel has the columns up to its own as neighbours, or to the next one
// if it is `wide`.
struct RowBefore {
    long offset;
    int dy, dz;
    bool isWide;
};

// The pass, a row at a time.
//
// The ids of the labels around a voxel decide its label. After an exact step with the root m,
// those ids are m or its new aliases, and nothing is left to merge. So a voxel with the same
// labels around it as the voxel before gets m too, and changes only the counts of m, which are
// added for all such voxels of a stretch at once. A stretch ends where a previous row has a label
// that differs from the label to its left, is not the background and has another id than m. In
// label mode equal labels have equal values, so the same holds there as long as the voxels have
// the same value.
template <typename T, typename L>
class RowLabelling {
public:
    RowLabelling(const T* data, L* labels, ComponentTable& components, T low, T high, const int* dims, int neighbours,
                 bool isLabelMode) :
        data_(data),
        labels_(labels), components_(components), low_(low), high_(high), dims_{dims[0], dims[1], dims[2]},
        isLabelMode_(isLabelMode), nWords_(wordsOf(dims[0])), rowBytes_(bytesOfRow(dims[0]))
    {
        int offsets[13];
        KpConnectedComponents::mknbtableprev(neighbours, dims, nSteps_, offsets, deltas_);
        // For a row: foreground, seeds (of labels: changes of value), ends of stretches, each with a
        // word of zeros after it. For this slice and the one before: changes of label, rows without
        // a gap. Bit 0 of a row is never set, so the first word of the next row serves as the zeros
        // after it; one more word follows the last row.
        const long changeBytes = rowBytes_ * dims_[1] * std::min(dims_[2], 2L);
        bits_.resize(nWords_ * 3 + (changeBytes + 7) / 8 + 1);
        std::fill(bits_.begin(), bits_.end(), RowBits{0});
    }

    bool run()
    {
        for (z_ = 0; z_ < dims_[2]; ++z_)
            for (y_ = 0; y_ < dims_[1]; ++y_) {
                start_ = (z_ * dims_[1] + y_) * dims_[0];
                if (!labelRow())
                    return false;
            }
        return true;
    }

private:
    RowBits* foreground() { return bits_.data(); }
    RowBits* seeds() { return bits_.data() + nWords_; }
    RowBits* ends() { return bits_.data() + 2 * nWords_; }
    unsigned char* labelChanges(long y, long z)
    {
        return reinterpret_cast<unsigned char*>(bits_.data() + 3 * nWords_) + ((z % 2) * dims_[1] + y) * rowBytes_;
    }

    // Bytes for the changes of label of a row: narrow rows share words, so that they take no more for a voxel.
    static long bytesOfRow(long n) { return n <= 8 ? 1 : n <= 16 ? 2 : n <= 32 ? 4 : (wordsOf(n) - 1) * 8; }
    bool isNarrow() const { return rowBytes_ < 8; }

    bool labelRow()
    {
        unsigned char* const stored = labelChanges(y_, z_);
        RowBits narrow = 0;
        changes_ = isNarrow() ? &narrow : reinterpret_cast<RowBits*>(stored);
        const bool isDone = labelRuns();
        if (isNarrow())
            std::memcpy(stored, &narrow, static_cast<std::size_t>(rowBytes_));  // the lowest bits: first in memory
        return isDone;
    }

    bool labelRuns()
    {
        const T* row = data_ + start_;
        std::fill_n(changes_, nWords_ - 1, RowBits{0});
        if (!fillBits(foreground(), dims_[0], [=, low = low_](long i) { return !(row[i] < low); })) {
            std::fill_n(labels_ + start_, dims_[0], L{0});
            return true;
        }
        findNeighbours();
        findEnds();
        for (long x = 0; x < dims_[0];) {
            const long first = findBit(foreground(), x, dims_[0]);
            std::fill(labels_ + start_ + x, labels_ + start_ + first, L{0});
            x = findBit(foreground(), first, dims_[0], ~RowBits{0});
            if (!labelRun(first, x))
                return false;
        }
        return true;
    }

    // The neighbours in reach of the rows along this border, for voxels at either end of the row and between.
    void findNeighbours()
    {
        const int border = (y_ == 0 ? 1 : 0) + (y_ + 1 == dims_[1] ? 2 : 0) + (z_ == 0 ? 4 : 0);
        if (border == border_)
            return;
        border_ = border;
        nRows_ = 0;
        for (Steps& steps : steps_)
            steps.n = 0;
        for (int i = 0; i < nSteps_; ++i) {
            const auto& [dx, dy, dz] = deltas_[i];
            if (y_ + dy < 0 || y_ + dy >= dims_[1] || z_ + dz < 0)
                continue;
            for (int side = 0; side < 4; ++side) {
                if ((dx >= 0 || side % 2 == 0) && (dx <= 0 || side / 2 == 0))
                    steps_[side].offsets[steps_[side].n++] = dx + dims_[0] * (dy + dims_[1] * dz);
            }
            if (dy != 0 || dz != 0)
                addRowBefore(dx, dy, dz);
        }
    }

    void addRowBefore(int dx, int dy, int dz)
    {
        int i = 0;
        while (i < nRows_ && (rows_[i].dy != dy || rows_[i].dz != dz))
            ++i;
        if (i == nRows_)
            rows_[nRows_++] = RowBefore{dims_[0] * (dy + dims_[1] * dz), dy, dz, false};
        rows_[i].isWide |= dx > 0;
    }

    // Marks the voxels that may have other labels around them than the one before. After a
    // clean-up some marked changes of label are obsolete, which costs time only.
    void findEnds()
    {
        const T* row = data_ + start_;
        RowBits* const ends = this->ends();
        const long n = nWords_ - 1;
        if (isLabelMode_) {
            const RowBits* changes = seeds();
            fillBits(seeds(), dims_[0] - 1, [=](long i) { return row[i + 1] != row[i]; });
            for (long i = 0; i < n; ++i)
                ends[i] = changes[i] << 1 | (i > 0 ? changes[i - 1] >> 63 : 0);
        } else {
            fillBits(seeds(), dims_[0], [=, high = high_](long i) { return row[i] >= high; });
            std::fill_n(ends, n, RowBits{0});
        }
        for (int r = 0; r < nRows_; ++r) {
            const unsigned char* const stored = labelChanges(y_ + rows_[r].dy, z_ - rows_[r].dz);
            const bool isWide = rows_[r].isWide;
            if (isNarrow()) {
                RowBits word = 0;
                std::memcpy(&word, stored, static_cast<std::size_t>(rowBytes_));
                ends[0] |= isWide ? word >> 1 : word;
                continue;
            }
            const auto* const before = reinterpret_cast<const RowBits*>(stored);
            for (long i = 0; i < n; ++i)
                ends[i] |= isWide ? before[i] >> 1 | before[i + 1] << 63 : before[i];
        }
    }

    bool labelRun(long x, long end)
    {
        while (x < end) {
            const int m = labelVoxel(x);
            if (m < 0)
                return false;
            const long first = ++x;
            if (nSteps_ == 0 || components_[m].id != m)
                continue;
            x = findBit(ends(), x, end);
            while (x < end && isNoEnd(x, m))
                x = findBit(ends(), x + 1, end);
            if (x > first)
                labelStretch(first, x, m);
        }
        return true;
    }

    // Whether all labels that are new neighbours at `x` lead to `m`.
    bool isNoEnd(long x, int m) const
    {
        if (isLabelMode_ && data_[start_ + x] != data_[start_ + x - 1])
            return false;
        for (int r = 0; r < nRows_; ++r) {
            if (rows_[r].isWide && x + 1 == dims_[0])
                continue;
            const long at = start_ + x + rows_[r].offset + (rows_[r].isWide ? 1 : 0);
            const int id = components_[labels_[at]].id;
            if (id != 0 && id != m && (!isLabelMode_ || data_[at] == data_[start_ + x]))
                return false;
        }
        return true;
    }

    void labelStretch(long from, long end, int m)
    {
        std::fill(labels_ + start_ + from, labels_ + start_ + end, static_cast<L>(m));
        Component& component = components_[m];
        component.nVoxels += static_cast<unsigned>(end - from);
        if (!isLabelMode_)
            component.nSeeds += static_cast<unsigned>(countBits(seeds(), from, end));
        addRowTo(component.sum, from, y_, z_, end - from);
    }

    // The exact step; -1 if there are too many components.
    int labelVoxel(long x)
    {
        const long at = start_ + x;
        const Steps& steps = steps_[(x == 0 ? 1 : 0) + (x + 1 == dims_[0] ? 2 : 0)];
        int ids[13];
        const int m = isLabelMode_ ? gather<true>(steps, at, ids) : gather<false>(steps, at, ids);
        if (m < 0)
            return -1;
        Component& component = components_[m];
        ++component.nVoxels;
        if (!isLabelMode_ && data_[at] >= high_)
            ++component.nSeeds;
        const float position[3] = {static_cast<float>(x), static_cast<float>(y_), static_cast<float>(z_)};
        for (int axis = 0; axis < 3; ++axis)
            component.sum[axis] += position[axis];
        labels_[at] = static_cast<L>(m);  // last: the label may overwrite the value
        if (x > 0 && labels_[at - 1] != labels_[at])
            changes_[x / 64] |= RowBits{1} << x % 64;
        return m;
    }

    // Finds the label of a voxel and makes the others around it its aliases. The background's entry has the id 0, so
    // all labels can be looked up alike.
    template <bool isLabelMode>
    int gather(const Steps& steps, long at, int (&ids)[13])
    {
        unsigned lowest = std::numeric_limits<unsigned>::max();  // less 1, so that the background is above all
        int highest = 0;
        const Component* components = components_.data();
        for (int i = 0; i < steps.n; ++i) {
            const long other = at + steps.offsets[i];
            ids[i] = components[labels_[other]].id;  // intentional: one step only
            if constexpr (isLabelMode)
                ids[i] = data_[other] == data_[at] ? ids[i] : 0;
            lowest = std::min(lowest, static_cast<unsigned>(ids[i]) - 1);
            highest = std::max(highest, ids[i]);
        }
        if (highest == 0)
            return newComponent(at);
        const int m = static_cast<int>(lowest + 1);
        if (highest != m)
            merge(m, ids, steps.n);
        return m;
    }

    int newComponent(long at)
    {
        const int m = addComponent(components_, labels_, at);
        if (m > 0 && isLabelMode_)
            components_[m].nSeeds = seedsOf(data_[at]);
        return m;
    }

    void merge(int m, const int* ids, int n)
    {
        for (int i = 0; i < n; ++i) {
            if (ids[i] != 0 && ids[i] != m)
                components_[m].addAlias(components_[ids[i]], isLabelMode_);
        }
    }

    const T* data_;
    L* labels_;
    ComponentTable& components_;
    T low_, high_;
    long dims_[3];
    bool isLabelMode_;
    int nSteps_ = 0;
    int deltas_[13][3];
    long nWords_;    // in a row of bits, with the zeros after it
    long rowBytes_;  // of the changes of label
    KpDArray<RowBits> bits_;

    // Of the row at hand.
    long y_ = 0, z_ = 0, start_ = 0;
    int border_ = -1;
    Steps steps_[4];
    RowBefore rows_[4];
    int nRows_ = 0;
    RowBits* changes_ = nullptr;
};

}  // namespace
}  // namespace kplib::detail

using kplib::detail::ComponentTable;

template <typename T, typename L>
int KpConnectedComponents::do_label(T* data, L* labels, KpDArray<Component>& components, T low, T high, const int* dims,
                                    int neighbours, int labelMode)
{
    using namespace kplib::detail;
    if (dims[0] < 8)  // from this width on bits of a row are faster
        return PlainLabelling<T, L>(data, labels, components, low, high, dims, neighbours, labelMode).run();
    startComponents(components);
    const long nVoxels = nVoxelsOf(dims);
    if (nVoxels > 0 && !RowLabelling<T, L>(data, labels, components, low, high, dims, neighbours, labelMode != 0).run())
        return -1;
    cleanUpComponents(components, labels, nVoxels, -1, -1);
    return static_cast<int>(components.size()) - 1;
}

template int KpConnectedComponents::do_label(unsigned char*, unsigned short*, ComponentTable&, unsigned char,
                                             unsigned char, const int*, int, int);
template int KpConnectedComponents::do_label(unsigned char*, int*, ComponentTable&, unsigned char, unsigned char,
                                             const int*, int, int);
template int KpConnectedComponents::do_label(short*, unsigned short*, ComponentTable&, short, short, const int*, int,
                                             int);
template int KpConnectedComponents::do_label(unsigned short*, unsigned short*, ComponentTable&, unsigned short,
                                             unsigned short, const int*, int, int);
template int KpConnectedComponents::do_label(int*, unsigned short*, ComponentTable&, int, int, const int*, int, int);
template int KpConnectedComponents::do_label(float*, unsigned short*, ComponentTable&, float, float, const int*, int,
                                             int);
template int KpConnectedComponents::do_label(double*, unsigned short*, ComponentTable&, double, double, const int*, int,
                                             int);
