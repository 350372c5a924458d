/// @file
/// Comparisons of ranges of code units, and searches in them.
///
/// They only read the ranges they are given: they allocate nothing, check nothing and can't fail. The
/// searches of code units use SIMD instructions if the processor has them.

#pragma once

#include <cstddef>
#include <cstring>
#include <type_traits>

#include "TwoWay.h"
#include "xchar.h"

namespace mirel {

/// @name Comparing ranges
/// A range is a pair of pointers or iterators; the second points past the last element. Code units compare as
/// unsigned values in both widths. An empty range may be a pair of null pointers. At worst the cost is linear
/// in the shorter length.
/// @snippet examples/reference.cpp comparing ranges
/// @{

/// Orders two ranges by their first differing element; a proper prefix of a range orders before it.
/// @return -1, 0 or 1
template <class It1, class It2> int LexicographicalCompareX(It1 x1, It1 x2, It2 y1, It2 y2) {
  for (; x1 != x2 && y1 != y2; ++x1, ++y1) {
    if (detail::UnitValue(*x1) < detail::UnitValue(*y1))
      return -1;
    if (detail::UnitValue(*y1) < detail::UnitValue(*x1))
      return 1;
  }
  if (x1 != x2)
    return 1;
  return y1 == y2 ? 0 : -1;
}

/// Orders two ranges of bytes. If they differ within the common length, returns memcmp's value, which needn't
/// be -1 or 1; otherwise the lengths decide: -1, 0 or 1.
inline int LexicographicalCompareX(const unsigned char* x1, const unsigned char* x2, const unsigned char* y1,
                                   const unsigned char* y2) {
  const ssize_t lenX = x2 - x1;
  const ssize_t lenY = y2 - y1;
  const ssize_t len = lenX < lenY ? lenX : lenY;
  // Even for no bytes memcmp may not be given the null pointers of an empty range.
  const int result = lenX > 0 && lenY > 0 ? std::memcmp(x1, y1, static_cast<std::size_t>(len)) : 0;
  if (result != 0)
    return result;
  return lenX < lenY ? -1 : lenX > lenY;
}

/// Orders two ranges of 8-bit code units, as bytes.
inline int LexicographicalCompareX(const char* x1, const char* x2, const char* y1, const char* y2) {
  const auto bytes = [](const char* p) { return reinterpret_cast<const unsigned char*>(p); };
  return LexicographicalCompareX(bytes(x1), bytes(x2), bytes(y1), bytes(y2));
}

/// Returns whether [x1, x2) and the range of the same length at y1 have equal elements.
inline bool IsEqual(const char8* x1, const char8* x2, const char8* y1) {
  return x1 == x2 || std::memcmp(x1, y1, static_cast<std::size_t>(x2 - x1)) == 0;
}
/// Returns whether [x1, x2) and the range of the same length at y1 have equal 16-bit code units.
inline bool IsEqual(const uint16* x1, const uint16* x2, const uint16* y1) {
  return x1 == x2 || std::memcmp(x1, y1, static_cast<std::size_t>(x2 - x1) * sizeof(uint16)) == 0;
}

/// Returns whether [y1, y2) is a prefix of [x1, x2). An empty range is a prefix of every range.
template <class It1, class It2> bool IsPrefix(It1 x1, It1 x2, It2 y1, It2 y2) {
  for (; y1 != y2; ++x1, ++y1)
    if (x1 == x2 || detail::UnitValue(*x1) != detail::UnitValue(*y1))
      return false;
  return true;
}

/// @}
/// @name Searching ranges
/// Each search returns a position in the haystack, or its end if nothing is found. Nothing is allocated. At
/// worst the cost is linear in the haystack for one element, and in the product of both lengths for a needle
/// or a set. It is linear in the sum of the lengths for needles if both ranges have random-access iterators
/// over integers, and for all searches if every pointer is a `const char8*` or every one a `const char16*`.
/// Such pointers, with a v of the same unit type, select overloads of the same names and results, which use
/// SIMD instructions if the processor has them. A pointer to units that aren't const, or a v of another type,
/// selects the template.
/// @snippet examples/reference.cpp searching ranges
/// @{

/// Finds the first element equal to v; returns i2 if there is none.
template <class It, class T> It Find(It i1, It i2, const T& v) {
  while (i1 != i2 && detail::UnitValue(*i1) != detail::UnitValue(v))
    ++i1;
  return i1;
}

/// Finds the start of the first occurrence of [y1, y2) in [x1, x2); returns x2 if there is none. An empty
/// needle is found at x1.
template <class It1, class It2> It1 FindFirstSubSequence(It1 x1, It1 x2, It2 y1, It2 y2) {
  if constexpr (detail::kAreOverIntegers<It1, It2>) {
    return detail::FindNeedle(x1, x2, y1, y2);
  } else {
    while (x1 != x2 && !IsPrefix(x1, x2, y1, y2))
      ++x1;
    return x1;
  }
}

/// Finds the first element of [x1, x2) that occurs in [y1, y2); returns x2 if there is none.
template <class It1, class It2> It1 FindFirstOf(It1 x1, It1 x2, It2 y1, It2 y2) {
  while (x1 != x2 && Find(y1, y2, *x1) == y2)
    ++x1;
  return x1;
}

/// Finds the first element of [x1, x2) that doesn't occur in [y1, y2); returns x2 if there is none.
template <class It1, class It2> It1 FindFirstNotOf(It1 x1, It1 x2, It2 y1, It2 y2) {
  while (x1 != x2 && Find(y1, y2, *x1) != y2)
    ++x1;
  return x1;
}

/// Finds the last element equal to v; returns i2 if there is none.
template <class It, class T> It FindLast(It i1, It i2, const T& v) {
  for (It p = i2; p != i1;)
    if (detail::UnitValue(*--p) == detail::UnitValue(v))
      return p;
  return i2;
}

/// Finds the start of the last occurrence of [y1, y2) in [x1, x2); returns x2 if there is none. An empty
/// needle is found at x2.
template <class It1, class It2> It1 FindLastSubSequence(It1 x1, It1 x2, It2 y1, It2 y2) {
  if constexpr (detail::kAreOverIntegers<It1, It2>) {
    return detail::FindLastNeedle(x1, x2, y1, y2);
  } else {
    It1 p = x2;
    while (p != x1 && !IsPrefix(p, x2, y1, y2))
      --p;
    return IsPrefix(p, x2, y1, y2) ? p : x2;
  }
}

/// Finds the last element of [x1, x2) that occurs in [y1, y2); returns x2 if there is none.
template <class It1, class It2> It1 FindLastOf(It1 x1, It1 x2, It2 y1, It2 y2) {
  for (It1 p = x2; p != x1;)
    if (Find(y1, y2, *--p) != y2)
      return p;
  return x2;
}

/// Finds the last element of [x1, x2) that doesn't occur in [y1, y2); returns x2 if there is none.
template <class It1, class It2> It1 FindLastNotOf(It1 x1, It1 x2, It2 y1, It2 y2) {
  for (It1 p = x2; p != x1;)
    if (Find(y1, y2, *--p) == y2)
      return p;
  return x2;
}

/// @}

namespace detail {

/// The searches above for pointers to code units, as functions for one instruction set. They return i2 or x2
/// when nothing is found. Needles aren't empty.
template <class T> struct SearchKernels {
  using P = const T*;
  P (*find)(P i1, P i2, T v);
  P (*findLast)(P i1, P i2, T v);
  P (*findFirstSubSequence)(P x1, P x2, P y1, P y2);
  P (*findLastSubSequence)(P x1, P x2, P y1, P y2);
  P (*findFirstOf)(P x1, P x2, P y1, P y2);
  P (*findFirstNotOf)(P x1, P x2, P y1, P y2);
  P (*findLastOf)(P x1, P x2, P y1, P y2);
  P (*findLastNotOf)(P x1, P x2, P y1, P y2);
  /// Counts the equal units before the first difference of the n at x and the n at y; n if all are equal.
  ssize_t (*findDifference)(P x, P y, ssize_t n);
};

/// Returns this processor's best kernels for 8-bit code units, or the scalar path. The result never changes,
/// so a loop needs to ask only once.
[[gnu::const]] MIREL_API const SearchKernels<char8>& BestSearches(const char8*);
/// Returns this processor's best kernels for 16-bit code units, or the scalar path. The result never changes.
[[gnu::const]] MIREL_API const SearchKernels<char16>& BestSearches(const char16*);

/// Returns whether a range is so short that the loops in this file are faster than a call of a kernel.
template <class T> bool IsShort(const T* x1, const T* x2) { return x2 - x1 <= 16; }

/// Finds what Find() does, but checks for the end of the range only at every fourth unit.
template <class T> const T* FindByFour(const T* i1, const T* i2, T v) {
  while (i2 - i1 >= 4 && i1[0] != v && i1[1] != v && i1[2] != v && i1[3] != v)
    i1 += 4;
  while (i1 != i2 && *i1 != v)
    ++i1;
  return i1;
}

/// Finds what FindLast() does, but checks for the beginning of the range only at every fourth unit. It
/// decrements an index, since compilers generate better code for that than for a pointer that goes back.
template <class T> const T* FindLastByFour(const T* i1, const T* i2, T v) {
  ssize_t i = i2 - i1;
  while (i >= 4 && i1[i - 1] != v && i1[i - 2] != v && i1[i - 3] != v && i1[i - 4] != v)
    i -= 4;
  while (i > 0)
    if (i1[--i] == v)
      return i1 + i;
  return i2;
}

/// Reads the unit at p, which the program may have written as another type (utils/Ranges.h).
template <class T> T CopyOf(const T* p) {
  T unit;
  std::memcpy(&unit, p, sizeof(T));
  return unit;
}

template <class T>
using IfCodeUnit = std::enable_if_t<std::is_same_v<T, char8> || std::is_same_v<T, char16>, int>;

} // namespace detail

// Overload resolution prefers these for pointers to const code units. The results are those of the templates
// above, so the reference leaves them out.
/// @cond

template <class T, detail::IfCodeUnit<T> = 0>
bool IsPrefix(const T* x1, const T* x2, const T* y1, const T* y2) {
  return y1 == y2 || (y2 - y1 <= x2 - x1 && *x1 == detail::CopyOf(y1) && IsEqual(y1, y2, x1));
}
template <class T, detail::IfCodeUnit<T> = 0> const T* Find(const T* i1, const T* i2, const T& v) {
  if constexpr (sizeof(T) == 1) {
    // The C library's memchr is as fast as a kernel. Even for no bytes it may not be given null pointers.
    const void* const p = i1 == i2 ? nullptr : std::memchr(i1, v, static_cast<std::size_t>(i2 - i1));
    return p != nullptr ? static_cast<const T*>(p) : i2;
  } else {
    return detail::IsShort(i1, i2) ? detail::FindByFour(i1, i2, v) : detail::BestSearches(i1).find(i1, i2, v);
  }
}
template <class T, detail::IfCodeUnit<T> = 0> const T* FindLast(const T* i1, const T* i2, const T& v) {
  return detail::IsShort(i1, i2) ? detail::FindLastByFour(i1, i2, v)
                                 : detail::BestSearches(i1).findLast(i1, i2, v);
}
template <class T, detail::IfCodeUnit<T> = 0>
const T* FindFirstSubSequence(const T* x1, const T* x2, const T* y1, const T* y2) {
  if (y1 == y2)
    return x1;
  if (!detail::IsShort(x1, x2)) {
    const ssize_t length = y2 - y1;
    if (sizeof(T) == 1 && x2 - x1 >= length) // if the first byte is rare, memchr does most of the work
      x1 = Find(x1, x2 - (length - 1), detail::CopyOf(y1));
    return x2 - x1 < length ? x2 : detail::BestSearches(x1).findFirstSubSequence(x1, x2, y1, y2);
  }
  for (const T* p = x1; x2 - p >= y2 - y1; ++p)
    if (*p == detail::CopyOf(y1) && IsEqual(y1, y2, p))
      return p;
  return x2;
}
template <class T, detail::IfCodeUnit<T> = 0>
const T* FindLastSubSequence(const T* x1, const T* x2, const T* y1, const T* y2) {
  if (y1 == y2)
    return x2;
  if (!detail::IsShort(x1, x2))
    return detail::BestSearches(x1).findLastSubSequence(x1, x2, y1, y2);
  for (ssize_t i = (x2 - x1) - (y2 - y1); i >= 0; --i)
    if (x1[i] == detail::CopyOf(y1) && IsEqual(y1, y2, x1 + i))
      return x1 + i;
  return x2;
}
template <class T, detail::IfCodeUnit<T> = 0>
const T* FindFirstOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return detail::BestSearches(x1).findFirstOf(x1, x2, y1, y2);
}
template <class T, detail::IfCodeUnit<T> = 0>
const T* FindFirstNotOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return detail::BestSearches(x1).findFirstNotOf(x1, x2, y1, y2);
}
template <class T, detail::IfCodeUnit<T> = 0>
const T* FindLastOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return detail::BestSearches(x1).findLastOf(x1, x2, y1, y2);
}
template <class T, detail::IfCodeUnit<T> = 0>
const T* FindLastNotOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return detail::BestSearches(x1).findLastNotOf(x1, x2, y1, y2);
}
inline int LexicographicalCompareX(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  const ssize_t lenX = x2 - x1;
  const ssize_t lenY = y2 - y1;
  const ssize_t len = lenX < lenY ? lenX : lenY;
  const ssize_t i = detail::IsShort(x1, x1 + len) ? detail::EqualElements(x1, y1, len)
                                                  : detail::BestSearches(x1).findDifference(x1, y1, len);
  if (i < len)
    return x1[i] < y1[i] ? -1 : 1;
  return lenX < lenY ? -1 : lenX > lenY;
}

/// @endcond

} // namespace mirel
