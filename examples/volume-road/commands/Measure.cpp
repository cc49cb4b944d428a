#include "../pictures/Letters.h"
#include "../report/Lines.h"
#include "../volume/Segment.h"
#include "../volume/SliceShapes.h"
#include "Commands.h"
#include "Load.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/numerics/KpAlignPointSets.h>
#include <kplib/geometry/numerics/KpFitPlane.h>
#include <kplib/geometry/numerics/KpRandom.h>
#include <kplib/geometry/shapes/KpLine2D.h>
#include <kplib/threads/ProgressScope.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace {

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

KpResult draw(const Volume& shown, const MiddleSlice& slice, const SliceShapes& shapes, const OutputFolder& out)
{
    constexpr int sides = 360;
    const auto width = static_cast<double>(slice.size().x()), height = static_cast<double>(slice.size().y());
    const double pixel = pixelSize(slice.pixel() / 2, width, height);
    Picture picture(pixelsFor(width, pixel), pixelsFor(height, pixel));
    for (long row = 0; row < picture.height; ++row) {
        for (long column = 0; column < picture.width; ++column) {
            const KpVec2f place(static_cast<float>(static_cast<double>(column) * pixel),
                                static_cast<float>(static_cast<double>(row) * pixel));
            std::copy_n(slice.colour(place).data(), 3, picture.at(column, row));
        }
    }
    drawLine(picture, shapes.simplified.vertices(), pixel);
    drawLine(picture, shapes.ellipse.tesselate(sides), pixel);
    drawLine(picture, shapes.angle.vertices(), pixel);
    drawLetters(picture, lettersOf(shown, KpVec3f(shown.axes[0]), KpVec3f(shown.axes[1])));
    return writePng(picture, out, "measure.png");
}

double wide(float v)
{
    return static_cast<double>(v);
}

void addOutline(const char* name, const Polygon2D& outline, Lines& lines)
{
    lines.add(name,
              KpString(0, "%zu vertices, %.1f mm round, %.1f mm2", outline.size(), outline.length(), areaOf(outline)),
              {{"vertices", outline.size()}, {"length", outline.length()}, {"area", areaOf(outline)}});
}

void addShapes(const SliceShapes& shapes, Lines& lines)
{
    addOutline("outline", shapes.outline, lines);
    addOutline("simplified to 1 mm", shapes.simplified, lines);
    const Ellipse2D& e = shapes.ellipse;
    const double length = wide(e.circumference()), area = wide(e.area()), x = wide(e.radiusX()), y = wide(e.radiusY());
    lines.add("ellipse", KpString(0, "radii %.1f and %.1f mm, %.1f mm round, %.1f mm2", x, y, length, area),
              {{"radii", {x, y}}, {"length", length}, {"area", area}});
    const double degrees = wide(shapes.angle.angle().second) * 180 / M_PI;
    lines.add("angle", KpString(0, "%.1f degrees", degrees), degrees);
}

/// The surface of the region in the patient, in mm.
KpDArray<KpVec3f> surfaceOf(const Volume& volume, const KpBitfield& outline, const Space& space)
{
    const KpMat4f toPatient = space.voxels->asTransformation();
    KpDArray<KpVec3f> points;
    for (long z = 0, i = 0; z < volume.dims[2]; ++z) {
        const auto level = static_cast<float>(volume.height(z) / volume.spacing[2]);
        for (long y = 0; y < volume.dims[1]; ++y) {
            for (long x = 0; x < volume.dims[0]; ++x, ++i) {
                if (outline.test(static_cast<unsigned long>(i)))
                    points.append(
                        toPatient.multVecMatrix(KpVec3f(static_cast<float>(x), static_cast<float>(y), level)));
            }
        }
    }
    return points;
}

void addPlane(const KpDArray<KpVec3f>& surface, Lines& lines)
{
    KpFitPlane fit;
    fit.points() = surface;
    fit.fit();
    const KpVec3d c(fit.centroid()), n(fit.normal());
    double sum = 0;
    for (const KpVec3f& p : surface)
        sum += wide((p - fit.centroid()).dot(fit.normal())) * wide((p - fit.centroid()).dot(fit.normal()));
    const double distance = std::sqrt(sum / static_cast<double>(std::max(surface.size(), 1L)));
    lines.add("plane of the surface",
              KpString(0, "through (%.2f, %.2f, %.2f) mm, normal (%.4f, %.4f, %.4f), mean distance %.2f mm", c.x(),
                       c.y(), c.z(), n.x(), n.y(), n.z(), distance),
              {{"through", {c.x(), c.y(), c.z()}}, {"normal", {n.x(), n.y(), n.z()}}, {"distance", distance}});
}

/// Moves every hundredth point of the surface by a known motion, shakes it by up to a tenth of a millimetre, and finds
/// the motion again.
void addAlignment(const KpDArray<KpVec3f>& surface, Lines& lines)
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
        sum += wide((found.multVecMatrix(from[i]) - to[i]).squaredLength());
    const double residual = std::sqrt(sum / static_cast<double>(std::max(from.size(), 1L)));
    lines.add("alignment", KpString(0, "%ld pairs of points, mean residual %.4f mm", from.size(), residual),
              {{"pairs", from.size()}, {"residual", residual}});
}

struct Work {
    Series series;
    HxParamBundle root{"Volume"};
    Volume volume;
    std::optional<Space> space;
    Region region;
};

KpResult measureRegion(Work& work, const Job& job, const OutputFolder& out)
{
    if (!work.volume.isPlaneScaled)
        return badInput("the pixel spacing is unknown: there is nothing to measure in mm");
    Volume shown;
    display(work.volume, windowOf(work.series.windows, work.volume), shown);
    const MiddleSlice slice(shown, work.region.outline);
    const SliceShapes shapes = shapesOf(slice);
    const KpDArray<KpVec3f> surface = surfaceOf(work.volume, work.region.outline, *work.space);
    if (shapes.outline.isEmpty() || surface.size() < 3)
        return badInput("there is nothing to measure in the middle slice");
    Lines lines;
    addShapes(shapes, lines);
    if (work.volume.isScaled) {
        addPlane(surface, lines);
        addAlignment(surface, lines);
    }
    if (work.volume.components == 3)
        lines.add("measured on", "the luminance of the colours");
    for (const std::string& warning : work.series.warnings)
        lines.add("warning", warning.c_str());
    KpResult written = draw(shown, slice, shapes, out);
    written << (job.isJson ? writeText(lines.json(), out, "measures.json")
                           : writeText(lines.text(), out, "measures.txt"));
    return written;
}

}  // namespace

KpResult measure(const Job& job, KpProgressInterface& progress)
{
    OutputFolder out;
    if (KpResult opened = out.open(job.target); opened.isBad())
        return opened;
    const ProgressScope scope(&progress);
    progress.startWorking(4, "");
    Road road(progress);
    Work work;
    loadSeries(job, road, progress, work.series, work.volume, work.root);
    road.nested("segment", [&] {
        work.space.emplace(work.series.frameUid(), work.volume);
        return segment(work.volume, *work.space, job.threshold, progress, work.region);
    });
    road.plain("measure", [&] { return measureRegion(work, job, out); });
    KpResult result = road.result();
    if (result.isOk())
        result << out.publish();
    return result;
}
