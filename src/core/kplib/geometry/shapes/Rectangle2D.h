#pragma once

#include <kplib/geometry/shapes/Shape2D.h>

#include <utility>
#include <vector>

/// A rectangle along the axes, y downward. Its first corner is the upper left one and its second
/// the lower right one, unless it was made otherwise: they are not sorted axis by axis.
class KPLIB_API Rectangle2D : public Shape2D {
public:
    /// Empty: four zeros.
    Rectangle2D() = default;
    /// From two corners, exchanged as a whole if the first is greater, by x and then by y. So the
    /// upper right and the lower left corner of an area give one whose corners run the wrong way
    /// in y.
    Rectangle2D(const KpVec2f& a, const KpVec2f& b);

    // Without sorting.

    /// @{
    /// From a centre or a position, and a size.
    static Rectangle2D fromCenterAndHalfSize(const KpVec2f& center, const KpVec2f& halfSize);
    void setCenterAndHalfSize(const KpVec2f& center, const KpVec2f& halfSize);
    static Rectangle2D fromPositionAndSize(const KpVec2f& position, const KpVec2f& size);
    void setPositionAndSize(const KpVec2f& position, const KpVec2f& size);
    /// @}

    /// The centre.
    KpVec2f center() const { return (upperLeft_ + lowerRight_) / 2.0F; }
    /// Never negative.
    KpVec2f size() const;
    /// The first corner.
    const KpVec2f& getUpperLeft() const { return upperLeft_; }
    /// The second corner.
    const KpVec2f& getLowerRight() const { return lowerRight_; }

    /// Borders included; nothing lies in one whose corners run the wrong way.
    bool contains(const KpVec2f& p) const;
    /// Grows to hold `other`.
    void merge(const Rectangle2D& other);

    /// Five: round from the upper left corner by the upper right one, and back to it.
    std::vector<KpVec2f> vertices() const override;
    /// `p` itself within the area, whichever way the corners run.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
    /// The rectangle itself.
    Rectangle2D boundingBox() const override { return *this; }
    /// Four zeros.
    bool isEmpty() const override;
    bool equals(const AbstractShape2D& other) const override;

private:
    KpVec2f upperLeft_{0, 0};
    KpVec2f lowerRight_{0, 0};
};
