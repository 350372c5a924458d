/// @file
/// Code points: a range that decodes UTF-8 or UTF-16 while a loop walks it, and a function that appends one.
///
/// It knows strings and views, and leaves single sequences to utils/Sequences.h. Only AppendCodePoint()
/// allocates.

#pragma once

#include <cstddef>
#include <iterator>
#include <string>
#include <string_view>
#include <type_traits>

#include "Precondition.h"
#include "Sequences.h"
#include "xchar.h"
#include "xstring.h"
#include "xvector.h"

namespace mirel {

namespace detail {

/// Matches a temporary std::string, for deleted overloads.
template <class S>
using IfTemporaryString = std::enable_if_t<std::is_same_v<std::remove_const_t<S>, std::string>, int>;

inline ssize_t SizeOf(std::string_view text) { return static_cast<ssize_t>(text.size()); }

} // namespace detail

/// Walks a text by code points, forwards and backwards. Each maximal subpart of malformed text reads as
/// U+FFFD, and both directions find the same subparts.
///
/// It decodes a code point when it reaches it, not at each `*`. `*` returns a value, not a reference.
/// @snippet examples/reference.cpp code point iterators
template <class T> class CodePointIterator {
public:
  typedef std::bidirectional_iterator_tag
      iterator_concept;                              ///< C++20: bidirectional, though it yields values.
  typedef std::input_iterator_tag iterator_category; ///< C++17: no other category may yield values.
  typedef char32_t value_type;                       ///< A Unicode scalar value.
  typedef std::ptrdiff_t difference_type;            ///< Counts code points.
  typedef void pointer;                              ///< A code point has no address.
  typedef char32_t reference;                        ///< A value.

  /// Makes a singular iterator, which may only be assigned to.
  CodePointIterator() = default;

  /// The code point, or U+FFFD for malformed text. The iterator may not be past the end.
  char32_t operator*() const { return m_codePoint; }
  /// The index of the code point's first unit, counted from the beginning of the range.
  ssize_t position() const { return m_p - m_begin; }
  /// Returns whether the iterator stands at malformed text. It may not be past the end.
  bool isMalformed() const { return !m_isWellFormed; }

  /// Goes to the next code point. The iterator may not be past the end.
  [[gnu::always_inline]] CodePointIterator& operator++() {
    m_p = m_next;
    Read();
    return *this;
  }
  /// Goes to the next code point and returns the iterator as it was.
  CodePointIterator operator++(int) {
    const CodePointIterator before = *this;
    ++*this;
    return before;
  }
  /// Goes to the previous code point. The iterator may not be at the beginning.
  CodePointIterator& operator--() {
    m_p = detail::Previous(m_begin, m_p);
    Read();
    return *this;
  }
  /// Goes to the previous code point and returns the iterator as it was.
  CodePointIterator operator--(int) {
    const CodePointIterator before = *this;
    --*this;
    return before;
  }

  /// Returns whether two iterators of one range stand at the same place.
  friend bool operator==(const CodePointIterator& a, const CodePointIterator& b) { return a.m_p == b.m_p; }
  /// Returns whether two iterators of one range stand at different places.
  friend bool operator!=(const CodePointIterator& a, const CodePointIterator& b) { return a.m_p != b.m_p; }

private:
  template <class> friend class CodePointRange;

  CodePointIterator(const T* begin, const T* p, const T* end) : m_begin(begin), m_p(p), m_end(end) {}

  /// Decodes the sequence at m_p, unless that is the end. Always inlined, as Decode() is: otherwise a loop
  /// keeps its iterator in memory.
  [[gnu::always_inline]] void Read() {
    if (m_p == m_end)
      return;
    const detail::Sequence sequence = detail::Decode(m_p, m_end);
    m_next = m_p + sequence.length;
    m_codePoint = sequence.codePoint;
    m_isWellFormed = sequence.isWellFormed;
  }

  const T* m_begin = nullptr;
  const T* m_p = nullptr;
  const T* m_next = nullptr; ///< where the next code point begins; unused at the end
  const T* m_end = nullptr;
  char32_t m_codePoint = 0;
  bool m_isWellFormed = true;
};

/// The code points of a text that the range doesn't own. CodePoints() makes such a range. Any change of the
/// text invalidates the range and its iterators.
/// @snippet examples/reference.cpp code points
template <class T> class CodePointRange {
public:
  typedef CodePointIterator<T> iterator;       ///< Walks the code points.
  typedef CodePointIterator<T> const_iterator; ///< Walks the code points.

  /// Makes the range of the pn units at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  CodePointRange(const T* p, ssize_t pn) : m_begin(p), m_end(p) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    m_end += pn;
  }

  /// An iterator at the first code point.
  [[gnu::always_inline]] iterator begin() const {
    iterator first(m_begin, m_begin, m_end);
    first.Read();
    return first;
  }
  /// An iterator past the last code point.
  iterator end() const { return {m_begin, m_end, m_end}; }
  /// Returns whether there are no code points.
  bool empty() const { return m_begin == m_end; }

private:
  const T* m_begin;
  const T* m_end;
};

/// @name Code points
/// Return a range for `for (char32_t c : CodePoints(s))`: the code points of a UTF-8 or UTF-16 text, with
/// U+FFFD for each maximal subpart of malformed text, as the lossy conversions replace it. The range refers
/// to the text, so a call with a temporary string doesn't compile.
/// @snippet examples/reference.cpp code points
/// @{

/// Returns the code points of the pn UTF-8 units at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline CodePointRange<char8> CodePoints(const char8* p, ssize_t pn) { return {p, pn}; }
/// Returns the code points of the pn UTF-16 units at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline CodePointRange<char16> CodePoints(const char16* p, ssize_t pn) { return {p, pn}; }
/// Returns the code points of a UTF-8 string.
inline CodePointRange<char8> CodePoints(const xvector<char8>& text) { return {text.data(), text.size()}; }
/// Returns the code points of a UTF-16 string.
inline CodePointRange<char16> CodePoints(const xvector<char16>& text) { return {text.data(), text.size()}; }
/// Returns the code points of a view, a std::string or a literal.
inline CodePointRange<char8> CodePoints(std::string_view text) { return {text.data(), detail::SizeOf(text)}; }
CodePointRange<char8> CodePoints(const xvector<char8>&& text) = delete;
CodePointRange<char16> CodePoints(const xvector<char16>&& text) = delete;
template <class S, detail::IfTemporaryString<S> = 0> CodePointRange<char8> CodePoints(S&& text) = delete;
CodePointRange<char8> CodePoints(std::nullptr_t) = delete;

/// @}
/// @name Appending a code point
/// Append the units of c, or of U+FFFD where c is not a Unicode scalar value: a surrogate, or above U+10FFFF.
/// A failed allocation throws std::bad_alloc and leaves dst as it was. Amortised constant time.
/// @snippet examples/reference.cpp code points
/// @{

/// Appends c in UTF-8, one to four units; U+FFFD if c isn't a Unicode scalar value.
inline void AppendCodePoint(xvector<char8>& dst, char32_t c) {
  if (c < 0x80) {
    dst.push_back(static_cast<char8>(c));
    return;
  }
  char8 units[4];
  dst.push_back(units, detail::Encode(detail::IsScalarValue(c) ? c : detail::kReplacement, units));
}
/// Appends c in UTF-16, one or two units; U+FFFD if c isn't a Unicode scalar value.
inline void AppendCodePoint(xvector<char16>& dst, char32_t c) {
  char16 units[2];
  dst.push_back(units, detail::Encode(detail::IsScalarValue(c) ? c : detail::kReplacement, units));
}

/// @}

} // namespace mirel
