#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/numerics/KpDelaunay.h>

#include <algorithm>
#include <cstdio>
#include <memory>

namespace {

struct Close {
    void operator()(FILE* f) const { std::fclose(f); }
};

template <typename... Floats>
void print(FILE* f, const char* format, Floats... values)
{
    std::fprintf(f, format, static_cast<double>(values)...);
}

void writeFrame(FILE* f, const KpVec2f& range)
{
    const float dx = range.x(), dy = range.y(), m = std::max(dx, dy);
    const KpVec2f offset = dx > dy ? KpVec2f(0, (1 - dy / dx) / 2) : KpVec2f((1 - dx / dy) / 2, 0);
    print(f, "%g %g translate\n%g %g scale\n", offset.x(), offset.y(), 1 / m, 1 / m);
}

void writeTriangles(FILE* f, const KpVec2f* points, int n, const KpDArray<KpDelaunay::Triangle>& triangles)
{
    KpVec2f low = points[0], high = low;
    for (int i = 1; i < n; ++i)
        for (int axis = 0; axis < 2; ++axis) {
            low[axis] = std::min(low[axis], points[i][axis]);
            high[axis] = std::max(high[axis], points[i][axis]);
        }
    writeFrame(f, high - low);
    std::fprintf(f, "0 setlinewidth\n");
    for (const KpDelaunay::Triangle& t : triangles) {
        const KpVec2f a = points[t[0]] - low, b = points[t[1]] - low, c = points[t[2]] - low;
        print(f, "%g %g M %g %g L %g %g L CS\n", a.x(), a.y(), b.x(), b.y(), c.x(), c.y());
    }
}

}  // namespace

bool KpDelaunay::writeEPS(const char* path, KpVec2f* points, int n, KpDArray<Triangle>& triangles)
{
    const std::unique_ptr<FILE, Close> file(std::fopen(path, "w"));
    if (!file)
        return false;
    std::fprintf(file.get(), "%%!PS-Adobe-2.0 EPSF-2.0\n"
                             "%%%%BoundingBox: 84 207 511 634\n"
                             "/M  { moveto } bind def\n"
                             "/L { lineto } bind def\n"
                             "/CS { closepath stroke } bind def\n"
                             "85 208 translate\n"
                             "425 425 scale\n");
    if (n > 0)
        writeTriangles(file.get(), points, n, triangles);
    std::fprintf(file.get(), "showpage\n");
    return true;
}
