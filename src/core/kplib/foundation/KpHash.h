#pragma once

#include <kplib/foundation/Kp128.h>
#include <kplib/foundation/KpID.h>

#include <cstdint>

// Hashes of 32 bits. They are cheap and do not mix bits; the containers that use them allow for
// that. The hashes of vectors, digests and UUIDs are in the headers of these types.

/// h * 9 + c over the characters, which count as signed; 0 for an empty text.
constexpr unsigned int kp_hash(const char* s)
{
    unsigned int h = 0;
    for (; *s != '\0'; ++s)
        h = h * 9 + static_cast<unsigned int>(static_cast<signed char>(*s));
    return h;
}

/// The low 32 bits.
constexpr unsigned int kp_hash(long long v)
{
    return static_cast<unsigned int>(v);
}

/// The low 32 bits of the address.
inline unsigned int kp_hash(const void* p)
{
    return static_cast<unsigned int>(reinterpret_cast<std::uintptr_t>(p));
}

/// The low 32 bits of the first word.
constexpr unsigned int kp_hash(const Kp128& v)
{
    return static_cast<unsigned int>(v.first);
}

/// The hash of an identifier is that of its value.
template <typename T, T empty>
constexpr unsigned int kp_hash(KpID<T, empty> id)
{
    return kp_hash(static_cast<long long>(id.value()));
}
/// As above.
template <typename T>
constexpr unsigned int kp_hash(const KpID_C<T>& id)
{
    return kp_hash(id.value());
}

/// kp_hash() under the name that Qt's hash containers use.
template <typename T, T empty>
constexpr unsigned int qHash(KpID<T, empty> id)
{
    return kp_hash(id);
}
/// As above.
template <typename T>
constexpr unsigned int qHash(const KpID_C<T>& id)
{
    return kp_hash(id);
}
