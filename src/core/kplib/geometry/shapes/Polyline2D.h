#pragma once

#include <kplib/geometry/shapes/Rectangle2D.h>
#include <kplib/geometry/shapes/Shape2D.h>

#include <utility>
#include <vector>

/// A line through a list of vertices. boundingBox() keeps its result, so that it changes the
/// object: threads that share one need a lock, also for reading.
class KPLIB_API Polyline2D : public Shape2D {
public:
    Polyline2D() = default;
    /// A line through these vertices.
    explicit Polyline2D(std::vector<KpVec2f> vertices) : vertices_(std::move(vertices)) {}

    std::vector<KpVec2f> vertices() const override { return vertices_; }
    /// @{
    /// The vertices as a range.
    std::vector<KpVec2f>::const_iterator begin() const { return vertices_.begin(); }
    std::vector<KpVec2f>::const_iterator end() const { return vertices_.end(); }
    /// @}

    /// Number of vertices.
    size_t size() const { return vertices_.size(); }
    /// Checked: std::out_of_range.
    const KpVec2f& at(size_t i) const { return vertices_.at(i); }

    // Each change drops the bounding box that is kept.

    /// Replaces all vertices.
    virtual void setVertices(std::vector<KpVec2f> vertices);
    /// Adds a vertex at the end.
    virtual void append(KpVec2f v);
    /// Not checked.
    void set(size_t i, const KpVec2f& v);
    /// Removes all vertices.
    void clear();
    /// Adds `v` to all vertices.
    void offset(KpVec2f v);
    /// Drops the bounding box.
    void invalidateBoundingBox() { isBoxValid_ = false; }

    /// No vertices.
    bool isEmpty() const override { return vertices_.empty(); }
    /// At least three vertices, and the last one exactly the first.
    bool isClosed() const;
    /// Appends the first vertex, unless it is closed. False with fewer than three.
    bool close();

    /// Of one vertex that vertex; none without.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
    /// Four zeros without vertices.
    Rectangle2D boundingBox() const override;
    bool equals(const AbstractShape2D& other) const override;

    /// The sum of the lengths of the segments.
    double length() const;
    /// One less than vertices; 0 without.
    size_t numberOfSegments() const { return vertices_.empty() ? 0 : vertices_.size() - 1; }
    /// The distance of the vertices 2 `i` and 2 `i` + 1: here a segment is a pair of vertices,
    /// unlike those that numberOfSegments() counts. 0 without that pair.
    float lengthOfSegment(size_t i) const;

protected:
    /// The vertices, for derived classes with rules of their own for them.
    std::vector<KpVec2f>& changeVertices()
    {
        invalidateBoundingBox();
        return vertices_;
    }

private:
    std::vector<KpVec2f> vertices_;
    mutable bool isBoxValid_ = false;
    mutable Rectangle2D box_;
};
