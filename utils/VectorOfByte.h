/// @file
/// The buffer of bytes that owns the storage of every container.
///
/// It knows bytes: every size, offset and capacity is in bytes. It knows neither elements nor text.

#pragma once

#include <cstddef>
#include <cstring>
#include <initializer_list>
#include <type_traits>
#include <utility>

#include "BasicTypes.h"
#include "Integers.h"
#include "NotOffered.h"
#include "Precondition.h"
#include "RangeAlgorithms.h" // programs find the algorithms through this header too

namespace mirel {

namespace detail {

struct Storage; // gives the conversions and FillFrom() access to a vector's storage

/// Throws std::bad_alloc. A throw in a header doesn't compile in a program without exceptions.
[[noreturn, gnu::cold]] MIREL_API void AllocationFailed();

} // namespace detail

/// An untyped, growable array of bytes: the storage of every vector and string.
///
/// Parameters: `i` is an offset or an iterator, `n` a number of bytes from there, `i1`/`i2` and `r1`/`r2` the
/// ends of half-open ranges in this buffer and elsewhere, `x` a byte, `count` a number of bytes to add or
/// remove. An integer of any type may stand for an offset, a count or a byte: a literal 0 is one of these,
/// never a pointer. Only push_back(x) takes x as a number of its own type, and appends all bytes of it.
///
/// A source that lies in the buffer itself gives the result as if it had been copied first. Bad arguments
/// stop the process with the text after "@pre", before anything has changed. A source is checked after all
/// offsets and counts: it may not be reversed, nor may its beginning be null unless its end is.
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
      size_ += count; // all that insertbytes(size(), count) does if there is room
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

  // Overloads for integers of any type. Each matches an integer exactly and calls the documented overload of
  // its name. Deleted overloads follow.
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
