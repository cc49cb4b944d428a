#include "Measure.h"

#include "DicomSeries.h"
#include "Letters.h"
#include "Road.h"
#include "Space.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/numerics/KpAlignPointSets.h>
#include <kplib/geometry/numerics/KpFitPlane.h>
#include <kplib/geometry/numerics/KpPls.h>
#include <kplib/geometry/numerics/KpRandom.h>
#include <kplib/geometry/shapes/Angle2D.h>
#include <kplib/geometry/shapes/Ellipse2D.h>
#include <kplib/geometry/shapes/KpLine2D.h>
#include <kplib/geometry/shapes/Polygon2D.h>
#include <kplib/threads/ProgressScope.h>

#include <algorithm>
#include <cmath>

namespace {

constexpr int rays = 360;
constexpr float tolerance = 1;  // mm

/// The middle slice, in mm along its rows and columns.
class Slice {
public:
    Slice(const Volume& volume, const KpBitfield& outline) : volume_(volume), outline_(outline) {}

    double pixel() const { return std::min(volume_.spacing[0], volume_.spacing[1]); }
    KpVec2f size() const { return {extent(0), extent(1)}; }

    bool isOutline(long x, long y) const
    {
        const auto voxel = static_cast<unsigned long>(first() + y * volume_.dims[0] + x);
        return voxel < outline_.nBits() && outline_.test(voxel);
    }
    KpVec2f at(long x, long y) const
    {
        return {static_cast<float>(static_cast<double>(x) * volume_.spacing[0]),
                static_cast<float>(static_cast<double>(y) * volume_.spacing[1])};
    }
    /// The byte of the voxel nearest to a place.
    unsigned char grey(const KpVec2f& place) const
    {
        const auto index = [&](int axis) {
            const auto a = static_cast<size_t>(axis);
            const long i = std::lround(static_cast<double>(place[axis]) / volume_.spacing[a]);
            return std::clamp(i, 0L, volume_.dims[a] - 1);
        };
        return volume_.bytes[first() + index(1) * volume_.dims[0] + index(0)];
    }
    long width() const { return volume_.dims[0]; }
    long height() const { return volume_.dims[1]; }

private:
    long first() const { return volume_.dims[2] / 2 * volume_.sliceCount(); }
    float extent(size_t axis) const
    {
        return static_cast<float>(static_cast<double>(volume_.dims[axis] - 1) * volume_.spacing[axis]);
    }

    const Volume& volume_;
    const KpBitfield& outline_;
};

/// What is measured in the slice.
struct Shapes {
    Polygon2D outline, simplified;
    Ellipse2D ellipse;
    Angle2D angle;
};

/// The outermost points of the outline as seen from its middle, a ray a degree.
std::vector<KpVec2f> outermost(const Slice& slice)
{
    std::vector<KpVec2f> found;
    for (long y = 0; y < slice.height(); ++y) {
        for (long x = 0; x < slice.width(); ++x) {
            if (slice.isOutline(x, y))
                found.push_back(slice.at(x, y));
        }
    }
    if (found.empty())
        return found;
    const KpVec2f middle = Polyline2D(found).boundingBox().center();
    std::array<float, rays> farthest{};
    std::array<KpVec2f, rays> points{};
    for (const KpVec2f& p : found) {
        const KpVec2f d = p - middle;
        const double turn = std::atan2(static_cast<double>(d.y()), static_cast<double>(d.x())) / (2 * M_PI) + 0.5;
        const auto ray = static_cast<size_t>(std::min(turn * rays, rays - 1.0));
        if (d.length() > farthest[ray]) {
            farthest[ray] = d.length();
            points[ray] = p;
        }
    }
    std::vector<KpVec2f> outline;
    for (size_t i = 0; i < rays; ++i) {
        if (farthest[i] > 0)
            outline.push_back(points[i]);
    }
    return outline;
}

Shapes measure(const Slice& slice)
{
    Shapes shapes;
    shapes.outline.setVertices(outermost(slice));
    KpDArray<KpVec2f> points, kept;
    for (const KpVec2f& p : shapes.outline)
        points.append(p);
    KpPls::DouglasPeuckerInLoop(points, tolerance, kept);
    shapes.simplified.setVertices({kept.begin(), kept.end()});
    const Rectangle2D box = shapes.outline.boundingBox();
    shapes.ellipse = Ellipse2D::span(box.getUpperLeft(), box.getLowerRight());
    const KpVec2f middle = box.center();
    shapes.angle.setVertices({shapes.outline.closestPoint(box.getUpperLeft()).second, middle,
                              shapes.outline.closestPoint({box.getLowerRight().x(), box.getUpperLeft().y()}).second});
    return shapes;
}

/// By the trapezoids under the sides.
double areaOf(const Polygon2D& polygon)
{
    double twice = 0;
    for (size_t i = 1; i < polygon.size(); ++i) {
        const KpVec2f &a = polygon.at(i - 1), &b = polygon.at(i);
        twice += static_cast<double>(a.x()) * static_cast<double>(b.y()) -
                 static_cast<double>(b.x()) * static_cast<double>(a.y());
    }
    return std::abs(twice) / 2;
}

void drawLine(Picture& picture, const std::vector<KpVec2f>& points, double pixel)
{
    for (size_t i = 1; i < points.size(); ++i) {
        const KpLine2D side(points[i - 1], points[i]);
        const long steps = std::lround(static_cast<double>(side.direction().length()) / pixel * 2) + 1;
        for (long s = 0; s <= steps; ++s) {
            const KpVec2f p = side.position() + side.direction() * (static_cast<float>(s) / static_cast<float>(steps));
            const long column = std::lround(static_cast<double>(p.x()) / pixel);
            const long row = std::lround(static_cast<double>(p.y()) / pixel);
            if (column >= 0 && column < picture.width && row >= 0 && row < picture.height)
                picture.mark(column, row);
        }
    }
}

KpResult draw(const Volume& shown, const Slice& slice, const Shapes& shapes, const OutputFolder& out)
{
    const auto width = static_cast<double>(slice.size().x()), height = static_cast<double>(slice.size().y());
    const double pixel = pixelSize(slice.pixel() / 2, width, height);
    Picture picture(pixelsFor(width, pixel), pixelsFor(height, pixel));
    for (long row = 0; row < picture.height; ++row) {
        for (long column = 0; column < picture.width; ++column)
            picture.set(column, row,
                        slice.grey(KpVec2f(static_cast<float>(static_cast<double>(column) * pixel),
                                           static_cast<float>(static_cast<double>(row) * pixel))));
    }
    drawLine(picture, shapes.simplified.vertices(), pixel);
    drawLine(picture, shapes.ellipse.tesselate(rays), pixel);
    drawLine(picture, shapes.angle.vertices(), pixel);
    drawLetters(picture, lettersOf(shown, toVec(shown.axes[0]), toVec(shown.axes[1])));
    return writePng(picture, out, "measure.png");
}

void addShapes(const Shapes& shapes, KpString& text)
{
    const double degrees = static_cast<double>(shapes.angle.angle().second) * 180 / M_PI;
    text += KpString(0, "%-20s %zu vertices, %.1f mm round, %.1f mm2\n", "outline", shapes.outline.size(),
                     shapes.outline.length(), areaOf(shapes.outline));
    text += KpString(0, "%-20s %zu vertices, %.1f mm round, %.1f mm2\n", "simplified to 1 mm", shapes.simplified.size(),
                     shapes.simplified.length(), areaOf(shapes.simplified));
    text += KpString(0, "%-20s radii %.1f and %.1f mm, %.1f mm round, %.1f mm2\n", "ellipse",
                     static_cast<double>(shapes.ellipse.radiusX()), static_cast<double>(shapes.ellipse.radiusY()),
                     static_cast<double>(shapes.ellipse.circumference()), static_cast<double>(shapes.ellipse.area()));
    text += KpString(0, "%-20s %.1f degrees\n", "angle", degrees);
}

/// The surface of the region in the patient, in mm.
KpDArray<KpVec3f> surfaceOf(const Volume& volume, const KpBitfield& outline, const Space& space)
{
    const KpMat4f toPatient = space.voxels->asTransformation();
    KpDArray<KpVec3f> points;
    for (long z = 0, i = 0; z < volume.dims[2]; ++z) {
        for (long y = 0; y < volume.dims[1]; ++y) {
            for (long x = 0; x < volume.dims[0]; ++x, ++i) {
                if (outline.test(static_cast<unsigned long>(i)))
                    points.append(toPatient.multVecMatrix(
                        KpVec3f(static_cast<float>(x), static_cast<float>(y), static_cast<float>(z))));
            }
        }
    }
    return points;
}

void addPlane(const KpDArray<KpVec3f>& surface, KpString& text)
{
    KpFitPlane fit;
    fit.points() = surface;
    fit.fit();
    const KpVec3f &c = fit.centroid(), &n = fit.normal();
    double sum = 0;
    for (const KpVec3f& p : surface) {
        const auto distance = static_cast<double>((p - c).dot(n));
        sum += distance * distance;
    }
    const auto number = [](float v) { return static_cast<double>(v); };
    text += KpString(0, "%-20s through (%.2f, %.2f, %.2f) mm, normal (%.4f, %.4f, %.4f), mean distance %.2f mm\n",
                     "plane of the surface", number(c.x()), number(c.y()), number(c.z()), number(n.x()), number(n.y()),
                     number(n.z()), std::sqrt(sum / static_cast<double>(std::max(surface.size(), 1L))));
}

/// Moves every hundredth point of the surface by a known motion, shakes it by up to a tenth of a millimetre, and finds
/// the motion again.
void addAlignment(const KpDArray<KpVec3f>& surface, KpString& text)
{
    KpMat4f motion, shift, found;
    motion.setRotate(KpRotation(KpVec3f(1, 2, 3), 0.4F));
    shift.setTranslate(KpVec3f(12, -7, 30));
    motion *= shift;
    KpRandom random(20);
    const auto shake = [&random] { return static_cast<float>((random.next() - 0.5) * 0.2); };
    KpDArray<KpVec3f> from, to;
    for (long i = 0; i < surface.size(); i += 100) {
        from.append(surface[i]);
        to.append(motion.multVecMatrix(surface[i]) + KpVec3f(shake(), shake(), shake()));
    }
    kpAlignPointSets(found, to.data(), from.data(), static_cast<int>(from.size()), 0, nullptr);
    double sum = 0;
    for (long i = 0; i < from.size(); ++i)
        sum += static_cast<double>((found.multVecMatrix(from[i]) - to[i]).squaredLength());
    text += KpString(0, "%-20s %ld pairs of points, mean residual %.4f mm\n", "alignment", from.size(),
                     std::sqrt(sum / static_cast<double>(std::max(from.size(), 1L))));
}

}  // namespace

KpResult measureRoad(const Job& job, const std::string& target, KpProgressInterface& progress)
{
    OutputFolder out;
    if (KpResult opened = out.open(target); opened.isBad())
        return opened;
    const ProgressScope scope(&progress);
    progress.startWorking(4, "");
    Road road(progress);
    Series series;
    HxParamBundle root("Volume");
    Volume volume;
    std::optional<Space> space;
    Region region;
    road.nested("look for images", [&] { return scanSeries(job.folder.c_str(), job.uid, progress, series); });
    road.nested("read images", [&] { return readSeries(series, progress, volume, root); });
    road.nested("segment", [&] {
        space.emplace(series.frameUid(), volume);
        return segment(volume, *space, job.threshold, progress, region);
    });
    road.plain("measure", [&] {
        Volume shown;
        display(volume, windowOf(root, volume), shown);
        const Slice slice(shown, region.outline);
        const Shapes shapes = measure(slice);
        const KpDArray<KpVec3f> surface = surfaceOf(volume, region.outline, *space);
        if (shapes.outline.isEmpty() || surface.size() < 3)
            return badInput("there is nothing to measure in the middle slice");
        KpString text;
        addShapes(shapes, text);
        addPlane(surface, text);
        addAlignment(surface, text);
        KpResult written = draw(shown, slice, shapes, out);
        written << writeText(text, out, "measures.txt");
        return written;
    });
    KpResult result = road.result();
    if (result.isOk())
        result << out.publish();
    return result;
}
