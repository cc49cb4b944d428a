#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <cstdint>

/// A short vector of components of one type in memory that is owned elsewhere. Copies refer to the
/// same components.
///
/// Complex, string, uint and sbyte components are accepted but not computed with. No lock: the
/// owner of the buffer guards the memory.
class KPLIB_API KpTypedElement {
public:
    KpTypedElement() = default;
    /// The `count` components that start at an address.
    KpTypedElement(KpTypedPointer components, std::int32_t count) :
        data_(components.data), type_(components.type), n_(count)
    {
    }

    /// Adds or subtracts component by component in the arithmetic of this element's type: integers
    /// wrap. Precondition: `other` has the same type and count. Does nothing for a type that is
    /// not numeric.
    KpTypedElement& operator+=(const KpTypedElement& other);
    /// As above.
    KpTypedElement& operator-=(const KpTypedElement& other);

    /// Square root of the sum of the squares, in double and in the order of the components; 0 without components and
    /// for a type that isn't a number.
    double length() const;

    /// The first component.
    void* data() const { return data_; }
    /// Type of the components.
    KpPrimType type() const { return type_; }
    /// Number of components.
    std::int32_t n() const { return n_; }

private:
    void* data_ = nullptr;
    KpPrimType type_;
    std::int32_t n_ = 0;
};
