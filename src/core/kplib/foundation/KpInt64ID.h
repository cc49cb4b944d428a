#pragma once

#include <kplib/foundation/KpID.h>
#include <kplib/foundation/KpString.h>

/// Base of the identifiers of 64 bits that people read and write: conversion from and to text.
/// `ID` is the class that derives from it; their empty values differ, so that identifiers of two
/// kinds cannot be compared.
template <typename ID, long long empty>
class KpInt64ID : public KpID<long long, empty> {
public:
    using KpID<long long, empty>::KpID;

    /// The value in decimal.
    KpString toKpString() const { return KpString::fromInt64(this->value()); }
    /// The decimal number at the start of `text`; 0 without one, whether or not that is the empty value.
    static ID fromLatin1(const char* text) { return ID(KpString::toInt64(text)); }
    /// The id of that number.
    static ID fromInt64(long long value) { return ID(value); }
};
