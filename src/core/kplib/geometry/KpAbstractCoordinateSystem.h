#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/geometry/KpMat4f.h>

#include <string>

class KpCoordinateSystem;
class KpFrameOfReference;

/// A space of positions: a node of a tree whose root is a named frame of reference. Systems can be
/// related only if they end at the same frame.
///
/// A child holds its parent, so a parent is an object on the heap that handles hold; a system
/// without children may be any object, and functions that ask it or about it take no handle to it.
/// Systems may be changed, which also moves all child systems. There is no notification. The count
/// of handles is for one thread.
class KPLIB_API KpAbstractCoordinateSystem : public KpHandable {
public:
    /// The root this system ends at; null if it floats.
    virtual KpHandle<const KpFrameOfReference> frameOfReference() const = 0;
    /// The parent; null for a root or a system that floats.
    virtual KpHandle<const KpAbstractCoordinateSystem> parent() const = 0;
    /// From this system to its parent.
    virtual KpMat4f asTransformation() const = 0;
    /// From this system to the root.
    virtual KpMat4f asTransformationToFrameOfReference() const = 0;
    /// One name and its value as in a JSON object, without the braces around.
    virtual std::string dump() const = 0;

    /// A new system with this one as its parent, in the same place. This one lives on the heap.
    KpHandle<KpCoordinateSystem> createChildSystem() const;
};
