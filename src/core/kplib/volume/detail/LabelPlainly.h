#pragma once

#include <kplib/volume/detail/ComponentTable.h>

#include <algorithm>

namespace kplib::detail {

// The definition of KpConnectedComponents::do_label(), voxel by voxel: the fast pass equals it to the bit. Narrow
// images use it too.
template <typename T, typename L>
class PlainLabelling {
public:
    PlainLabelling(const T* data, L* labels, ComponentTable& components, T low, T high, const int* dims, int neighbours,
                   int labelMode) :
        data_(data),
        labels_(labels), components_(components), low_(low), high_(high), dims_(dims), labelMode_(labelMode)
    {
        int offsets[13];  // too small for large slices
        KpConnectedComponents::mknbtableprev(neighbours, dims, n_, offsets, deltas_);
        for (int i = 0; i < n_; ++i) {
            const auto& [dx, dy, dz] = deltas_[i];
            offsets_[i] = dx + static_cast<long>(dims[0]) * (dy + static_cast<long>(dims[1]) * dz);
        }
    }

    int run()
    {
        startComponents(components_);
        const bool isDone = walk();
        if (isDone)
            cleanUpComponents(components_, labels_, nVoxelsOf(dims_), -1, -1);
        return isDone ? static_cast<int>(components_.size()) - 1 : -1;
    }

private:
    bool walk()
    {
        long i = 0;
        for (int z = 0; z < dims_[2]; ++z)
            for (int y = 0; y < dims_[1]; ++y)
                for (int x = 0; x < dims_[0]; ++x, ++i) {
                    if (data_[i] < low_)
                        labels_[i] = 0;
                    else if (!label(x, y, z, i))
                        return false;
                }
        return true;
    }

    bool label(int x, int y, int z, long i)
    {
        gather(x, y, z, i);
        int m = nIds_ > 0 ? *std::min_element(ids_, ids_ + nIds_) : 0;
        if (nIds_ == 0) {
            m = addComponent(components_, labels_, i);
            if (m < 0)
                return false;
            if (labelMode_ != 0)
                components_[m].nSeeds = seedsOf(data_[i]);
        }
        for (int k = 0; k < nIds_; ++k) {
            if (ids_[k] != m)
                components_[m].addAlias(components_[ids_[k]], labelMode_);
        }
        count(m, x, y, z, i);
        return true;
    }

    void gather(int x, int y, int z, long i)
    {
        const bool isInterior = isInside(x, 0) && isInside(y, 1) && isInside(z, 2);
        nIds_ = 0;
        for (int k = 0; k < n_; ++k) {
            const auto& [dx, dy, dz] = deltas_[k];
            if (!isInterior && !(isValid(x + dx, 0) && isValid(y + dy, 1) && isValid(z + dz, 2)))
                continue;
            const long other = i + offsets_[k];
            if ((labelMode_ == 0 || data_[other] == data_[i]) && labels_[other] != 0)
                ids_[nIds_++] = components_[labels_[other]].id;  // intentional: one step only
        }
    }

    void count(int m, int x, int y, int z, long i)
    {
        Component& component = components_[m];
        ++component.nVoxels;
        component.sum[0] += static_cast<float>(x);
        component.sum[1] += static_cast<float>(y);
        component.sum[2] += static_cast<float>(z);
        if (labelMode_ == 0 && data_[i] >= high_)
            ++component.nSeeds;
        labels_[i] = static_cast<L>(m);
    }

    bool isInside(int at, int axis) const { return at > 0 && at < dims_[axis] - 1; }
    bool isValid(int at, int axis) const { return at >= 0 && at < dims_[axis]; }

    const T* data_;
    L* labels_;
    ComponentTable& components_;
    T low_, high_;
    const int* dims_;
    int labelMode_;
    int n_ = 0;
    long offsets_[13];
    int deltas_[13][3];
    int nIds_ = 0;
    int ids_[13];
};

}  // namespace kplib::detail
