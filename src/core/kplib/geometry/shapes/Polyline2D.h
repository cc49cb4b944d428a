#pragma once

#include <kplib/geometry/shapes/Rectangle2D.h>
#include <kplib/geometry/shapes/Shape2D.h>

#include <utility>
#include <vector>

/// A line through a list of vertices. boundingBox() caches its result and so changes the object:
/// threads that share one need a lock for reading too.
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
    /// Vertex `i`. Throws std::out_of_range if there is none.
    const KpVec2f& at(size_t i) const { return vertices_.at(i); }

    // Each change invalidates the cached bounding box.

    /// Replaces all vertices.
    virtual void setVertices(std::vector<KpVec2f> vertices);
    /// Adds a vertex at the end.
    virtual void append(KpVec2f v);
    /// Replaces vertex `i`, which is not checked.
    void set(size_t i, const KpVec2f& v);
    /// Removes all vertices.
    void clear();
    /// Adds `v` to all vertices.
    void offset(KpVec2f v);
    /// Invalidates the cached bounding box.
    void invalidateBoundingBox() { isBoxValid_ = false; }

    /// Whether there are no vertices.
    bool isEmpty() const override { return vertices_.empty(); }
    /// Whether there are at least three vertices and the last one equals the first exactly.
    bool isClosed() const;
    /// Appends the first vertex if the line is not closed. Returns false if there are fewer than
    /// three vertices.
    bool close();

    /// The nearest point of the line. For a single vertex that vertex; for none the flag is false.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
    /// The bounding box, cached; four zeros without vertices.
    Rectangle2D boundingBox() const override;
    bool equals(const AbstractShape2D& other) const override;

    /// The sum of the lengths of the segments.
    double length() const;
    /// The number of vertices less one, or 0 without vertices.
    size_t numberOfSegments() const { return vertices_.empty() ? 0 : vertices_.size() - 1; }
    /// The distance of the vertices 2 `i` and 2 `i` + 1: here a segment is a pair of vertices,
    /// unlike in numberOfSegments(). 0 if there is no such pair.
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
