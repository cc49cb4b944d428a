#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <cstdint>

/// A short vector of components of one type that lie elsewhere: it owns nothing, and copies of it share them.
///
/// Complex, string, uint and sbyte components are carried, but not computed with. No lock: what it points at is guarded
/// by the owner of the buffer.
class KPLIB_API KpTypedElement {
public:
    KpTypedElement() = default;
    KpTypedElement(KpTypedPointer components, std::int32_t count) :
        data_(components.data), type_(components.type), n_(count)
    {
    }

    /// Adds or subtracts component by component in the arithmetic of this element's type: integers wrap. Type and count
    /// of `other` are taken to be this one's, unchecked. A type that isn't a number: nothing happens.
    KpTypedElement& operator+=(const KpTypedElement& other);
    KpTypedElement& operator-=(const KpTypedElement& other);

    /// Square root of the sum of the squares, in double and in the order of the components; 0 without components and
    /// for a type that isn't a number.
    double length() const;

    void* data() const { return data_; }
    KpPrimType type() const { return type_; }
    std::int32_t n() const { return n_; }

private:
    void* data_ = nullptr;
    KpPrimType type_;
    std::int32_t n_ = 0;
};
