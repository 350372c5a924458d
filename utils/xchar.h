/// @file
/// The code units that strings are made of.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// A UTF-8 code unit, or a byte of ASCII text. No result depends on whether plain char is signed.
typedef char char8;

/// A UTF-16 code unit in the machine's own byte order; the same type as uint16, not `char16_t`.
typedef uint16_t char16;

/// The character type of xostream.
typedef char8 xchar;

/// Points at a null-terminated string of char8.
typedef const char8* ConstString8Z;

namespace detail {

/// Returns the value by which a code unit compares. Plain char may be signed, but text orders as unsigned.
inline unsigned char UnitValue(char x) { return static_cast<unsigned char>(x); }
template <class T> const T& UnitValue(const T& x) { return x; }

} // namespace detail

} // namespace mirel
