#include "Operation.h"

#include <kplib/foundation/KpAllocator.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/rawdata/KpPackedIndexing.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/KpSuperPackedIndexing.h>
#include <kplib/rawdata/KpTypedData2D.h>
#include <kplib/rawdata/KpTypedData3D.h>
#include <kplib/rawdata/TmDataAccess.h>

#include <array>
#include <memory>

namespace kplib::probe {

namespace {

constexpr int side = 12, voxels = side * side * side;

std::array<short, voxels> block()
{
    std::array<short, voxels> values;
    for (int i = 0; i < voxels; ++i)
        values[static_cast<unsigned long>(i)] = static_cast<short>(i * 31);
    return values;
}

Outcome views()
{
    auto values = block();
    const KpVec3l dims(12L, 12L, 12L), none(0L, 0L, 0L);
    const KpHandle<TmDataAccess> whole(new TmDataAccess(dims, none, static_cast<void*>(values.data()),
                                                        KpPrimType::Short, 1, KpAllocator::AllocatorNone));
    KpHandle<TmDataAccess> part, copy;
    whole->subBox(part, KpBox3i(2, 7, 2, 7, 2, 7));
    if (whole->clone(copy, KpAllocator::AllocatorMalloc).isBad())
        return {};
    return Digest() << part->hash().first << copy->hash().first;
}

Outcome ownedVolume()
{
    const KpHandle<TmDataAccess> volume(
        new TmDataAccess(KpVec3l(12L, 12L, 12L), KpPrimType::Short, 1, KpAllocator::AllocatorMalloc));
    if (!volume->hasData())
        return {};
    KpRawData::memset({volume->dataPtr(0), KpPrimType::Short}, 7, voxels);
    return Digest() << volume->hash().first;
}

Outcome flipped()
{
    auto values = block();
    const int dims[] = {side, side, side};
    if (!KpRawData::flip(values.data(), 2, dims, 1))
        return {};
    return Digest().add(values.data(), sizeof values);
}

Outcome cropped()
{
    auto* memory = static_cast<short*>(kpmalloc(voxels * sizeof(short)));
    const auto values = block();
    std::memcpy(memory, values.data(), sizeof values);
    void* data = memory;
    int dims[] = {side, side, side};
    const int min[] = {2, 2, 2}, max[] = {20, 8, 8};
    const bool isCropped = KpRawData::crop(data, 2, dims, min, max, nullptr);
    const std::unique_ptr<void, KpFree> owner(data);
    if (!isCropped)
        return {};
    return Digest().add(data, static_cast<unsigned long>(dims[0] * dims[1] * dims[2]) * sizeof(short));
}

Outcome permuted()
{
    auto values = block();
    int dims[] = {side, side / 2, side * 2};
    const int order[] = {2, 0, 1};
    if (!KpRawData::swapDims({values.data(), KpPrimType::Short}, dims, order, 1))
        return {};
    return Digest().add(values.data(), sizeof values) << dims[0];
}

Outcome reduced()
{
    auto values = block();
    std::array<short, voxels / 8> small{};
    KpRawData::downSample3D(small.data(), {values.data(), KpPrimType::Short}, side, side, side, 2, 2, 2, nullptr);
    return Digest().add(small.data(), sizeof small);
}

Outcome indices()
{
    std::array<unsigned char, 2000> flags{};
    for (unsigned long i = 0; i < flags.size(); i += 3)
        flags[i] = 1;
    const KpPackedIndexing packed(flags.data(), static_cast<int>(flags.size()));
    KpSuperPackedIndexing super;
    super.appendIndexSpace(flags.data(), static_cast<long>(flags.size()));
    return Digest() << packed.index(999) << super.index(999) << packed.count();
}

Outcome slices()
{
    const auto values = block();
    KpTypedData3D volume(side, side, side, KpPrimType::Short, 1);
    std::memcpy(volume.data(), values.data(), sizeof values);
    KpTypedData2D slice(side, side, KpPrimType::Short, 1);
    if (!slice.data())
        return {};
    volume.getSlice(1, 3, slice, 1);
    const KpTypedData2D copy(slice);
    if (!copy.data())
        return {};
    volume.putSlice(2, 4, copy);
    return Digest().add(volume.data(), sizeof values);
}

}  // namespace

Operations rawdataOperations()
{
    static constexpr Operation list[] = {
        {"views of a volume", views}, {"a volume", ownedVolume},      {"a block flipped", flipped},
        {"a block cropped", cropped}, {"a block permuted", permuted}, {"a block reduced", reduced},
        {"packed indices", indices},  {"slices of a volume", slices},
    };
    return list;
}

}  // namespace kplib::probe
