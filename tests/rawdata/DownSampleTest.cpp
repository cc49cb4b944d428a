#include "Elements.h"

#include <kplib/rawdata/detail/DownSampleKernels.h>
#include <kplib/threads/KpProgressInterface.h>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

const struct Case {
    long dx, dy, dz;
    int fx, fy, fz, n;
} cases[] = {{131, 7, 5, 2, 2, 2, 1},     {133, 9, 5, 4, 4, 2, 1},  {70, 6, 4, 3, 1, 2, 1},
             {37, 6, 4, 1, 2, 3, 2},      {29, 7, 3, 5, 3, 1, 4},   {4300, 2, 2, 2, 1, 2, 1},
             {2500, 2, 1, 2100, 2, 1, 1}, {3, 2, 2, 2, 1, 2, 1500}, {40, 35, 33, 17, 16, 16, 1},
             {6, 5, 4, 7, 1, 1, 1},       {6, 5, 4, 6, 5, 4, 1},    {6, 5, 4, 1, 6, 1, 2}};

enum { mean, greatest, corner };

/// The definition, voxel by voxel, of all three rules; sums of real numbers depend on its order.
template <typename T>
std::array<std::vector<T>, 3> reference(const std::vector<T>& src, const Case& c)
{
    using Sum = std::conditional_t<std::is_integral_v<T>, std::int64_t, T>;
    std::array<std::vector<T>, 3> results;
    for (long z = 0; z + c.fz <= c.dz; z += c.fz)
        for (long y = 0; y + c.fy <= c.dy; y += c.fy)
            for (long x = 0; x + c.fx <= c.dx; x += c.fx)
                for (long k = 0; k < c.n; ++k) {
                    const auto at = [&](long i, long j, long l) { return src[((l * c.dy + j) * c.dx + i) * c.n + k]; };
                    Sum sum = 0;
                    T most = at(x, y, z);
                    for (long l = z; l < z + c.fz; ++l)
                        for (long j = y; j < y + c.fy; ++j)
                            for (long i = x; i < x + c.fx; ++i) {
                                sum += at(i, j, l);
                                most = at(i, j, l) > most ? at(i, j, l) : most;
                            }
                    results[mean].push_back(static_cast<T>(sum / static_cast<Sum>(long{c.fx} * c.fy * c.fz)));
                    results[greatest].push_back(most);
                    results[corner].push_back(at(x, y, z));
                }
    return results;
}

/// All layers by one loop, as KpRawData walks them.
void runPath(BlockLoop* loop, const Case& c, void* dst, const void* src, int size)
{
    const long rowStride = c.dx * c.n, sliceStride = rowStride * c.dy, blocks = c.dx / c.fx;
    auto* to = static_cast<char*>(dst);
    for (long z = 0; z + c.fz <= c.dz; z += c.fz)
        for (long y = 0; y + c.fy <= c.dy; y += c.fy, to += blocks * c.n * size)
            loop({static_cast<const char*>(src) + (z * sliceStride + y * rowStride) * size, to, blocks, c.fx, c.fy,
                  c.fz, c.n, rowStride, sliceStride});
}

/// Notes the calls: w for work begun, 3/9 for step 3 of 9, c for a question, s for the end.
class Recorder : public KpProgressInterface {
public:
    explicit Recorder(int questions) : cancelAfter(questions) {}
    void beforeStartWorking() override { told += "w "; }
    void afterStopWorking() override { told += "s "; }
    void setProgressValue(int v) override { told += std::to_string(v) + "/" + std::to_string(globalMaximum()) + " "; }
    bool isCanceled() const override { return told += "c ", --cancelAfter == 0; }

    mutable std::string told;
    mutable int cancelAfter;
};

}  // namespace

TEST(DownSample, everyPathEqualsTheDefinition)
{
    eachType([]<typename T>(KpElementTag<T>) {
        for (const Case& c : cases)
            for (bool isAtTheLimits : {false, true}) {
                SCOPED_TRACE(std::to_string(c.dx) + " by " + std::to_string(c.fx));
                auto values = someValues<T>(c.dx * c.dy * c.dz * c.n, 12);
                for (T& v : values)
                    if (isAtTheLimits && std::is_integral_v<T>)
                        v = v > 0 ? std::numeric_limits<T>::min() : std::numeric_limits<T>::max();
                const auto expected = reference(values, c);
                for (const BlockRule rule : {BlockRule::Mean, BlockRule::Maximum}) {
                    const auto& results = expected[rule == BlockRule::Mean ? mean : greatest];
                    auto* const operation = rule == BlockRule::Mean ? KpRawData::downSample3DN
                                                                    : KpRawData::downSampleMaxFilterComponents3DN;
                    expectOfEachPath(blockPaths(), results, values, [&](auto loops, void* dst, void* src) {
                        runPath(loops(typeOf<T>, rule), c, dst, src, sizeof(T));
                    });
                    std::vector<T> dst(results.size());
                    operation(dst.data(), values.data(), c.dx, c.dy, c.dz, c.fx, c.fy, c.fz, c.n, nullptr);
                    EXPECT_TRUE(areSame(dst, results));
                }
                std::vector<T> labels(expected[corner].size());
                T *a = values.data(), *b = labels.data();
                if (std::is_same_v<T, std::uint16_t>)
                    std::swap(a, b);
                if (c.n == 1)
                    KpRawData::downSampleLabels3D(a, b, c.dx, c.dy, c.dz, c.fx, c.fy, c.fz, nullptr);
                EXPECT_TRUE(c.n > 1 || areSame(labels, expected[corner]));
            }
    });
}

TEST(DownSample, progressFollowsTheLayers)
{
    auto *const means = KpRawData::downSample3D, *const labels = KpRawData::downSampleLabels3D;
    // clang-format off
    const struct { decltype(means) call; int f, cancelAfter, type; const char* told; long written; } runs[] = {
        {means, 2, 0, 7, "w 0/9 c 1/9 c 3/9 c 5/9 c 7/9 s ", 8}, {labels, 2, 2, 7, "w 0/9 c 1/9 c s ", 4},
        {means, 2, 1, 7, "w 0/9 c s ", 2},
        {means, 3, 0, 7, "w 0/9 c 1/9 c 4/9 c 7/9 s ", 0},       {labels, 3, 0, 7, "w 0/9 c 1/9 c 2/9 c 3/9 s ", 0},
        {means, 4, 0, 7, "", 0},  // more than one above the size
        {means, 0, 0, 7, "", 0}, {labels, 0, 0, 7, "", 0}, {means, 2, 0, 8, "", 0}, {labels, 2, 0, -3, "", 0}};
    // clang-format on
    for (const auto& run : runs) {
        Recorder progress(run.cancelAfter);
        const KpPrimType type(run.type);
        std::vector<std::uint16_t> src(36, 5), dst(8, 1), expected = dst;
        std::fill_n(expected.begin(), run.written, 5);
        void* const to = run.f == 3 ? nullptr : dst.data();  // an empty target may be null
        const std::string error = std::string("E Unsupported data type ") + type.name();
        EXPECT_EQ(logged([&] {
                      run.call(to, {src.data(), type}, 2, 2, 9, 1, run.f, run.f, &progress);
                  }),
                  type == KpPrimType::UShort ? "" : error + " in KpRawData::downSample3D\n");
        EXPECT_EQ(std::tuple(progress.told, dst), std::tuple(run.told, expected)) << progress.told;
    }
}
