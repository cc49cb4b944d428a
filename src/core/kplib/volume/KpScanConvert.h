#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2f.h>

/// Converts polygons of any shape to spans of pixels by the even-odd rule: a pixel belongs to the
/// polygon if its centre, at +0.5 in x and y, does. P. S. Heckbert, "Concave polygon scan
/// conversion", Graphics Gems, 1990.
///
/// Rows are reported in ascending order, the spans of a row from left to right. Distinct threads
/// may render at once, and a callback may render with another object.
class KPLIB_API KpScanConvert {
public:
    /// Receives the pixels from `xLeft` to `xRight`, both included, of row `y`.
    using SpanCB = void (*)(void* userData, int xLeft, int xRight, int y);
    /// Receives one pixel.
    using PixelCB = void (*)(void* userData, int x, int y);

    /// Reports pixels from (x0, y0) to (x1, y1), both included.
    KpScanConvert(int x0, int y0, int x1, int y1) : window_{x0, y0, x1, y1} {}

    /// Sets the receiver of each span, its ends included, in place of the pixel callback; and the
    /// first argument of both.
    void setSpanCB(SpanCB callback, void* userData)
    {
        spanCB_ = callback;
        userData_ = userData;
    }
    /// Sets the receiver of each pixel, from left to right, used while no span callback is set;
    /// and the first argument of both.
    void setPixelCB(PixelCB callback, void* userData)
    {
        pixelCB_ = callback;
        userData_ = userData;
    }

    /// Reports the polygon of `n` vertices, closed implicitly. Fewer than 3 vertices enclose
    /// nothing. O(n log n), and a few comparisons for each span. Polygons of a few hundred
    /// vertices allocate nothing; larger ones may throw std::bad_alloc.
    void render(int n, const KpVec2f* points);

    /// The span callback at the start: passes the pixels to the pixel callback of the object that
    /// renders.
    static void defaultSpanCB(void* userData, int xLeft, int xRight, int y);
    /// Passes a span to the span callback of the object that renders. Both do nothing if none does
    /// on this thread.
    static void concaveCB(int y, int xLeft, int xRight);

private:
    void* userData_ = nullptr;
    SpanCB spanCB_ = defaultSpanCB;
    PixelCB pixelCB_ = nullptr;
    int window_[4];
};
