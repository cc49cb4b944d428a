#include "Elements.h"

#include <kplib/foundation/KpHandle.h>
#include <kplib/net/TmMsg.h>
#include <kplib/rawdata/TmDataAccess.h>
#include <kplib/system/KpMD5Coder.h>
#include <kplib/threads/KpThread.h>

#include <support/FailingMalloc.h>

#include <climits>
#include <cstdlib>

using namespace kplib::test;
using Handle = KpHandle<TmDataAccess>;

namespace {

const KpVec3l size543(5L, 4L, 3L);

/// 5 x 4 x 3 voxels of two components over noise, in each kind of layout.
struct Layout {
    const char* what;
    long gapX, gapY;  // bytes behind a voxel and behind a row
    bool isSliced;

    KpVec3l strides(int voxel) const
    {
        const long x = voxel + gapX, y = 5 * x + gapY;
        return {x, y, isSliced ? 0L : 4 * y + gapY};
    }
    Handle volume(KpPrimType type, Bytes& memory) const
    {
        memory = someValues<std::uint8_t>(3000, 7);
        void* const slices[] = {&memory[2000], &memory[0], &memory[1000]};
        const KpVec3l s = strides(2 * type.size());
        return isSliced ? new TmDataAccess(size543, s, slices, type, 2, KpAllocator::AllocatorNone)
                        : new TmDataAccess(size543, s, memory.data(), type, 2, KpAllocator::AllocatorNone);
    }
};
const Layout layouts[] = {{"dense", 0, 0, false},
                          {"gaps between rows", 0, 3, false},
                          {"gaps everywhere", 5, 3, false},
                          {"sliced", 0, 0, true},
                          {"sliced with gaps", 0, 3, true}};

/// Calls `work(volume, layout)` for each type and layout.
template <typename Work>
void eachVolume(Work work)
{
    for (int type = 0; type < KpPrimType::NumTypes; ++type)
        for (const Layout& layout : layouts) {
            const testing::ScopedTrace trace(__FILE__, __LINE__, KpPrimType(type).name() + std::string(layout.what));
            Bytes memory;
            work(layout.volume(KpPrimType(type), memory), layout);
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

Bytes header(const KpVec3l& dims, int nDataVar, int type)
{
    Bytes bytes(32);
    std::memcpy(&bytes[0], dims.data(), 24);
    std::memcpy(&bytes[24], &nDataVar, 4);
    std::memcpy(&bytes[28], &type, 4);
    return bytes;
}

Bytes operator+(Bytes a, const Bytes& b)
{
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

Bytes bytesOf(const TmMsg& msg)
{
    return {msg.dataPtr(), msg.dataPtr() + msg.size()};
}

/// An allocator that has no memory for the first `failures` times.
int failures, freed;
void* allocateSome(unsigned long n)
{
    return failures-- > 0 ? nullptr : std::malloc(n);
}
void freeOne(void* p)
{
    ++freed;
    std::free(p);
}
const KpAllocator counting(allocateSome, freeOne);

}  // namespace

TEST(Volume, worksOutStrides)
{
    int block[3];
    void* const slices[] = {&block[0], &block[1], &block[2]};
    const KpVec3l none(0L, 0L, 0L);
    const auto without = [&](KpVec3l dims, KpVec3l strides) {
        return Handle(new TmDataAccess(dims, strides, nullptr, KpPrimType::Short, 3, KpAllocator::AllocatorNone));
    };
    const auto sliced = [&](KpVec3l dims, KpVec3l strides) {
        return Handle(new TmDataAccess(dims, strides, slices, KpPrimType::Short, 3, KpAllocator::AllocatorNone));
    };
    // clang-format off
    const struct { const char* what; Handle volume; KpVec3l strides; bool valid, linear, contiguous, data; } cases[] = {
        {"empty", new TmDataAccess(), none, true, false, true, false},
        {"dense", without(size543, none), {6L, 30L, 120L}, true, true, true, false},
        {"from x on", without(size543, {7L, 0L, 0L}), {7L, 35L, 140L}, true, true, false, false},
        {"from y on", without(size543, {0L, 40L, 0L}), {6L, 40L, 160L}, true, true, false, false},
        {"z", without(size543, {0L, 0L, 121L}), {6L, 30L, 121L}, true, true, false, false},
        {"x too short", without(size543, {5L, 0L, 0L}), {5L, 25L, 100L}, false, true, false, false},
        {"y too short", without(size543, {0L, 29L, 0L}), {6L, 29L, 116L}, false, true, false, false},
        {"z too short", without(size543, {0L, 0L, 119L}), {6L, 30L, 119L}, false, true, false, false},
        {"below nothing", without({5L, 0L, -1L}, none), {6L, 30L, 0L}, false, false, true, false},
        {"sliced", sliced(size543, none), {6L, 30L, 0L}, true, false, false, true},
        {"slices and z", sliced(size543, {0L, 0L, 120L}), {6L, 30L, 120L}, false, true, true, true},
        {"one slice", sliced({5L, 4L, 1L}, none), {6L, 30L, 120L}, true, true, true, true}};
    // clang-format on
    for (const auto& [what, volume, strides, valid, linear, contiguous, data] : cases) {
        SCOPED_TRACE(what);
        EXPECT_EQ(volume->strides(), strides);
        EXPECT_EQ(volume->isValid(), valid);
        EXPECT_EQ(volume->isLinear(), linear);
        EXPECT_EQ(volume->isContiguous(), contiguous);
        EXPECT_EQ(volume->hasData(), data);
    }
    EXPECT_EQ(cases[9].volume->dataPtr(2), &block[2]);
    EXPECT_EQ(cases[1].volume->size(), 360);
    EXPECT_EQ(without({1L << 31, 1L << 31, 2L}, none)->size(), LONG_MAX);
}

TEST(Volume, givesItsMemoryBack)
{
    for (int fails : {0, 1, 2}) {
        failures = fails;
        freed = 0;
        static int callbacks;
        callbacks = 0;
        KpAllocator::setFreeUnusedUncompressedDataCB([] { ++callbacks; });
        Handle volume = new TmDataAccess(size543, KpPrimType::Int, 1, counting);
        KpAllocator::setFreeUnusedUncompressedDataCB({});
        EXPECT_EQ(volume->hasData(), fails < 2);
        EXPECT_EQ(callbacks, fails > 0);

        int order = 0;
        volume->setDeleteCallback(
            [](TmDataAccess* object, void* data) { *static_cast<int*>(data) = object->hasData() ? 1 : 2; }, &order);
        Handle view;
        volume->subBox(view, {1, 2, 1, 2, 1, 2});
        EXPECT_EQ(view.get() != nullptr, volume->hasData());
        view = nullptr;
        EXPECT_EQ(freed, 0);
        if (fails == 1)
            volume->dataRelease();
        volume = nullptr;
        EXPECT_EQ(freed, fails < 2);
        EXPECT_EQ(order, fails == 0 ? 1 : 2);
    }
    void* const slices[] = {std::malloc(1), std::malloc(1)};
    freed = 0;
    TmDataAccess({1L, 1L, 2L}, {}, slices, KpPrimType::Byte, 1, counting).dataRelease();
    EXPECT_EQ(freed, 2);
}

TEST(Volume, subBoxLooksOnTheSameVoxels)
{
    eachVolume([](const Handle& volume, const Layout& layout) {
        for (const KpBox3i& box : {KpBox3i(1, 2, 1, 2, 1, 2), {0, 4, 0, 3, 0, 2}, {4, 4, 1, 3, 2, 2}}) {
            Handle view;
            volume->subBox(view, box);
            EXPECT_EQ(view->dims(), KpVec3l(box.size()) + KpVec3l(1L, 1L, 1L));
            EXPECT_EQ(view->isLinear(), !layout.isSliced || view->dims()[2] == 1);
            EXPECT_TRUE(view->isValid());
            for (long z = 0; z < view->dims()[2]; ++z)
                for (long y = 0; y < view->dims()[1]; ++y)
                    EXPECT_EQ(view->dataPtr(1, y, z), volume->dataPtr(box.xmin() + 1, box.ymin() + y, box.zmin() + z));
        }
    });
}

TEST(Volume, cloneIsACopyOfItsOwn)
{
    eachVolume([](Handle volume, const Layout& layout) {
        const Bytes expected = voxels(*volume);
        const KpResult result = volume->clone(volume, counting);  // the object is held by the result alone
        EXPECT_EQ(result.codeValue(), &layout != layouts);
        EXPECT_EQ(result.line() > 0, result.isBad());
        EXPECT_EQ(volume.get() != nullptr, result.isOk());
        if (volume) {
            EXPECT_EQ(voxels(*volume), expected);
            EXPECT_TRUE(volume->allocator() == KpAllocator::AllocatorMalloc);
            volume->subBox(volume, {0, 0, 0, 0, 0, 0});  // looks on what went with the object
            EXPECT_EQ(volume->size(), 2 * volume->primType().size());
        }
    });
    const TmDataAccess unfilled(size543, KpVec3l(0L, 0L, 0L), nullptr, KpPrimType::Int, 1, counting);
    const TmDataAccess huge({1L << 31, 1L << 31, 1L << 31}, {}, nullptr, KpPrimType::Int, 1, counting);
    Handle copy;
    EXPECT_TRUE(unfilled.clone(copy, counting).isOk());
    EXPECT_TRUE(copy->hasData());
    EXPECT_EQ(TmDataAccess().clone(copy, counting).codeValue(), 0);
    EXPECT_EQ(huge.clone(copy, counting).codeValue(), 1);
    EXPECT_FALSE(copy->hasData());
}

TEST(Volume, linesEqualTheirVoxelsOneByOne)
{
    // What a float becomes in an integer type; in int all from 2^31 on is the smallest.
    const auto cut = [](float v, auto sample) {
        using T = decltype(sample);
        using Limits = std::numeric_limits<T>;
        if constexpr (std::is_floating_point_v<T>)
            return static_cast<T>(v);
        else if (std::isnan(v) || (sizeof(T) == 4 && v >= 2147483648.0f))
            return sizeof(T) == 4 ? Limits::min() : T{0};
        else
            return static_cast<T>(std::clamp<double>(v, Limits::min(), Limits::max()));
    };
    const std::array<long, 3> starts[] = {{-1, 3, 2}, {2, -1, 1}, {4, 1, 77}, {-1, -1, 0}, {0, 3, -1}};
    eachType([&]<typename T>(ElementTag<T>) {
        for (const int components : {1, 2})
            for (const long gap : {0, 3})
                for (auto at : starts) {
                    const int axis = at[0] == -1 ? 0 : at[1] == -1 ? 1 : 2;
                    if (at[1] == -1 && axis == 0)
                        at[1] = 1;
                    const long voxel = components * long{sizeof(T)} + gap;
                    const KpVec3l dims(axis == 0 ? 70L : 5L, axis == 1 ? 70L : 4L, axis == 2 ? 70L : 3L);
                    Bytes memory = someValues<std::uint8_t>(voxel * dims[0] * dims[1] * dims[2] + 7000, 8);
                    const TmDataAccess volume(dims, {voxel, 0L, 0L}, memory.data(), typeOf<T>, components,
                                              KpAllocator::AllocatorNone);
                    const auto element = [&](long i) {
                        std::array<long, 3> where = at;
                        where[axis] = i;
                        return static_cast<std::uint8_t*>(volume.dataPtr(where[0], where[1], where[2]));
                    };
                    std::vector<float> in = someValues<float>(70, 9), out(70);
                    in[0] = NAN;
                    in[1] = 2147483648.0f;
                    Bytes expected = memory;
                    for (long i = 0; i < 70; ++i) {
                        const T value = cut(in[i], T{});
                        std::memcpy(&expected[element(i) - memory.data()], &value, sizeof value);
                    }
                    EXPECT_TRUE(volume.putRow(at[0], at[1], at[2], in.data()).isOk());
                    EXPECT_EQ(memory, expected);
                    EXPECT_TRUE(volume.row(at[0], at[1], at[2], out.data()).isOk());
                    std::vector<float> values(70);
                    for (long i = 0; i < 70; ++i) {
                        T value;
                        std::memcpy(&value, element(i), sizeof value);
                        values[i] = static_cast<float>(value);
                    }
                    EXPECT_TRUE(areSame(out, values)) << axis << ' ' << components << ' ' << gap;
                }
    });
}

TEST(Volume, linesOfWhatIsNoNumber)
{
    float untouched = 5;
    for (int type : {5, 6, 8, 9, 10, -1, 0}) {
        Bytes memory(480, 9);
        void* const data = type == 0 ? nullptr : memory.data();  // bytes are numbers, but there are none
        const TmDataAccess volume(size543, {}, data, KpPrimType(type), 1, KpAllocator::AllocatorNone);
        EXPECT_TRUE(volume.putRow(-1, 0, 0, &untouched).isOk() && volume.row(-1, 0, 0, &untouched).isOk());
        EXPECT_TRUE(untouched == 5 && memory == Bytes(480, 9));
    }
}

TEST(Volume, digestAndMessageHoldTheVoxels)
{
    TmMsg msg;
    eachVolume([&](const Handle& volume, const Layout& layout) {
        if (layout.gapX > 0)
            return;
        const KpPrimType type = volume->primType();
        const Bytes bytes = header(size543, 2, type) + voxels(*volume);
        Bytes ordered = bytes;  // type, components, sizes
        std::memcpy(&ordered[0], &bytes[28], 4);
        std::memcpy(&ordered[4], &bytes[24], 4);
        std::memcpy(&ordered[8], &bytes[0], 24);
        const auto words = KpLib::MD5Coder().append(ordered.data(), ordered.size()).md5().words();
        EXPECT_TRUE((volume->hash() == Kp128{words[0], words[1]}));

        msg.reset(0);
        const TmDataAccess* const sent = volume.get();
        msg << sent << 4711;
        EXPECT_EQ(bytesOf(msg), Bytes{0} + bytes + Bytes({0x67, 0x12, 0, 0}));
        TmDataAccess* read = nullptr;
        int next = 0;
        msg >> read >> next;
        EXPECT_EQ(next, 4711);
        ASSERT_TRUE(read && read->refCount() == 0);
        const Handle handle(read);
        EXPECT_TRUE(read->isContiguous() && read->hash() == volume->hash());
        EXPECT_EQ(voxels(*read), voxels(*volume));

        volume->dataRelease();
        const auto head = KpLib::MD5Coder().append(ordered.data(), 32).md5().words();
        EXPECT_TRUE((volume->hash() == Kp128{head[0], head[1]}));
        msg.reset(0);
        msg << sent;
        EXPECT_EQ(bytesOf(msg), Bytes{0} + header(size543, 2, type) + Bytes(120 * type.size()));
    });
    TmDataAccess* object = nullptr;
    const TmDataAccess* const none = nullptr;
    msg.reset(0);
    msg << none;
    EXPECT_EQ(bytesOf(msg), Bytes{1});
    msg >> object;
    EXPECT_EQ(object, nullptr);
}

TEST(Volume, doubtfulMessages)
{
    const long big = 1L << 62;
    // clang-format off
    const struct { const char* what; KpVec3l dims; int nDataVar, type; long come; bool isRead; } cases[] = {
        {"all there", {3L, 2L, 1L}, 2, 0, 12, true},
        {"one voxel short", {3L, 2L, 1L}, 2, 0, 11, false},
        {"none", {0L, big, big}, 2, 0, 0, true},
        {"no such type", {big, 2L, 1L}, 2, 12, 0, true},
        {"no components", {big, 2L, 1L}, 0, 0, 0, true},
        {"below nothing", {-3L, -2L, 1L}, 2, 0, 12, false},
        {"components below nothing", {-3L, 2L, 1L}, -2, 0, 12, false},
        {"product of 2^64 + 12", {(1L << 32) + 1, (1L << 32) - 1, 1L}, 1, 0, 12, false},
        {"product of 2^64", {big, 4L, 1L}, 1, 0, 12, false},
        {"no header", {3L, 2L, 1L}, 2, 0, -1, false}, {"half a header", {3L, 2L, 1L}, 2, 0, -20, false},
        {"nothing", {3L, 2L, 1L}, 2, 0, -33, false}};
    // clang-format on
    for (const auto& [what, dims, nDataVar, type, come, isRead] : cases) {
        SCOPED_TRACE(what);
        Bytes bytes = Bytes{0} + header(dims, nDataVar, type);
        bytes.resize(bytes.size() + come, 7);
        TmMsg msg(bytes.size(), bytes.data());
        TmDataAccess* object = nullptr;
        {
            const FailingMalloc failing(isRead ? LONG_MAX : 0);
            msg >> object;
            EXPECT_EQ(failing.count() > 0, isRead);  // nothing is asked for in vain
        }
        EXPECT_EQ(object != nullptr, isRead);
        const Handle handle(object);
        if (object) {
            float line = 5;
            EXPECT_EQ(object->size(), come);
            EXPECT_TRUE(come > 0 || (object->row(-1, 0, 0, &line).isOk() && line == 5));
            EXPECT_EQ(object->hash(), object->hash());
        }
    }
    Bytes bytes = Bytes{0} + header(size543, 1, 0) + Bytes(60);
    TmMsg msg(bytes.size(), bytes.data());
    TmDataAccess* object = nullptr;
    {
        const FailingMalloc failing(2);  // behind the object and its array of blocks
        msg >> object;
    }
    const Handle handle(object);
    EXPECT_TRUE(object && !object->hasData() && !msg.holds(1));
}

TEST(Volume, keepsALock)
{
    TmDataAccess volume;
    EXPECT_TRUE(volume.lockerThreadId() == 0 && !volume.isLockedWritable() && !volume.isMapDataToMemoryInProgress());
    EXPECT_EQ(volume.lockedROI(), KpBox3i(0, -1, 0, -1, 0, -1));
    volume.moveToCurrentThread();
    EXPECT_EQ(volume.lockerThreadId(), tmCurrentThreadId());
}
