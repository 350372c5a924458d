/// @file
/// The primitives that fill, copy and destroy the elements of a vector.
///
/// They know pointers to elements, and decide how an element type is filled and copied. They allocate
/// nothing.

#pragma once

#include <cstddef>
#include <cstring>

#include "Precondition.h"
#include "xchar.h"

namespace mirel {

/// @name Element ranges
/// A range is half open and given by two pointers; a source may have other iterators. An empty range may be a
/// pair of null pointers. Overload resolution decides how p_copy() copies: from `const char8*` to `char8*`
/// and from `const char16*` to `char16*` as one block, anything else in a loop.
/// @snippet examples/reference.cpp element ranges
/// @{

/// Assigns x to the elements of [r1, r2), in ascending order; a reversed range is empty.
/// @pre "r1 >= r2 || r1 != nullptr"
template <class T> void assigning_p_create(T* r1, T* r2, T x) {
  MIREL_ASSERT(r1 >= r2 || r1 != nullptr);
  for (; r1 < r2; ++r1)
    *r1 = x;
}

/// Fills [r1, r2) with x; a reversed range is empty. @pre "r1 >= r2 || r1 != nullptr"
inline void p_create(char8* r1, char8* r2, char8 x) {
  MIREL_ASSERT(r1 >= r2 || r1 != nullptr);
  if (r1 < r2)
    std::memset(r1, x, static_cast<std::size_t>(r2 - r1));
}
/// Fills [r1, r2) with x, a 16-bit code unit; a reversed range is empty.
/// @pre "r1 >= r2 || r1 != nullptr"
inline void p_create(char16* r1, char16* r2, char16 x) { assigning_p_create<char16>(r1, r2, x); }

/// Copies [src1, src2) to dst as one block. The two ranges may not overlap.
/// @pre "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)"
template <class T> void memcpy_p_copy(T* dst, const T* src1, const T* src2) {
  MIREL_ASSERT(src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr));
  if (src1 != src2) // memcpy may not be given null pointers, even for no bytes
    std::memcpy(dst, src1, static_cast<std::size_t>(src2 - src1) * sizeof(T));
}

/// Copies the elements of [src1, src2), first to last, to dst.
/// @pre "src1 == src2 || dst != nullptr"
template <class T, class It> void p_copy(T* dst, It src1, It src2) {
  MIREL_ASSERT(src1 == src2 || dst != nullptr);
  for (; src1 != src2; ++src1, ++dst)
    *dst = *src1;
}
/// Copies the 8-bit code units of [src1, src2) to dst as one block. The two ranges may not overlap.
/// @pre "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)"
inline void p_copy(char8* dst, const char8* src1, const char8* src2) {
  memcpy_p_copy<char8>(dst, src1, src2);
}
/// Copies the 16-bit code units of [src1, src2) to dst as one block. The two ranges may not overlap.
/// @pre "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)"
inline void p_copy(char16* dst, const char16* src1, const char16* src2) {
  memcpy_p_copy<char16>(dst, src1, src2);
}

/// Does nothing: 8-bit code units need no destruction.
inline void p_del(char8*, char8*) {}
/// Does nothing: 16-bit code units need no destruction.
inline void p_del(char16*, char16*) {}

/// @}

} // namespace mirel
