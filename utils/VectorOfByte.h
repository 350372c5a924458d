/// @file
/// Algorithms over ranges of code units, and the buffer of bytes that owns the storage of every container.
///
/// The algorithms only read the ranges they are given: they allocate nothing, check nothing and can't fail.
/// The buffer knows bytes: every size, offset and capacity is in bytes. It knows neither elements nor text.

#pragma once

#include <cstddef>
#include <cstring>
#include <initializer_list>
#include <type_traits>
#include <utility>

#include "Integers.h"
#include "NotOffered.h"
#include "Precondition.h"
#include "TwoWay.h"
#include "xchar.h"

namespace mirel {

namespace detail {

struct Storage; // gives the conversions and FillFrom() access to a vector's storage

/// Throws std::bad_alloc. A throw in a header doesn't compile in a program without exceptions.
[[noreturn, gnu::cold]] MIREL_API void AllocationFailed();

} // namespace detail

/// @name Comparing ranges
/// A range is a pair of pointers or iterators, the second one past the last element. Code units compare as
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

/// Orders two ranges of bytes. A difference within the common length yields the value of memcmp, of any size;
/// otherwise the lengths decide: -1, 0 or 1.
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
/// Such pointers select overloads of the same names and results, which use SIMD instructions if the processor
/// has them; a pointer to units that aren't const doesn't.
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
  if constexpr (detail::kAreIntegers<It1, It2>) {
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
  if constexpr (detail::kAreIntegers<It1, It2>) {
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

/// Returns the best kernels of this processor for such units, or the scalar path. The result never changes,
/// so a loop needs to ask only once.
[[gnu::const]] MIREL_API const SearchKernels<char8>& BestSearches(const char8*);
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

/// An untyped, growable array of bytes: the storage of every vector and string.
///
/// Parameters: `i` is an offset or an iterator, `n` a number of bytes from there, `i1`/`i2` and `r1`/`r2` the
/// ends of half-open ranges in this buffer and elsewhere, `x` a byte, `count` a number of bytes to add or
/// remove. An integer of any type may stand for an offset, a count or a byte: a literal 0 is one of these,
/// never a pointer. Only push_back(x) takes x as a number of its own type, and appends all bytes of it.
///
/// A source that lies in the buffer itself gives the result as if it had been copied first. Bad arguments
/// stop the process with the text after "@pre", before anything has changed. A source is checked after all
/// offsets and counts: it may not be reversed, nor its beginning be null unless its end is.
/// @pre "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)" of each source
///
/// A failed allocation throws std::bad_alloc before anything has changed. Whatever may grow the buffer may
/// move its storage, which invalidates pointers into it; erasing keeps the storage and moves down the bytes
/// that follow. A series of edits takes amortised constant time per byte added, plus time linear in the
/// number of bytes moved.
/// @snippet examples/reference.cpp VectorOfByte
class MIREL_DESCRIBED MIREL_API VectorOfByte {
public:
  typedef uint8 value_type;     ///< A byte.
  typedef value_type* iterator; ///< A pointer into the storage.

  /// @name Construction, copy
  /// @snippet examples/reference.cpp bytes construction
  /// @{

  /// Makes an empty buffer without storage.
  VectorOfByte() noexcept : m_buffer(nullptr), size_(0), m_capacity(0) {}
  /// Copies the bytes of [r1, r2). @pre "r1 <= r2"
  VectorOfByte(const value_type* r1, const value_type* r2);
  /// Makes count bytes of value x. @pre "0 <= count"
  explicit VectorOfByte(ssize_t count, value_type x);
  /// Copies the listed bytes.
  VectorOfByte(std::initializer_list<uint8> r);
  /// Copies a buffer; the capacity is the size.
  VectorOfByte(const VectorOfByte& r);
  /// Releases the storage.
  ~VectorOfByte() {
    if (m_buffer != nullptr) // compilers remove the call if they see that the pointer is null
      Release(m_buffer);
  }

  /// Becomes a copy of r; the storage is kept if it is large enough.
  VectorOfByte& operator=(const VectorOfByte& r);
  /// Exchanges contents, sizes and capacities in constant time.
  void swap(VectorOfByte& r) noexcept {
    std::swap(m_buffer, r.m_buffer);
    std::swap(size_, r.size_);
    std::swap(m_capacity, r.m_capacity);
  }

  /// @}
  /// @name Capacity
  /// @snippet examples/reference.cpp bytes capacity
  /// @{

  ssize_t size() const { return size_; }          ///< The number of bytes in use.
  ssize_t capacity() const { return m_capacity; } ///< The number of bytes of storage.
  bool empty() const { return size_ == 0; }       ///< Returns whether the size is 0.

  /// Makes room for exactly n bytes in all; does nothing if there is room, or if n is negative. It is const
  /// so that a const string can make room for its terminator; the contents stay as they are.
  void reserve(ssize_t n) const;
  /// Changes the size to n bytes; new bytes are uninitialised. @pre "0 <= n"
  void resize(ssize_t n);
  /// Appends count uninitialised bytes. @pre "0 <= count"
  void growbytes(ssize_t count) {
    MIREL_ASSERT(0 <= count);
    if (count <= m_capacity - size_)
      size_ += count; // all that insertbytes() does at the end if there is room
    else
      insertbytes(size(), count);
  }
  /// Removes all bytes and keeps the storage.
  void clear() noexcept { size_ = 0; }

  /// @}
  /// @name Access
  /// data() and begin() are null in a buffer without storage.
  /// @snippet examples/reference.cpp bytes access
  /// @{

  value_type* begin() { return m_buffer; }                        ///< Points to the first byte.
  const value_type* begin() const { return m_buffer; }            ///< Points to the first byte.
  value_type* end() { return m_buffer + size_; }                  ///< Points past the end.
  const value_type* end() const { return m_buffer + size_; }      ///< Points past the end.
  value_type* data() { return m_buffer; }                         ///< Points to the first byte.
  const value_type* data() const { return m_buffer; }             ///< Points to the first byte.
  value_type* data_end() { return m_buffer + size_; }             ///< Points past the end.
  const value_type* data_end() const { return m_buffer + size_; } ///< Points past the end.

  /// The byte at offset i, unchecked.
  value_type& operator[](ssize_t i) { return m_buffer[i]; }
  /// The byte at offset i. @pre "0 <= i && i < size()"
  value_type operator[](ssize_t i) const {
    MIREL_ASSERT(0 <= i && i < size());
    return m_buffer[i];
  }
  /// The first byte. @pre "size() > 0"
  value_type& front() {
    MIREL_ASSERT(size() > 0);
    return m_buffer[0];
  }
  /// The first byte. @pre "size() > 0"
  value_type front() const {
    MIREL_ASSERT(size() > 0);
    return m_buffer[0];
  }
  /// The last byte. @pre "size() > 0"
  value_type& back() {
    MIREL_ASSERT(size() > 0);
    return m_buffer[size_ - 1];
  }
  /// The last byte. @pre "size() > 0"
  value_type back() const {
    MIREL_ASSERT(size() > 0);
    return m_buffer[size_ - 1];
  }

  /// Returns whether p points into the storage, unused capacity included.
  bool owns(const void* p) const {
    return reinterpret_cast<uintptr_t>(p) - reinterpret_cast<uintptr_t>(m_buffer) <
           static_cast<uintptr_t>(m_capacity);
  }

  /// @}
  /// @name Assigning, appending
  /// @snippet examples/reference.cpp bytes assigning
  /// @{

  /// Becomes a copy of [r1, r2). @pre "r1 <= r2"
  void assign(const value_type* r1, const value_type* r2);
  /// Appends the bytes of r.
  VectorOfByte& operator+=(const VectorOfByte& r);
  /// Appends the bytes of [r1, r2). @pre "r1 <= r2"
  void push_back(const value_type* r1, const value_type* r2);

  /// Appends all bytes of one number in the machine's own byte order: four for an int, for example. If there
  /// isn't enough room, it reserves the new size plus the old capacity.
  template <class T> void push_back(const T& x) {
    static_assert(std::is_arithmetic_v<T> || std::is_enum_v<T>,
                  "push_back appends one number: write += for a buffer, and push_back(r1, r2) for bytes");
    static_assert(!std::is_same_v<std::remove_cv_t<T>, long double>,
                  "a long double may have padding bytes: append it as a double");
    const std::remove_volatile_t<T> value = x; // x may lie in the storage that is about to be released
    const std::size_t n = std::size_t(size_) + sizeof(T); // unsigned, where it can't overflow
    if (std::size_t(m_capacity) < n) {
      const ssize_t capacity = GrownCapacity(m_capacity, n);
      m_buffer = Reallocate(m_buffer, capacity);
      m_capacity = capacity;
    }
    std::memcpy(m_buffer + size_, &value, sizeof(T));
    size_ = ssize_t(n);
  }

  /// Removes the last count bytes. @pre "0 <= count", then "size_ >= 0" of the size that would be left
  void pop_back(ssize_t count) {
    MIREL_ASSERT(0 <= count);
    MIREL_ASSERT_AS(count <= size_, "size_ >= 0");
    size_ -= count;
  }

  /// @}
  /// @name Inserting
  /// For an iterator, the precondition is on its distance from begin().
  /// @snippet examples/reference.cpp bytes inserting
  /// @{

  /// Opens a gap of n uninitialised bytes before offset i. @pre "0 <= i && i <= size()", then "0 <= n"
  void insertbytes(ssize_t i, ssize_t n);
  /// Inserts the bytes of [r1, r2) before offset i. @pre "0 <= i && i <= size()", then "r1 <= r2"
  void insert(ssize_t i, const value_type* r1, const value_type* r2);
  /// Inserts the bytes of [r1, r2) before an iterator. @pre "0 <= i && i <= size()", then "r1 <= r2"
  void insert(iterator i, const value_type* r1, const value_type* r2) { insert(i - begin(), r1, r2); }
  /// Inserts count bytes of value x before offset i. @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(ssize_t i, ssize_t count, value_type x);
  /// Inserts count bytes of value x before an iterator. @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(iterator i, ssize_t count, value_type x) { insert(i - begin(), count, x); }
  /// Inserts one byte before offset i. @pre "0 <= i && i <= size()"
  void insert(ssize_t i, value_type x) { insert(i, ssize_t(1), x); }
  /// Inserts one byte before an iterator. @pre "0 <= i && i <= size()" @return an iterator at that byte
  iterator insert(iterator i, value_type x);

  /// @}
  /// @name Moving, erasing
  /// @snippet examples/reference.cpp bytes moving
  /// @{

  /// Moves n bytes from offset s to offset d, even where the two ranges overlap.
  /// @pre "0 <= d && 0 <= n && d+n <= size()", then "0 <= s && 0 <= n && s+n <= size()"
  void move(ssize_t d, ssize_t s, ssize_t n);
  /// Removes the bytes of [i1, i2). @pre "begin() <= i1 && i1 <= i2 && i2 <= end()"
  void erase(iterator i1, iterator i2);
  /// Removes the byte at i and returns an iterator at the next one. @pre "begin() <= i && i < end()"
  iterator erase(iterator i);
  /// Removes n bytes from offset i on. @pre "0 <= i && 0 <= n && i+n <= size()"
  void erase(ssize_t i, ssize_t n);
  /// Removes the byte at offset i. @pre "0 <= i && i < size()"
  void erase_element(ssize_t i);

  /// @}
  /// @name Comparison
  /// The sign of the result is the order of the first differing bytes, as unsigned values; a proper prefix of
  /// a buffer orders before it. The cost is at worst linear in the shorter length.
  /// @snippet examples/reference.cpp bytes comparison
  /// @{

  /// Compares all bytes with those of r.
  int compare(const VectorOfByte& r) const;
  /// Compares n bytes from offset i on with those of r. @pre "0 <= i && 0 <= n && i+n <= size()"
  int compare(ssize_t i, ssize_t n, const VectorOfByte& r) const;
  /// Compares n bytes from offset i on with rn bytes of r from offset ri on.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  int compare(ssize_t i, ssize_t n, const VectorOfByte& r, ssize_t ri, ssize_t rn) const;
  /// Compares n bytes from offset i on with the pn at p.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "pn == 0 || (pn > 0 && p != nullptr)"
  int compare(ssize_t i, ssize_t n, const value_type* p, ssize_t pn) const;

  /// @}
  /// @name Relations
  /// Order buffers as compare() does; no byte is read to find buffers of different sizes unequal.
  /// @snippet examples/reference.cpp bytes relations
  /// @{

  /// Returns whether the bytes are equal.
  bool operator==(const VectorOfByte& r) const { return size_ == r.size_ && compare(r) == 0; }
  /// Returns whether the bytes differ.
  bool operator!=(const VectorOfByte& r) const { return !(*this == r); }
  /// Returns whether this buffer orders before r.
  bool operator<(const VectorOfByte& r) const { return compare(r) < 0; }
  /// Returns whether this buffer orders before r or equals it.
  bool operator<=(const VectorOfByte& r) const { return compare(r) <= 0; }
  /// Returns whether this buffer orders after r.
  bool operator>(const VectorOfByte& r) const { return compare(r) > 0; }
  /// Returns whether this buffer orders after r or equals it.
  bool operator>=(const VectorOfByte& r) const { return compare(r) >= 0; }

  /// @}

  // Overloads for integers of any type, which match an integer exactly and call the declared overload of
  // their name; then deleted overloads.
  /// @cond

  template <class N, class X, detail::IfIntegers<N, X> = 0>
  explicit VectorOfByte(N count, X x) MIREL_FITS(value_type, x)
      : VectorOfByte(detail::Count(count), detail::Unit<value_type>(x)) {}
  template <class N, detail::IfIntegers<N> = 0> void insert(N i, const value_type* r1, const value_type* r2) {
    insert(detail::Count(i), r1, r2);
  }
  template <class N, class M, class X, detail::IfIntegers<N, M, X> = 0>
  void insert(N i, M count, X x) MIREL_FITS(value_type, x) {
    insert(detail::Count(i), detail::Count(count), detail::Unit<value_type>(x));
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  void insert(iterator i, N count, X x) MIREL_FITS(value_type, x) {
    insert(i, detail::Count(count), detail::Unit<value_type>(x));
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0> void insert(N i, X x) MIREL_FITS(value_type, x) {
    insert(detail::Count(i), detail::Unit<value_type>(x));
  }
  template <class X, detail::IfIntegers<X> = 0> iterator insert(iterator i, X x) MIREL_FITS(value_type, x) {
    return insert(i, detail::Unit<value_type>(x));
  }
  template <class N, class M, detail::IfIntegers<N, M> = 0> void erase(N i, M n) {
    erase(detail::Count(i), detail::Count(n));
  }

  iterator erase(std::nullptr_t) = delete;
  template <class N, detail::IfIntegers<N> = 0> detail::WriteEraseElement erase(N) = delete;
  // Where two pointers are expected, an integer is neither a null pointer nor a count.
  template <class P, class Q, class Hint = detail::WriteTwoPointers, detail::IfPointerAndInteger<P, Q> = 0>
  VectorOfByte(P, Q) = delete;
  template <class P, class Q, detail::IfPointerAndInteger<P, Q> = 0>
  detail::WriteTwoPointers assign(P, Q) = delete;
  template <class P, class Q, detail::IfPointerAndInteger<P, Q> = 0>
  detail::WriteTwoPointers push_back(P, Q) = delete;
  template <class I, class P, class Q, detail::IfPointerAndInteger<P, Q> = 0>
  detail::WriteTwoPointers insert(I, P, Q) = delete;
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  detail::WriteNullptrOrInsertCopies assign(N, X) = delete;
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  detail::WriteNullptrOrInsertCopies push_back(N, X) = delete;
  template <class... N, detail::IfIntegers<N...> = 0>
  detail::WriteNullptrOrPointerAndCount compare(N...) const = delete;
  /// @endcond

private:
  /// Returns the capacity to which a buffer grows for n bytes, which are more than it has room for. Throws
  /// std::bad_alloc if an ssize_t can't count them.
  static ssize_t GrownCapacity(ssize_t capacity, std::size_t n);
  void GrowTo(std::size_t n);
  // The pointer is passed by value, so that a buffer whose address nobody takes can stay in registers through
  // a loop of appends.
  static value_type* Reallocate(value_type* buffer, ssize_t n);
  static void Release(value_type* buffer) noexcept;
  /// Reduces the storage to n bytes; keeps it if that fails. n must be at least 1 and at least size().
  void Shrink(ssize_t n) noexcept;
  friend struct detail::Storage;

public:
  mutable value_type* m_buffer; ///< The storage, or null while there is none.
  ssize_t size_; ///< Bytes in use, 0 <= size_ <= m_capacity; the rest is unused capacity and may be written.
  mutable ssize_t m_capacity; ///< The number of bytes of storage.
};

} // namespace mirel
