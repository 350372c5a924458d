/// @file
/// xvector<T>, a growable array of code units, and the primitives that act on runs of its elements.
///
/// The vector knows elements: it turns element counts into bytes and overwrites the gaps that its byte buffer
/// opens. It allocates nothing itself, and knows nothing of zero termination.

#pragma once

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <initializer_list>
#include <iterator>
#include <limits>
#include <new>
#include <type_traits>

#include <utils/VectorOfByte.h>

namespace mirel {

/// @name Element runs
/// A run is a half-open range of pointers; an empty one may be a pair of null pointers. Overload resolution
/// picks the way: a `const T*` source is one block copy, any other source an element loop.
/// @{

/// Assigns x to the elements of [r1, r2), in ascending order; a reversed range is empty.
/// @pre "r1 >= r2 || r1 != nullptr"
template <class T> void assigning_p_create(T* r1, T* r2, T x) {
  MIREL_ASSERT(r1 >= r2 || r1 != nullptr);
  for (; r1 < r2; ++r1)
    *r1 = x;
}

/// Fills the run [r1, r2) with x; a reversed range is empty. @pre "r1 >= r2 || r1 != nullptr"
inline void p_create(char8* r1, char8* r2, char8 x) {
  MIREL_ASSERT(r1 >= r2 || r1 != nullptr);
  if (r1 < r2)
    std::memset(r1, x, static_cast<std::size_t>(r2 - r1));
}
/// The same for 16-bit code units.
inline void p_create(char16* r1, char16* r2, char16 x) { assigning_p_create<char16>(r1, r2, x); }

/// Copies [src1, src2) to the run at dst, which may not overlap it, as one block.
/// @pre "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)"
template <class T> void memcpy_p_copy(T* dst, const T* src1, const T* src2) {
  MIREL_ASSERT(src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr));
  if (src1 != src2) // memcpy may not be given null pointers, even for no bytes
    std::memcpy(dst, src1, static_cast<std::size_t>(src2 - src1) * sizeof(T));
}

/// Copies the elements of [src1, src2), first to last, to the run at dst.
/// @pre "src1 == src2 || dst != nullptr"
template <class T, class It> void p_copy(T* dst, It src1, It src2) {
  MIREL_ASSERT(src1 == src2 || dst != nullptr);
  for (; src1 != src2; ++src1, ++dst)
    *dst = *src1;
}
/// The same for 8-bit code units, as memcpy_p_copy().
inline void p_copy(char8* dst, const char8* src1, const char8* src2) {
  memcpy_p_copy<char8>(dst, src1, src2);
}
/// The same for 16-bit code units, as memcpy_p_copy().
inline void p_copy(char16* dst, const char16* src1, const char16* src2) {
  memcpy_p_copy<char16>(dst, src1, src2);
}

/// Destroys a run: nothing to do for code units.
inline void p_del(char8*, char8*) {}
/// The same for 16-bit code units.
inline void p_del(char16*, char16*) {}

/// @}

namespace detail {

/// Lets a template take part in overload resolution only for iterators, never for numbers.
template <class It>
using IfIterator = std::enable_if_t<
    std::is_convertible_v<typename std::iterator_traits<It>::iterator_category, std::input_iterator_tag>,
    int>;

/// Lets a template take part only for (pointer, integer), where a literal 0 counts as an integer.
template <class P, class Ptr, class N>
using IfPointerAndCount = std::enable_if_t<
    (std::is_pointer_v<P> || std::is_null_pointer_v<P>)&&std::is_convertible_v<P, Ptr> && kIsInteger<N>, int>;

} // namespace detail

/// A growable array of code units (char8 or char16) with the operations of a string.
///
/// Parameters, throughout: `i` an index or iterator, `n` a number of elements from there; `i1`/`i2` the ends
/// of a half-open range of this vector; `r` another vector, `ri`/`rn` a sub-range of it; `p`/`pn` a pointer
/// and a number of elements; `r1`/`r2` a half-open range elsewhere; `x` an element; `c` an element that is
/// looked for; `offset` where a search starts; `count` a repeat, fill or substring length. All are in
/// elements, and signed.
///
/// @par Bad arguments
/// stop the process with the text given after "@pre", before anything has changed. They are never clamped. A
/// null pointer is an empty range together with a count of 0, and a bad argument otherwise.
/// @par Memory
/// that can't be had is std::bad_alloc: contents, size and capacity are as they were before the call.
/// @par Invalidation
/// Whatever may add elements or capacity may move the storage: pointers, references and iterators from before
/// are invalid. Erasing keeps the storage and moves down the elements behind; swap() exchanges the storage.
/// @par Aliasing
/// An argument that is, or lies in, the vector itself gives the result as if it had been copied first.
/// @par Cost
/// A run of edits takes amortised constant time per element added, plus that of the elements that move.
/// @par Threads
/// Different threads may use different vectors, and may read one vector that no thread changes.
///
/// A literal 0 is an index, a count or an element, never a pointer: that is what the overloads for integers
/// of any type are for, which do what the overload above them does.
template <class T> class MIREL_DESCRIBED MIREL_API xvector {
public:
  /// @name Types
  /// @{

  typedef T value_type;                   ///< An element.
  typedef T* iterator;                    ///< A pointer into the storage.
  typedef const T* const_iterator;        ///< The same to const elements.
  typedef T& reference;                   ///< An element in place.
  typedef const T& const_reference;       ///< The same to const elements.
  typedef ssize_t size_type;              ///< A count or index, signed.
  typedef std::ptrdiff_t difference_type; ///< The distance of two iterators.

  /// As a count: up to the end. As the start of a reverse search: the last element. As a result: not found.
  enum { npos = -1 };

  /// Goes from the last element to the first: designates the element before the pointer that it holds.
  /// @pre "p" of every dereference and step: only a null pointer is caught
  class const_reverse_iterator {
  public:
    typedef std::bidirectional_iterator_tag iterator_category; ///< It goes both ways.
    typedef T value_type;                                      ///< An element.
    typedef std::ptrdiff_t difference_type;                    ///< The distance of two iterators.
    typedef const T* pointer;                                  ///< What -> gives.
    typedef const T& reference;                                ///< What * gives.

    /// Designates the element before _p.
    explicit const_reverse_iterator(const T* _p) : p(_p) {}
    /// The pointer held, one past the element designated.
    operator const T*() const { return p; }
    /// The element designated.
    const T& operator*() const {
      MIREL_ASSERT(p);
      return p[-1];
    }
    /// The same for its members.
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
    /// The same. @return where it was
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
    /// The same. @return where it was
    const const_reverse_iterator operator--(int) {
      const const_reverse_iterator old(*this);
      --*this;
      return old;
    }
    bool operator==(const const_reverse_iterator& rhs) const { return p == rhs.p; } ///< Same place.
    bool operator!=(const const_reverse_iterator& rhs) const { return p != rhs.p; } ///< Other place.

  protected:
    const T* p; ///< One past the element designated.
  };

  /// The same over elements that may be changed.
  class reverse_iterator : public const_reverse_iterator {
  public:
    typedef T* pointer;   ///< What -> gives.
    typedef T& reference; ///< What * gives.

    /// Designates the element before _p.
    explicit reverse_iterator(T* _p) : const_reverse_iterator(_p) {}
    /// The pointer held, one past the element designated.
    operator T*() const { return const_cast<T*>(this->p); }
    /// The element designated.
    T& operator*() const { return const_cast<T&>(const_reverse_iterator::operator*()); }
    /// The same for its members.
    T* operator->() const { return const_cast<T*>(const_reverse_iterator::operator->()); }
    /// Steps towards the first element.
    reverse_iterator& operator++() {
      const_reverse_iterator::operator++();
      return *this;
    }
    /// The same. @return where it was
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
    /// The same. @return where it was
    const reverse_iterator operator--(int) {
      const reverse_iterator old(*this);
      --*this;
      return old;
    }
  };

  /// @}
  /// @name Construction, copy
  /// There is no move: copies copy, and swap() exchanges storage. A new vector's capacity is its size.
  /// @{

  /// An empty vector, without storage.
  xvector() {}
  /// rn elements of r from index ri on. @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  xvector(const xvector<T>& r, ssize_t ri, ssize_t rn) { assign(r, ri, rn); }
  /// The pn elements at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  xvector(const T* p, ssize_t pn) { assign(p, pn); }
  /// The same for counts of any integer type.
  template <class P, class N, detail::IfPointerAndCount<P, const T*, N> = 0>
  xvector(P p, N pn) : xvector(static_cast<const T*>(p), ssize_t(pn)) {}
  /// count elements equal to x. @pre "0 <= count"
  explicit xvector(ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= count);
    FillRun(0, 0, count, x);
  }
  /// The same for int, and implicit.
  xvector(int count, const T& x) : xvector(ssize_t(count), x) {}
  /// The same for integers of any type.
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  explicit xvector(N count, X x) : xvector(ssize_t(count), T(x)) {}
  /// The elements of [r1, r2). @pre "r1 <= r2"
  xvector(const T* r1, const T* r2) { assign(r1, r2); }
  /// A copy.
  xvector(const xvector<T>& r) { assign(r); }
  /// The listed elements.
  xvector(std::initializer_list<T> r) { assign(r.begin(), r.end()); }
  /// Gives the storage back.
  ~xvector() { p_del(data(), data_end()); }

  /// Becomes a copy of r; keeps the storage where it is large enough.
  xvector<T>& operator=(const xvector<T>& r) {
    if (this != &r)
      assign(r);
    return *this;
  }
  /// Exchanges elements and capacities in constant time; pointers stay valid and point into the other vector.
  void swap(xvector<T>& r) noexcept { m_buffer.swap(r.m_buffer); }

  /// @}
  /// @name Capacity
  /// @{

  /// Makes room for size elements in all, exactly; does nothing where there is room. @pre "size >= 0"
  void reserve(ssize_t size) const {
    MIREL_ASSERT(size >= 0);
    m_buffer.reserve(Bytes(size));
  }
  /// How many elements there is room for in the storage.
  ssize_t capacity() const { return Elements(m_buffer.capacity()); }
  /// Drops elements at the end, or adds elements equal to x there. @pre "newSize >= 0"
  void resize(ssize_t newSize, const T& x);
  bool empty() const { return m_buffer.empty(); }            ///< Whether there are no elements.
  ssize_t size() const { return Elements(m_buffer.size()); } ///< How many elements there are.
  ssize_t length() const { return size(); }                  ///< As size().

  /// @}
  /// @name Access
  /// data() is null in a vector that has no storage yet. The elements stand one behind the other.
  /// @{

  /// The first element.
  const T* data() const { return reinterpret_cast<const T*>(m_buffer.begin()); }
  T* data() { return reinterpret_cast<T*>(m_buffer.begin()); } ///< The first element.
  /// Behind the last element.
  const T* data_end() const { return reinterpret_cast<const T*>(m_buffer.end()); }
  T* data_end() { return reinterpret_cast<T*>(m_buffer.end()); } ///< Behind the last element.

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
  /// @{

  const_iterator begin() const { return data(); }   ///< The first element.
  const_iterator end() const { return data_end(); } ///< Behind the last element.
  iterator begin() { return data(); }               ///< The first element.
  iterator end() { return data_end(); }             ///< Behind the last element.
  /// The last element.
  const_reverse_iterator rbegin() const { return const_reverse_iterator(end()); }
  /// Before the first element.
  const_reverse_iterator rend() const { return const_reverse_iterator(begin()); }
  reverse_iterator rbegin() { return reverse_iterator(end()); } ///< The last element.
  reverse_iterator rend() { return reverse_iterator(begin()); } ///< Before the first element.

  /// @}
  /// @name Assignment
  /// Replaces the whole contents; keeps the storage where it is large enough.
  /// @{

  /// The elements of [r1, r2). Pointers are copied from directly, other iterators through a vector in
  /// between.
  /// @pre "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void assign(It r1, It r2) {
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    const auto source = Source(r1, r2);
    ReplaceRun(0, size(), source.begin(), source.size());
  }
  /// The elements of r.
  void assign(const xvector<T>& r) { ReplaceRun(0, size(), r.begin(), r.size()); }
  /// rn elements of r from index ri on. @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  void assign(const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    ReplaceRun(0, size(), r.begin() + ri, rn);
  }
  /// The pn elements at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void assign(const T* p, ssize_t pn) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    ReplaceRun(0, size(), p, pn);
  }
  /// count elements equal to x. @pre "0 <= count"
  void assign(ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= count);
    FillRun(0, size(), count, x);
  }
  /// The same for integers of any type.
  template <class N, class X, detail::IfIntegers<N, X> = 0> void assign(N count, X x) {
    assign(ssize_t(count), T(x));
  }
  /// Removes all elements and keeps the storage.
  void erase() {
    p_del(data(), data_end());
    m_buffer.clear();
  }
  void clear() { erase(); } ///< As erase().

  /// @}
  /// @name Appending
  /// @{

  /// Appends x. When the vector is full, the new capacity is the new size plus the old capacity.
  void push_back(const T& x) { m_buffer.template push_back<T>(x); }
  /// Appends the elements of [r1, r2), which may be any iterators as in assign(). @pre "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void push_back(It r1, It r2) {
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    const auto source = Source(r1, r2);
    Append(source.begin(), source.size());
  }
  /// Appends the elements of [r1, r2) count times. @pre "0 <= count", then "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void push_back(ssize_t count, It r1, It r2);
  /// Inserts x before the first element.
  void push_front(const T& x) { insert(ssize_t(0), x); }
  /// Appends the elements of r.
  xvector<T>& operator+=(const xvector<T>& r) { return append(r); }
  /// Appends x.
  xvector<T>& operator+=(const T& x) {
    push_back(x);
    return *this;
  }
  /// A new vector: the elements of this one, then those of r. Allocates once.
  const xvector<T> operator+(const xvector<T>& r) const {
    xvector<T> z;
    z.reserve(size() + r.size());
    z = *this;
    z.append(r);
    return z;
  }
  /// A new vector: the elements of this one, then x. Allocates once.
  const xvector<T> operator+(const T& x) const {
    xvector<T> z;
    z.reserve(size() + 1);
    z = *this;
    z.push_back(x);
    return z;
  }
  /// Makes the contents count copies of themselves, in new storage. @pre "0 <= count"
  xvector<T>& operator*=(ssize_t count) {
    MIREL_ASSERT(0 <= count);
    xvector<T> product;
    product.push_back(count, begin(), end());
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
    FillRun(size(), 0, count, x);
    return *this;
  }
  /// The same for integers of any type.
  template <class N, class X, detail::IfIntegers<N, X> = 0> xvector<T>& append(N count, X x) {
    return append(ssize_t(count), T(x));
  }

  /// @}
  /// @name Moving
  /// @{

  /// Copies n elements from index s to index d, also where the two stretches overlap. The size stays.
  /// @pre "0 <= d && 0 <= n && d+n <= size()", then "0 <= s && 0 <= n && s+n <= size()"
  void move(ssize_t d, ssize_t s, ssize_t n) {
    // What the buffer asserts, asserted before the scaling to bytes, which could overflow.
    MIREL_ASSERT_SUBRANGE(d, n, size());
    MIREL_ASSERT_SUBRANGE(s, n, size());
    m_buffer.move(d * S, s * S, n * S);
  }

  /// @}
  /// @name Inserting
  /// Before index or iterator i. Before an iterator the precondition is on its distance from begin().
  /// @{

  /// Inserts the elements of [r1, r2), which may be any iterators as in assign().
  /// @pre "0 <= i && i <= size()", then "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> void insert(ssize_t i, It r1, It r2) {
    MIREL_ASSERT(0 <= i && i <= size());
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    const auto source = Source(r1, r2);
    ReplaceRun(i, 0, source.begin(), source.size());
  }
  /// Inserts the elements of r. @pre "0 <= i && i <= size()"
  void insert(ssize_t i, const xvector<T>& r) {
    MIREL_ASSERT(0 <= i && i <= size());
    ReplaceRun(i, 0, r.begin(), r.size());
  }
  /// Inserts rn elements of r from index ri on.
  /// @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()", then "0 <= i && i <= size()"
  void insert(ssize_t i, const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    MIREL_ASSERT(0 <= i && i <= size());
    ReplaceRun(i, 0, r.begin() + ri, rn);
  }
  /// Inserts the pn elements at p. @pre "pn == 0 || (pn > 0 && p != nullptr)", then "0 <= i && i <= size()"
  void insert(ssize_t i, const T* p, ssize_t pn) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    MIREL_ASSERT(0 <= i && i <= size());
    ReplaceRun(i, 0, p, pn);
  }
  /// Inserts x. @pre "0 <= i && i <= size()"
  void insert(ssize_t i, const T& x) {
    MIREL_ASSERT(0 <= i && i <= size());
    FillRun(i, 0, 1, x);
  }
  /// The same for integers of any type.
  template <class N, class X, detail::IfIntegers<N, X> = 0> void insert(N i, X x) {
    insert(ssize_t(i), T(x));
  }
  /// Inserts x before an iterator. @return where it is now
  iterator insert(iterator i, const T& x) {
    const ssize_t n = i - begin();
    insert(n, x);
    return begin() + n;
  }
  /// Inserts count elements equal to x. @pre "0 <= i && i <= size()", then "0 <= count"
  void insert(ssize_t i, ssize_t count, const T& x) {
    MIREL_ASSERT(0 <= i && i <= size());
    MIREL_ASSERT(0 <= count);
    FillRun(i, 0, count, x);
  }
  /// The same before an iterator.
  void insert(iterator i, ssize_t count, const T& x) { insert(i - begin(), count, x); }
  /// The same for int.
  void insert(iterator i, int count, const T& x) { insert(i, ssize_t(count), x); }
  /// The same before an index.
  void insert(ssize_t i, int count, const T& x) { insert(i, ssize_t(count), x); }
  /// count elements equal to x before an iterator, for integers of any type.
  template <class N, class X, detail::IfIntegers<N, X> = 0> void insert(iterator i, N count, X x) {
    insert(i, ssize_t(count), T(x));
  }
  /// The same before an index.
  template <class N, class M, class X, detail::IfIntegers<N, M, X> = 0> void insert(N i, M count, X x) {
    insert(ssize_t(i), ssize_t(count), T(x));
  }

  /// @}
  /// @name Replacing
  /// The n elements from index i on, or those of [i1, i2), by others.
  /// @{

  /// By the elements of r. @pre "0 <= i && 0 <= n && i+n <= size()"
  void replace(ssize_t i, ssize_t n, const xvector<T>& r) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    ReplaceRun(i, n, r.begin(), r.size());
  }
  /// The same for integers of any type.
  template <class N, class M, detail::IfIntegers<N, M> = 0> void replace(N i, M n, const xvector<T>& r) {
    replace(ssize_t(i), ssize_t(n), r);
  }
  /// By rn elements of r from index ri on.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  void replace(ssize_t i, ssize_t n, const xvector<T>& r, ssize_t ri, ssize_t rn) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    ReplaceRun(i, n, r.begin() + ri, rn);
  }
  /// By the pn elements at p.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "pn == 0 || (pn > 0 && p != nullptr)"
  void replace(ssize_t i, ssize_t n, const T* p, ssize_t pn) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    ReplaceRun(i, n, p, pn);
  }
  /// The same for integers of any type.
  template <class N, class M, detail::IfIntegers<N, M> = 0> void replace(N i, M n, const T* p, ssize_t pn) {
    replace(ssize_t(i), ssize_t(n), p, pn);
  }
  /// By count elements equal to x. @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= count"
  void replace(ssize_t i, ssize_t n, ssize_t count, const T& x) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT(0 <= count);
    FillRun(i, n, count, x);
  }
  /// The same for integers of any type.
  template <class N, class M, class K, class X, detail::IfIntegers<N, M, K, X> = 0>
  void replace(N i, M n, K count, X x) {
    replace(ssize_t(i), ssize_t(n), ssize_t(count), T(x));
  }
  /// The elements of [i1, i2) by those of r. @pre "begin() <= i1 && i1 <= i2 && i2 <= end()"
  void replace(iterator i1, iterator i2, const xvector<T>& r) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    ReplaceRun(i1 - begin(), i2 - i1, r.begin(), r.size());
  }
  /// The elements of [i1, i2) by the pn at p.
  /// @pre "begin() <= i1 && i1 <= i2 && i2 <= end()", then "pn == 0 || (pn > 0 && p != nullptr)"
  void replace(iterator i1, iterator i2, const T* p, ssize_t pn) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    ReplaceRun(i1 - begin(), i2 - i1, p, pn);
  }
  /// The elements of [i1, i2) by count elements equal to x.
  /// @pre "begin() <= i1 && i1 <= i2 && i2 <= end()", then "0 <= count"
  void replace(iterator i1, iterator i2, ssize_t count, const T& x) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    MIREL_ASSERT(0 <= count);
    FillRun(i1 - begin(), i2 - i1, count, x);
  }
  /// The same for integers of any type.
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  void replace(iterator i1, iterator i2, N count, X x) {
    replace(i1, i2, ssize_t(count), T(x));
  }

  /// @}
  /// @name Erasing
  /// Removes elements. Those behind move down in one step, which invalidates what points there; the storage
  /// stays. A count can't be npos.
  /// @{

  /// The elements of [i1, i2). @pre "begin() <= i1 && i1 <= i2 && i2 <= end()"
  void erase(iterator i1, iterator i2) {
    MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
    p_del(i1, i2);
    m_buffer.erase(reinterpret_cast<uint8*>(i1), reinterpret_cast<uint8*>(i2));
  }
  /// The element at i. @pre "begin() <= i && i < end()" @return where the next element is now
  iterator erase(iterator i) {
    MIREL_ASSERT(begin() <= i && i < end());
    const ssize_t n = i - begin();
    erase(i, i + 1);
    return begin() + n;
  }
  iterator erase(std::nullptr_t) = delete; // erase(0) would be a null iterator
  /// n elements from index i on. @pre "0 <= i && 0 <= n && i+n <= size()"
  void erase(ssize_t i, ssize_t n) {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    erase(begin() + i, begin() + i + n);
  }
  /// The same for integers of any type.
  template <class N, class M, detail::IfIntegers<N, M> = 0> void erase(N i, M n) {
    erase(ssize_t(i), ssize_t(n));
  }
  /// The elements from index i1 up to but excluding i2. @pre "0 <= i1 && i1 <= i2 && i2 <= size()"
  void erase_range(ssize_t i1, ssize_t i2) {
    MIREL_ASSERT(0 <= i1 && i1 <= i2 && i2 <= size());
    erase(begin() + i1, begin() + i2);
  }
  /// The element at index i. @pre "0 <= i && i < size()"
  void erase_element(ssize_t i) {
    MIREL_ASSERT(0 <= i && i < size());
    erase(begin() + i);
  }
  /// The first element, in time linear in the size. @pre "size() > 0"
  void pop_front() {
    MIREL_ASSERT(size() > 0);
    erase_element(0);
  }
  /// The last element, in constant time. @pre "size() > 0"
  void pop_back() {
    MIREL_ASSERT(size() > 0);
    m_buffer.pop_back(S);
  }
  /// All elements equal to x, in one pass. @return how many there were
  ssize_t FindAndErase(const T& x);
  /// The one with the highest index of the elements equal to x. @return 1, or 0 if there was none
  ssize_t FindAndEraseFirst(const T& x);

  /// @}
  /// @name Comparison
  /// By the first differing element as an unsigned value; of a vector and its proper prefix, the prefix is
  /// first. compare() is negative, 0 or positive: for char8 a difference is the value of memcmp, otherwise
  /// -1, 0 or 1. The cost is at worst linear in the shorter length.
  /// @{

  /// All elements, with those of r.
  int compare(const xvector<T>& r) const {
    return LexicographicalCompareX(begin(), end(), r.begin(), r.end());
  }
  /// All elements, with the pn at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  int compare(const T* p, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return LexicographicalCompareX(begin(), end(), p, p + pn);
  }
  /// The n elements from index i on, with those of r. @pre "0 <= i && 0 <= n && i+n <= size()"
  int compare(ssize_t i, ssize_t n, const xvector<T>& r) const {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    return LexicographicalCompareX(begin() + i, begin() + i + n, r.begin(), r.end());
  }
  /// The n elements from index i on, with rn of r from index ri on.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  int compare(ssize_t i, ssize_t n, const xvector<T>& r, ssize_t ri, ssize_t rn) const {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
    return LexicographicalCompareX(begin() + i, begin() + i + n, r.begin() + ri, r.begin() + ri + rn);
  }
  /// The n elements from index i on, with the pn at p.
  /// @pre "0 <= i && 0 <= n && i+n <= size()", then "pn == 0 || (pn > 0 && p != nullptr)"
  int compare(ssize_t i, ssize_t n, const T* p, ssize_t pn) const {
    MIREL_ASSERT_SUBRANGE(i, n, size());
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return LexicographicalCompareX(begin() + i, begin() + i + n, p, p + pn);
  }
  /// Whether the two hold the same elements; vectors of different sizes are told apart without reading any.
  bool _Eq(const xvector<T>& r) const { return size() == r.size() && IsEqual(begin(), end(), r.begin()); }
  /// Whether this one orders before r.
  bool _Lt(const xvector<T>& r) const { return compare(r) < 0; }
  /// Whether [r1, r2) stands at index offset. @pre "0 <= offset && offset <= size()", then "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> bool contains(It r1, It r2, ssize_t offset) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    return IsPrefix(begin() + offset, end(), AsConst(r1), AsConst(r2));
  }

  /// @}
  /// @name Search
  /// The result is an index, or npos when nothing is found. What is looked for is an element, a range of any
  /// forward iterators, a vector, or a pointer and count (with offset before the count).
  ///
  /// Forward searches begin at index offset. @pre "0 <= offset && offset <= size()"
  ///
  /// Reverse searches go from index offset, npos being that of the last element, down to 0.
  /// @pre "offset == npos || (0 <= offset && offset < size())"
  ///
  /// A pointer and count is checked before offset, a range after it.
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  /// @pre "r1 <= r2"
  ///
  /// Nothing is allocated. At worst the cost is linear in the length searched for one element; in the sum of
  /// both lengths for needles and sets of code units, and for needles of integers by random-access iterators;
  /// and their product otherwise.
  /// @{

  /// The first element that is c.
  ssize_t find(const T& c, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    return Index(Find(begin() + offset, end(), c), end());
  }
  /// The first occurrence of a range. An empty one is found at offset.
  template <class It, detail::IfIterator<It> = 0> ssize_t find(It r1, It r2, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    if (r1 == r2)
      return offset;
    return Index(FindFirstSubSequence(begin() + offset, end(), AsConst(r1), AsConst(r2)), end());
  }
  /// The same of a vector.
  ssize_t find(const xvector<T>& r, ssize_t offset = 0) const { return find(r.begin(), r.end(), offset); }
  /// The same of the pn elements at p.
  ssize_t find(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find(p, p + pn, offset);
  }

  /// The last element at or before offset that is c.
  ssize_t rfind(const T& c, ssize_t offset = npos) const {
    MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
    return Index(FindLast(begin(), After(offset), c), After(offset));
  }
  /// The last occurrence of a range that starts at or before offset; it may reach past it. An empty one is
  /// found at offset, for npos at size().
  template <class It, detail::IfIterator<It> = 0> ssize_t rfind(It r1, It r2, ssize_t offset = npos) const;
  /// The same of a vector.
  ssize_t rfind(const xvector<T>& r, ssize_t offset = npos) const {
    return rfind(r.begin(), r.end(), offset);
  }
  /// The same of the pn elements at p.
  ssize_t rfind(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return rfind(p, p + pn, offset);
  }

  /// The first element that is c.
  ssize_t find_first_of(const T& c, ssize_t offset = 0) const { return find(c, offset); }
  /// The first element that occurs in a set. An empty one matches nothing.
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_first_of(It r1, It r2, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    return Index(FindFirstOf(begin() + offset, end(), AsConst(r1), AsConst(r2)), end());
  }
  /// The same of a vector. It isn't const: on a const vector give its range.
  ssize_t find_first_of(const xvector<T>& r, ssize_t offset = 0) {
    return find_first_of(r.begin(), r.end(), offset);
  }
  /// The same of the pn elements at p.
  ssize_t find_first_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_first_of(p, p + pn, offset);
  }

  /// The first element that is not c.
  ssize_t find_first_not_of(const T& c, ssize_t offset = 0) const {
    return find_first_not_of(&c, &c + 1, offset);
  }
  /// The first element that doesn't occur in a set. An empty one excludes nothing.
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_first_not_of(It r1, It r2, ssize_t offset = 0) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    return Index(FindFirstNotOf(begin() + offset, end(), AsConst(r1), AsConst(r2)), end());
  }
  /// The same of a vector. It isn't const: on a const vector give its range.
  ssize_t find_first_not_of(const xvector<T>& r, ssize_t offset = 0) {
    return find_first_not_of(r.begin(), r.end(), offset);
  }
  /// The same of the pn elements at p.
  ssize_t find_first_not_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_first_not_of(p, p + pn, offset);
  }

  /// The last element at or before offset that is c.
  ssize_t find_last_of(const T& c, ssize_t offset = npos) const { return rfind(c, offset); }
  /// The last element at or before offset that occurs in a set.
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_last_of(It r1, It r2, ssize_t offset = npos) const {
    MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    return Index(FindLastOf(begin(), After(offset), AsConst(r1), AsConst(r2)), After(offset));
  }
  /// The same of a vector.
  ssize_t find_last_of(const xvector<T>& r, ssize_t offset = npos) const {
    return find_last_of(r.begin(), r.end(), offset);
  }
  /// The same of the pn elements at p.
  ssize_t find_last_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_last_of(p, p + pn, offset);
  }

  /// The last element at or before offset that is not c.
  ssize_t find_last_not_of(const T& c, ssize_t offset = npos) const {
    return find_last_not_of(&c, &c + 1, offset);
  }
  /// The last element at or before offset that doesn't occur in a set.
  template <class It, detail::IfIterator<It> = 0>
  ssize_t find_last_not_of(It r1, It r2, ssize_t offset = npos) const {
    MIREL_ASSERT(offset == npos || (0 <= offset && offset < size()));
    MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
    return Index(FindLastNotOf(begin(), After(offset), AsConst(r1), AsConst(r2)), After(offset));
  }
  /// The same of a vector.
  ssize_t find_last_not_of(const xvector<T>& r, ssize_t offset = npos) const {
    return find_last_not_of(r.begin(), r.end(), offset);
  }
  /// The same of the pn elements at p.
  ssize_t find_last_not_of(const T* p, ssize_t offset, ssize_t pn) const {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    return find_last_not_of(p, p + pn, offset);
  }

  /// A new vector: count elements from index offset on, npos being all that follow.
  /// @pre "0 <= offset && offset <= size()", then "count == npos || (0 <= count && offset+count <= size())"
  xvector<T> substr(ssize_t offset = 0, ssize_t count = npos) const {
    MIREL_ASSERT(0 <= offset && offset <= size());
    MIREL_ASSERT_AS(count == npos || detail::IsSubrange(offset, count, size()),
                    "count == npos || (0 <= count && offset+count <= size())");
    const T* const r1 = begin() + offset;
    return xvector<T>(r1, count == npos ? end() : r1 + count);
  }

  /// @}

private:
  /// The element size in bytes.
  static constexpr ssize_t S = sizeof(T);

  /// Elements of a caller's as a pointer and a count.
  struct Run {
    const T* p;
    ssize_t pn;
    const T* begin() const { return p; }
    ssize_t size() const { return pn; }
  };

  template <class It>
  static constexpr bool IsElementPointer = std::is_same_v<It, T*> || std::is_same_v<It, const T*>;

  /// The only place where a number of elements that may be too large becomes one of bytes.
  static ssize_t Bytes(ssize_t count) {
    if (count > std::numeric_limits<ssize_t>::max() / S)
      throw std::bad_alloc();
    return count * S;
  }
  /// And back. Without a sign it is a shift, and compilers see that it is never negative.
  static ssize_t Elements(ssize_t bytes) { return ssize_t(static_cast<std::size_t>(bytes) / sizeof(T)); }
  /// False for a reversed range of pointers; of other iterators nothing is known.
  template <class It> static bool IsRange(It r1, It r2) {
    if constexpr (std::is_pointer_v<It>)
      return r1 <= r2;
    else
      return true;
  }
  /// The elements of [r1, r2) in one piece: pointers to elements as they are, other iterators through a copy,
  /// since only a pointer tells whether it points into this vector.
  template <class It> static auto Source(It r1, It r2) {
    if constexpr (IsElementPointer<It>) {
      return Run{r1, r2 - r1};
    } else {
      xvector<T> copy;
      for (; r1 != r2; ++r1)
        copy.push_back(static_cast<T>(*r1));
      return copy;
    }
  }
  /// Takes patterns given by non-const pointers to the same algorithms as those given by const ones.
  template <class It> static auto AsConst(It it) {
    if constexpr (IsElementPointer<It>)
      return static_cast<const T*>(it);
    else
      return it;
  }

  // Whatever inserts, assigns or replaces resizes a run of elements and overwrites it. Only push_back of one
  // element is the buffer's own.
  T* ResizeRun(ssize_t i, ssize_t n, ssize_t newN);
  void ReplaceRun(ssize_t i, ssize_t n, const T* p, ssize_t pn);
  void FillRun(ssize_t i, ssize_t n, ssize_t count, T x);

  /// Appends the pn elements at p: the most frequent edit, inline where there is room. Then they may also lie
  /// in this vector, even in its spare part: the storage stays, and memmove takes runs that overlap.
  void Append(const T* p, ssize_t pn) {
    const ssize_t oldSize = size();
    if (pn > capacity() - oldSize)
      return ReplaceRun(oldSize, 0, p, pn);
    m_buffer.growbytes(pn * S);
    if (pn > 0) // memmove may not be given null pointers, even for no bytes
      std::memmove(begin() + oldSize, p, static_cast<std::size_t>(pn * S));
  }

  /// The end of the part that a reverse search from offset goes through.
  const T* After(ssize_t offset) const { return offset == npos ? end() : begin() + offset + 1; }
  /// A search result as an index, where notFound is what the search returns for nothing.
  ssize_t Index(const T* result, const T* notFound) const {
    if (result == notFound)
      return npos;
    return result - begin();
  }

  friend struct detail::Storage;

  VectorOfByte m_buffer;
};

/// Exchanges the contents of two vectors in constant time.
template <class T> void swap(xvector<T>& a, xvector<T>& b) noexcept { a.swap(b); }

/// Makes room for newN elements in the place of the n at index i, and returns it; the caller overwrites it
/// all.
///
///     |  before  |      n      |      behind      |
///     |  before  |         newN         |      behind      |
template <class T> T* xvector<T>::ResizeRun(ssize_t i, ssize_t n, ssize_t newN) {
  if (i + n == size() && newN > n)
    m_buffer.growbytes(Bytes(newN - n));
  else if (newN > n)
    m_buffer.insertbytes((i + n) * S, Bytes(newN - n));
  else if (newN < n)
    erase(begin() + i + newN, begin() + i + n);
  return begin() + i;
}

/// Puts the pn elements at p in the place of the n at index i. The arguments have been checked.
template <class T> void xvector<T>::ReplaceRun(ssize_t i, ssize_t n, const T* p, ssize_t pn) {
  if (m_buffer.owns(p)) {
    xvector<T> copy;
    copy.ReplaceRun(0, 0, p, pn);
    return ReplaceRun(i, n, copy.begin(), pn);
  }
  T* const run = ResizeRun(i, n, pn);
  p_copy(run, p, p + pn);
}

/// Puts count elements of value x in the place of the n at index i. x comes by value: it may be one of them.
template <class T> void xvector<T>::FillRun(ssize_t i, ssize_t n, ssize_t count, T x) {
  T* const run = ResizeRun(i, n, count);
  p_create(run, run + count, x);
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

template <class T>
template <class It, detail::IfIterator<It>>
void xvector<T>::push_back(ssize_t count, It r1, It r2) {
  MIREL_ASSERT(0 <= count);
  MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
  if constexpr (!IsElementPointer<It>) {
    auto source = Source(r1, r2);
    push_back(count, source.begin(), source.end());
  } else {
    if (r1 == r2)
      return;
    if (m_buffer.owns(r1)) {
      xvector<T> copy(r1, r2);
      return push_back(count, copy.begin(), copy.end());
    }
    const ssize_t oldSize = size();
    const ssize_t n = r2 - r1;
    if (count > std::numeric_limits<ssize_t>::max() / n)
      throw std::bad_alloc();
    ResizeRun(oldSize, 0, count * n);
    for (ssize_t k = 0; k < count; ++k)
      p_copy(begin() + oldSize + k * n, r1, r2);
  }
}

template <class T> ssize_t xvector<T>::FindAndErase(const T& x) {
  const T value = x; // x may be an element that is overwritten on the way
  T* const kept = std::remove(begin(), end(), value);
  const ssize_t count = end() - kept;
  erase(kept, end());
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
  MIREL_ASSERT_AS(IsRange(r1, r2), "r1 <= r2");
  if (r1 == r2)
    return offset == npos ? size() : offset;
  const ssize_t pn = std::distance(r1, r2);
  // The last occurrence that may count starts at offset and so ends pn elements later.
  const T* const last = end() - After(offset) < pn ? end() : After(offset) + pn - 1;
  return Index(FindLastSubSequence(begin(), last, AsConst(r1), AsConst(r2)), last);
}

} // namespace mirel
