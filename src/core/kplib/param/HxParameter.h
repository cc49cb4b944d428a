#pragma once

#include <kplib/foundation/KpPrimType.h>
#include <kplib/param/HxParamBase.h>

/// A named array of values of one primitive type, or a text.
///
/// Setters may change the type. Each counts as a change, even if the values are equal, unless its
/// argument is the stored block itself. Indices are not checked. Exhausted memory throws
/// KpMemoryException and leaves the parameter unchanged.
class KPLIB_API HxParameter : public HxParamBase {
public:
    /// A new text parameter, owned by the caller.
    static HxParameter* create(const char* name, const char* text);

    /// A text, a number, or `n` numbers, copied; n = 0 leaves the value null.
    HxParameter(const char* name, const char* text);
    /// @{
    /// As above.
    HxParameter(const char* name, int v);
    HxParameter(const char* name, double v);
    HxParameter(const char* name, int n, const int* values);
    HxParameter(const char* name, int n, const float* values);
    HxParameter(const char* name, int n, const double* values);
    /// @}

    /// `n` values of any type. With null `data` they are uninitialised, to be filled through value(). For a text,
    /// `data` is the text, copied, and null gives a null value.
    HxParameter(const char* name, int n, KpPrimType type, const void* data);

    /// As HxParamBase: a copy outside any tree.
    HxParameter(const HxParameter& other);
    /// Copies name, flags and value. The change of the value is recorded in the bundles above
    /// only.
    HxParameter& operator=(const HxParameter& other);

    HxParameter* duplicate() const override;
    ~HxParameter() override;

    /// Sets a text (null: the empty one) or `n` numbers, and records TouchValue. The source may lie in the old value.
    void set(const char* text);
    /// @{
    /// As above.
    void set(int n, const int* values);
    void set(int n, const float* values);
    void set(int n, const double* values);
    /// @}

    int dimension() const { return dimension_; }  ///< number of values, 1 for a text
    /// Type of the values.
    KpPrimType primType() const { return primType_; }
    void* value() { return value_; }  ///< dimension() elements or the text; null if there is no storage
    /// As above.
    const void* value() const { return value_; }

    /// The text of the value. Numbers are written into one of four process-wide, unlocked strings
    /// in rotation, so that the last four results are valid. Null only for a text constructed from
    /// null.
    const char* getString() const
    {
        return primType_ == KpPrimType::String ? static_cast<const char*>(value_) : numbersAsString();
    }

    /// Adds the values to `out`, which is cleared first unless `append`: numbers with a blank between them, integers in
    /// decimal, floats by "%.8g", doubles by "%.12g", nothing for other types; a text without its double quotes. If
    /// memory runs out, `out` holds a part of it.
    void print(KpString& out, bool append = false) const;

    /// Element `i` as an int. Floating-point numbers are truncated after 0.5 is added, negative
    /// ones too; a number outside the range of int gives INT_MIN. Of a complex number the real
    /// part is used, of a text the number at its start, whatever `i` is. 0 for other types.
    int getNum(int i) const;
    /// As getNum(), without rounding.
    double getReal(int i) const;

    /// All elements into an array of dimension() elements.
    void getNum(int* out) const;
    /// As above, in double precision.
    void getReal(double* out) const;

    /// Whether the stored block is `data`, or holds the same `n` bytes with `type` Byte. Any other
    /// type differs, even from itself, so that each set() is a change.
    bool isEqual(int n, KpPrimType type, const void* data) const;

    /// Equal names, and a value that isEqual() to that of `other`.
    bool operator==(const HxParameter& other) const;

    /// The value in the leaf of a DICOM tree, "description: value": what follows the first colon and one more
    /// character, whatever that is. False, and `out` stays, if nothing follows the colon.
    bool getBundleTagValue(const char*& out) const;

private:
    void assign(int n, KpPrimType type, const void* data);
    const char* text() const { return value_ ? static_cast<const char*>(value_) : ""; }
    const char* numbersAsString() const;
    unsigned long storedBytes() const;

    int dimension_;
    KpPrimType primType_;
    void* value_;
};
