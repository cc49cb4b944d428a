#include "Page.h"

#include "../pictures/Pictures.h"
#include "../volume/Reduce.h"
#include "../volume/Sampler.h"
#include "Template.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/rawdata/KpRawData.h>

#include <array>
#include <cmath>
#include <string>
#include <vector>
#include <zlib.h>

#include <algorithm>

namespace {

using Json = nlohmann::ordered_json;

constexpr long mostVoxels = 8L << 20;  // a file of about 10 MB, which a browser opens at once

/// The volume, reduced along the axes with the finest steps until it is small enough.
Volume reduced(Volume& volume)
{
    std::array<int, 3> factors{1, 1, 1};
    const auto stepOf = [&](size_t axis) { return volume.spacing[static_cast<int>(axis)] * factors[axis]; };
    const auto size = [&] {
        return volume.dims[0] / factors[0] * (volume.dims[1] / factors[1]) * (volume.dims[2] / factors[2]);
    };
    while (size() > mostVoxels) {
        size_t finest = 0;
        for (size_t axis = 1; axis < 3; ++axis)
            finest = stepOf(axis) < stepOf(finest) ? axis : finest;
        ++factors[finest];
    }
    KpProgressInterface unseen;
    return reducedByMean(volume, factors, unseen);
}

/// Upright voxels for the page: x to the left, y to the back, z to the head, as near as the slices allow, without tilt
/// and with even gaps.
struct Grid {
    std::array<long, 3> dims;
    KpVec3d spacing;
    std::array<KpVec3d, 3> directions;
    KpVec3d origin;

    long count() const { return dims[0] * dims[1] * dims[2]; }
};

KpVec3d cornerOf(const Volume& volume, int corner)
{
    const auto last = [&](int axis) { return corner >> axis & 1 ? volume.dims[static_cast<size_t>(axis)] - 1 : 0; };
    return volume.slicePosition(last(2)) + volume.axes[0] * (volume.spacing[0] * static_cast<double>(last(0))) +
           volume.axes[1] * (volume.spacing[1] * static_cast<double>(last(1)));
}

Grid gridOf(const Volume& volume)
{
    Grid grid;
    const auto along = patientAxes(volume);
    grid.origin = KpVec3d(0, 0, 0);
    for (int p = 0; p < 3; ++p) {
        const PatientAxis& axis = along[static_cast<size_t>(p)];
        double low = HUGE_VAL, high = -HUGE_VAL;
        for (int corner = 0; corner < 8; ++corner) {
            const double at = cornerOf(volume, corner).dot(axis.direction);
            low = std::min(low, at);
            high = std::max(high, at);
        }
        grid.directions[static_cast<size_t>(p)] = axis.direction;
        grid.spacing[p] = volume.spacing[static_cast<int>(axis.axis)];
        grid.dims[static_cast<size_t>(p)] = std::lround((high - low) / grid.spacing[p]) + 1;
        grid.origin += axis.direction * low;
    }
    return grid;
}

/// Calls `visit(i, place)` with the place of each voxel of the grid in a system of voxels.
template <typename Visit>
void forEachPlace(const Grid& grid, const Space& space, Visit visit)
{
    KpHandle<KpCoordinateSystem> system = space.patient->createChildSystem();
    system->setOrigin(KpVec3f(grid.origin));
    for (int i = 0; i < 3; ++i)
        system->setAxis(i, KpVec3f(grid.directions[static_cast<size_t>(i)] * grid.spacing[i]));
    const KpMat4f toVoxels = system->transformationTo(*space.voxels);
    long i = 0;
    for (long z = 0; z < grid.dims[2]; ++z) {
        for (long y = 0; y < grid.dims[1]; ++y) {
            for (long x = 0; x < grid.dims[0]; ++x, ++i)
                visit(i, toVoxels.multVecMatrix(
                             KpVec3f(static_cast<float>(x), static_cast<float>(y), static_cast<float>(z))));
        }
    }
}

/// The values of a volume on the grid; zero outside.
template <typename Element>
void resample(const Volume& volume, const Grid& grid, const Space& space, KpDArray<unsigned char>& bytes)
{
    bytes.resize(grid.count() * volume.components * static_cast<long>(sizeof(Element)));
    std::fill(bytes.begin(), bytes.end(), static_cast<unsigned char>(0));
    auto* const to = reinterpret_cast<Element*>(bytes.data());
    const Sampler<Element> sampler(volume);
    forEachPlace(grid, space, [&](long i, const KpVec3f& place) {
        if (sampler.contains(place))
            sampler.sample(place, to + i * volume.components);
    });
}

/// A mask of the volume's size on the grid.
KpDArray<unsigned char> maskOn(const Grid& grid, const Volume& volume, const Space& space, const KpBitfield& mask)
{
    KpDArray<unsigned char> bytes;
    bytes.resize(grid.count());
    const Sampler<unsigned char> sampler(volume);
    forEachPlace(grid, space, [&](long i, const KpVec3f& place) {
        bytes[i] = mask.nBits() > 0 && sampler.contains(place) && mask.test(sampler.nearest(place));
    });
    return bytes;
}

/// The volume in words of 16 bits; its slope and intercept lead from them to displayed values.
Volume inWords(Volume volume)
{
    if (volume.type == KpPrimType::UShort || volume.components == 3)
        return volume;
    Volume words = volume.withoutVoxels();
    words.type = KpPrimType::UShort;
    words.allocate();
    const auto n = static_cast<unsigned long>(volume.count());
    float low = 0, high = 0;
    KpRawData::getRange(volume.voxels(), n, low, high);
    const bool isWhole = volume.type == KpPrimType::Short || volume.type == KpPrimType::Byte;
    const double first = static_cast<double>(low), range = std::max(static_cast<double>(high) - first, 1e-30);
    const double step = isWhole ? 1 : range / 65535;
    KpRawData::mapLinear(words.voxels(), volume.voxels(), n, step / 2 - first, 1 / step);
    words.intercept = volume.intercept + first * volume.slope;
    words.slope = volume.slope * step;
    return words;
}

std::string base64(const std::vector<unsigned char>& bytes)
{
    static constexpr char digits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (size_t i = 0; i < bytes.size(); i += 3) {
        const auto byte = [&](size_t k) { return i + k < bytes.size() ? unsigned{bytes[i + k]} : 0U; };
        const unsigned word = byte(0) << 16 | byte(1) << 8 | byte(2);
        for (size_t k = 0; k < 4; ++k)
            text += i + k > bytes.size() ? '=' : digits[word >> (18 - 6 * k) & 63];
    }
    return text;
}

std::string packed(const KpDArray<unsigned char>& bytes)
{
    uLongf size = compressBound(static_cast<uLong>(bytes.size()));
    std::vector<unsigned char> deflated(size);
    compress2(deflated.data(), &size, bytes.data(), static_cast<uLong>(bytes.size()), 5);
    deflated.resize(size);
    return base64(deflated);
}

Json lettersJson(const Volume& volume, const KpVec3d& right, const KpVec3d& down)
{
    const KpOrientationLetters letters = lettersOf(volume, KpVec3f(right), KpVec3f(down));
    return {{"right", letters.right()}, {"top", letters.top()}, {"left", letters.left()}, {"bottom", letters.bottom()}};
}

Json presetsJson(const Series& series, const Window& window)
{
    Json presets = Json::array();
    for (const KpWindowLevel& preset : series.windows.presets) {
        const Window own = series.windows.of(preset);
        const std::string name = preset.explanation().empty() ? own.origin : preset.explanation();
        presets.push_back({{"name", name}, {"center", own.center}, {"width", own.width}});
    }
    if (presets.empty())
        presets.push_back({{"name", window.origin}, {"center", window.center}, {"width", window.width}});
    return presets;
}

Json metaOf(const Volume& volume, const Grid& grid, const Series& series, const Window& window, const Report& report)
{
    Json lines = Json::array();
    std::string title;
    for (const auto& line : report.all()) {
        lines.push_back({line.name, line.text});
        if (line.name == "modality" || line.name == "series description")
            title += (title.empty() ? "" : ", ") + line.text;
    }
    const auto [left, back, up] = grid.directions;
    return {{"title", title.empty() ? "Volume" : title},
            {"dims", grid.dims},
            {"spacing", {grid.spacing[0], grid.spacing[1], grid.spacing[2]}},
            {"placed", volume.isPlaced},
            {"components", volume.components},
            {"slope", volume.slope},
            {"intercept", volume.intercept},
            {"window",
             {{"center", window.center},
              {"width", window.width},
              {"function", nameOf(window.function)},
              {"inverted", window.isInverted}}},
            {"presets", presetsJson(series, window)},
            {"letters",
             {{"axial", lettersJson(volume, left, back)},
              {"coronal", lettersJson(volume, left, -up)},
              {"sagittal", lettersJson(volume, back, -up)}}},
            {"report", lines},
            {"warnings", series.warnings}};
}

/// Puts a text in place of a mark of the template.
void replace(std::string& page, const std::string& mark, const std::string& text)
{
    page.replace(page.find(mark), mark.size(), text);
}

/// JSON that cannot end the element of the page in which it stands.
std::string inScript(const Json& json)
{
    std::string text = json.dump(-1, ' ', false, Json::error_handler_t::replace), safe;
    for (const char c : text)
        safe += c == '<' ? std::string("\\u003c") : std::string(1, c);
    return safe;
}

}  // namespace

KpResult writePage(Volume& volume, const Space& space, const Region& region, const Series& series, const Window& window,
                   const Report& report, const OutputFolder& out)
{
    Volume shown = inWords(reduced(volume));
    const Grid grid = gridOf(shown);
    constexpr long mostOnGrid = 8 * mostVoxels;
    if (grid.count() > mostOnGrid)
        return badInput("the slices are too far apart for a page of upright planes");
    KpDArray<unsigned char> voxels;
    const Space ownSpace(series.frameUid(), shown);
    if (shown.components == 3)
        resample<unsigned char>(shown, grid, ownSpace, voxels);
    else
        resample<unsigned short>(shown, grid, ownSpace, voxels);
    std::string page = pageTemplate;
    replace(page, "@META@", inScript(metaOf(shown, grid, series, window, report)));
    replace(page, "@VOXELS@", packed(voxels));
    replace(page, "@MASK@", packed(maskOn(grid, volume, space, region.mask)));
    return writeText(page, out, "index.html");
}
