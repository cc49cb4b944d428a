#pragma once

#include <kplib/geometry/shapes/Shape2D.h>

#include <utility>
#include <vector>

/// A rectangle along the axes, y downward. Its first corner is the upper left one and its second
/// the lower right one, unless it is constructed otherwise: corners are not sorted axis by axis.
class KPLIB_API Rectangle2D : public Shape2D {
public:
    /// Empty: four zeros.
    Rectangle2D() = default;
    /// From two corners, which are exchanged as a whole if the first is greater, by x and then by
    /// y. So the upper right and the lower left corner of an area give a rectangle whose corners
    /// are reversed in y.
    Rectangle2D(const KpVec2f& a, const KpVec2f& b);

    // The corners are not sorted.

    /// @{
    /// From a centre or a position, and a size.
    static Rectangle2D fromCenterAndHalfSize(const KpVec2f& center, const KpVec2f& halfSize);
    void setCenterAndHalfSize(const KpVec2f& center, const KpVec2f& halfSize);
    static Rectangle2D fromPositionAndSize(const KpVec2f& position, const KpVec2f& size);
    void setPositionAndSize(const KpVec2f& position, const KpVec2f& size);
    /// @}

    /// The centre.
    KpVec2f center() const { return (upperLeft_ + lowerRight_) / 2.0F; }
    /// The size, never negative.
    KpVec2f size() const;
    /// The first corner.
    const KpVec2f& getUpperLeft() const { return upperLeft_; }
    /// The second corner.
    const KpVec2f& getLowerRight() const { return lowerRight_; }

    /// Whether `p` is inside, borders included. False for each point if the corners are reversed
    /// on an axis.
    bool contains(const KpVec2f& p) const;
    /// Extends the rectangle to contain `other`.
    void merge(const Rectangle2D& other);

    /// Five vertices: the upper left, upper right, lower right and lower left corner, and the
    /// first one again.
    std::vector<KpVec2f> vertices() const override;
    /// The nearest point of the area, `p` itself if inside, independent of the order of the
    /// corners.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
    /// The rectangle itself.
    Rectangle2D boundingBox() const override { return *this; }
    /// Whether all four numbers are zero.
    bool isEmpty() const override;
    bool equals(const AbstractShape2D& other) const override;

private:
    KpVec2f upperLeft_{0, 0};
    KpVec2f lowerRight_{0, 0};
};
