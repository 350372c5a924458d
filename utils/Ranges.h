/// @file
/// Ranges as arguments: which iterators they may have, how they are checked, and how their elements are read.
///
/// @par Units of other types
/// A range may have any iterators over integers or enumerators, but not over types that convert to them. Each
/// element is read as its unsigned value, on every processor: the byte E9 is the unit 00E9 of a string16,
/// whether plain char is signed or not. A stored element must fit the vector's units, which is checked before
/// anything changes. An element that is searched for may have any value, and equals nothing if it doesn't
/// fit.
/// @pre "Fits<T>(*r1)" of each element that is stored
///
/// @par Cost
/// Pointers to elements of the vector's width, and the iterators of string views and of standard strings and
/// vectors of such elements, are as fast as `const T*`; from C++20 on so is every contiguous iterator. An
/// edit with other iterators copies the elements first. If they are forward iterators, the copy takes one
/// allocation, but the range is walked twice unless they are random-access iterators. A search allocates
/// nothing.
///
/// This header knows iterators and the byte buffer, but none of the library's vectors and strings.

#pragma once

#include <limits>
#include <string> // has std::iterator_traits without the streams that <iterator> brings along
#include <type_traits>
#include <utility>
#if __cplusplus >= 202002L
#include <iterator>
#endif
#if __cpp_lib_concepts < 202002L
#include <vector>
#endif

#include "Integers.h"
#include "NotOffered.h"
#include "Precondition.h"
#include "VectorOfByte.h"

namespace mirel {

namespace detail {

/// Lets a template take part in overload resolution only for iterators, never for numbers.
template <class It>
using IfIterator = std::enable_if_t<
    std::is_convertible_v<typename std::iterator_traits<It>::iterator_category, std::input_iterator_tag>,
    int>;

template <class It> using ValueType = typename std::iterator_traits<It>::value_type;

template <class It, class Tag>
constexpr bool kHasCategory = std::is_base_of_v<Tag, typename std::iterator_traits<It>::iterator_category>;

#if __cpp_lib_concepts >= 202002L
// Iterators of C++20's views may satisfy the concepts without having the category: their `*` doesn't return a
// reference.
template <class It>
constexpr bool kIsForward = std::forward_iterator<It> || kHasCategory<It, std::forward_iterator_tag>;
template <class It>
constexpr bool kIsRandomAccess =
    std::random_access_iterator<It> || kHasCategory<It, std::random_access_iterator_tag>;
template <class It> constexpr bool kIsContiguous = std::contiguous_iterator<It>;
#else
template <class It> constexpr bool kIsForward = kHasCategory<It, std::forward_iterator_tag>;
template <class It> constexpr bool kIsRandomAccess = kHasCategory<It, std::random_access_iterator_tag>;
template <class It, class C>
constexpr bool kIsIteratorOf =
    std::is_same_v<It, typename C::iterator> || std::is_same_v<It, typename C::const_iterator>;
/// Whether It is a pointer, or known to be a contiguous iterator. The iterators of string views are covered.
template <class It>
constexpr bool kIsContiguous = std::is_pointer_v<It> || kIsIteratorOf<It, std::vector<ValueType<It>>>
#ifdef __GLIBCXX__ // libc++'s strings have the iterators of its vectors, and exist for characters only
                               || kIsIteratorOf<It, std::basic_string<ValueType<It>>>
#endif
    ;
#endif

/// Whether V is an integer or enumeration type, so that its values have unsigned counterparts.
template <class V> constexpr bool kIsNumber = std::is_integral_v<V> || std::is_enum_v<V>;
/// Whether elements of type V are units of the width of T, and so can be copied as bytes.
template <class T, class V>
constexpr bool kIsUnit = kIsNumber<V> && !std::is_same_v<V, bool> && sizeof(V) == sizeof(T);

/// Whether the elements are volatile, and so must be read one by one.
template <class It>
constexpr bool kIsVolatile =
    std::is_volatile_v<std::remove_reference_t<typename std::iterator_traits<It>::reference>>;

/// Returns whether It is a contiguous iterator over non-volatile units as wide as T. kIsContiguous isn't
/// instantiated for other elements, since it would instantiate the standard containers of those.
template <class T, class It> constexpr bool IsContiguousOver() { // decided at compile time
  if constexpr (!kIsUnit<T, ValueType<It>> || kIsVolatile<It>)
    return false;
  else
    return kIsContiguous<It>;
}

/// The base of our reverse iterators. They convert to the pointers that they hold, whose arithmetic and order
/// have the opposite direction, so the operators for both are deleted here.
struct ReversePointer {
  template <class X> ReverseIteratorsOnlyStep operator[](const X&) const = delete;
  template <class X> ReverseIteratorsOnlyStep operator+(const X&) const = delete;
  template <class X> ReverseIteratorsOnlyStep operator-(const X&) const = delete;
  template <class X> ReverseIteratorsOnlyStep operator+=(const X&) = delete;
  template <class X> ReverseIteratorsOnlyStep operator-=(const X&) = delete;
  template <class X> ReverseIteratorsOnlyStep operator<(const X&) const = delete;
  template <class X> ReverseIteratorsOnlyStep operator>(const X&) const = delete;
  template <class X> ReverseIteratorsOnlyStep operator<=(const X&) const = delete;
  template <class X> ReverseIteratorsOnlyStep operator>=(const X&) const = delete;
};
template <class N, IfIntegers<N> = 0> ReverseIteratorsOnlyStep operator+(N, const ReversePointer&) = delete;
template <class X> ReverseIteratorsOnlyStep operator-(X*, const ReversePointer&) = delete;
template <class X> ReverseIteratorsOnlyStep operator<(X*, const ReversePointer&) = delete;
template <class X> ReverseIteratorsOnlyStep operator>(X*, const ReversePointer&) = delete;
template <class X> ReverseIteratorsOnlyStep operator<=(X*, const ReversePointer&) = delete;
template <class X> ReverseIteratorsOnlyStep operator>=(X*, const ReversePointer&) = delete;

/// Returns the pointer that one of our reverse iterators holds.
template <class It> const ValueType<It>* Held(It it) { return it; }

/// Returns false for a reversed range of random-access iterators or of our reverse iterators; others can't be
/// checked.
template <class It> constexpr bool IsRange(const It& r1, const It& r2) {
  if constexpr (std::is_base_of_v<ReversePointer, It>)
    return Held(r2) <= Held(r1);
  else if constexpr (kIsRandomAccess<It>)
    return r1 <= r2;
  else
    return true;
}

/// Returns whether an iterator is a null pointer or holds one, as a value-initialised contiguous iterator
/// does.
template <class It> constexpr bool IsNull([[maybe_unused]] const It& it) {
  if constexpr (std::is_pointer_v<It>) {
    return it == nullptr;
  } else if constexpr (kIsNumber<ValueType<It>>) { // decided at compile time
#if __cpp_lib_to_address >= 201711L
    if constexpr (kIsContiguous<It>) // decided at compile time
      return std::to_address(it) == nullptr;
#elif !defined _GLIBCXX_DEBUG
    // In debug mode iterators without a container can't be compared; the standard library reports them.
    if constexpr (kIsContiguous<It>) // decided at compile time
      return it == It();
#endif
  }
  return false; // decided at compile time
}

template <class It>
constexpr bool IsInMemory(const std::reverse_iterator<It>&, const std::reverse_iterator<It>&);
template <class It> constexpr bool IsInMemory(const std::move_iterator<It>&, const std::move_iterator<It>&);

/// Returns false for a range that isn't empty and whose lower end in memory is a null pointer.
template <class It> constexpr bool IsInMemory(const It& r1, const It& r2) {
  if constexpr (std::is_base_of_v<ReversePointer, It>)
    return IsInMemory(Held(r2), Held(r1));
  else
    return !IsNull(r1) || r1 == r2;
}
template <class It>
constexpr bool IsInMemory(const std::reverse_iterator<It>& r1, const std::reverse_iterator<It>& r2) {
  return IsInMemory(r2.base(), r1.base());
}
template <class It>
constexpr bool IsInMemory(const std::move_iterator<It>& r1, const std::move_iterator<It>& r2) {
  return IsInMemory(r1.base(), r2.base());
}

/// Returns the unsigned value of an element of a range.
template <class V, class X> constexpr auto SourceValue(const X& x) {
  static_assert(kIsNumber<V>, "code units are integers or enumerators: convert the elements first");
  if constexpr (kIsNumber<V>) // decided at compile time
    return UnsignedValue(static_cast<V>(x));
  else
    return 0u;
}

template <class T, class N> constexpr bool Fits(N value) {
  return value <= std::numeric_limits<std::make_unsigned_t<T>>::max();
}

/// A contiguous range of units. The program may have written them as another type, and compilers assume that
/// different types don't alias: so only the C library, non-inline functions of this library and CopyOf()
/// may read them, never a mere `*`.
template <class T> class UnitSpan {
public:
  template <class V> UnitSpan(const V* p, ssize_t n) : m_p(reinterpret_cast<const T*>(p)), m_size(n) {}

  const T* begin() const { return m_p; }
  const T* end() const { return m_p + m_size; }
  ssize_t size() const { return m_size; }

private:
  const T* m_p;
  ssize_t m_size;
};

/// A copy of any range as units; each element must fit.
template <class T> class UnitCopy {
public:
  template <class It> UnitCopy(It r1, It r2) {
    if constexpr (kIsForward<It>)
      Reserve(Length(r1, r2));
    for (; r1 != r2; ++r1) {
      const auto value = SourceValue<ValueType<It>>(*r1);
      MIREL_ASSERT_AS(Fits<T>(value), "Fits<T>(*r1)");
      m_units.push_back(static_cast<T>(value));
    }
  }

  const T* begin() const { return reinterpret_cast<const T*>(m_units.begin()); }
  ssize_t size() const { return m_units.size() / ssize_t(sizeof(T)); }

private:
  static constexpr ssize_t kMax = std::numeric_limits<ssize_t>::max();

  template <class It> static ssize_t Length(It r1, It r2) {
    if constexpr (kIsRandomAccess<It>) {
      return Saturated(r2 - r1);
    } else {
      ssize_t length = 0;
      for (; r1 != r2; ++r1)
        length += length != kMax;
      return length;
    }
  }
  void Reserve(ssize_t length) {
    m_units.reserve(length <= kMax / ssize_t(sizeof(T)) ? length * ssize_t(sizeof(T)) : kMax);
  }

  VectorOfByte m_units;
};

/// An iterator over the unsigned values of a range. Its category is random-access, forward or input: the
/// strongest of these that the range's iterators have.
template <class It> class ValueIterator {
public:
  typedef std::conditional_t<
      kIsRandomAccess<It>, std::random_access_iterator_tag,
      std::conditional_t<kIsForward<It>, std::forward_iterator_tag, std::input_iterator_tag>>
      iterator_category;
  typedef decltype(SourceValue<ValueType<It>>(*std::declval<It&>())) value_type;
  typedef ssize_t difference_type;
  typedef const value_type* pointer;
  typedef value_type reference;

  explicit ValueIterator(It it) : m_it(it) {}
  value_type operator*() const { return SourceValue<ValueType<It>>(*m_it); }
  value_type operator[](ssize_t i) const { return *(*this + i); }
  ValueIterator& operator++() {
    ++m_it;
    return *this;
  }
  ValueIterator& operator--() {
    --m_it;
    return *this;
  }
  ValueIterator operator+(ssize_t n) const { return ValueIterator(m_it + static_cast<Difference>(n)); }
  ValueIterator operator-(ssize_t n) const { return ValueIterator(m_it - static_cast<Difference>(n)); }
  ssize_t operator-(const ValueIterator& y) const { return Saturated(m_it - y.m_it); }
  bool operator==(const ValueIterator& y) const { return m_it == y.m_it; }
  bool operator!=(const ValueIterator& y) const { return !(m_it == y.m_it); }

private:
  typedef typename std::iterator_traits<It>::difference_type Difference;

  It m_it;
};

template <class It> class ValueRange {
public:
  ValueRange(It r1, It r2) : m_begin(r1), m_end(r2) {}
  ValueIterator<It> begin() const { return m_begin; }
  ValueIterator<It> end() const { return m_end; }

private:
  ValueIterator<It> m_begin, m_end;
};

/// Returns the units of [r1, r2), whose iterators are contiguous, without dereferencing r2.
template <class T, class It> UnitSpan<T> Span(It r1, It r2) {
  if constexpr (std::is_pointer_v<It>)
    return {r1, r2 - r1};
  else
    return {r1 == r2 ? nullptr : __builtin_addressof(*r1), static_cast<ssize_t>(r2 - r1)};
}

/// Returns the units of [r1, r2) as a contiguous range to copy from. It makes a copy unless the iterators are
/// contiguous over units as wide as T: other elements must be converted, and other iterators don't reveal
/// whether they point into the vector.
template <class T, class It> auto Source(It r1, It r2) {
  if constexpr (IsContiguousOver<T, It>())
    return Span<T>(r1, r2);
  else
    return UnitCopy<T>(r1, r2);
}

/// Refuses input iterators, whose range can be read only once: a search reads its needle many times.
template <class It> constexpr void RequireForward() {
  static_assert(kIsForward<It>, "a search reads its needle more than once: copy it into a string first");
}

/// Returns the units of [r1, r2) as a needle. A search reads them more than once, contains() only once.
template <class T, class It> auto Needle(It r1, It r2) {
  if constexpr (IsContiguousOver<T, It>())
    return Span<T>(r1, r2);
  else
    return ValueRange<It>(r1, r2);
}

} // namespace detail

} // namespace mirel

/// Asserts that [r1, r2) is a range that can be copied from.
#define MIREL_ASSERT_SOURCE(r1, r2)                                                                          \
  (MIREL_ASSERT_AS(::mirel::detail::IsRange(r1, r2), "r1 <= r2"),                                            \
   MIREL_ASSERT_AS(::mirel::detail::IsInMemory(r1, r2),                                                      \
                   "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)"))

/// Asserts that [r1, r2) is a range that can be read.
#define MIREL_ASSERT_NEEDLE(r1, r2)                                                                          \
  (MIREL_ASSERT_AS(::mirel::detail::IsRange(r1, r2), "r1 <= r2"),                                            \
   MIREL_ASSERT_AS(::mirel::detail::IsInMemory(r1, r2), "r1 == r2 || r1 != nullptr"))
