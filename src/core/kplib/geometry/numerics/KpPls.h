#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// Polyline simplification: keeps those points of a line that matter within a tolerance, in the units of the points.
///
/// D. H. Douglas and T. K. Peucker, "Algorithms for the reduction of the number of points required to represent a
/// digitized line or its caricature", 1973; K. Reumann and A. P. M. Witkam, "Optimizing curve segmentation in computer
/// graphics", 1974. `result` may be `points`. Pure functions.
class KPLIB_API KpPls {
public:
    KpPls() = delete;

    /// Keeps the ends, and of each stretch the point farthest from the line through its ends, if that is farther than
    /// `tolerance`. Of a line whose ends coincide nothing is kept, of a single point neither: use the next one. O(n log
    /// n) mostly, O(n^2) at worst.
    static void DouglasPeucker(const KpDArray<KpVec2f>& points, float tolerance, KpDArray<KpVec2f>& result);
    /// The same for a closed line, in two halves: from the first point to the one farthest from it, and back.
    static void DouglasPeuckerInLoop(const KpDArray<KpVec2f>& points, float tolerance, KpDArray<KpVec2f>& result);

    /// Keeps the ends, and each last point that still lies within a strip of `tolerance` on both sides of the line from
    /// the point kept before. O(n).
    static void ReumannWitkam(const KpDArray<KpVec2f>& points, float tolerance, KpDArray<KpVec2f>& result);
    static void ReumannWitkam(KpDArray<KpVec2f>& points, float tolerance);  ///< in place

    /// Sets the bits of those points from `first` to `last` that DouglasPeucker() keeps.
    static void DouglasPeuckerImpl(const KpDArray<KpVec2f>& points, KpBitfield& marks, long first, long last,
                                   float tolerance);
    /// The points whose bits are set, in their order.
    static void extractMarkedPoints(const KpDArray<KpVec2f>& points, const KpBitfield& marks,
                                    KpDArray<KpVec2f>& result);
};
