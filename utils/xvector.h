/// @file
/// xvector<T>, a growable array of code units.
///
/// The vector knows elements: it turns element counts into bytes and overwrites the gaps that its byte buffer
/// opens. It allocates nothing itself, and knows nothing of null termination.

#pragma once

#include <cstddef>
#include <cstring>
#include <initializer_list>
#include <limits>
#include <type_traits>

#include "Elements.h"
#include "Integers.h"
#include "NotOffered.h"
#include "Precondition.h"
#include "RangeAlgorithms.h"
#include "Ranges.h"
#include "VectorOfByte.h"
#include "xchar.h"

namespace mirel {

/// A growable array of code units (char8 or char16) with the operations of a string.
///
/// Parameters, throughout: `i` an index or iterator, `n` a number of elements from there; `i1`/`i2` the ends
/// of a half-open range of this vector; `r` another vector, `ri`/`rn` a sub-range of it; `p`/`pn` a pointer
/// and a number of elements; `r1`/`r2` a half-open range elsewhere; `x` an element; `c` an element that is
/// looked for; `offset` where a search or a substring starts; `count` a number of repetitions, or the length
/// of a substring. Indices and counts are in elements, and signed. An integer of any type may stand for an
/// index, a count or an element: a literal 0 is one of these, never a pointer. utils/Ranges.h says which
/// iterators a range may have, and how its elements are read; a single element is read as its unsigned value
/// too, and truncated if it doesn't fit, even in a search. Clang refuses a constant that doesn't fit. So does
/// g++ if it optimises, but it only warns of one that is searched for, and may take a variable for a
/// constant if it knows the value.
///
/// @par Bad arguments
/// They stop the process with the text given after "@pre", before anything has changed. They are never
/// clamped. A null pointer with a count of 0, or a pair of null pointers, is an empty range; any other null
/// pointer is a bad argument.
/// @par Ranges
/// They are checked after all indices and counts: a range of random-access iterators, or of our reverse
/// iterators, may not be reversed, and the beginning of a range may not be a null pointer unless the end is
/// one too.
/// @pre "r1 <= r2", then, where elements are copied,
/// "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)", and "r1 == r2 || r1 != nullptr"
/// where they are searched for
/// @par Memory
/// A failed allocation throws std::bad_alloc: contents, size and capacity are as they were before the call.
/// @par Invalidation
/// Whatever may add elements or capacity may move the storage, which invalidates all pointers, references and
/// iterators. Erasing keeps the storage and moves down the elements that follow; swap() exchanges the
/// storage.
/// @par Aliasing
/// An argument that is, or lies in, the vector itself gives the result as if it had been copied first.
/// @par Cost
/// A series of edits takes amortised constant time per element added, plus time linear in the number of
/// elements moved.
/// @par Threads
/// Different threads may use different vectors, and may read one vector that no thread changes. reserve()
/// counts as a change, although it is const.
///
/// @snippet examples/reference.cpp xvector
template <class T> class MIREL_DESCRIBED MIREL_API xvector {
  static_assert(std::is_same_v<T, char8> || std::is_same_v<T, char16>,
                "a vector is of char8 or char16; use std::vector for other elements");

public:
  /// @name Types
  /// @snippet examples/reference.cpp types
  /// @{

  typedef T value_type;                   ///< An element.
  typedef T* iterator;                    ///< A pointer into the storage.
  typedef const T* const_iterator;        ///< A pointer into the storage, to const elements.
  typedef T& reference;                   ///< An element in place.
  typedef const T& const_reference;       ///< A const element in place.
  typedef ssize_t size_type;              ///< A count or index, signed.
  typedef std::ptrdiff_t difference_type; ///< The distance of two iterators.

  /// As the count of substr(), up to the end; as the start of a reverse search, the last element; as a
  /// result, not found.
  enum { npos = -1 };

  class const_reverse_iterator;
  class reverse_iterator;

  /// @}
  /// @name Construction, copy
  /// A vector has no move operations: a temporary is copied too. Use swap() to exchange storage. A new
  /// vector's capacity is its size.
  /// @snippet examples/reference.cpp construction
  /// @{

  /// Makes an empty vector, without storage.
  xvector() {}
  /// Copies rn elements of r from index ri on. @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  xvector(const xvector<T>& r, ssize_t ri, ssize_t rn) { assign(r, ri, rn); }
  /// Copies the pn elements at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  xvector(const T* p, ssize_t pn) { assign(p, pn); }
#if __SIZEOF_POINTER__ != 4 // otherwise ssize_t is int
  /// Makes count elements equal to x. @pre "0 <= count"
  explicit xvector(ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= count);
    FillRange(0, 0, count, x);
  }
#endif
  /// Makes count elements equal to x; not explicit for an int. @pre "0 <= count"
  xvector(int count, const T& x) {
    MIREL_ASSERT(0 <= count);
    FillRange(0, 0, count, x);
  }
  /// Copies the elements of [r1, r2). @pre "r1 <= r2"
  xvector(const T* r1, const T* r2) { assign(r1, r2); }
  /// Copies the elements of [r1, r2), which may be any iterators. @pre "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> xvector(It r1, It r2) { assign(r1, r2); }
  /// Copies a vector.
  xvector(const xvector<T>& r) { assign(r); }
  /// Copies the listed elements.
  xvector(std::initializer_list<T> r) { assign(r.begin(), r.end()); }
  /// Releases the storage.
  ~xvector() { p_del(data(), data_end()); }

  /// Becomes a copy of r; the storage is kept if it is large enough.
  xvector<T>& operator=(const xvector<T>& r) {
    if (this != &r)
      assign(r);
    return *this;
  }
  /// Exchanges elements and capacities in constant time; pointers stay valid and point into the other vector.
  void swap(xvector<T>& r) noexcept { m_buffer.swap(r.m_buffer); }

  /// @}
  /// @name Capacity
  /// @snippet examples/reference.cpp capacity
  /// @{

  /// Makes room for exactly size elements in all; does nothing if there is room. @pre "size >= 0"
  void reserve(ssize_t size) const {
    MIREL_ASSERT(size >= 0);
    m_buffer.reserve(Bytes(size));
  }
  /// The number of elements that the storage has room for.
  ssize_t capacity() const { return Elements(m_buffer.capacity()); }
  /// Removes elements at the end, or appends elements equal to x. @pre "newSize >= 0"
  void resize(ssize_t newSize, const T& x);
  bool empty() const { return m_buffer.empty(); }            ///< Returns whether there are no elements.
  ssize_t size() const { return Elements(m_buffer.size()); } ///< The number of elements.
  ssize_t length() const { return size(); }                  ///< The number of elements, as size().

  /// @}
  /// @name Access
  /// data() is null in a vector without storage. The elements are contiguous.
  /// @snippet examples/reference.cpp access
  /// @{

  /// Points to the first element.
  const T* data() const { return reinterpret_cast<const T*>(m_buffer.begin()); }
  T* data() { return reinterpret_cast<T*>(m_buffer.begin()); } ///< Points to the first element.
  /// Points past the end.
  const T* data_end() const { return reinterpret_cast<const T*>(m_buffer.end()); }
  T* data_end() { return reinterpret_cast<T*>(m_buffer.end()); } ///< Points past the end.

  /// The element at index i. @pre "0 <= i && i < size()"
  const T& operator[](ssize_t i) const {
    MIREL_ASSERT(0 <= i && i < size());
    return begin()[i];
  }
  /// The element at index i. @pre "0 <= i && i < size()"
  T& operator[](ssize_t i) {
    MIREL_ASSERT(0 <= i && i < size());
    return begin()[i];
  }
  /// The first element. @pre "size() > 0"
  const T& front() const {
    MIREL_ASSERT(size() > 0);
    return *begin();
  }
  /// The first element. @pre "size() > 0"
  T& front() {
    MIREL_ASSERT(size() > 0);
    return *begin();
  }
  /// The last element. @pre "size() > 0"
  const T& back() const {
    MIREL_ASSERT(size() > 0);
    return begin()[size() - 1];
  }
  /// The last element. @pre "size() > 0"
  T& back() {
    MIREL_ASSERT(size() > 0);
    return begin()[size() - 1];
  }

  /// @}
  /// @name Iterators
  /// @snippet examples/reference.cpp iterators
  /// @{

  const_iterator begin() const { return data(); }   ///< Points to the first element.
  const_iterator end() const { return data_end(); } ///< Points past the end.
  iterator begin() { return data(); }               ///< Points to the first element.
  iterator end() { return data_end(); }             ///< Points past the end.
  /// Designates the last element.
  const_reverse_iterator rbegin() const { return const_reverse_iterator(end()); }
  /// The reverse past-the-end iterator.
  const_reverse_iterator rend() const { return const_reverse_iterator(begin()); }
  reverse_iterator rbegin() { return reverse_iterator(end()); } ///< Designates the last element.
  reverse_iterator rend() { return reverse_iterator(begin()); } ///< The reverse past-the-end iterator.

  /// @}
  /// @name Assignment
  /// Replace the whole contents; the storage is kept if it is large enough.
  /// @snippet examples/reference.cpp assignment
  /// @{

  /// Becomes a copy of [r1, r2), which may be any iterators. @pre "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void assign(It r1, It r2) {
    MIREL_ASSERT_SOURCE(r1, r2);
    const auto source = detail::Source<T>(r1, r2);
    ReplaceRange(0, size(), source.begin(), source.size());
  }
  /// Becomes a copy of r.
  void assign(const xvector<T>& r) { ReplaceRange(0, size(), r.begin(), r.size()); }
  /// Becomes a copy of rn elements of r from index ri on. @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  void assign(const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    ReplaceRange(0, size(), r.begin() + ri, rn);
  }
  /// Becomes a copy of the pn elements at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void assign(const T* p, ssize_t pn) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    ReplaceRange(0, size(), p, pn);
  }
  /// Becomes count elements equal to x. @pre "0 <= count"
  void assign(ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= count);
    FillRange(0, size(), count, x);
  }
  /// Removes all elements and keeps the storage.
  void erase() {
    p_del(data(), data_end());
    m_buffer.clear();
  }
  void clear() { erase(); } ///< Removes all elements and keeps the storage, as erase().

  /// @}
  /// @name Appending
  /// @snippet examples/reference.cpp appending
  /// @{

  /// Appends x. When the vector is full, the new capacity is the new size plus the old capacity.
  void push_back(const T& x) { m_buffer.template push_back<T>(x); }
  /// Appends the elements of [r1, r2), which may be any iterators. @pre "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void push_back(It r1, It r2) {
    MIREL_ASSERT_SOURCE(r1, r2);
    const auto source = detail::Source<T>(r1, r2);
    Append(source.begin(), source.size());
  }
  /// Appends the elements of [r1, r2) count times. @pre "0 <= count", then "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void push_back(ssize_t count, It r1, It r2) {
    MIREL_ASSERT(0 <= count);
    MIREL_ASSERT_AS(detail::IsRange(r1, r2), "r1 <= r2");
    if (count == 0) // nothing is copied, so the range isn't checked any further
      return;
    MIREL_ASSERT_SOURCE(r1, r2);
    const auto source = detail::Source<T>(r1, r2);
    AppendRepeated(count, source.begin(), source.size());
  }
  /// Inserts x before the first element.
  void push_front(const T& x) { insert(ssize_t(0), x); }
  /// Appends the elements of r.
  xvector<T>& operator+=(const xvector<T>& r) { return append(r); }
  /// Appends x.
  xvector<T>& operator+=(const T& x) {
    push_back(x);
    return *this;
  }
  /// Returns a new vector: the elements of this one, then those of r. Allocates once.
  const xvector<T> operator+(const xvector<T>& r) const {
    xvector<T> z;
    z.reserve(Sum(size(), r.size()));
    z = *this;
    z.append(r);
    return z;
  }
  /// Returns a new vector: the elements of this one, then x. Allocates once.
  const xvector<T> operator+(const T& x) const {
    xvector<T> z;
    z.reserve(Sum(size(), 1));
    z = *this;
    z.push_back(x);
    return z;
  }
  /// Repeats the contents count times, in new storage. @pre "0 <= count"
  xvector<T>& operator*=(ssize_t count) {
    MIREL_ASSERT(0 <= count);
    xvector<T> product;
    product.AppendRepeated(count, begin(), size());
    swap(product);
    return *this;
  }
  /// Appends the elements of r.
  xvector<T>& append(const xvector<T>& r) {
    Append(r.begin(), r.size());
    return *this;
  }
  /// Appends rn elements of r from index ri on. @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  xvector<T>& append(const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    Append(r.begin() + ri, rn);
    return *this;
  }
  /// Appends the pn elements at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  xvector<T>& append(const T* p, ssize_t pn) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    Append(p, pn);
    return *this;
  }
  /// Appends count elements equal to x. @pre "0 <= count"
  xvector<T>& append(ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= count);
    FillRange(size(), 0, count, x);
    return *this;
  }

  /// @}
  /// @name Moving
  /// @snippet examples/reference.cpp moving
  /// @{

  /// Copies n elements from index s to index d, even where the two ranges overlap. The size stays.
  /// @pre "0 <= d && 0 <= n && d+n <= size()", then "0 <= s && 0 <= n && s+n <= size()"
  void move(ssize_t d, ssize_t s, ssize_t n) {
    // The buffer asserts this too, but after the scaling to bytes, which could overflow.
    MIREL_ASSERT_SUBRANGE(d, n, size());
    MIREL_ASSERT_SUBRANGE(s, n, size());
    m_buffer.move(d * S, s * S, n * S);
  }

  /// @}
  /// @name Inserting
  /// Insert before index or iterator i. For an iterator, the precondition is on its distance from begin().
  /// @snippet examples/reference.cpp inserting
  /// @{

  /// Inserts the elements of [r1, r2), which may be any iterators, before index i.
  /// @pre "0 <= i && i <= size()", then "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void insert(ssize_t i, It r1, It r2) {
    MIREL_ASSERT(0 <= i && i <= size());
    MIREL_ASSERT_SOURCE(r1, r2);
    const auto source = detail::Source<T>(r1, r2);
    ReplaceRange(i, 0, source.begin(), source.size());
  }
  /// Inserts the elements of r before index i. @pre "0 <= i && i <= size()"
  void insert(ssize_t i, const xvector<T>& r) {
    MIREL_ASSERT(0 <= i && i <= size());
    ReplaceRange(i, 0, r.begin(), r.size());
  }
  /// Inserts rn elements of r, from index ri on, before index i.
  /// @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()", then "0 <= i && i <= size()"
  void insert(ssize_t i, const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    MIREL_ASSERT(0 <= i && i <= size());
    ReplaceRange(i, 0, r.begin() + ri, rn);
  }
  /// Inserts the pn elements at p before index i.
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)", then "0 <= i && i <= size()"
  void insert(ssize_t i, const T* p, ssize_t pn) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    MIREL_ASSERT(0 <= i && i <= size());
    ReplaceRange(i, 0, p, pn);
  }
  /// Inserts x before index i. @pre "0 <= i && i <= size()"
  void insert(ssize_t i, const T& x) {
    MIREL_ASSERT(0 <= i && i <= size());
    FillRange(i, 0, 1, x);
  }
  /// Inserts x before an iterator. @pre "0 <= i && i <= size()" @return an iterator at the inserted element
  iterator insert(iterator i, const T& x) {
    const ssize_t n = i - begin();
    insert(n, x);
    return begin() + n;
  }
  /// Inserts count elements equal to x before index i. @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(ssize_t i, ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= i && i <= size());
    MIREL_ASSERT(0 <= count);
    FillRange(i, 0, count, x);
  }
  /// Inserts count elements equal to x before an iterator. @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(iterator i, ssize_t count, const T& x) { insert(i - begin(), count, x); }
#if __SIZEOF_POINTER__ != 4 // otherwise ssize_t is int
  /// Inserts count elements equal to x, with an int for the count, before index i.
  /// @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(ssize_t i, int count, const T& x) { insert(i, ssize_t(count), x); }
  /// Inserts count elements equal to x, with an int for the count, before an iterator.
  /// @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(iterator i, int count, const T& x) { insert(i, ssize_t(count), x); }
#endif

  /// @}
  /// @name Replacing
  /// Replace the n elements from index i on, or those of [i1, i2).
  /// @snippet examples/reference.cpp replacing
  /// @{

  /// Replaces n elements from index i on with those of r. @pre "0 <= i && 0 <= n && i+n <= size()"
  void replace(ssize_t i, ssize_t n, const xvector<T>& r) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    ReplaceRange(i, n, r.begin(), r.size());
  }
  /// Replaces n elements from index i on with rn elements of r from index ri on.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  void replace(ssize_t i, ssize_t n, const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    ReplaceRange(i, n, r.begin() + ri, rn);
  }
  /// Replaces n elements from index i on with the pn elements at p.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "pn == 0 || (pn > 0 && p != nullptr)"
  void replace(ssize_t i, ssize_t n, const T* p, ssize_t pn) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    ReplaceRange(i, n, p, pn);
  }
  /// Replaces n elements from index i on with count elements equal to x.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= count"
  void replace(ssize_t i, ssize_t n, ssize_t count, const T& x) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT(0 <= count);
    FillRange(i, n, count, x);
  }
  /// Replaces the elements of [i1, i2) with those of r. @pre "begin() <= i1 && i1 <= i2 && i2 <= end()"
  void replace(iterator i1, iterator i2, const xvector<T>& r) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    ReplaceRange(i1 - begin(), i2 - i1, r.begin(), r.size());
  }
  /// Replaces the elements of [i1, i2) with the pn elements at p.
  /// @pre "begin() <= i1 && i1 <= i2 && i2 <= end()", then "pn == 0 || (pn > 0 && p != nullptr)"
  void replace(iterator i1, iterator i2, const T* p, ssize_t pn) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    ReplaceRange(i1 - begin(), i2 - i1, p, pn);
  }
  /// Replaces the elements of [i1, i2) with count elements equal to x.
  /// @pre "begin() <= i1 && i1 <= i2 && i2 <= end()", then "0 <= count"
  void replace(iterator i1, iterator i2, ssize_t count, const T& x) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    MIREL_ASSERT(0 <= count);
    FillRange(i1 - begin(), i2 - i1, count, x);
  }

  /// @}
  /// @name Erasing
  /// The elements that follow move down once, which invalidates pointers to them; the storage stays. A count
  /// can't be npos.
  /// @snippet examples/reference.cpp erasing
  /// @{

  /// Removes the elements of [i1, i2). @pre "begin() <= i1 && i1 <= i2 && i2 <= end()"
  void erase(iterator i1, iterator i2) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    p_del(i1, i2);
    m_buffer.erase(reinterpret_cast<uint8*>(i1), reinterpret_cast<uint8*>(i2));
  }
  /// Removes the element at i. @pre "begin() <= i && i < end()" @return an iterator at the next element
  iterator erase(iterator i) {
    MIREL_ASSERT(begin() <= i && i < end());
    const ssize_t n = i - begin();
    erase(i, i + 1);
    return begin() + n;
  }
  /// Removes n elements from index i on. @pre "0 <= i && 0 <= n && i+n <= size()"
  void erase(ssize_t i, ssize_t n) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    erase(begin() + i, begin() + i + n);
  }
  /// Removes the elements from index i1 up to but excluding i2.
  /// @pre "0 <= i1 && i1 <= i2 && i2 <= size()"
  void erase_range(ssize_t i1, ssize_t i2) {
    MIREL_ASSERT(0 <= i1 && i1 <= i2 && i2 <= size());
    erase(begin() + i1, begin() + i2);
  }
  /// Removes the element at index i. @pre "0 <= i && i < size()"
  void erase_element(ssize_t i) {
    MIREL_ASSERT(0 <= i && i < size());
    erase(begin() + i);
  }
  /// Removes the first element, in time linear in the size. @pre "size() > 0"
  void pop_front() {
    MIREL_ASSERT(size() > 0);
    erase_element(0);
  }
  /// Removes the last element, in constant time. @pre "size() > 0"
  void pop_back() {
    MIREL_ASSERT(size() > 0);
    m_buffer.pop_back(S);
  }
  /// Removes all elements equal to x, in one pass. @return how many there were
  ssize_t FindAndErase(const T& x);
  /// Removes the element equal to x that has the highest index. @return 1, or 0 if there was none
  ssize_t FindAndEraseFirst(const T& x);

  /// @}
  /// @name Comparison
  /// Compare the first differing elements as unsigned values; a proper prefix of a vector orders before it.
  /// compare() returns a negative number, 0 or a positive one: for char8 the value of memcmp if two elements
  /// differ, otherwise -1, 0 or 1. The cost is at worst linear in the shorter length.
  /// @snippet examples/reference.cpp comparison
  /// @{

  /// Compares all elements with those of r.
  int compare(const xvector<T>& r) const {
    return LexicographicalCompareX(begin(), end(), r.begin(), r.end());
  }
  /// Compares all elements with the pn at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  int compare(const T* p, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return LexicographicalCompareX(begin(), end(), p, p + pn);
  }
  /// Compares the n elements from index i on with those of r.
  /// @pre "0 <= i && 0 <= n && i+n <= size()"
  int compare(ssize_t i, ssize_t n, const xvector<T>& r) const {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    return LexicographicalCompareX(begin() + i, begin() + i + n, r.begin(), r.end());
  }
  /// Compares the n elements from index i on with rn of r from index ri on.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  int compare(ssize_t i, ssize_t n, const xvector<T>& r, ssize_t ri, ssize_t rn) const {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    return LexicographicalCompareX(begin() + i, begin() + i + n, r.begin() + ri, r.begin() + ri + rn);
  }
  /// Compares the n elements from index i on with the pn at p.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "pn == 0 || (pn > 0 && p != nullptr)"
  int compare(ssize_t i, ssize_t n, const T* p, ssize_t pn) const {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return LexicographicalCompareX(begin() + i, begin() + i + n, p, p + pn);
  }
  /// Returns whether both have equal elements; none is read if the sizes differ.
  bool _Eq(const xvector<T>& r) const { return size() == r.size() && IsEqual(begin(), end(), r.begin()); }
  /// Returns whether this vector orders before r.
  bool _Lt(const xvector<T>& r) const { return compare(r) < 0; }
  /// Returns whether [r1, r2) stands at index offset. @pre "0 <= offset && offset <= size()", then "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> bool contains(It r1, It r2, ssize_t offset) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_NEEDLE(r1, r2);
    const auto needle = detail::Needle<T>(r1, r2);
    return IsPrefix(begin() + offset, end(), needle.begin(), needle.end());
  }

  /// @}
  /// @name Search
  /// Return an index, or npos if nothing is found. The needle or set is an element, a range of any forward
  /// iterators, a vector, or a pointer and a count (which follows offset).
  ///
  /// Forward searches begin at index offset. @pre "0 <= offset && offset <= size()"
  ///
  /// Reverse searches go from index offset down to 0; npos is the last element.
  /// @pre "offset == npos || (0 <= offset && offset < size())"
  ///
  /// A pointer and its count are checked before offset, a range after it.
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  /// @pre "r1 <= r2"
  ///
  /// A search allocates nothing. At worst its cost is linear in the searched length for one element; in the
  /// sum of both lengths for needles and sets that are contiguous units of the vector's width, and for
  /// needles of any integers with random-access iterators; otherwise in the product of both lengths.
  /// @snippet examples/reference.cpp search
  /// @{

  /// Finds the first element equal to c, from offset on.
  /// @return its index, or npos @pre "0 <= offset && offset <= size()"
  ssize_t find(const T& c, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    return Index(Find(begin() + offset, end(), c), end());
  }
  /// Finds the first occurrence of [r1, r2) from offset on; an empty range is found at offset.
  template <class It, detail::IfIterator<It> = 0> ssize_t find(It r1, It r2, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    detail::RequireForward<It>();
    MIREL_ASSERT_NEEDLE(r1, r2);
    if (r1 == r2)
      return offset;
    const auto needle = detail::Needle<T>(r1, r2);
    return Index(FindFirstSubSequence(begin() + offset, end(), needle.begin(), needle.end()), end());
  }
  /// Finds the first occurrence of r from offset on.
  ssize_t find(const xvector<T>& r, ssize_t offset = 0) const { return find(r.begin(), r.end(), offset); }
  /// Finds the first occurrence of the pn elements at p from offset on.
  ssize_t find(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find(p, p + pn, offset);
  }

  /// Finds the last element equal to c, at or before offset.
  /// @return its index, or npos @pre "offset == npos || (0 <= offset && offset < size())"
  ssize_t rfind(const T& c, ssize_t offset = npos) const {
    MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
    return Index(FindLast(begin(), After(offset), c), After(offset));
  }
  /// Finds the last occurrence of [r1, r2) that starts at or before offset; it may end after offset. An empty
  /// range is found at offset, or for npos at size().
  template <class It, detail::IfIterator<It> = 0> ssize_t rfind(It r1, It r2, ssize_t offset = npos) const;
  /// Finds the last occurrence of r that starts at or before offset.
  ssize_t rfind(const xvector<T>& r, ssize_t offset = npos) const {
    return rfind(r.begin(), r.end(), offset);
  }
  /// Finds the last occurrence of the pn elements at p that starts at or before offset.
  ssize_t rfind(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return rfind(p, p + pn, offset);
  }

  /// Finds the first element equal to c from offset on, as find().
  /// @return its index, or npos @pre "0 <= offset && offset <= size()"
  ssize_t find_first_of(const T& c, ssize_t offset = 0) const { return find(c, offset); }
  /// Finds the first element from offset on that occurs in [r1, r2). An empty set matches nothing.
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_first_of(It r1, It r2, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    detail::RequireForward<It>();
    MIREL_ASSERT_NEEDLE(r1, r2);
    const auto set = detail::Needle<T>(r1, r2);
    return Index(FindFirstOf(begin() + offset, end(), set.begin(), set.end()), end());
  }
  /// Finds the first element from offset on that occurs in r. This overload isn't const: on a const vector,
  /// pass r.begin() and r.end().
  ssize_t find_first_of(const xvector<T>& r, ssize_t offset = 0) {
    return find_first_of(r.begin(), r.end(), offset);
  }
  /// Finds the first element from offset on that is one of the pn at p.
  ssize_t find_first_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_first_of(p, p + pn, offset);
  }

  /// Finds the first element from offset on that differs from c.
  /// @return its index, or npos @pre "0 <= offset && offset <= size()"
  ssize_t find_first_not_of(const T& c, ssize_t offset = 0) const {
    return find_first_not_of(&c, &c + 1, offset);
  }
  /// Finds the first element from offset on that doesn't occur in [r1, r2). An empty set excludes nothing.
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_first_not_of(It r1, It r2, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    detail::RequireForward<It>();
    MIREL_ASSERT_NEEDLE(r1, r2);
    const auto set = detail::Needle<T>(r1, r2);
    return Index(FindFirstNotOf(begin() + offset, end(), set.begin(), set.end()), end());
  }
  /// Finds the first element from offset on that doesn't occur in r. This overload isn't const: on a const
  /// vector, pass r.begin() and r.end().
  ssize_t find_first_not_of(const xvector<T>& r, ssize_t offset = 0) {
    return find_first_not_of(r.begin(), r.end(), offset);
  }
  /// Finds the first element from offset on that is none of the pn at p.
  ssize_t find_first_not_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_first_not_of(p, p + pn, offset);
  }

  /// Finds the last element equal to c at or before offset, as rfind().
  /// @return its index, or npos @pre "offset == npos || (0 <= offset && offset < size())"
  ssize_t find_last_of(const T& c, ssize_t offset = npos) const { return rfind(c, offset); }
  /// Finds the last element at or before offset that occurs in [r1, r2).
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_last_of(It r1, It r2, ssize_t offset = npos) const {
    MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
    detail::RequireForward<It>();
    MIREL_ASSERT_NEEDLE(r1, r2);
    const auto set = detail::Needle<T>(r1, r2);
    return Index(FindLastOf(begin(), After(offset), set.begin(), set.end()), After(offset));
  }
  /// Finds the last element at or before offset that occurs in r.
  ssize_t find_last_of(const xvector<T>& r, ssize_t offset = npos) const {
    return find_last_of(r.begin(), r.end(), offset);
  }
  /// Finds the last element at or before offset that is one of the pn at p.
  ssize_t find_last_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_last_of(p, p + pn, offset);
  }

  /// Finds the last element at or before offset that differs from c.
  /// @return its index, or npos @pre "offset == npos || (0 <= offset && offset < size())"
  ssize_t find_last_not_of(const T& c, ssize_t offset = npos) const {
    return find_last_not_of(&c, &c + 1, offset);
  }
  /// Finds the last element at or before offset that doesn't occur in [r1, r2).
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_last_not_of(It r1, It r2, ssize_t offset = npos) const {
    MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
    detail::RequireForward<It>();
    MIREL_ASSERT_NEEDLE(r1, r2);
    const auto set = detail::Needle<T>(r1, r2);
    return Index(FindLastNotOf(begin(), After(offset), set.begin(), set.end()), After(offset));
  }
  /// Finds the last element at or before offset that doesn't occur in r.
  ssize_t find_last_not_of(const xvector<T>& r, ssize_t offset = npos) const {
    return find_last_not_of(r.begin(), r.end(), offset);
  }
  /// Finds the last element at or before offset that is none of the pn at p.
  ssize_t find_last_not_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_last_not_of(p, p + pn, offset);
  }

  /// Returns a new vector of count elements from index offset on; npos means all that follow.
  /// @pre "0 <= offset && offset <= size()", then "count == npos || (0 <= count && offset+count <= size())"
  xvector<T> substr(ssize_t offset = 0, ssize_t count = npos) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_AS(count == npos || detail::IsSubrange(offset, count, size()),
                    "count == npos || (0 <= count && offset+count <= size())");
    const T* const r1 = begin() + offset;
    return xvector<T>(r1, count == npos ? end() : r1 + count);
  }

  /// @}

  // Overloads for integers of any type, then deleted overloads. An integer matches the former exactly, so
  // that a literal 0 is an index, a count or an element, never a null pointer. Each calls the documented
  // overload of the same name, and converts elements by their unsigned value.
  /// @cond

  template <class P, class N, detail::IfPointerAndCount<P, const T*, N> = 0>
  xvector(P p, N pn) : xvector(static_cast<const T*>(p), detail::Count(pn)) {}
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  explicit xvector(N count, X x) MIREL_FITS(T, x) : xvector(detail::Count(count), detail::Unit<T>(x)) {}
  template <class X, detail::IfIntegers<X> = 0> void resize(ssize_t newSize, X x) MIREL_FITS(T, x) {
    resize(newSize, detail::Unit<T>(x));
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0> void assign(N count, X x) MIREL_FITS(T, x) {
    assign(detail::Count(count), detail::Unit<T>(x));
  }
  template <class X, detail::IfIntegers<X> = 0> void push_back(X x) MIREL_FITS(T, x) {
    push_back(detail::Unit<T>(x));
  }
  template <class X, detail::IfIntegers<X> = 0> void push_front(X x) MIREL_FITS(T, x) {
    push_front(detail::Unit<T>(x));
  }
  template <class X, detail::IfIntegers<X> = 0> xvector<T>& operator+=(X x) MIREL_FITS(T, x) {
    return *this += detail::Unit<T>(x);
  }
  template <class X, detail::IfIntegers<X> = 0> const xvector<T> operator+(X x) const MIREL_FITS(T, x) {
    return *this + detail::Unit<T>(x);
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  xvector<T>& append(N count, X x) MIREL_FITS(T, x) {
    return append(detail::Count(count), detail::Unit<T>(x));
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0> void insert(N i, X x) MIREL_FITS(T, x) {
    insert(detail::Count(i), detail::Unit<T>(x));
  }
  template <class X, detail::IfIntegers<X> = 0> iterator insert(iterator i, X x) MIREL_FITS(T, x) {
    return insert(i, detail::Unit<T>(x));
  }
  template <class N, class M, class X, detail::IfIntegers<N, M, X> = 0>
  void insert(N i, M count, X x) MIREL_FITS(T, x) {
    insert(detail::Count(i), detail::Count(count), detail::Unit<T>(x));
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  void insert(iterator i, N count, X x) MIREL_FITS(T, x) {
    insert(i, detail::Count(count), detail::Unit<T>(x));
  }
  template <class N, class M, detail::IfIntegers<N, M> = 0> void replace(N i, M n, const xvector<T>& r) {
    replace(detail::Count(i), detail::Count(n), r);
  }
  template <class N, class M, detail::IfIntegers<N, M> = 0> void replace(N i, M n, const T* p, ssize_t pn) {
    replace(detail::Count(i), detail::Count(n), p, pn);
  }
  template <class N, class M, class K, class X, detail::IfIntegers<N, M, K, X> = 0>
  void replace(N i, M n, K count, X x) MIREL_FITS(T, x) {
    replace(detail::Count(i), detail::Count(n), detail::Count(count), detail::Unit<T>(x));
  }
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  void replace(iterator i1, iterator i2, N count, X x) MIREL_FITS(T, x) {
    replace(i1, i2, detail::Count(count), detail::Unit<T>(x));
  }
  template <class N, class M, detail::IfIntegers<N, M> = 0> void erase(N i, M n) {
    erase(detail::Count(i), detail::Count(n));
  }
  template <class X, detail::IfIntegers<X> = 0> ssize_t FindAndErase(X x) MIREL_FITS(T, x) {
    return FindAndErase(detail::UnitToFind<T, 0>(x));
  }
  template <class X, detail::IfIntegers<X> = 0> ssize_t FindAndEraseFirst(X x) MIREL_FITS(T, x) {
    return FindAndEraseFirst(detail::UnitToFind<T, 0>(x));
  }
  template <class X, class... N, detail::IfIntegers<X, N...> = 0>
  ssize_t find(X c, N... offset) const MIREL_FITS(T, c) {
    return find(detail::UnitToFind<T, sizeof...(N)>(c), detail::Count(offset)...);
  }
  template <class X, class... N, detail::IfIntegers<X, N...> = 0>
  ssize_t rfind(X c, N... offset) const MIREL_FITS(T, c) {
    return rfind(detail::UnitToFind<T, sizeof...(N)>(c), detail::Count(offset)...);
  }
  template <class X, class... N, detail::IfIntegers<X, N...> = 0>
  ssize_t find_first_of(X c, N... offset) const MIREL_FITS(T, c) {
    return find_first_of(detail::UnitToFind<T, sizeof...(N)>(c), detail::Count(offset)...);
  }
  template <class X, class... N, detail::IfIntegers<X, N...> = 0>
  ssize_t find_first_not_of(X c, N... offset) const MIREL_FITS(T, c) {
    return find_first_not_of(detail::UnitToFind<T, sizeof...(N)>(c), detail::Count(offset)...);
  }
  template <class X, class... N, detail::IfIntegers<X, N...> = 0>
  ssize_t find_last_of(X c, N... offset) const MIREL_FITS(T, c) {
    return find_last_of(detail::UnitToFind<T, sizeof...(N)>(c), detail::Count(offset)...);
  }
  template <class X, class... N, detail::IfIntegers<X, N...> = 0>
  ssize_t find_last_not_of(X c, N... offset) const MIREL_FITS(T, c) {
    return find_last_not_of(detail::UnitToFind<T, sizeof...(N)>(c), detail::Count(offset)...);
  }

  iterator erase(std::nullptr_t) = delete;
  template <class N, detail::IfIntegers<N> = 0> detail::WriteEraseElement erase(N) = delete;
  template <class N, class Hint = detail::WritePointerAndCount, detail::IfIntegers<N> = 0>
  xvector(N, const T*) = delete;
  template <class X, detail::IfIntegers<X> = 0> detail::WriteAssignOfOneUnit assign(X) = delete;
  template <class X, detail::IfIntegers<X> = 0> detail::WritePushBack append(X) = delete;
  template <class... N, detail::IfIntegers<N...> = 0>
  detail::WriteNullptrOrPointerAndCount compare(N...) const = delete;
  detail::WriteRangeOfTheSet find_first_of(const xvector<T>&, ssize_t = 0) const = delete;
  detail::WriteRangeOfTheSet find_first_not_of(const xvector<T>&, ssize_t = 0) const = delete;
  // A reverse iterator converts to a pointer past the element that it designates.
  template <class... A> detail::ReverseIteratorsOnlyStep erase(const detail::ReversePointer&, A...) = delete;
  template <class... A> detail::ReverseIteratorsOnlyStep insert(const detail::ReversePointer&, A...) = delete;
  template <class... A>
  detail::ReverseIteratorsOnlyStep replace(const detail::ReversePointer&, A...) = delete;
  detail::ReverseIteratorsOnlyStep operator+=(const detail::ReversePointer&) = delete;
  // These refuse text of other units, standard strings and reverse iterators. In the compiler's message, the
  // type of Hint names what to write instead.
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  explicit xvector(const X&, N...) = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void assign(const X&, N...) = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void append(const X&, N...) = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void find(const X&, N...) const = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void rfind(const X&, N...) const = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void find_first_of(const X&, N...) const = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void find_first_not_of(const X&, N...) const = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void find_last_of(const X&, N...) const = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void find_last_not_of(const X&, N...) const = delete;
  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void compare(const X&, N...) const = delete;
  template <class X, class Hint = detail::Instead<T, X>> void _Eq(const X&) const = delete;
  template <class X, class Hint = detail::Instead<T, X>> void _Lt(const X&) const = delete;
  template <class I, class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void insert(I, const X&, N...) = delete;
  template <class I, class J, class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void replace(I, J, const X&, N...) = delete;
  template <class I, class J, class X, class... N, class Hint = detail::Instead<T, X, N...>>
  void compare(I, J, const X&, N...) const = delete;

protected:
  /// The most elements whose bytes an ssize_t can count.
  static constexpr ssize_t kMaxSize = std::numeric_limits<ssize_t>::max() / ssize_t(sizeof(T));
  /// Adds two sizes; throws std::bad_alloc if no vector can be that large.
  static ssize_t Sum(ssize_t a, ssize_t b) {
    if (b > kMaxSize - a)
      detail::AllocationFailed();
    return a + b;
  }
  /// Appends the pn elements at p; the arguments have been checked. It is inline for the most frequent edit,
  /// an append to a vector with room. The storage then stays, so the elements may lie in it, even in the
  /// unused capacity: memmove takes ranges that overlap.
  void Append(const T* p, ssize_t pn) {
    const ssize_t oldSize = size();
    if (pn > capacity() - oldSize)
      return ReplaceRange(oldSize, 0, p, pn);
    m_buffer.growbytes(pn * S);
    if (pn > 0) // memmove may not be given null pointers, even for no bytes
      std::memmove(begin() + oldSize, p, static_cast<std::size_t>(pn * S));
  }
  /// @endcond

private:
  /// The element size in bytes.
  static constexpr ssize_t S = sizeof(T);

  /// Converts a number of elements to bytes. No other place does so with a number that may be too large.
  static ssize_t Bytes(ssize_t count) {
    if (count > kMaxSize)
      detail::AllocationFailed();
    return count * S;
  }
  /// Converts bytes to elements. An unsigned division is a shift, and compilers see that the result is never
  /// negative.
  static ssize_t Elements(ssize_t bytes) { return ssize_t(static_cast<std::size_t>(bytes) / sizeof(T)); }
  // Every insertion, assignment and replacement resizes a range of elements and overwrites it. The exceptions
  // are resize(), push_back() of one element, and Append() to a vector with room.
  T* ResizeRange(ssize_t i, ssize_t n, ssize_t newN);
  void ReplaceRange(ssize_t i, ssize_t n, const T* p, ssize_t pn);
  void FillRange(ssize_t i, ssize_t n, ssize_t count, T x);
  void AppendRepeated(ssize_t count, const T* p, ssize_t pn);

  /// Returns the end of the elements that a reverse search from offset goes through.
  const T* After(ssize_t offset) const { return offset == npos ? end() : begin() + offset + 1; }
  /// Converts a search result to an index; notFound is the result of a search that finds nothing.
  ssize_t Index(const T* result, const T* notFound) const {
    if (result == notFound)
      return npos;
    return result - begin();
  }

  friend struct detail::Storage;

  VectorOfByte m_buffer;
};

/// Goes from the last element to the first. It designates the element before the pointer that it holds, and
/// only steps; for arithmetic use std::reverse_iterator.
/// @pre "p" of every dereference and step; only a null pointer is detected
///
/// @snippet examples/reference.cpp reverse iterators
template <class T> class xvector<T>::const_reverse_iterator : public detail::ReversePointer {
public:
  typedef std::bidirectional_iterator_tag iterator_category; ///< It steps both ways.
  typedef T value_type;                                      ///< An element.
  typedef std::ptrdiff_t difference_type;                    ///< The distance of two iterators.
  typedef const T* pointer;                                  ///< The result of `->`.
  typedef const T& reference;                                ///< The result of `*`.

  /// Designates the element before _p.
  explicit const_reverse_iterator(const T* _p) : p(_p) {}
  /// Converts to the pointer held, one past the designated element.
  operator const T*() const { return p; }
  /// The designated element.
  const T& operator*() const {
    MIREL_ASSERT(p);
    return p[-1];
  }
  /// The address of the designated element.
  const T* operator->() const {
    MIREL_ASSERT(p);
    return p - 1;
  }
  /// Steps towards the first element.
  const_reverse_iterator& operator++() {
    MIREL_ASSERT(p);
    --p;
    return *this;
  }
  /// Steps towards the first element. @return where it was
  const const_reverse_iterator operator++(int) {
    const const_reverse_iterator old(*this);
    ++*this;
    return old;
  }
  /// Steps towards the last element.
  const_reverse_iterator& operator--() {
    MIREL_ASSERT(p);
    ++p;
    return *this;
  }
  /// Steps towards the last element. @return where it was
  const const_reverse_iterator operator--(int) {
    const const_reverse_iterator old(*this);
    --*this;
    return old;
  }
  /// Returns whether both stand at the same place.
  bool operator==(const const_reverse_iterator& rhs) const { return p == rhs.p; }
  /// Returns whether the two stand at different places.
  bool operator!=(const const_reverse_iterator& rhs) const { return p != rhs.p; }

protected:
  const T* p; ///< One past the designated element.
};

/// Goes from the last element to the first, as const_reverse_iterator does; the elements may be changed.
/// @snippet examples/reference.cpp reverse iterators
template <class T> class xvector<T>::reverse_iterator : public xvector<T>::const_reverse_iterator {
public:
  typedef T* pointer;   ///< The result of `->`.
  typedef T& reference; ///< The result of `*`.

  /// Designates the element before _p.
  explicit reverse_iterator(T* _p) : const_reverse_iterator(_p) {}
  /// Converts to the pointer held, one past the designated element.
  operator T*() const { return const_cast<T*>(this->p); }
  /// The designated element.
  T& operator*() const { return const_cast<T&>(const_reverse_iterator::operator*()); }
  /// The address of the designated element.
  T* operator->() const { return const_cast<T*>(const_reverse_iterator::operator->()); }
  /// Steps towards the first element.
  reverse_iterator& operator++() {
    const_reverse_iterator::operator++();
    return *this;
  }
  /// Steps towards the first element. @return where it was
  const reverse_iterator operator++(int) {
    const reverse_iterator old(*this);
    ++*this;
    return old;
  }
  /// Steps towards the last element.
  reverse_iterator& operator--() {
    const_reverse_iterator::operator--();
    return *this;
  }
  /// Steps towards the last element. @return where it was
  const reverse_iterator operator--(int) {
    const reverse_iterator old(*this);
    --*this;
    return old;
  }
};

/// Exchanges the contents of two vectors in constant time.
template <class T> void swap(xvector<T>& a, xvector<T>& b) noexcept { a.swap(b); }

/// Changes the size of the range of n elements at index i to newN, and returns its beginning. The caller
/// overwrites the whole range.
///
///     |  before  |      n      |      after       |
///     |  before  |         newN         |      after       |
template <class T> T* xvector<T>::ResizeRange(ssize_t i, ssize_t n, ssize_t newN) {
  if (i + n == size() && newN > n)
    m_buffer.growbytes(Bytes(newN - n));
  else if (newN > n)
    m_buffer.insertbytes((i + n) * S, Bytes(newN - n));
  else if (newN < n)
    erase(begin() + i + newN, begin() + i + n);
  return begin() + i;
}

/// Replaces the n elements at index i with the pn at p. The arguments have been checked.
template <class T> void xvector<T>::ReplaceRange(ssize_t i, ssize_t n, const T* p, ssize_t pn) {
  if (m_buffer.owns(p)) {
    xvector<T> copy;
    copy.ReplaceRange(0, 0, p, pn);
    return ReplaceRange(i, n, copy.begin(), pn);
  }
  T* const range = ResizeRange(i, n, pn);
  p_copy(range, p, p + pn);
}

/// Replaces the n elements at index i with count elements equal to x. The argument may be an element of this
/// vector, so x is passed by value.
template <class T> void xvector<T>::FillRange(ssize_t i, ssize_t n, ssize_t count, T x) {
  T* const range = ResizeRange(i, n, count);
  p_create(range, range + count, x);
}

template <class T> void xvector<T>::resize(ssize_t newSize, const T& x) {
  MIREL_ASSERT(newSize >= 0);
  const T value = x;
  const ssize_t oldSize = size();
  if (newSize < oldSize)
    p_del(begin() + newSize, end());
  m_buffer.resize(Bytes(newSize));
  if (oldSize < newSize)
    p_create(begin() + oldSize, end(), value);
}

/// Appends the pn elements at p count times. The arguments have been checked.
template <class T> void xvector<T>::AppendRepeated(ssize_t count, const T* p, ssize_t pn) {
  if (pn == 0)
    return;
  if (m_buffer.owns(p)) {
    xvector<T> copy(p, pn);
    return AppendRepeated(count, copy.begin(), pn);
  }
  if (count > kMaxSize / pn)
    detail::AllocationFailed();
  T* range = ResizeRange(size(), 0, count * pn);
  for (; range != end(); range += pn)
    p_copy(range, p, p + pn);
}

template <class T> ssize_t xvector<T>::FindAndErase(const T& x) {
  const T value = x; // x may be an element that the loop overwrites
  const ssize_t first = find(value);
  if (first == npos)
    return 0;
  T* kept = begin() + first;
  T* const last = end();
  for (const T* p = kept + 1; p != last; ++p)
    if (*p != value)
      *kept++ = *p;
  const ssize_t count = last - kept;
  erase(kept, last);
  return count;
}

template <class T> ssize_t xvector<T>::FindAndEraseFirst(const T& x) {
  const ssize_t i = rfind(x);
  if (i == npos)
    return 0;
  erase_element(i);
  return 1;
}

template <class T>
template <class It, detail::IfIterator<It>>
ssize_t xvector<T>::rfind(It r1, It r2, ssize_t offset) const {
  MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
  detail::RequireForward<It>();
  MIREL_ASSERT_NEEDLE(r1, r2);
  if (r1 == r2)
    return offset == npos ? size() : offset;
  const auto pn = std::distance(r1, r2); // may have more bits than an ssize_t
  // The last occurrence that may count starts at offset and so ends pn elements later.
  const T* const last = end() - After(offset) < pn ? end() : After(offset) + (pn - 1);
  const auto needle = detail::Needle<T>(r1, r2);
  return Index(FindLastSubSequence(begin(), last, needle.begin(), needle.end()), last);
}

} // namespace mirel
