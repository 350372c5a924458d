/// @file
/// Code points: a range that decodes UTF-8 or UTF-16 while a loop walks it, and a function that appends one.
///
/// Checking, counting and ExplainMalformed() also decode with the functions here, wherever no SIMD kernel
/// does it for them, and so do the lossy conversions from malformed text on. The strict conversions don't:
/// they have a scalar path of their own. Nothing here has global state, and only AppendCodePoint() allocates.

#pragma once

#include <cstddef>
#include <iterator>
#include <string>
#include <string_view>
#include <type_traits>

#include "Precondition.h"
#include "xchar.h"
#include "xstring.h"
#include "xvector.h"

namespace mirel {

namespace detail {

/// U+FFFD, the replacement character, which takes the place of malformed text.
constexpr char32_t kReplacement = 0xFFFD;

/// A decoded sequence. A well-formed one is a code point and the number of its units. A malformed one is
/// U+FFFD and the length of a maximal subpart: the units that begin a well-formed sequence without completing
/// it, or else a single unit (Unicode Standard 3.9, U+FFFD Substitution of Maximal Subparts).
struct Sequence {
  char32_t codePoint;
  int length;
  bool isWellFormed;
};

inline bool IsContinuation(char8 unit) { return (UnitValue(unit) & 0xC0) == 0x80; }
inline bool IsHighSurrogate(char16 unit) { return (unit & 0xFC00) == 0xD800; }
inline bool IsLowSurrogate(char16 unit) { return (unit & 0xFC00) == 0xDC00; }

/// Decodes the UTF-8 sequence at p, by table 3-7 of the Unicode Standard. p isn't the end.
///
/// Always inlined: with a call for each sequence, a loop over a text took five to seven times as long.
[[gnu::always_inline]] inline Sequence Decode(const char8* p, const char8* end) {
  const char32_t lead = UnitValue(p[0]);
  if (lead < 0x80)
    return {lead, 1, true};
  if (end - p < 2 || !IsContinuation(p[1]) || lead < 0xC2 || lead > 0xF4)
    return {kReplacement, 1, false};
  const char32_t second = UnitValue(p[1]) & 0x3F;
  if (lead < 0xE0)
    return {(lead & 0x1F) << 6 | second, 2, true};
  if (lead < 0xF0) {
    const char32_t upper = (lead & 0x0F) << 6 | second; // the code point without its low six bits
    if (upper < 0x800 >> 6 || upper >> 5 == 0xD800 >> 11)
      return {kReplacement, 1, false};
    if (end - p < 3 || !IsContinuation(p[2]))
      return {kReplacement, 2, false};
    return {upper << 6 | (UnitValue(p[2]) & 0x3F), 3, true};
  }
  const char32_t upper = (lead & 0x07) << 6 | second; // the code point without its low twelve bits
  if (upper < 0x10000 >> 12 || upper > 0x10FFFF >> 12)
    return {kReplacement, 1, false};
  if (end - p < 3 || !IsContinuation(p[2]))
    return {kReplacement, 2, false};
  if (end - p < 4 || !IsContinuation(p[3]))
    return {kReplacement, 3, false};
  return {upper << 12 | (UnitValue(p[2]) & 0x3Fu) << 6 | (UnitValue(p[3]) & 0x3Fu), 4, true};
}

/// Decodes the UTF-16 sequence at p, by definition D91 of the Unicode Standard. p isn't the end.
[[gnu::always_inline]] inline Sequence Decode(const char16* p, const char16* end) {
  const char32_t unit = *p;
  if (unit >> 11 != 0xD800 >> 11)
    return {unit, 1, true};
  if (IsHighSurrogate(p[0]) && end - p > 1 && IsLowSurrogate(p[1]))
    return {0x10000 + ((unit - 0xD800) << 10) + (p[1] - 0xDC00u), 2, true};
  return {kReplacement, 1, false};
}

/// Returns where the last sequence before p begins, if [begin, p) is decoded from begin on. A unit that isn't
/// a continuation byte always begins a sequence, so at most four units are read.
inline const char8* Previous(const char8* begin, const char8* p) {
  for (int k = 1; k <= 4 && p - begin >= k; ++k)
    if (!IsContinuation(p[-k]))
      return Decode(p - k, p).length == k ? p - k : p - 1;
  return p - 1;
}
inline const char16* Previous(const char16* begin, const char16* p) {
  return p - begin >= 2 && IsHighSurrogate(p[-2]) && IsLowSurrogate(p[-1]) ? p - 2 : p - 1;
}

/// Writes the units of a scalar value. @return the end of what was written
inline char8* Encode(char32_t c, char8* out) {
  const auto put = [&](char32_t unit) { *out++ = static_cast<char8>(unit); };
  const auto putContinuation = [&](int shift) { put(0x80 | (c >> shift & 0x3F)); };
  if (c < 0x80) {
    put(c);
    return out;
  }
  if (c < 0x800) {
    put(0xC0 | c >> 6);
  } else {
    if (c < 0x10000) {
      put(0xE0 | c >> 12);
    } else {
      put(0xF0 | c >> 18);
      putContinuation(12);
    }
    putContinuation(6);
  }
  putContinuation(0);
  return out;
}
inline char16* Encode(char32_t c, char16* out) {
  if (c >= 0x10000) {
    *out++ = static_cast<char16>(0xD800 + ((c - 0x10000) >> 10));
    c = 0xDC00 + (c & 0x3FF);
  }
  *out++ = static_cast<char16>(c);
  return out;
}

/// Returns the number of units that Encode() writes.
template <class T> int EncodedLength(char32_t c) {
  if constexpr (sizeof(T) == 1)
    return 1 + (c >= 0x80) + (c >= 0x800) + (c >= 0x10000);
  else
    return 1 + (c >= 0x10000);
}

constexpr bool IsScalarValue(char32_t c) { return c < 0xD800 || (c >= 0xE000 && c <= 0x10FFFF); }

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
