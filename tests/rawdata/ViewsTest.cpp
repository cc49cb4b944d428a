#include "Elements.h"

#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/rawdata/KpTypedData2D.h>
#include <kplib/rawdata/KpTypedData3D.h>

#include <support/FailingMalloc.h>

#include <climits>
#include <cstdlib>

using namespace kplib::test;

namespace {

struct Strides {
    int pixel, row;
};

/// The bytes of pixel (x, y).
Bytes pixel(const KpRawData2D& image, int x, int y)
{
    const auto* p = static_cast<std::uint8_t*>(image.data()) + x * image.pixelStride() + y * image.rowStride();
    return {p, p + image.bytesPerPixel()};
}

/// All pixels, row after row.
Bytes pixels(const KpRawData2D& image)
{
    Bytes all;
    for (int y = 0; y < image.dims()[1]; ++y)
        for (int x = 0; x < image.dims()[0]; ++x)
            std::ranges::copy(pixel(image, x, y), std::back_inserter(all));
    return all;
}

}  // namespace

TEST(Image, copiesBetweenStridesOfAnyKind)
{
    for (int bytes : {1, 2, 3, 4, 8, 12}) {
        const int w = 5, h = 3, packed = w * bytes;
        const Strides kinds[] = {{bytes, packed},
                                 {bytes, packed + 3},
                                 {bytes + 1, w * (bytes + 1)},
                                 {h * bytes, bytes},
                                 {2 * bytes, -7 * 20}};
        for (const Strides& from : kinds)
            for (const Strides& to : kinds) {
                const Bytes before = someValues<std::uint8_t>(1500, 1);
                Bytes source = someValues<std::uint8_t>(1500, 2), target = before;
                const KpRawData2D src(w, h, bytes, from.pixel, from.row, source.data() + 700);
                KpRawData2D dst(w, h, bytes, to.pixel, to.row, target.data() + 700);
                EXPECT_EQ(src.isContiguous(), &from == kinds);
                EXPECT_TRUE(dst.copyData(src));
                EXPECT_EQ(pixels(dst), pixels(src));

                // What isn't a pixel is as it was, before and after they are cleared.
                Bytes expected = before;
                for (const bool isCleared : {false, true}) {
                    for (int i = 0; i < packed * h; ++i)
                        expected[700 + i / packed * to.row + i % packed / bytes * to.pixel + i % bytes] =
                            isCleared ? 0 : pixels(src)[i];
                    EXPECT_EQ(target, expected);
                    dst.clear();
                }

                KpRawData2D local(src);
                local.makeLocal();
                EXPECT_TRUE(local.isContiguous() && local.ownedData() == local.data());
                EXPECT_EQ(pixels(local), pixels(src));
            }
    }
}

TEST(Image, refusesOtherSizes)
{
    Bytes memory(100, 7);
    const KpRawData2D from(2, 3, 4, memory.data());
    for (const auto& [w, h, bytes] : {std::array{3, 2, 4}, {2, 4, 4}, {2, 3, 2}}) {
        KpRawData2D to(w, h, bytes);
        to.clear();
        EXPECT_FALSE(to.copyData(from));
        EXPECT_EQ(pixels(to), Bytes(w * h * bytes));
    }
}

TEST(Image, ownsOrLooksOn)
{
    Bytes memory = someValues<std::uint8_t>(24, 3);
    const KpRawData2D view(2, 3, 4, memory.data());
    KpRawData2D owner(5, 5, 5);  // its block goes with the assignment
    owner = view;
    EXPECT_EQ(owner.data(), memory.data());
    EXPECT_EQ(owner.ownedData(), nullptr);

    owner.makeLocal();
    void* const block = owner.data();
    owner.makeLocal();
    const KpRawData2D& self = owner;
    owner = self;
    EXPECT_EQ(owner.ownedData(), block);
    const KpRawData2D copy(owner);
    EXPECT_NE(copy.data(), block);
    EXPECT_EQ(copy.ownedData(), copy.data());
    EXPECT_EQ(pixels(copy), memory);

    void* const other = std::malloc(6);
    owner.commit(3, 2, 1, other);
    EXPECT_EQ(owner.ownedData(), other);
    EXPECT_TRUE(owner.isContiguous());
    owner.cleanup();
    EXPECT_EQ(owner.ownedData(), nullptr);
    EXPECT_EQ(owner.data(), other);
    owner.init(0, 3, 4);
    EXPECT_EQ(owner.data(), other);  // no size, no change

    KpRawData2D fresh;
    EXPECT_TRUE(fresh.isContiguous() && fresh.copyData(KpRawData2D()));
    fresh.init(0, 0, 4);
    EXPECT_EQ(fresh.data(), nullptr);
    EXPECT_EQ(fresh.ownedData(), nullptr);
}

TEST(Image, withoutMemoryHoldsNull)
{
    const auto huge = [](KpRawData2D& image) { image.init(INT_MAX, INT_MAX, INT_MAX); };
    const auto create = [](KpRawData2D& image) {
        const FailingMalloc failing(0);
        image.init(2, 3, 4);
    };
    const auto assign = [](KpRawData2D& image) {
        KpRawData2D other;
        other.commit(1, 1, 1, kpmalloc(1));
        const FailingMalloc failing(0);
        image = other;
    };
    const auto localise = [](KpRawData2D& image) {
        Bytes memory(24);
        image.init(2, 3, 4, 9, memory.data());
        const FailingMalloc failing(0);
        image.makeLocal();
    };
    for (void (*work)(KpRawData2D&) : {+huge, +create, +assign, +localise}) {
        KpRawData2D image(7, 7, 7);
        work(image);
        EXPECT_EQ(image.data(), nullptr);
        EXPECT_EQ(image.ownedData(), nullptr);
        image.clear();
        EXPECT_TRUE(image.copyData(image));
    }
}

TEST(Slice, equalsVoxelsOneByOne)
{
    for (int voxel : {1, 2, 3, 4, 8, 12})
        for (int orientation : {-1, 0, 1, 2, 3}) {
            SCOPED_TRACE(std::to_string(voxel) + " bytes, orientation " + std::to_string(orientation));
            const std::array<int, 3> size = {5, 4, 3};
            Bytes memory = someValues<std::uint8_t>(60 * voxel, 4);
            KpRawData3D block(5, 4, 3, voxel, memory.data());
            const bool isKnown = orientation >= 0 && orientation <= 2;
            const int across = isKnown ? orientation : 0, row = across == 0 ? 1 : 0, column = across == 2 ? 1 : 2;
            int dims[3] = {};
            block.getDims(dims, orientation);
            EXPECT_TRUE(dims[0] == size[row] && dims[1] == size[column] && dims[2] == size[across]);

            for (int k = 0; k < size[across]; ++k) {
                KpRawData2D view, filled(dims[0], dims[1], voxel), changed(dims[0], dims[1], voxel);
                filled.clear();
                Bytes random = someValues<std::uint8_t>(dims[0] * dims[1] * voxel, 5), expected;
                block.getSlice(orientation, k, view, 0);
                block.getSlice(orientation, k, filled, 1);
                void* p = nullptr;
                int strides[2];
                block.accessSlice(orientation, k, p, strides[0], strides[1]);
                for (int j = 0; j < dims[1]; ++j)
                    for (int i = 0; i < dims[0]; ++i) {
                        std::array<int, 3> at{};
                        at[row] = i;
                        at[column] = j;
                        at[across] = k;
                        const long index = at[0] + 5 * (at[1] + 4 * at[2]);
                        EXPECT_EQ(block.getOffset(i, j, k, orientation), index);
                        EXPECT_EQ(static_cast<std::uint8_t*>(p) + i * strides[0] + j * strides[1],
                                  &memory[index * voxel]);
                        expected.insert(expected.end(), &memory[index * voxel], &memory[index * voxel] + voxel);
                    }
                Bytes after = memory;
                block.putSlice(orientation, k, KpRawData2D(1, 1, 1, random.data()));
                if (!isKnown) {
                    EXPECT_EQ(view.data(), nullptr);
                    EXPECT_EQ(pixels(filled), Bytes(expected.size()));
                    EXPECT_EQ(memory, after);
                    continue;
                }
                EXPECT_EQ(pixels(filled), expected);
                EXPECT_EQ(pixels(view), random);  // the view sees what was put
                EXPECT_EQ(view.isContiguous(), orientation == 2);
                block.putSlice(orientation, k, filled);
                EXPECT_EQ(memory, after);
            }
        }
}

TEST(Block, ownsOrLooksOn)
{
    KpRawData3D block(2, 3, 4, 5);
    EXPECT_EQ(block.ownedData(), block.data());
    void* mine = kpmalloc(9);
    void* const expected = mine;
    block.swapDataPtr(mine);
    EXPECT_EQ(block.data(), expected);
    kpfree(mine);
    mine = nullptr;
    block.swapDataPtr(mine);
    EXPECT_EQ(mine, expected);
    EXPECT_TRUE(!block.data() && !block.ownedData());

    block.commit(1, 1, 9, 1, mine);
    EXPECT_EQ(block.ownedData(), expected);
    block.init(0, 0, 0, 0);  // memory even for nothing
    EXPECT_NE(block.ownedData(), nullptr);
    for (int n : {1 << 20, INT_MAX}) {
        EXPECT_THROW(block.init(n, n, n, n), KpMemoryException);
        EXPECT_TRUE(!block.data() && !block.ownedData());
    }
}

TEST(TypedViews, sizeOfPixelsFollowsTheType)
{
    for (int number = 0; number < KpPrimType::NumTypes; ++number) {
        const KpPrimType type(number);
        Bytes memory(400);
        const KpTypedPointer p(memory.data(), type);
        const int dims[] = {2, 3, 4};
        const KpTypedData3D volumes[] = {{2, 3, 4, type, 2}, {dims, type, 2}, {2, 3, 4, p, 2}, {dims, p, 2}};
        for (const KpTypedData3D& volume : volumes) {
            KpTypedData2D slice;
            volume.getSlice(1, 2, slice, 0);
            const KpTypedData2D images[] = {slice, {2, 4, type, 2}, {2, 4, p, 2}, {dims, p, 2}, {2, 4, 999, 70, p, 2}};
            for (const KpTypedData2D& image : images) {
                EXPECT_EQ(image.primType(), type);
                EXPECT_EQ(image.nDataVar(), 2);
                EXPECT_EQ(image.bytesPerPixel(), 2 * type.size());
                EXPECT_EQ(image.pixelStride(), 2 * type.size());
            }
            EXPECT_EQ(slice.rowStride(), 12 * type.size());
            EXPECT_EQ(images[4].rowStride(), 70);
        }
        EXPECT_EQ(volumes[2].data(), memory.data());
    }
}
