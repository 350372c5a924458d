/// @file
/// Sequences: the code units of one code point, decoded and encoded.
///
/// It knows pointers to code units, neither strings nor kernels. Ranges of code points use it; checks and
/// counts use it for text that no kernel handles. The conversions have a scalar path of their own for
/// well-formed text; lossy ones use this file from malformed text on.

#pragma once

#include "xchar.h"

namespace mirel::detail {

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

} // namespace mirel::detail
