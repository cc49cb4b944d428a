#include <kplib/volume/KpConnectedComponents.h>
#include <kplib/volume/detail/LabelPlainly.h>
#include <rawdata/Volumes.h>

#include <cmath>
#include <vector>

// Connected components against the same pass voxel by voxel: of a mask with an organ of a quarter of the volume and
// some small lesions, of noise, and of a segmentation into a hundred labels.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

struct Volume {
    int dims[3];
    std::string name() const
    {
        return std::to_string(dims[0]) + 'x' + std::to_string(dims[1]) + 'x' + std::to_string(dims[2]);
    }
};

const Volume ct{{512, 512, 256}}, atlas{{181, 217, 181}};

using Image = std::vector<unsigned char>;

template <typename Value>
Image imageOf(const Volume& volume, Value value)
{
    Image image;
    image.reserve(static_cast<std::size_t>(nVoxelsOf(volume.dims)));
    for (int z = 0; z < volume.dims[2]; ++z)
        for (int y = 0; y < volume.dims[1]; ++y)
            for (int x = 0; x < volume.dims[0]; ++x) {
                // From the middle of the volume, its border at 1.
                const auto from = [&](int at, int axis) { return 2.0f * float(at) / float(volume.dims[axis]) - 1; };
                image.push_back(static_cast<unsigned char>(value(from(x, 0), from(y, 1), from(z, 2))));
            }
    return image;
}

/// A body whose surface has folds as deep as a twelfth of its radius.
bool isInBody(float x, float y, float z)
{
    const float folds = 0.02f * (std::sin(40 * x) + std::sin(40 * y) + std::sin(40 * z));
    return x * x + y * y + z * z < 0.6f + folds;
}

Image mask(const Volume& volume)
{
    return imageOf(volume, [](float x, float y, float z) {
        const float lesion = std::sin(30 * x) * std::sin(30 * y) * std::sin(30 * z);
        return isInBody(x, y, z) || lesion > 0.9f;
    });
}

Image noise(const Volume& volume)
{
    std::minstd_rand random(1);
    return imageOf(volume, [&](float, float, float) { return random() >> 16 & 1; });
}

Image segmentation(const Volume& volume)
{
    return imageOf(volume, [](float x, float y, float z) {
        if (!isInBody(x, y, z))
            return 0;
        const auto part = [](float at, float bend) {
            return static_cast<int>(2.5f * (at + 1 + 0.08f * std::sin(bend)));
        };
        return 1 + part(x, 9 * y) % 5 + 5 * (part(y, 9 * z) % 5) + 25 * (part(z, 9 * x) % 4);
    });
}

template <typename L>
using Pass = int(unsigned char* data, L* labels, ComponentTable& table, unsigned char low, unsigned char high,
                 const int* dims, int neighbours, int labelMode);

template <typename L>
int plainly(unsigned char* data, L* labels, ComponentTable& table, unsigned char low, unsigned char high,
            const int* dims, int neighbours, int labelMode)
{
    return PlainLabelling<unsigned char, L>(data, labels, table, low, high, dims, neighbours, labelMode).run();
}

template <typename L = unsigned short>
void addImage(const std::string& kind, Image (*make)(const Volume&), const Volume& volume, int neighbours,
              int labelMode, double limit)
{
    const std::string suffix = "/" + kind + "/" + volume.name() + "/" + std::to_string(neighbours);
    const auto run = [=](benchmark::State& state, Pass<L>* pass, const std::string& baseline) {
        Image image = make(volume);
        std::vector<L> labels(image.size()), expected(image.size());
        ComponentTable table;
        const auto low = static_cast<unsigned char>(1 - labelMode);
        for (auto _ : state) {
            pass(image.data(), labels.data(), table, low, 1, volume.dims, neighbours, labelMode);
            benchmark::ClobberMemory();
        }
        plainly(image.data(), expected.data(), table, low, 1, volume.dims, neighbours, labelMode);
        if (labels != expected)
            state.SkipWithError("wrong labels");
        report(state, static_cast<double>(image.size()), static_cast<double>(image.size() * (1 + sizeof(L))), baseline,
               baseline.empty() ? 0 : limit);
    };
    add("plain pass" + suffix, run, plainly<L>, "");
    add("do_label" + suffix, run, KpConnectedComponents::do_label<unsigned char, L>, "plain pass" + suffix);
}

[[maybe_unused]] const bool isRegistered = [] {
    for (const Volume& volume : {ct, atlas}) {
        for (int neighbours : {6, 18, 26})
            addImage("mask", mask, volume, neighbours, 0, neighbours == 6 ? 0.25 : 0.2);
        addImage<int>("noise", noise, volume, 6, 0, 1);  // more components than short labels can number
        addImage("noise", noise, volume, 18, 0, 1);
        addImage("noise", noise, volume, 26, 0, 1);
        addImage("labels", segmentation, volume, 26, 1, 0.2);
    }
    return true;
}();

}  // namespace
