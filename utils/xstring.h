/// @file
/// string8 and string16, their null-terminated interface, and the conversions between UTF-8, UTF-16 and
/// ASCII.
///
/// The string knows null termination and nothing else: it measures a null-terminated argument once and passes
/// the range to the vector. It has no storage and no invariant of its own.

#pragma once

#include <cstddef>
#include <cstring>
#include <initializer_list>
#include <type_traits>

#include "Integers.h"
#include "NotOffered.h"
#include "Precondition.h"
#include "Ranges.h"
#include "xchar.h"
#include "xvector.h"

namespace mirel {

class xostream;

/// Counts the code units from s to the first null, which isn't included, in linear time. s may not be a null
/// pointer; that isn't checked.
inline ssize_t GetStringLength(const char8* s) { return static_cast<ssize_t>(std::strlen(s)); }
/// Counts the 16-bit code units from s to the first null, which isn't included, in linear time. s may not be
/// a null pointer; that isn't checked.
inline ssize_t GetStringLength(const char16* s) {
  const char16* end = s;
  while (*end != 0)
    ++end;
  return end - s;
}

// Measures a null-terminated argument of a member. It is a macro so that the report names the member.
/// @cond
#define MIREL_LENGTH(s) (MIREL_ASSERT_AS((s) != nullptr, "s != nullptr"), GetStringLength(s))
/// @endcond

/// A string: a vector of code units that also takes and returns null-terminated strings.
///
/// Any of its units may be null, and no terminator is kept: c_str() writes one past the end, where the next
/// change may overwrite it. A string has all members of xvector, and what is said there of bad arguments,
/// ranges, memory, invalidation, aliasing and cost holds here too.
///
/// A null-terminated argument (`const T*` without a count) ends before its first null. It is measured once,
/// before anything else is checked or changed, and then treated as a pointer and a count. A literal null
/// pointer in its place doesn't compile.
/// @pre "s != nullptr" of every null-terminated argument
///
/// Two integers in braces that initialise a string are a count and a unit: string8{3, 'x'} has three units.
/// Two that initialise a vector, as in s.append({3, 'x'}), are a list of two units. `s = {3, 'x'}` doesn't
/// compile, and `s = {}` empties the string.
/// @snippet examples/reference.cpp basic_xstring
template <class T> class MIREL_DESCRIBED MIREL_API basic_xstring : public xvector<T> {
  typedef xvector<T> Base;

public:
  /// @name Construction
  /// @snippet examples/reference.cpp string construction
  /// @{

  /// Makes an empty string, without storage.
  basic_xstring() {}
  /// Copies rn units of r from index ri on; npos isn't a count here.
  /// @pre "0 <= ri && 0 <= rn && ri+rn <= r.size()"
  basic_xstring(const basic_xstring<T>& r, ssize_t ri, ssize_t rn) : Base(r, ri, rn) {}
  /// Copies the rn units at r. @pre "pn == 0 || (pn > 0 && p != nullptr)", of r and rn
  basic_xstring(const T* r, ssize_t rn) : Base(r, rn) {}
  /// Copies the units of a null-terminated string.
  basic_xstring(const T* r) : Base(r, MIREL_LENGTH(r)) {}
  /// Makes count units equal to x. @pre "0 <= count"
  explicit basic_xstring(ssize_t count, T x) : Base(count, x) {}
  /// Copies the units of [r1, r2). @pre "r1 <= r2"
  basic_xstring(const T* r1, const T* r2) : Base(r1, r2) {}
  /// Copies the units of [r1, r2), which may be any iterators. @pre "r1 <= r2"
  template <class It, detail::IfIterator<It> = 0> basic_xstring(It r1, It r2) : Base(r1, r2) {}
  /// Copies a string; the capacity is the size.
  basic_xstring(const basic_xstring<T>& r) : Base(r) {}
  /// Copies a vector, such as a result of operator+. It is a template so that braces never convert to a
  /// vector.
  template <class V, std::enable_if_t<std::is_same_v<V, xvector<T>>, int> = 0>
  basic_xstring(const V& r) : Base(r) {}
  /// Releases the storage.
  ~basic_xstring() {}

  /// @}
  /// @name Assignment
  /// @snippet examples/reference.cpp string assignment
  /// @{

  /// Becomes a copy of r; the storage is kept if it is large enough.
  basic_xstring<T>& operator=(const basic_xstring<T>& r) = default;
  /// Becomes a copy of a null-terminated string.
  basic_xstring<T>& operator=(const T* rhs) {
    assign(rhs);
    return *this;
  }
  using Base::assign;
  /// Becomes a copy of a null-terminated string.
  basic_xstring<T>& assign(const T* s) {
    assign(s, MIREL_LENGTH(s));
    return *this;
  }

  /// @}
  /// @name Null termination
  /// @snippet examples/reference.cpp null termination
  /// @{

  /// Returns the contents with a null past the end, which is not part of the string.
  ///
  /// The call counts as a change, although it is const: no other thread may use the string meanwhile. If
  /// there is no unused capacity, it makes room, and for more than the null: appends that alternate with
  /// c_str() then take amortised constant time. Making room may move the storage, which invalidates pointers,
  /// references, iterators and views.
  /// The result is valid until the next change other than c_str(), which returns the same pointer again.
  const T* c_str() const {
    const ssize_t n = this->size();
    if (n == this->capacity())
      this->reserve(Base::Sum(n, 1 + (n / 2 < Base::kMaxSize - n ? n / 2 : 0)));
    const T* const p = this->data();
    MIREL_ASSERT(p); // there is storage, since room was made
    const_cast<T*>(p)[n] = 0;
    return p;
  }

  /// @}
  /// @name Appending, inserting, replacing
  /// @snippet examples/reference.cpp string edits
  /// @{

  using Base::operator+=;
  /// Appends a null-terminated string.
  basic_xstring<T>& operator+=(const T* s) { return append(s); }
  using Base::append;
  /// Appends a null-terminated string.
  basic_xstring<T>& append(const T* s) {
    Base::Append(s, MIREL_LENGTH(s));
    return *this;
  }
  using Base::insert;
  /// Inserts a null-terminated string before index i. @pre "0 <= i && i <= size()"
  basic_xstring<T>& insert(ssize_t i, const T* s) {
    insert(i, s, MIREL_LENGTH(s));
    return *this;
  }
  using Base::replace;
  /// Replaces n units from index i on with a null-terminated string.
  /// @pre "0 <= i && 0 <= n && i+n <= size()"
  basic_xstring<T>& replace(ssize_t i, ssize_t n, const T* p) {
    replace(i, n, p, MIREL_LENGTH(p));
    return *this;
  }

  /// @}
  /// @name Comparison
  /// @snippet examples/reference.cpp string comparison
  /// @{

  using Base::compare;
  /// Compares all units with those of a null-terminated string.
  int compare(const T* p) const { return compare(p, MIREL_LENGTH(p)); }
  /// Compares n units from index i on with a null-terminated string.
  /// @pre "0 <= i && 0 <= n && i+n <= size()"
  int compare(ssize_t i, ssize_t n, const T* p) const { return compare(i, n, p, MIREL_LENGTH(p)); }
  using Base::_Eq;
  /// Returns whether the string equals a null-terminated string.
  bool _Eq(const T* rhs) const { return compare(rhs) == 0; }
  using Base::_Lt;
  /// Returns whether the string orders before a null-terminated string.
  bool _Lt(const T* rhs) const { return compare(rhs) < 0; }

  /// @}
  /// @name Search
  /// Return an index or npos, as the vector's searches do. Forward searches begin at index offset.
  /// @pre "0 <= offset && offset <= size()"
  ///
  /// Reverse searches go from index offset down to 0; npos is the last unit.
  /// @pre "offset == npos || (0 <= offset && offset < size())"
  ///
  /// @snippet examples/reference.cpp string search
  /// @{

  using Base::find;
  /// Finds the first occurrence of a null-terminated string from offset on; an empty one is found at offset.
  ssize_t find(const T* p, ssize_t offset = 0) const { return find(p, offset, MIREL_LENGTH(p)); }
  using Base::rfind;
  /// Finds the last occurrence of a null-terminated string that starts at or before offset; an empty one is
  /// found at offset, or for npos at size().
  ssize_t rfind(const T* p, ssize_t offset = Base::npos) const { return rfind(p, offset, MIREL_LENGTH(p)); }
  using Base::find_first_of;
  /// Finds the first unit from offset on that occurs in a null-terminated set.
  ssize_t find_first_of(const T* s, ssize_t offset = 0) const {
    return find_first_of(s, offset, MIREL_LENGTH(s));
  }
  using Base::find_first_not_of;
  /// Finds the first unit from offset on that doesn't occur in a null-terminated set.
  ssize_t find_first_not_of(const T* s, ssize_t offset = 0) const {
    return find_first_not_of(s, offset, MIREL_LENGTH(s));
  }
  using Base::find_last_of;
  /// Finds the last unit at or before offset that occurs in a null-terminated set.
  ssize_t find_last_of(const T* s, ssize_t offset = Base::npos) const {
    return find_last_of(s, offset, MIREL_LENGTH(s));
  }
  using Base::find_last_not_of;
  /// Finds the last unit at or before offset that doesn't occur in a null-terminated set.
  ssize_t find_last_not_of(const T* s, ssize_t offset = Base::npos) const {
    return find_last_not_of(s, offset, MIREL_LENGTH(s));
  }

  /// Returns a new string of count units from index offset on; npos means all that follow.
  /// @pre "0 <= offset && offset <= size()", then "count == npos || (0 <= count && offset+count <= size())"
  basic_xstring<T> substr(ssize_t offset = 0, ssize_t count = Base::npos) const {
    Base units = Base::substr(offset, count);
    basic_xstring<T> result;
    result.swap(units);
    return result;
  }

  /// @}
  // Overloads for integers of any type, as in xvector, and deleted ones: a literal null pointer isn't a
  // string.
  /// @cond

  template <class P, class N, detail::IfPointerAndCount<P, const T*, N> = 0>
  basic_xstring(P r, N rn) : Base(static_cast<const T*>(r), detail::Count(rn)) {}
  template <class N, class X, detail::IfIntegers<N, X> = 0>
  explicit basic_xstring(N count, X x) MIREL_FITS(T, x) : Base(detail::Count(count), detail::Unit<T>(x)) {}
  /// Takes `s = {}`, which is ambiguous without this overload: {} also initialises a null pointer.
  basic_xstring<T>& operator=(std::initializer_list<detail::NoUnit>) {
    this->clear();
    return *this;
  }

  template <class X, class... N, class Hint = detail::Instead<T, X, N...>>
  explicit basic_xstring(const X&, N...) = delete;
  template <class X, class Hint = detail::Instead<T, X>> void operator=(const X&) = delete;
  template <class N, class Hint = detail::WritePointerAndCount, detail::IfIntegers<N> = 0>
  basic_xstring(N, const T*) = delete;
  basic_xstring(std::nullptr_t) = delete;
  basic_xstring<T>& operator=(std::nullptr_t) = delete;
  template <class X, detail::IfIntegers<X> = 0> detail::WriteAssignOfOneUnit operator=(X) = delete;
  basic_xstring<T>& assign(std::nullptr_t) = delete;
  basic_xstring<T>& operator+=(std::nullptr_t) = delete;
  basic_xstring<T>& append(std::nullptr_t) = delete;
  basic_xstring<T>& insert(ssize_t, std::nullptr_t) = delete;
  basic_xstring<T>& replace(ssize_t, ssize_t, std::nullptr_t) = delete;
  int compare(std::nullptr_t) const = delete;
  int compare(ssize_t, ssize_t, std::nullptr_t) const = delete;
  bool _Eq(std::nullptr_t) const = delete;
  bool _Lt(std::nullptr_t) const = delete;
  ssize_t find(std::nullptr_t, ssize_t = 0) const = delete;
  ssize_t rfind(std::nullptr_t, ssize_t = 0) const = delete;
  ssize_t find_first_of(std::nullptr_t, ssize_t = 0) const = delete;
  ssize_t find_first_not_of(std::nullptr_t, ssize_t = 0) const = delete;
  ssize_t find_last_of(std::nullptr_t, ssize_t = 0) const = delete;
  ssize_t find_last_not_of(std::nullptr_t, ssize_t = 0) const = delete;
  /// @endcond
};

#undef MIREL_LENGTH

/// Exchanges the contents of two strings in constant time.
template <class T> void swap(basic_xstring<T>& a, basic_xstring<T>& b) noexcept { a.swap(b); }

typedef basic_xstring<char8> string8;   ///< A string of UTF-8 code units, or of any bytes.
typedef basic_xstring<char16> string16; ///< A string of UTF-16 code units.
typedef basic_xstring<char> xstring;    ///< A string of plain char, the same type as string8.

extern template class xvector<char8>;
extern template class basic_xstring<char8>;
extern template class xvector<char16>;
extern template class basic_xstring<char16>;

/// @name Conversions
/// Convert the srcLen units at src, in one pass and in linear time, and replace the contents of the
/// destination with the result.
/// UTF-16 is in the machine's own byte order; a byte order mark is a code point like any other, and so is a
/// null. What is well-formed is defined by the Unicode Standard: table 3-7 for UTF-8, definition D91 for
/// UTF-16. A failed allocation throws std::bad_alloc; a UTF conversion then leaves the beginning of the
/// result in the destination; the conversion from ASCII leaves the destination as it was. On return the
/// destination has its old capacity, or room for the result and the terminator of c_str() if that is more; an
/// empty source adds no capacity. The source may not lie in the destination. With a srcLen of 0, src may be a
/// null pointer; with a larger one, src isn't checked.
/// @snippet examples/reference.cpp conversions
/// @{

/// Converts ASCII to UTF-16, a unit for each byte; bytes from 0x80 on become "?". @pre "newSize >= 0", of
/// srcLen
MIREL_API void Utf16FromAscii(string16& dst, const char8* src, ssize_t srcLen);

/// Converts UTF-8 to UTF-16.
/// @return false if the source is malformed or truncated; the destination then holds what precedes the
/// malformed sequence
/// @pre "srcLen >= 0"
MIREL_API bool Utf16FromUtf8(string16& dst, const char8* src, ssize_t srcLen);
/// Converts a null-terminated string from UTF-8 to UTF-16.
/// @return false if the source is malformed or truncated
/// @pre "src"
MIREL_API bool Utf16FromUtf8(string16& dst, const char8* src);
/// Converts UTF-16 to UTF-8.
/// @return false if the source is malformed or truncated; the destination then holds what precedes the
/// malformed sequence
/// @pre "srcLen >= 0"
MIREL_API bool Utf8FromUtf16(string8& dst, const char16* src, ssize_t srcLen);
/// Converts a null-terminated string from UTF-16 to UTF-8.
/// @return false if the source is malformed or truncated
/// @pre "src"
MIREL_API bool Utf8FromUtf16(string8& dst, const char16* src);

/// Converts between the encodings in generic code: from UTF-8 to UTF-16 if CharOut is char16 and CharIn is
/// char8, and from UTF-16 to UTF-8 if CharOut is char8 and CharIn is char16.
/// @return false if the source is malformed or truncated; the destination then holds what precedes the
/// malformed sequence
/// @pre "srcLen >= 0"
template <class CharOut, class CharIn>
bool UtfToUtf([[maybe_unused]] basic_xstring<CharOut>& result, const CharIn*, ssize_t) {
  static_assert(sizeof(CharIn) == 0, "UtfToUtf converts char8 to char16, and char16 to char8");
  return false;
}
/// @cond
template <> MIREL_API bool UtfToUtf<char16, char8>(string16& result, const char8* src, ssize_t srcLen);
template <> MIREL_API bool UtfToUtf<char8, char16>(string8& result, const char16* src, ssize_t srcLen);
// A reverse iterator converts to a pointer past the element that it designates.
template <class... N>
detail::ReverseIteratorsOnlyStep Utf16FromUtf8(string16&, const detail::ReversePointer&, N...) = delete;
template <class... N>
detail::ReverseIteratorsOnlyStep Utf8FromUtf16(string8&, const detail::ReversePointer&, N...) = delete;
detail::ReverseIteratorsOnlyStep Utf16FromAscii(string16&, const detail::ReversePointer&, ssize_t) = delete;
/// @endcond

/// @}

/// Writes the units of v, nulls included, to os as write() does: the indent applies, but not the width.
MIREL_API xostream& operator<<(xostream& os, const string8& v);

/// Does nothing; a reference to it pulls the string code of a static library into a program.
MIREL_API void HackToForcexstringIntoUtilsDll();

} // namespace mirel
