/// @file
/// Text by code points: a range that decodes UTF-8 or UTF-16 as it is walked, and the way to append one.
///
/// The decoder here says where a sequence ends and whether it is well-formed, for everything in the library
/// that meets malformed text. It knows single sequences; it allocates nothing and keeps nothing.

#pragma once

#include <cstddef>
#include <iterator>
#include <string>
#include <string_view>
#include <type_traits>

#include "xstring.h"

namespace mirel {

namespace detail {

/// What stands in the place of malformed text, U+FFFD.
constexpr char32_t kReplacement = 0xFFFD;

/// A code point and the number of its units, or U+FFFD and the length of a maximal subpart: the units that
/// begin a well-formed sequence and don't finish one, or a single unit where none do (Unicode Standard 3.9,
/// U+FFFD Substitution of Maximal Subparts).
struct Sequence {
  char32_t codePoint;
  int length;
  bool isWellFormed;
};

inline bool IsContinuation(char8 unit) { return (UnitValue(unit) & 0xC0) == 0x80; }
inline bool IsHighSurrogate(char16 unit) { return (unit & 0xFC00) == 0xD800; }
inline bool IsLowSurrogate(char16 unit) { return (unit & 0xFC00) == 0xDC00; }

/// The sequence at p in UTF-8, as table 3-7 of the Unicode Standard has it. p isn't the end.
///
/// It is always inlined: as a call, with its result in memory, it took five to seven times as long in a loop
/// over a text.
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
    const char32_t upper = (lead & 0x0F) << 6 | second; // bits from the sixth on; the table has the limits
    if (upper < 0x800 >> 6 || upper >> 5 == 0xD800 >> 11)
      return {kReplacement, 1, false};
    if (end - p < 3 || !IsContinuation(p[2]))
      return {kReplacement, 2, false};
    return {upper << 6 | (UnitValue(p[2]) & 0x3F), 3, true};
  }
  const char32_t upper = (lead & 0x07) << 6 | second; // bits from the twelfth on
  if (upper < 0x10000 >> 12 || upper > 0x10FFFF >> 12)
    return {kReplacement, 1, false};
  if (end - p < 3 || !IsContinuation(p[2]))
    return {kReplacement, 2, false};
  if (end - p < 4 || !IsContinuation(p[3]))
    return {kReplacement, 3, false};
  return {upper << 12 | (UnitValue(p[2]) & 0x3Fu) << 6 | (UnitValue(p[3]) & 0x3Fu), 4, true};
}

/// The sequence at p in UTF-16, as definition D91 of the Unicode Standard has it. p isn't the end.
[[gnu::always_inline]] inline Sequence Decode(const char16* p, const char16* end) {
  const char32_t unit = *p;
  if (unit >> 11 != 0xD800 >> 11)
    return {unit, 1, true};
  if (IsHighSurrogate(p[0]) && end - p > 1 && IsLowSurrogate(p[1]))
    return {0x10000 + ((unit - 0xD800) << 10) + (p[1] - 0xDC00u), 2, true};
  return {kReplacement, 1, false};
}

/// Where the sequence that ends at p begins, of those that Decode() finds one by one from begin on. A unit
/// that isn't a continuation byte always begins one, so no more than four units are looked at.
inline const char8* Previous(const char8* begin, const char8* p) {
  for (int k = 1; k <= 4 && p - begin >= k; ++k)
    if (!IsContinuation(p[-k]))
      return Decode(p - k, p).length == k ? p - k : p - 1;
  return p - 1;
}
inline const char16* Previous(const char16* begin, const char16* p) {
  return p - begin >= 2 && IsHighSurrogate(p[-2]) && IsLowSurrogate(p[-1]) ? p - 2 : p - 1;
}

/// Writes the units of a scalar value. @return past the end of them
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

/// The units that Encode() writes.
template <class T> int EncodedLength(char32_t c) {
  if constexpr (sizeof(T) == 1)
    return 1 + (c >= 0x80) + (c >= 0x800) + (c >= 0x10000);
  else
    return 1 + (c >= 0x10000);
}

constexpr bool IsScalarValue(char32_t c) { return c < 0xD800 || (c >= 0xE000 && c <= 0x10FFFF); }

/// Lets a function take a temporary std::string, in order to refuse it.
template <class S>
using IfTemporaryString = std::enable_if_t<std::is_same_v<std::remove_const_t<S>, std::string>, int>;

inline ssize_t SizeOf(std::string_view text) { return static_cast<ssize_t>(text.size()); }

} // namespace detail

/// Walks a text by code points, forwards and backwards. Malformed text is U+FFFD for each maximal subpart,
/// the same ones in both directions.
///
/// It decodes the code point at which it stands once, when it gets there. It yields values, not references.
/// @snippet examples/reference.cpp code point iterators
template <class T> class CodePointIterator {
public:
  typedef std::bidirectional_iterator_tag iterator_concept; ///< For C++20, which lets values be yielded.
  typedef std::input_iterator_tag iterator_category; ///< For C++17, where more would promise references.
  typedef char32_t value_type;                       ///< A Unicode scalar value.
  typedef std::ptrdiff_t difference_type;            ///< Counts code points.
  typedef void pointer;                              ///< There is nothing to point at.
  typedef char32_t reference;                        ///< A value.

  /// An iterator to assign to.
  CodePointIterator() = default;

  /// The code point, or U+FFFD for malformed text. Not past the end.
  char32_t operator*() const { return m_codePoint; }
  /// The index of the unit at which the code point begins, counted from the beginning of the range.
  ssize_t position() const { return m_p - m_begin; }
  /// Whether the iterator stands at malformed text. Not past the end.
  bool isMalformed() const { return !m_isWellFormed; }

  /// Goes to the next code point. Not past the end.
  [[gnu::always_inline]] CodePointIterator& operator++() {
    m_p = m_next;
    Read();
    return *this;
  }
  /// Goes to the next code point and returns what it was.
  CodePointIterator operator++(int) {
    const CodePointIterator before = *this;
    ++*this;
    return before;
  }
  /// Goes to the previous code point. Not at the beginning.
  CodePointIterator& operator--() {
    m_p = detail::Previous(m_begin, m_p);
    Read();
    return *this;
  }
  /// Goes to the previous code point and returns what it was.
  CodePointIterator operator--(int) {
    const CodePointIterator before = *this;
    --*this;
    return before;
  }

  /// Whether two iterators of one range stand at the same place.
  friend bool operator==(const CodePointIterator& a, const CodePointIterator& b) { return a.m_p == b.m_p; }
  /// Whether two iterators of one range stand at different places.
  friend bool operator!=(const CodePointIterator& a, const CodePointIterator& b) { return a.m_p != b.m_p; }

private:
  template <class> friend class CodePointRange;

  CodePointIterator(const T* begin, const T* p, const T* end) : m_begin(begin), m_p(p), m_end(end) {}

  /// Decodes what is at m_p, unless that is the end. Always inlined, as Decode() is: otherwise the iterator
  /// of a loop has to be in memory.
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
  const T* m_next = nullptr; ///< where the next code point begins, while this isn't the end
  const T* m_end = nullptr;
  char32_t m_codePoint = 0;
  bool m_isWellFormed = true;
};

/// The code points of a text that it doesn't own, as CodePoints() makes it. Changing the text's storage
/// invalidates it and its iterators.
/// @snippet examples/reference.cpp code points
template <class T> class CodePointRange {
public:
  typedef CodePointIterator<T> iterator;       ///< Walks the code points.
  typedef CodePointIterator<T> const_iterator; ///< Walks the code points.

  /// The pn units at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  CodePointRange(const T* p, ssize_t pn) : m_begin(p), m_end(p) {
    MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
    m_end += pn;
  }

  /// The first code point.
  [[gnu::always_inline]] iterator begin() const {
    iterator first(m_begin, m_begin, m_end);
    first.Read();
    return first;
  }
  /// Past the last code point.
  iterator end() const { return {m_begin, m_end, m_end}; }
  /// Whether there are none.
  bool empty() const { return m_begin == m_end; }

private:
  const T* m_begin;
  const T* m_end;
};

/// @name Code points
/// A range for `for (char32_t c : CodePoints(s))`: the code points of a UTF-8 or UTF-16 text, and U+FFFD for
/// each maximal subpart of malformed text, as the lossy conversions replace it. The range refers to the text,
/// so a temporary string doesn't compile.
/// @snippet examples/reference.cpp code points
/// @{

/// The code points of the pn units at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline CodePointRange<char8> CodePoints(const char8* p, ssize_t pn) { return {p, pn}; }
/// The code points of the pn units at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline CodePointRange<char16> CodePoints(const char16* p, ssize_t pn) { return {p, pn}; }
/// The code points of a string.
inline CodePointRange<char8> CodePoints(const xvector<char8>& text) { return {text.data(), text.size()}; }
/// The code points of a string.
inline CodePointRange<char16> CodePoints(const xvector<char16>& text) { return {text.data(), text.size()}; }
/// The code points of what a view refers to, of a std::string or of a literal.
inline CodePointRange<char8> CodePoints(std::string_view text) { return {text.data(), detail::SizeOf(text)}; }
CodePointRange<char8> CodePoints(const xvector<char8>&& text) = delete;
CodePointRange<char16> CodePoints(const xvector<char16>&& text) = delete;
template <class S, detail::IfTemporaryString<S> = 0> CodePointRange<char8> CodePoints(S&& text) = delete;
CodePointRange<char8> CodePoints(std::nullptr_t) = delete;

/// @}
/// @name Appending a code point
/// Append the units of c, or of U+FFFD where c is no Unicode scalar value: a surrogate or above U+10FFFF. A
/// failed allocation throws std::bad_alloc and leaves dst as it was. Amortised constant time.
/// @snippet examples/reference.cpp code points
/// @{

/// In UTF-8, one to four units.
inline void AppendCodePoint(xvector<char8>& dst, char32_t c) {
  if (c < 0x80) {
    dst.push_back(static_cast<char8>(c));
    return;
  }
  char8 units[4];
  dst.push_back(units, detail::Encode(detail::IsScalarValue(c) ? c : detail::kReplacement, units));
}
/// In UTF-16, one or two units.
inline void AppendCodePoint(xvector<char16>& dst, char32_t c) {
  char16 units[2];
  dst.push_back(units, detail::Encode(detail::IsScalarValue(c) ? c : detail::kReplacement, units));
}

/// @}

} // namespace mirel
