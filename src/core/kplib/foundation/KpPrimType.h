#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

/// Type of the elements of typed memory. The numbers are part of messages and files and never
/// change.
class KPLIB_API KpPrimType {
public:
    /// The element types.
    enum Type : std::int32_t {
        Byte = 0,     ///< unsigned 8 bit
        Short = 1,    ///< signed 16 bit
        Int = 2,      ///< signed 32 bit
        Float = 3,    ///< IEEE 754 single
        Double = 4,   ///< IEEE 754 double
        Complex = 5,  ///< two singles, real and imaginary
        String = 6,   ///< a reference to text
        UShort = 7,   ///< unsigned 16 bit; after String, since the number is part of the wire format
        UInt = 8,     ///< unsigned 32 bit: has a name, a size and a wire form, but no typed operation
        SByte = 9,    ///< signed 8 bit: as UInt
    };
    /// Number of element types.
    static constexpr int NumTypes = 10;

    /// Names ("byte", "short" ...) and sizes in bytes, indexed by the value; valid for 0 to 9 only.
    static const char* const primTypeName[NumTypes];
    /// Sizes in bytes, as above.
    static const std::int32_t primTypeSize[NumTypes];

    /// Of that type.
    constexpr KpPrimType(Type type = Byte) : type_(type) {}

    /// From a number, such as one read from a message. Any number is stored unchanged.
    constexpr explicit KpPrimType(std::int32_t number) : type_(static_cast<Type>(number)) {}

    /// Sets `type` to the type of that exact name. Returns false, and leaves `type` unchanged, for
    /// an unknown name.
    static bool nameToType(const char* name, Type& type);

    /// The enumerator, for switches and comparisons.
    constexpr operator Type() const { return type_; }

    /// Whether this is one of the ten types.
    constexpr bool isValid() const { return static_cast<std::uint32_t>(type_) < NumTypes; }

    /// Whether the library computes with elements of this type: byte, short, int, float, double and ushort.
    constexpr bool isNumber() const;

    /// The name, or "unknown" for a value outside the ten types.
    const char* name() const { return isValid() ? primTypeName[type_] : "unknown"; }
    /// The size in bytes, or 0 for a value outside the ten types.
    int size() const { return isValid() ? primTypeSize[type_] : 0; }

private:
    Type type_;
};

// Switches over the types list each of them and have no default, so that the compiler names the places that a new type
// has to be added to.

constexpr bool KpPrimType::isNumber() const
{
    switch (type_) {
    case Byte:
    case Short:
    case Int:
    case Float:
    case Double:
    case UShort:
        return true;
    case Complex:
    case String:
    case UInt:
    case SByte:
        break;
    }
    return false;
}
