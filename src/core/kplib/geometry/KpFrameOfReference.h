#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpAbstractCoordinateSystem.h>

#include <string>
#include <utility>

/// A root of coordinate systems, named by an id such as that of a scanner's frame. Frames of the
/// same id are the same space.
class KPLIB_API KpFrameOfReference : public KpAbstractCoordinateSystem {
public:
    /// The frame of that id.
    explicit KpFrameOfReference(std::string id) : id_(std::move(id)) {}

    /// The id.
    const std::string& id() const { return id_; }
    /// Whether the ids are equal.
    friend bool operator==(const KpFrameOfReference& a, const KpFrameOfReference& b) { return a.id_ == b.id_; }

    /// A handle to this object, which must live on the heap: the last handle deletes it.
    KpHandle<const KpFrameOfReference> frameOfReference() const override;
    /// Null.
    KpHandle<const KpAbstractCoordinateSystem> parent() const override;
    /// The identity.
    KpMat4f asTransformation() const override;
    KpMat4f asTransformationToFrameOfReference() const override;
    /// "FrameOfReference":{"id":"...","parent": {}}
    std::string dump() const override;

private:
    std::string id_;
};
