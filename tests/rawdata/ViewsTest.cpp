#include "Elements.h"

#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/rawdata/KpTypedData2D.h>
#include <kplib/rawdata/KpTypedData3D.h>

#include <support/FailingMalloc.h>

#include <climits>

using namespace kplib::test;

namespace {

const std::pair<void*, void*> nothing;  // no data, and none owned

/// The bytes of all pixels, row after row.
Bytes pixels(const KpRawData2D& image)
{
    Bytes all;
    for (int y = 0; y < image.dims()[1]; ++y)
        for (int x = 0; x < image.dims()[0]; ++x) {
            const auto* p = static_cast<std::uint8_t*>(image.data()) + x * image.pixelStride() + y * image.rowStride();
            all.insert(all.end(), p, p + image.bytesPerPixel());
        }
    return all;
}

}  // namespace

TEST(Image, copiesBetweenStridesOfAnyKind)
{
    using Strides = std::array<int, 2>;  // of pixels and rows
    for (int n : {1, 2, 3, 4, 8, 12}) {
        const Strides kinds[] = {{n, 5 * n}, {n, 5 * n + 3}, {n + 1, 5 * (n + 1)}, {3 * n, n}, {2 * n, -140}};
        for (const Strides& from : kinds)
            for (const Strides& to : kinds) {
                Bytes source = someValues<std::uint8_t>(1500, 2), target = someValues<std::uint8_t>(1500, 1);
                Bytes expected = target;
                const KpRawData2D src(5, 3, n, from[0], from[1], &source[700]);
                KpRawData2D dst(5, 3, n, to[0], to[1], &target[700]), local(src);
                const auto expectPixels = [&](const Bytes& bytes) {  // and that all else is as it was
                    for (int i = 0; i < 15 * n; ++i)
                        expected[700 + i / n / 5 * to[1] + i / n % 5 * to[0] + i % n] = bytes[i];
                    EXPECT_EQ(target, expected);
                };
                EXPECT_TRUE(dst.copyData(src));
                expectPixels(pixels(src));
                dst.clear();
                expectPixels(Bytes(15 * n));
                EXPECT_EQ(local.isContiguous(), &from == kinds);
                local.makeLocal();
                EXPECT_TRUE(local.isContiguous());
                EXPECT_EQ(local.ownedData(), local.data());
                EXPECT_EQ(pixels(local), pixels(src));
            }
    }
    for (const auto& [w, h, n] : {std::array{3, 3, 4}, {2, 4, 4}, {2, 3, 2}})
        EXPECT_FALSE(KpRawData2D(w, h, n).copyData(KpRawData2D(2, 3, 4)));
}

TEST(Image, ownsOrLooksOn)
{
    Bytes memory = someValues<std::uint8_t>(24, 3);
    KpRawData2D image(5, 5, 5);  // its block goes with the assignment
    image = KpRawData2D(2, 3, 4, memory.data());
    EXPECT_EQ(std::tuple(image.data(), image.ownedData()), std::tuple(memory.data(), nullptr));
    image.makeLocal();
    void* const block = image.data();
    image.makeLocal();
    image = std::as_const(image);
    EXPECT_EQ(image.ownedData(), block);
    const KpRawData2D copy(image);
    EXPECT_NE(copy.data(), block);
    EXPECT_EQ(copy.ownedData(), copy.data());
    EXPECT_EQ(pixels(copy), memory);

    void* const other = kpmalloc(6);
    image.commit(3, 2, 1, other);
    EXPECT_EQ(image.ownedData(), other);
    image.init(0, 3, 4);
    EXPECT_EQ(std::tuple(image.data(), image.ownedData()), std::tuple(other, nullptr));  // no size, no change
}

TEST(Image, withoutMemoryHoldsNull)
{
    Bytes memory(30);
    KpRawData2D owner(2, 3, 4), view(2, 3, 4, 9, memory.data()), huge(INT_MAX, INT_MAX, INT_MAX), made, copy;
    {
        const FailingMalloc failing(0);
        made.init(2, 3, 4);
        copy = owner;
        view.makeLocal();
    }
    for (KpRawData2D* image : {&view, &huge, &made, &copy}) {
        EXPECT_EQ(std::pair(image->data(), image->ownedData()), nothing);
        image->clear();
        EXPECT_TRUE(image->copyData(*image));
    }
}

TEST(Slice, equalsVoxelsOneByOne)
{
    const int size[] = {5, 4, 3}, step[] = {1, 5, 20};
    for (int voxel : {1, 2, 3, 4, 8, 12})
        for (int orientation : {-1, 0, 1, 2, 3}) {
            SCOPED_TRACE(std::to_string(voxel) + " bytes, orientation " + std::to_string(orientation));
            const bool isKnown = orientation >= 0 && orientation <= 2;
            const int across = isKnown ? orientation : 0, row = across == 0 ? 1 : 0, column = across == 2 ? 1 : 2;
            Bytes memory = someValues<std::uint8_t>(60 * voxel, 4);
            KpRawData3D block(5, 4, 3, voxel, memory.data());
            int dims[3], strides[2];
            block.getDims(dims, orientation);
            EXPECT_EQ(std::to_array(dims), (std::array{size[row], size[column], size[across]}));
            for (int k = 0; k < size[across]; ++k) {
                Bytes expected, copied(dims[0] * dims[1] * voxel), noise = someValues<std::uint8_t>(copied.size(), k);
                KpRawData2D view, copy(1, 1, 1, copied.data());
                void* p = nullptr;
                block.accessSlice(orientation, k, p, strides[0], strides[1]);
                for (int j = 0; j < dims[1]; ++j)
                    for (int i = 0; i < dims[0]; ++i) {
                        const long index = i * step[row] + j * step[column] + k * step[across];
                        const std::uint8_t* at = &memory[index * voxel];
                        EXPECT_EQ(block.getOffset(i, j, k, orientation), index);
                        EXPECT_EQ(static_cast<std::uint8_t*>(p) + i * strides[0] + j * strides[1], at);
                        expected.insert(expected.end(), at, at + voxel);
                    }
                const Bytes before = memory;
                block.getSlice(orientation, k, view, 0);
                block.getSlice(orientation, k, copy, 1);
                EXPECT_EQ(copied, isKnown ? expected : Bytes(copied.size()));
                block.putSlice(orientation, k, KpRawData2D(1, 1, 1, noise.data()));
                EXPECT_EQ(pixels(view), isKnown ? noise : Bytes());  // the view sees what was put
                EXPECT_EQ(view.isContiguous(), !isKnown || orientation == 2);
                block.putSlice(orientation, k, copy);
                EXPECT_EQ(memory, before);
            }
        }
}

TEST(Slice, isRefusedWhereItsStridesAreBeyondAnInt)
{
    char voxel = 0;
    void* p = &voxel;
    int strides[2];
    const std::string line = "E KpRawData3D: the strides of a slice are 2147483648 bytes or more\n";
    const KpTypedData3D flat(1 << 15, 1 << 14, 2, {&voxel, KpPrimType::Int}, 1),
        wide(1 << 29, 2, 2, {&voxel, KpPrimType::Int}, 1);
    for (int orientation : {0, 1, 2}) {
        KpTypedData2D slice(1, 1, {&voxel, KpPrimType::Int}, 1);
        const bool isFine = orientation == 2;
        EXPECT_EQ(logged([&] { flat.getSlice(orientation, 0, slice, 0); }), isFine ? "" : line);
        EXPECT_EQ(std::pair(slice.data(), slice.dims()[0]), isFine ? std::pair(p, 1 << 15) : std::pair(nullptr, 0));
        EXPECT_EQ(logged([&] { wide.accessSlice(orientation, 0, p, strides[0], strides[1]); }), line);
        EXPECT_EQ(std::exchange(p, &voxel), nullptr);
    }
    const std::string rows = "E KpRawData2D: rows of 2147483648 bytes are too long\n";
    KpRawData2D image;
    EXPECT_EQ(logged([&] { image.init(1 << 29, 1, 4, &voxel); }), rows);
    EXPECT_EQ(std::pair(image.data(), image.ownedData()), nothing);
    EXPECT_EQ(logged([&] { image.init(1 << 29, 1, 4, 4, 0, &voxel); }), "") << "strides of their own";
    EXPECT_EQ(logged([&] { image.commit(1 << 29, 1, 4, std::malloc(1)); }), rows);
    EXPECT_EQ(logged([&] { image.init(1 << 29, 1, 4); }), rows);
    EXPECT_EQ(std::pair(image.data(), image.ownedData()), nothing);
}

TEST(Block, ownsOrLooksOn)
{
    KpRawData3D block(2, 3, 4, 5);
    void* mine = kpmalloc(9);
    void* const expected = mine;
    block.swapDataPtr(mine);
    EXPECT_EQ(std::tuple(block.data(), block.ownedData()), std::tuple(expected, expected));
    block.swapDataPtr(mine);
    EXPECT_EQ(std::tuple(mine, block.ownedData()), std::tuple(expected, block.data()));
    block.commit(1, 1, 9, 1, mine);
    block.init(0, 0, 0, 0);  // memory even for nothing
    EXPECT_NE(block.ownedData(), nullptr);
    for (int n : {1 << 20, INT_MAX}) {
        EXPECT_THROW(block.init(n, n, n, n), KpMemoryException);
        EXPECT_EQ(std::pair(block.data(), block.ownedData()), nothing);
    }
}

TEST(TypedViews, sizeOfPixelsFollowsTheType)
{
    const int dims[] = {2, 3, 4};
    for (int number = 0; number < KpPrimType::NumTypes; ++number) {
        Bytes memory(400);
        const KpPrimType type(number);
        const KpTypedPointer p(memory.data(), type);
        KpTypedData2D slice;
        KpTypedData3D(dims, type, 2).getSlice(3, 2, slice, 0);
        EXPECT_EQ(std::tuple(slice.nDataVar(), slice.primType(), slice.dims()[0]),
                  std::tuple(2, type, 0));  // these alone
        KpTypedData3D(dims, p, 2).getSlice(1, 2, slice, 0);
        EXPECT_EQ(slice.rowStride(), 12 * type.size());
        for (const KpTypedData2D& image : {slice, {2, 4, type, 2}, {dims, p, 2}, {2, 4, 99, 70, p, 2}}) {
            EXPECT_EQ(std::tuple(image.primType(), image.nDataVar(), image.pixelStride()),
                      std::tuple(type, 2, 2 * type.size()));
        }
    }
}
