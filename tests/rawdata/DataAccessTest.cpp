#include "Elements.h"

#include <kplib/foundation/KpHandle.h>
#include <kplib/net/TmMsg.h>
#include <kplib/rawdata/TmDataAccess.h>
#include <kplib/system/KpMD5Coder.h>

#include <support/FailingMalloc.h>

#include <cstdlib>

using namespace kplib::test;
using Handle = KpHandle<TmDataAccess>;

namespace {

const KpVec3l size543(5L, 4L, 3L), dense(0L, 0L, 0L);
const KpAllocator none(KpAllocator::AllocatorNone);

struct Layout {
    const char* what;
    long gapX, gapY;  // bytes after a voxel and after a row
    bool isSliced;
};
const Layout layouts[] = {{"dense", 0, 0, false},
                          {"gaps between rows", 0, 3, false},
                          {"gaps everywhere", 5, 3, false},
                          {"sliced with gaps", 0, 3, true}};

/// Calls `work(volume, layout)` for 5 x 4 x 3 voxels of two components of each type in each layout.
template <typename Work>
void eachVolume(Work work)
{
    for (int number = 0; number < KpPrimType::NumTypes; ++number)
        for (const Layout& layout : layouts) {
            const KpPrimType type(number);
            const testing::ScopedTrace trace(__FILE__, __LINE__, type.name() + std::string(layout.what));
            Bytes memory = someValues<std::uint8_t>(3000, 7);
            void* const slices[] = {&memory[2000], &memory[0], &memory[1000]};
            const long x = 2 * type.size() + layout.gapX, y = 5 * x + layout.gapY;
            const KpVec3l strides(x, y, layout.isSliced ? 0L : 4 * y + layout.gapY);
            work(Handle(layout.isSliced ? new TmDataAccess(size543, strides, slices, type, 2, none)
                                        : new TmDataAccess(size543, strides, memory.data(), type, 2, none)),
                 layout);
        }
}

/// The voxels without gaps.
Bytes voxels(const TmDataAccess& volume)
{
    Bytes all;
    for (long z = 0; z < volume.dims()[2]; ++z)
        for (long y = 0; y < volume.dims()[1]; ++y)
            for (long x = 0; x < volume.dims()[0]; ++x) {
                const auto* p = static_cast<std::uint8_t*>(volume.dataPtr(x, y, z));
                all.insert(all.end(), p, p + volume.nDataVar() * volume.primType().size());
            }
    return all;
}

/// An allocator that fails a given number of times and counts the freed blocks.
int failures, freed;
const KpAllocator counting([](unsigned long n) { return failures-- > 0 ? nullptr : std::malloc(n); },
                           [](void* p) {
                               ++freed;
                               std::free(p);
                           });

}  // namespace

TEST(Volume, worksOutStrides)
{
    int block[3];
    void* const slices[] = {&block[0], &block[1], &block[2]};
    // clang-format off
    const struct { const char* what; KpVec3l dims, given; bool isSliced; KpVec3l strides; bool valid, contiguous; } cases[] = {
        {"dense", size543, dense, false, {6L, 30L, 120L}, true, true},
        {"from x on", size543, {7L, 0L, 0L}, false, {7L, 35L, 140L}, true, false},
        {"from y on", size543, {0L, 40L, 0L}, false, {6L, 40L, 160L}, true, false},
        {"z", size543, {0L, 0L, 121L}, false, {6L, 30L, 121L}, true, false},
        {"x too short", size543, {5L, 0L, 0L}, false, {5L, 25L, 100L}, false, false},
        {"y too short", size543, {0L, 29L, 0L}, false, {6L, 29L, 116L}, false, false},
        {"z too short", size543, {0L, 0L, 119L}, false, {6L, 30L, 119L}, false, false},
        {"below nothing", {5L, 0L, -1L}, dense, false, {6L, 30L, 0L}, false, true},
        {"no columns", {0L, 4L, 3L}, dense, false, {6L, 0L, 0L}, true, true},
        {"sliced", size543, dense, true, {6L, 30L, 0L}, true, false},
        {"slices and z", size543, {0L, 0L, 120L}, true, {6L, 30L, 120L}, false, true},
        {"one slice", {5L, 4L, 1L}, dense, true, {6L, 30L, 120L}, true, true}};
    // clang-format on
    for (const auto& [what, dims, given, isSliced, strides, valid, contiguous] : cases) {
        SCOPED_TRACE(what);
        const Handle volume = isSliced ? new TmDataAccess(dims, given, slices, KpPrimType::Short, 3, none)
                                       : new TmDataAccess(dims, given, nullptr, KpPrimType::Short, 3, none);
        EXPECT_EQ(volume->strides(), strides);
        EXPECT_EQ(std::tuple(volume->isLinear(), volume->hasData()), std::tuple(strides[2] > 0, isSliced));
        EXPECT_EQ(std::tuple(volume->isValid(), volume->isContiguous()), std::tuple(valid, contiguous));
        EXPECT_TRUE((!isSliced || volume->dataPtrs()[0] == &block[0]));
    }
}

TEST(Volume, givesItsMemoryBack)
{
    for (int fails : {0, 1, 2}) {  // the second attempt is after the callback
        static int callbacks;
        failures = fails;
        freed = callbacks = 0;
        KpAllocator::setFreeUnusedUncompressedDataCB([] { ++callbacks; });
        Handle volume = new TmDataAccess(size543, KpPrimType::Int, 1, counting), view;
        KpAllocator::setFreeUnusedUncompressedDataCB({});
        EXPECT_EQ(std::tuple(volume->hasData(), callbacks), std::tuple(fails<2, fails> 0));
        int seen = 0;
        volume->setDeleteCallback(
            [](TmDataAccess* object, void* data) { *static_cast<int*>(data) = object->hasData() ? 1 : 2; }, &seen);
        volume->subBox(view, {1, 2, 1, 2, 1, 2});
        EXPECT_EQ(view.get() != nullptr, volume->hasData());
        view = nullptr;
        EXPECT_EQ(freed, 0);
        if (fails == 1)
            volume->dataRelease();
        volume = nullptr;
        EXPECT_EQ(std::tuple(freed, seen), std::tuple(fails < 2, fails == 0 ? 1 : 2));
    }
    void* const slices[] = {std::malloc(1), std::malloc(1)};
    TmDataAccess({1L, 1L, 2L}, dense, slices, KpPrimType::Byte, 1, counting).dataRelease();
    EXPECT_EQ(freed, 2);
}

TEST(Volume, subBoxLooksOnAndCloneCopies)
{
    eachVolume([](Handle volume, const Layout& layout) {
        for (const KpBox3i& box : {KpBox3i(1, 2, 1, 2, 1, 2), {3, 4, 1, 3, 2, 2}}) {
            Handle view;
            volume->subBox(view, box);
            EXPECT_EQ(view->dims(), KpVec3l(box.size()) + KpVec3l(1L, 1L, 1L));
            EXPECT_EQ(std::tuple(view->isValid(), view->isLinear()),
                      std::tuple(true, (!layout.isSliced || view->dims()[2] == 1)));
            for (long z = 0; z < view->dims()[2]; ++z)
                EXPECT_EQ(view->dataPtr(1, 1, z), volume->dataPtr(box.xmin() + 1, box.ymin() + 1, box.zmin() + z));
        }
        const Bytes expected = voxels(*volume);
        const KpResult result = volume->clone(volume, none);  // the object is held by the result alone
        EXPECT_EQ(result.codeValue(), (&layout != layouts));
        EXPECT_EQ((result.line() > 0), result.isBad());
        ASSERT_EQ(volume.get() != nullptr, result.isOk());
        if (volume) {
            EXPECT_EQ(voxels(*volume), expected);
            EXPECT_EQ(volume->allocator(), KpAllocator::AllocatorMalloc);
            volume->subBox(volume, {0, 0, 0, 0, 0, 0});
            EXPECT_EQ(volume->dims(), KpVec3l(1L, 1L, 1L));
        }
    });
    Handle copy;
    for (const long n : {0L, 5L, 1L << 31}) {  // an object without data is copied if there is memory
        const TmDataAccess source({n, n, n}, dense, nullptr, KpPrimType::Int, 1, none);
        EXPECT_EQ(source.clone(copy, none).isOk(), (n < 6));
        EXPECT_EQ(copy->hasData(), (n < 6));
    }
}

TEST(Volume, linesEqualTheirVoxelsOneByOne)
{
    // What a float becomes in an integer type; in int all from 2^31 on is the smallest.
    const auto cut = []<typename T>(float v, T) {
        using Limits = std::numeric_limits<T>;
        if constexpr (std::is_floating_point_v<T>)
            return static_cast<T>(v);
        else if (std::isnan(v) || (sizeof(T) == 4 && v >= 2147483648.0F))
            return sizeof(T) == 4 ? Limits::min() : T{0};
        else
            return static_cast<T>(std::clamp<double>(v, Limits::min(), Limits::max()));
    };
    const KpVec3l dims(18L, 19L, 20L);
    eachType([&]<typename T>(KpElementTag<T>) {
        for (const long gap : {0L, 1L, long{sizeof(T)}})
            for (const std::array<long, 3> at : {std::array{-1L, 3L, 2L}, {2, -1, 1}, {4, 1, 77}, {-1, -1, 0}}) {
                const int axis = at[0] == -1 ? 0 : at[1] == -1 ? 1 : 2;
                const long voxel = gap + long{sizeof(T)}, n = dims[axis], origin = 2000;
                Bytes memory = someValues<std::uint8_t>(18 * 19 * 20 * voxel + origin, 8);
                const TmDataAccess volume(dims, {voxel, 0L, 0L}, &memory[origin], typeOf<T>, 1, none);
                std::array<long, 3> on = at;
                std::vector<float> in = someValues<float>(n, 9), out(n), values(n);
                in[0] = NAN;
                in[1] = 2147483648.0F;
                Bytes expected = memory;
                for (long i = 0; i < n; ++i) {
                    const T value = cut(in[i], T{});
                    on[axis] = i;
                    std::memcpy(&expected[origin + ((on[2] * 19 + on[1]) * 18 + on[0]) * voxel], &value, sizeof value);
                    values[i] = static_cast<float>(value);
                }
                EXPECT_TRUE(volume.putRow(at[0], at[1], at[2], in.data()).isOk());
                EXPECT_EQ(memory, expected);
                EXPECT_TRUE(volume.row(at[0], at[1], at[2], out.data()).isOk());
                EXPECT_TRUE(areSame(out, values));
            }
    });
    for (int type : {5, 6, 8, 9, 10, -1, 0}) {  // not numbers, and bytes without data
        Bytes memory(480, 9);
        float untouched = 5;
        const TmDataAccess volume(size543, dense, type == 0 ? nullptr : &memory[0], KpPrimType(type), 1, none);
        EXPECT_TRUE(volume.putRow(-1, 0, 0, &untouched).isOk());
        EXPECT_TRUE(volume.row(-1, 0, 0, &untouched).isOk());
        EXPECT_EQ(std::tuple(untouched, memory), std::tuple(5, Bytes(480, 9)));
    }
}

TEST(Volume, digestAndMessageHoldTheVoxels)
{
    eachVolume([](const Handle& volume, const Layout&) {
        const KpPrimType type = volume->primType();
        Bytes bytes;  // of rows as if they had no gaps
        for (long row = 0; row < 12; ++row) {
            const auto* p = static_cast<std::uint8_t*>(volume->dataPtr(0, row % 4, row / 4));
            bytes.insert(bytes.end(), p, p + 10 * type.size());
        }
        for (const bool hasData : {true, false}) {
            const Bytes sent = hasData ? bytes : Bytes(bytes.size());
            KpLib::MD5Coder coder;
            coder << static_cast<int>(type) << 2 << size543;
            if (hasData)
                coder.append(bytes.data(), bytes.size());
            const auto words = coder.md5().words();
            EXPECT_EQ(volume->hash(), (Kp128{words[0], words[1]}));

            TmMsg msg, expected;
            expected << false << size543 << 2 << type;
            expected.writeRawBytes(sent.size(), sent.data());
            msg << volume.get() << 4711;
            EXPECT_TRUE(msg == (expected << 4711));
            TmDataAccess* read = nullptr;
            int next = 0;
            msg >> read >> next;
            ASSERT_EQ(next, 4711);
            ASSERT_TRUE(read);
            ASSERT_EQ(read->refCount(), 0);
            const Handle handle(read);
            EXPECT_EQ(std::tuple(read->isContiguous(), read->primType()), std::tuple(true, type));
            EXPECT_EQ(voxels(*read), sent);
            volume->dataRelease();
        }
    });
}

TEST(Volume, doubtfulMessages)
{
    const long big = 1L << 62;
    // clang-format off
    const struct { const char* what; KpVec3l dims; int nDataVar, type; long come; bool isRead; } cases[] = {
        {"all there", {3L, 2L, 1L}, 2, 0, 12, true}, {"one byte short", {3L, 2L, 1L}, 2, 0, 11, false},
        {"none", {0L, big, big}, 2, 0, 0, true}, {"no such type", {big, 2L, 1L}, 2, 12, 0, true},
        {"no components", {big, 2L, 1L}, 0, 0, 0, true}, {"slices below nothing", {0L, 2L, -1L}, 2, 0, 0, false},
        {"columns", {-1L, 0L, 2L}, 2, 0, 0, false}, {"rows", {0L, -1L, 2L}, 2, 0, 0, false},
        {"below nothing", {-3L, -2L, 1L}, 2, 0, 12, false},
        {"components below nothing", {0L, 2L, 1L}, -2, 0, 0, false},
        {"product of 2^64 + 8", {3L, (big + 2) / 3, 4L}, 1, 0, 12, false},
        {"half a header", {3L, 2L, 1L}, 2, 0, -20, false}, {"nothing", {3L, 2L, 1L}, 2, 0, -33, false}};
    // clang-format on
    for (const auto& [what, dims, nDataVar, type, come, isRead] : cases)
        for (const int fails : {3, 2}) {  // allocations that succeed: the object, its array of blocks, the block
            SCOPED_TRACE(what);
            TmMsg header;
            header << false << dims << nDataVar << KpPrimType(type);
            Bytes bytes(header.size() + come, 7);  // of exact size, so that a read past the end shows
            std::copy_n(header.dataPtr(), std::min(bytes.size(), header.size()), bytes.data());
            TmMsg msg(bytes.size(), bytes.data());
            TmDataAccess other, *object = &other;
            {
                const FailingMalloc failing(isRead ? fails : 0);
                msg >> object;
                EXPECT_EQ(failing.count() > 0, isRead);  // nothing is asked for in vain
            }
            const Handle handle(object);
            ASSERT_EQ(object != nullptr, isRead);
            if (isRead) {
                float line[3] = {5};
                const auto words = (KpLib::MD5Coder() << type << nDataVar << dims).md5().words();
                EXPECT_EQ(object->hash() == (Kp128{words[0], words[1]}), come == 0 || fails == 2);
                EXPECT_EQ(std::tuple(object->hasData(), object->size(), msg.holds(1)),
                          std::tuple(fails == 3, come, false));
                EXPECT_TRUE(object->row(-1, 0, 0, line).isOk());
                EXPECT_EQ(line[0], (come > 0 && fails == 3 ? 7 : 5));
            }
        }
    TmMsg msg;
    TmDataAccess below({-3L, 2L, 1L}, dense, nullptr, KpPrimType::Byte, 1, none), *object = &below;
    msg << static_cast<TmDataAccess*>(nullptr) << object;
    EXPECT_EQ(std::tuple(msg.size(), *msg.dataPtr()),
              std::tuple(34, 1));  // a byte for null, and of nothing the sizes alone
    msg >> object;
    EXPECT_EQ(object, nullptr);
}
