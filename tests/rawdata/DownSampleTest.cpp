#include "Elements.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/KpDownSampleKernels.h>
#include <kplib/threads/KpProgressInterface.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <functional>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

struct Case {
    long dx, dy, dz;
    int fx, fy, fz, n;
    long elements() const { return dx * dy * dz * n; }
};

const Case cases[] = {{5, 5, 5, 2, 2, 2, 1},    {131, 7, 5, 2, 2, 2, 1},  {133, 9, 5, 4, 4, 2, 1},
                      {70, 6, 4, 3, 1, 2, 1},   {37, 6, 4, 1, 2, 3, 2},   {41, 4, 4, 2, 2, 2, 3},
                      {29, 7, 3, 5, 3, 1, 4},   {64, 2, 2, 1, 1, 1, 1},   {4300, 2, 2, 2, 1, 2, 1},
                      {2500, 2, 1, 2100, 2, 1, 1}, {3, 2, 2, 2, 1, 2, 1500}, {40, 35, 33, 17, 16, 16, 1},
                      {6, 5, 4, 7, 1, 1, 1},    {6, 5, 4, 6, 5, 4, 1},    {6, 5, 4, 1, 6, 1, 2}};

/// The definition, voxel by voxel.
template <typename T>
std::vector<T> reference(const std::vector<T>& src, const Case& c, BlockRule rule)
{
    using Sum = std::conditional_t<std::is_integral_v<T>, std::int64_t, T>;
    std::vector<T> result;
    for (long z = 0; z + c.fz <= c.dz; z += c.fz)
        for (long y = 0; y + c.fy <= c.dy; y += c.fy)
            for (long x = 0; x + c.fx <= c.dx; x += c.fx)
                for (long k = 0; k < c.n; ++k) {
                    const auto at = [&](long i, long j, long l) {
                        return src[(((z + l) * c.dy + y + j) * c.dx + x + i) * c.n + k];
                    };
                    Sum sum = 0;
                    T greatest = at(0, 0, 0);
                    for (long l = 0; l < c.fz; ++l)
                        for (long j = 0; j < c.fy; ++j)
                            for (long i = 0; i < c.fx; ++i) {
                                sum += at(i, j, l);
                                greatest = at(i, j, l) > greatest ? at(i, j, l) : greatest;
                            }
                    const auto mean = static_cast<T>(sum / static_cast<Sum>(long{c.fx} * c.fy * c.fz));
                    result.push_back(rule == BlockRule::Mean ? mean : greatest);
                }
    return result;
}

/// All layers by one loop, as KpRawData walks them.
void runPath(BlockLoop* loop, const Case& c, void* dst, const void* src, int size)
{
    const long rowStride = c.dx * c.n, sliceStride = rowStride * c.dy, blocks = c.dx / c.fx;
    auto* to = static_cast<char*>(dst);
    for (long z = 0; z + c.fz <= c.dz; z += c.fz)
        for (long y = 0; y + c.fy <= c.dy; y += c.fy, to += blocks * c.n * size)
            loop({static_cast<const char*>(src) + (z * sliceStride + y * rowStride) * size, to, blocks, c.fx, c.fy, c.fz,
                  c.n, rowStride, sliceStride});
}

template <typename T>
std::vector<T> voxels(const Case& c, unsigned seed)
{
    std::vector<T> values = someValues<T>(c.elements(), seed);
    if (seed % 2 && std::is_integral_v<T>)  // quotients near the limits
        for (T& v : values)
            v = v > 0 ? std::numeric_limits<T>::min() : std::numeric_limits<T>::max();
    return values;
}

/// Notes the calls: w9 for work of 9 steps, 3 for a step reached, c for a question, s for the end.
class Recorder : public KpProgressInterface {
public:
    void startWorking(int maximum, std::string text) override
    {
        note('w' + std::to_string(maximum) + text);
        KpProgressInterface::startWorking(maximum, text);
    }
    void stopWorking() override
    {
        note("s");
        KpProgressInterface::stopWorking();
    }
    void setProgressValue(int value) override
    {
        if (!isStarting)
            note(std::to_string(value));
        KpProgressInterface::setProgressValue(value);
    }
    bool isCanceled() const override
    {
        note("c");
        return --cancelAfter == 0 || KpProgressInterface::isCanceled();
    }
    void setProgressText(const char* text) override
    {
        KpProgressInterface::setProgressText(text);
        isStarting = true;  // of the step 0 that a start sets by itself
    }
    void setProgressValueGlobal(int) override { isStarting = false; }
    std::string take() { return std::exchange(told, {}); }

    mutable int cancelAfter = 0;

private:
    void note(const std::string& what) const { told += what + ' '; }
    mutable std::string told;
    bool isStarting = false;
};

}  // namespace

TEST(DownSample, everyPathEqualsTheDefinition)
{
    eachType([]<typename T>(ElementTag<T>) {
        for (const Case& c : cases) {
            for (BlockRule rule : {BlockRule::Mean, BlockRule::Maximum}) {
                for (unsigned seed : {12, 13}) {
                    const std::vector<T> values = voxels<T>(c, seed), expected = reference(values, c, rule);
                    Elements<T> src(values, seed % 2);
                    for (const auto& path : blockPaths()) {
                        if (!path.usable)
                            continue;
                        Elements<T> dst(long(expected.size()), seed % 2);
                        runPath(path.run(src.typed().type, rule), c, dst.data(), src.data(), sizeof(T));
                        EXPECT_EQ(dst, expected) << path.name << ' ' << src.typed().type.name() << ' ' << c.dx << ' ' << c.fx;
                    }
                    Elements<T> dst(long(expected.size()));
                    (rule == BlockRule::Mean ? KpRawData::downSample3DN : KpRawData::downSampleMaxFilterComponents3DN)(
                        dst.data(), src.typed(), c.dx, c.dy, c.dz, c.fx, c.fy, c.fz, c.n, nullptr);
                    EXPECT_EQ(dst, expected);
                }
            }
        }
    });
}

TEST(DownSample, orderRoundingAndNaN)
{
    float row[] = {1e8f, 1.0f, -1e8f, 1.0f}, mean = 0;
    KpRawData::downSample3D(&mean, row, 4, 1, 1, 4, 1, 1, nullptr);
    EXPECT_EQ(mean, 0.25f);
    std::int16_t negative[] = {-1, -2}, cut = 0;
    KpRawData::downSample3D(&cut, negative, 2, 1, 1, 2, 1, 1, nullptr);
    EXPECT_EQ(cut, -1);
    const float nan = std::numeric_limits<float>::quiet_NaN();
    float pairs[] = {nan, 2, 3, nan}, greatest[2];
    KpRawData::downSampleMaxFilterComponents3DN(greatest, pairs, 2, 1, 1, 2, 1, 1, 2, nullptr);
    EXPECT_TRUE(greatest[0] != greatest[0] && greatest[1] == 2);
}

TEST(DownSample, labelsKeepTheCornerAndTheirDirection)
{
    eachType([]<typename T>(ElementTag<T>) {
        for (const Case& c : cases) {
            if (c.n > 1)
                continue;
            const std::vector<T> values = someValues<T>(c.elements(), 14);
            std::vector<T> expected;
            for (long z = 0; z < c.dz / c.fz; ++z)
                for (long y = 0; y < c.dy / c.fy; ++y)
                    for (long x = 0; x < c.dx / c.fx; ++x)
                        expected.push_back(values[(z * c.fz * c.dy + y * c.fy) * c.dx + x * c.fx]);
            Elements<T> src(values, 0), dst(long(expected.size()));
            const bool toFirst = std::is_same_v<T, std::uint16_t>;
            KpRawData::downSampleLabels3D(toFirst ? dst.data() : src.data(), toFirst ? src.typed() : dst.typed(), c.dx, c.dy,
                                          c.dz, c.fx, c.fy, c.fz, nullptr);
            EXPECT_EQ(dst, expected) << src.typed().type.name() << ' ' << c.dx;
        }
    });
}

TEST(DownSample, progressFollowsTheLayers)
{
    using Call = std::function<void(void*, KpTypedPointer, int, KpProgressInterface*)>;
    const Call mean = [](void* a, KpTypedPointer b, int f, KpProgressInterface* p) {
        KpRawData::downSample3D(a, b, 2, 2, 9, 1, f, f, p);
    };
    const Call labels = [](void* a, KpTypedPointer b, int f, KpProgressInterface* p) {
        KpRawData::downSampleLabels3D(a, b, 2, 2, 9, 1, f, f, p);
    };
    std::vector<std::uint16_t> src(36, 5);
    const struct {
        const Call& call;
        int factor, cancelAfter;
        KpPrimType type;
        const char* told;
        long written;
    } runs[] = {
        {mean, 2, 0, KpPrimType::UShort, "w9 c 1 c 3 c 5 c 7 s ", 8},
        {labels, 2, 0, KpPrimType::UShort, "w9 c 1 c 2 c 3 c 4 s ", 8},
        {mean, 2, 1, KpPrimType::UShort, "w9 c s ", 2},
        {labels, 2, 2, KpPrimType::UShort, "w9 c 1 c s ", 4},
        {mean, 3, 0, KpPrimType::UShort, "w9 c 1 c 4 c 7 s ", 0},  // one above the size: layers without rows
        {labels, 3, 0, KpPrimType::UShort, "w9 c 1 c 2 c 3 s ", 0},
        {mean, 4, 0, KpPrimType::UShort, "", 0},  // beyond that
        {mean, 0, 0, KpPrimType::UShort, "", 0},
        {labels, 0, 0, KpPrimType::UShort, "", 0},
        {mean, 2, 0, KpPrimType::UInt, "", 0},
        {labels, 2, 0, KpPrimType(-3), "", 0},
    };
    for (const auto& run : runs) {
        SCOPED_TRACE(run.told);
        Recorder progress;
        progress.cancelAfter = run.cancelAfter;
        std::vector<std::uint16_t> dst(8, 1), expected = dst;
        std::fill_n(expected.begin(), run.written, 5);
        const LogCapture log;
        run.call(dst.data(), {src.data(), run.type}, run.factor, &progress);
        EXPECT_EQ(progress.take(), run.told);
        EXPECT_EQ(dst, expected);
        EXPECT_EQ(log.lines().size(), run.type == KpPrimType::UShort ? 0u : 1u);
        if (!log.lines().empty()) {
            EXPECT_TRUE(log.lines()[0].ends_with(std::string("Unsupported data type ") + run.type.name() +
                                                 " in KpRawData::downSample3D\n"));
        }
    }
}
