#include "Pictures.h"

#include "Letters.h"
#include "Space.h"

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>
#include <cmath>

namespace {

/// The volume's axis that runs most along a patient's axis, and which way.
struct Along {
    size_t axis;
    bool isReversed;
    long size, stride;
    double spacing;
    KpVec3f direction;  // in the patient, as the picture shows it
};

std::array<Along, 3> alongPatientAxes(const Volume& volume)
{
    std::array<size_t, 3> best{0, 1, 2}, order = best;
    double most = -1;
    do {
        double sum = 0;
        for (size_t p = 0; p < 3; ++p)
            sum += std::abs(volume.axes[order[p]][p]);
        if (sum > most) {
            most = sum;
            best = order;
        }
    } while (std::next_permutation(order.begin(), order.end()));
    const std::array<long, 3> strides{1, volume.dims[0], volume.sliceCount()};
    std::array<Along, 3> along{};
    for (size_t p = 0; p < 3; ++p) {
        const size_t axis = best[p];
        const bool isReversed = volume.axes[axis][p] < 0;
        const KpVec3f direction = toVec(volume.axes[axis]);
        along[p] = {axis,          isReversed,           volume.dims[axis],
                    strides[axis], volume.spacing[axis], isReversed ? -direction : direction};
    }
    return along;
}

/// Position of pixel `i` of `n` on an axis: the voxel before it and the share of the next one.
struct Between {
    long offset, step;
    double share;

    long nearest() const { return share < 0.5 ? offset : offset + step; }
};

Between position(const Along& along, long i, double pixel)
{
    const double last = static_cast<double>(along.size - 1);
    double v = std::min(static_cast<double>(i) * pixel / along.spacing, last);
    if (along.isReversed)
        v = last - v;
    const long whole = std::min(static_cast<long>(v), std::max(0L, along.size - 2));
    return {whole * along.stride, along.size > 1 ? along.stride : 0, v - static_cast<double>(whole)};
}

Picture cut(Volume& shown, const KpBitfield& outline, const Along& across, const Along& down, const Along& normal)
{
    const auto extent = [](const Along& a) { return static_cast<double>(a.size - 1) * a.spacing; };
    const double pixel = pixelSize(std::min(across.spacing, down.spacing), extent(across), extent(down));
    Picture picture(pixelsFor(extent(across), pixel), pixelsFor(extent(down), pixel));
    const long planeOffset = normal.size / 2 * normal.stride;
    const unsigned char* const plane = shown.bytes.data() + planeOffset;
    for (long row = 0; row < picture.height; ++row) {
        const Between y = position(down, row, pixel);
        for (long column = 0; column < picture.width; ++column) {
            const Between x = position(across, column, pixel);
            const unsigned char* const at = plane + y.offset + x.offset;
            const double top = at[0] + x.share * (at[x.step] - at[0]);
            const double bottom = at[y.step] + x.share * (at[y.step + x.step] - at[y.step]);
            picture.pixels[row * picture.width + column] =
                static_cast<unsigned char>(std::lround(top + y.share * (bottom - top)));
            if (outline.test(static_cast<unsigned long>(planeOffset + x.nearest() + y.nearest())))
                picture.mark(column, row);
        }
    }
    drawLetters(picture, lettersOf(shown, across.direction, down.direction));
    return picture;
}

Along reversed(Along along)
{
    along.isReversed = !along.isReversed;
    along.direction = -along.direction;
    return along;
}

}  // namespace

Window windowOf(Volume& volume)
{
    KpDArray<float> values;
    values.resize(volume.count());
    KpRawData::memcpy({values.data(), KpPrimType::Float}, volume.voxels(), volume.count());
    const auto quantile = [&](double p) {
        float* const at = values.data() + static_cast<long>(p * static_cast<double>(values.size() - 1));
        std::nth_element(values.begin(), at, values.end());
        return static_cast<double>(*at) * volume.slope + volume.intercept;
    };
    const double a = quantile(0.005), b = quantile(0.995);
    Window window;
    window.center = (a + b) / 2;
    window.width = std::max(std::abs(b - a), 1.0) + 1;
    window.origin = "from the values, none in the header";
    return window;
}

std::vector<KpWindowLevel> presetsOf(const HxParamBundle& root)
{
    const std::array<std::string, 3> texts{root.findTag("G0028-1050", ""), root.findTag("G0028-1051", ""),
                                           root.findTag("G0028-1055", "")};
    std::vector<KpWindowLevel> presets = KpWindowLevel::createFromTags(texts);
    std::erase_if(presets,
                  [](const KpWindowLevel& p) { return !std::isfinite(p.center() + p.width()) || !(p.width() >= 1); });
    return presets;
}

Window windowOf(const HxParamBundle& root, const KpWindowLevel& preset)
{
    Window window;
    window.center = static_cast<double>(preset.center());
    window.width = static_cast<double>(preset.width());
    window.isInverted = KpString(root.findTag("G0028-0004", "")) == "MONOCHROME1";
    window.origin = "from the header";
    return window;
}

Window windowOf(const HxParamBundle& root, Volume& volume)
{
    const std::vector<KpWindowLevel> presets = presetsOf(root);
    Window window = windowOf(root, presets.empty() ? KpWindowLevel() : presets.front());
    if (!presets.empty())
        return window;
    const bool isInverted = window.isInverted;
    window = windowOf(volume);
    window.isInverted = isInverted;
    return window;
}

void display(Volume& volume, const Window& window, Volume& shown)
{
    shown.dims = volume.dims;
    shown.spacing = volume.spacing;
    shown.axes = volume.axes;
    shown.origin = volume.origin;
    shown.isPlaced = volume.isPlaced;
    shown.type = KpPrimType::Byte;
    shown.allocate();
    const double width = std::max((window.width - 1) / std::abs(volume.slope), 1e-6);
    const double center = (window.center - 0.5 - volume.intercept) / volume.slope;
    const double scale = (window.isInverted != (volume.slope < 0) ? -255 : 255) / width;
    const double offset = -center + (scale > 0 ? width / 2 : -width / 2) + 0.5 / scale;  // the last for rounding
    KpRawData::mapLinear(shown.voxels(), volume.voxels(), static_cast<unsigned long>(volume.count()), offset, scale);
}

KpResult writePlanes(Volume& shown, const KpBitfield& outline, const OutputFolder& out)
{
    const auto [left, back, up] = alongPatientAxes(shown);
    KpResult result = writeAxial(shown, outline, out, "axial.png");
    result << writePng(cut(shown, outline, left, reversed(up), back), out, "coronal.png");
    result << writePng(cut(shown, outline, back, reversed(up), left), out, "sagittal.png");
    return result;
}

KpResult writeAxial(Volume& shown, const KpBitfield& outline, const OutputFolder& out, const char* name)
{
    const auto [left, back, up] = alongPatientAxes(shown);
    return writePng(cut(shown, outline, left, back, up), out, name);
}

KpResult writeOverview(Volume& shown, const OutputFolder& out, const char* name)
{
    const auto [width, height, count] = shown.dims;
    const double square = std::sqrt(static_cast<double>(count * height) / static_cast<double>(width));
    const long across = std::clamp(std::lround(std::ceil(square)), 1L, count);
    const long down = (count + across - 1) / across;
    Picture picture(across * width, down * height);
    for (long z = 0; z < count; ++z) {
        const unsigned char* row = static_cast<const unsigned char*>(shown.slice(z).data);
        unsigned char* to = picture.pixels.data() + (z / across * height * across + z % across) * width;
        for (long y = 0; y < height; ++y, row += width, to += picture.width)
            std::copy_n(row, width, to);
    }
    drawLetters(picture, lettersOf(shown, toVec(shown.axes[0]), toVec(shown.axes[1])));
    return writePng(picture, out, name);
}
