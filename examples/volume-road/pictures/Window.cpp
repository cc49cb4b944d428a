#include "Window.h"

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <cstring>

namespace {

/// Every n-th displayed value, so that there are a few millions at most.
std::vector<float> sampled(Volume& volume)
{
    constexpr long most = 1 << 22;
    const long step = volume.count() / most + 1, n = volume.sliceCount();
    std::vector<float> values;
    KpDArray<double> slice;
    slice.resize(n);
    for (long z = 0, next = 0; z < volume.dims[2]; ++z) {
        KpRawData::memcpy({slice.data(), KpPrimType::Double}, volume.slice(z), n);
        for (; next < (z + 1) * n; next += step) {
            const double stored = slice[next - z * n];
            if (!volume.padding.contains(stored) && !std::isnan(stored))
                values.push_back(static_cast<float>(stored * volume.slope + volume.intercept));
        }
    }
    return values;
}

Window windowOfValues(Volume& volume)
{
    Window window;
    window.origin = "from the values, none in the header";
    std::vector<float> values = sampled(volume);
    if (values.empty())
        return window;
    const auto quantile = [&](double p) {
        const auto at = values.begin() + static_cast<long>(p * static_cast<double>(values.size() - 1));
        std::nth_element(values.begin(), at, values.end());
        return static_cast<double>(*at);
    };
    const double a = quantile(0.005), b = quantile(0.995);
    window.center = (a + b) / 2;
    // The finest step of the values, so that a volume of fractions is not shown by one grey.
    window.width = volume.type == KpPrimType::Float || volume.type == KpPrimType::Double || std::abs(volume.slope) < 1
                       ? std::max(b - a, 1e-6)
                       : std::max(b - a, 1.0) + 1;
    if (window.width < 2)
        window.function = Window::LinearExact;
    return window;
}

void displayLinear(Volume& volume, const Window& window, Volume& shown)
{
    const bool isExact = window.function == Window::LinearExact;
    const double displayedWidth = isExact ? window.width : window.width - 1;
    const double displayedCenter = isExact ? window.center : window.center - 0.5;
    const double width = std::max(displayedWidth / std::abs(volume.slope), 1e-6);
    const double center = (displayedCenter - volume.intercept) / volume.slope;
    const double scale = (window.isInverted != (volume.slope < 0) ? -255 : 255) / width;
    const double offset = -center + (scale > 0 ? width / 2 : -width / 2) + 0.5 / scale;  // the last for rounding
    KpRawData::mapLinear(shown.voxels(), volume.voxels(), static_cast<unsigned long>(volume.count()), offset, scale);
}

/// Calls `work(value, shown)` for each stored value, as a number, and the byte that shows it.
template <typename Work>
void eachVoxel(Volume& volume, Volume& shown, Work work)
{
    KpDArray<double> values;
    values.resize(volume.sliceCount());
    for (long z = 0; z < volume.dims[2]; ++z) {
        KpRawData::memcpy({values.data(), KpPrimType::Double}, volume.slice(z), values.size());
        auto* const to = static_cast<unsigned char*>(shown.slice(z).data);
        for (long i = 0; i < values.size(); ++i)
            work(values[i], to[i]);
    }
}

void displaySigmoid(Volume& volume, const Window& window, Volume& shown)
{
    eachVoxel(volume, shown, [&](double value, unsigned char& to) {
        const double v = value * volume.slope + volume.intercept;
        const double share = 1 / (1 + std::exp(-4 * (v - window.center) / window.width));
        to = static_cast<unsigned char>(std::lround(255 * (window.isInverted ? 1 - share : share)));
    });
}

void blackenPadding(Volume& volume, Volume& shown)
{
    eachVoxel(volume, shown, [&](double value, unsigned char& to) {
        if (volume.padding.contains(value))
            to = 0;
    });
}

}  // namespace

Window Windows::of(const KpWindowLevel& preset) const
{
    Window window;
    window.center = std::strtod(preset.centerString().c_str(), nullptr);
    window.width = std::strtod(preset.widthString().c_str(), nullptr);
    window.function = function;
    window.isInverted = isInverted;
    window.origin = origin;
    return window;
}

const char* nameOf(Window::Function function)
{
    static constexpr const char* names[] = {"LINEAR", "LINEAR_EXACT", "SIGMOID"};
    return names[function];
}

std::vector<KpWindowLevel> presetsOf(const std::string& centers, const std::string& widths,
                                     const std::string& explanations, Window::Function function)
{
    const std::array<std::string, 3> texts{centers, widths, explanations};
    std::vector<KpWindowLevel> presets = KpWindowLevel::createFromTags(texts);
    std::erase_if(presets, [&](const KpWindowLevel& p) {
        const bool isWide = function == Window::Linear ? p.width() >= 1 : p.width() > 0;
        return !std::isfinite(p.center() + p.width()) || !isWide;
    });
    return presets;
}

Window windowOf(const Windows& windows, Volume& volume)
{
    if (!windows.presets.empty())
        return windows.of(windows.presets.front());
    Window window = windowOfValues(volume);
    window.isInverted = windows.isInverted;
    return window;
}

void display(Volume& volume, const Window& window, Volume& shown)
{
    KpDArray<unsigned char> memory;
    memory.swap(shown.bytes);
    shown = volume.withoutVoxels();
    shown.bytes.swap(memory);
    shown.type = KpPrimType::Byte;
    shown.padding = {};
    shown.allocate();
    if (volume.components == 3) {
        std::memcpy(shown.bytes.data(), volume.bytes.data(), static_cast<size_t>(volume.bytes.size()));
        return;
    }
    if (window.function == Window::Sigmoid)
        displaySigmoid(volume, window, shown);
    else
        displayLinear(volume, window, shown);
    if (volume.padding.isPresent())
        blackenPadding(volume, shown);
}
