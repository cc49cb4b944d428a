#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/geometry/KpMat4f.h>

#include <string>

class KpCoordinateSystem;
class KpFrameOfReference;

/// A coordinate system in a tree whose root is a named frame of reference. Two systems are related
/// only if they have the same root.
///
/// Ownership: a child holds a handle to its parent, so every parent must live on the heap and be
/// held by handles. A system without children may be any object. Functions that are called on it
/// or take it as an argument hold no handle to it unless they say so.
///
/// Changes: a change of a system also moves all its child systems. No notification is sent.
///
/// Threads: the count of handles is for one thread.
class KPLIB_API KpAbstractCoordinateSystem : public KpHandable {
public:
    /// The root of the tree; null for a system without a root, which floats.
    virtual KpHandle<const KpFrameOfReference> frameOfReference() const = 0;
    /// The parent; null for a root or a system that floats.
    virtual KpHandle<const KpAbstractCoordinateSystem> parent() const = 0;
    /// The transformation from this system to its parent.
    virtual KpMat4f asTransformation() const = 0;
    /// The transformation from this system to the root.
    virtual KpMat4f asTransformationToFrameOfReference() const = 0;
    /// One name and its value as in a JSON object, without the surrounding braces.
    virtual std::string dump() const = 0;

    /// Returns a new system at the same place, with this one as its parent. This one must live on
    /// the heap.
    KpHandle<KpCoordinateSystem> createChildSystem() const;
};
