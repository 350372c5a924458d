// The conversions' oracle, written from the Unicode Standard: table 3-7 lists the well-formed UTF-8 sequences
// by their first two bytes, definition D91 the surrogate pairs. It decodes one code point at a time.

#pragma once

#include <string_view>
#include <type_traits>
#include <vector>

#include "../utils/src/Conversion.h"
#include "Support.h"

namespace oracle {

template <class T> using View = std::basic_string_view<T>;
template <class T> using Text = std::basic_string<T>;

struct Row {
  int first, last, secondFirst, secondLast;
  std::size_t length;
};
constexpr Row kTable[] = {
    {0x00, 0x7F, 0, 0, 1},       {0xC2, 0xDF, 0x80, 0xBF, 2}, {0xE0, 0xE0, 0xA0, 0xBF, 3},
    {0xE1, 0xEC, 0x80, 0xBF, 3}, {0xED, 0xED, 0x80, 0x9F, 3}, {0xEE, 0xEF, 0x80, 0xBF, 3},
    {0xF0, 0xF0, 0x90, 0xBF, 4}, {0xF1, 0xF3, 0x80, 0xBF, 4}, {0xF4, 0xF4, 0x80, 0x8F, 4}};

/// The length of the well-formed sequence that text begins with, 0 if there is none.
inline std::size_t SequenceLength(View<char8> text) {
  const auto byte = [&](std::size_t i) { return i < text.size() ? static_cast<unsigned char>(text[i]) : -1; };
  for (const Row& row : kTable) {
    if (byte(0) < row.first || byte(0) > row.last)
      continue;
    bool ok = row.length == 1 || (byte(1) >= row.secondFirst && byte(1) <= row.secondLast);
    for (std::size_t i = 2; i < row.length; ++i)
      ok = ok && byte(i) >= 0x80 && byte(i) <= 0xBF;
    return ok ? row.length : 0;
  }
  return 0;
}

/// The length of the maximal subpart that malformed text begins with: the bytes that begin a row without
/// completing it, or else one byte.
inline std::size_t SubpartLength(View<char8> text) {
  const auto byte = [&](std::size_t i) { return i < text.size() ? static_cast<unsigned char>(text[i]) : -1; };
  for (const Row& row : kTable)
    if (byte(0) >= row.first && byte(0) <= row.last) {
      if (byte(1) < row.secondFirst || byte(1) > row.secondLast)
        return 1;
      return row.length == 4 && byte(2) >= 0x80 && byte(2) <= 0xBF ? 3 : 2;
    }
  return 1;
}
inline std::size_t SubpartLength(View<char16>) { return 1; }

inline void Put(Text<char8>& text, char32_t c) {
  const auto put = [&](char32_t byte) { text += static_cast<char8>(byte); };
  if (c < 0x80)
    return put(c);
  put(c < 0x800 ? 0xC0 | c >> 6 : c < 0x10000 ? 0xE0 | c >> 12 : 0xF0 | c >> 18);
  for (int shift = c < 0x800 ? 0 : c < 0x10000 ? 6 : 12; shift >= 0; shift -= 6)
    put(0x80 | (c >> shift & 0x3F));
}

inline void Put(Text<char16>& units, char32_t c) {
  if (c >= 0x10000) {
    units += static_cast<char16>(0xD800 + ((c - 0x10000) >> 10));
    c = 0xDC00 + ((c - 0x10000) & 0x3FF);
  }
  units += static_cast<char16>(c);
}

constexpr bool IsHighSurrogate(char32_t c) { return c >= 0xD800 && c <= 0xDBFF; }
constexpr bool IsLowSurrogate(char32_t c) { return c >= 0xDC00 && c <= 0xDFFF; }
constexpr bool IsSurrogate(char32_t c) { return c >= 0xD800 && c <= 0xDFFF; }

/// A sequence of a text: well-formed, or a maximal subpart that U+FFFD replaces.
struct Sequence {
  std::size_t offset, length;
  char32_t codePoint;
  bool isWellFormed;
};

/// The sequence that text begins with.
inline Sequence First(View<char8> text) {
  const std::size_t n = SequenceLength(text);
  if (n == 0)
    return {0, SubpartLength(text), 0xFFFD, false};
  char32_t c = static_cast<unsigned char>(text[0]) & (n == 1 ? 0x7Fu : 0xFFu >> (n + 1));
  for (std::size_t i = 1; i < n; ++i)
    c = c << 6 | (static_cast<unsigned char>(text[i]) & 0x3F);
  return {0, n, c, true};
}
inline Sequence First(View<char16> text) {
  const char32_t a = text[0], b = text.size() > 1 ? text[1] : 0u;
  if (IsHighSurrogate(a) && IsLowSurrogate(b))
    return {0, 2, 0x10000 + ((a - 0xD800) << 10) + (b - 0xDC00), true};
  return {0, 1, IsSurrogate(a) ? 0xFFFD : a, !IsSurrogate(a)};
}

/// Converts source strictly. @return whether it is well-formed
template <class CharOut, class CharIn> bool Convert(Text<CharOut>& out, View<CharIn> source) {
  out.clear();
  while (!source.empty()) {
    const Sequence sequence = First(source);
    if (!sequence.isWellFormed)
      return false;
    Put(out, sequence.codePoint);
    source.remove_prefix(sequence.length);
  }
  return true;
}
template <class CharOut, class CharIn> bool Convert(Text<CharOut>& out, const Text<CharIn>& source) {
  return Convert(out, View<CharIn>(source));
}

/// Calls f with each implementation of the conversion on this processor: a function like UtfToUtf(), and its
/// name.
template <class CharOut, class CharIn, class F> void ForEachConverter(const F& f) {
#ifdef MIREL_SHARED // a shared library hides its kernels
  f(mirel::UtfToUtf<CharOut, CharIn>, "as chosen");
#else
  const mirel::detail::Kernels* kernels = nullptr;
  int k = 0;
  do {
    kernels = mirel::detail::KernelsAt(k++);
    f(
        [=](auto& dst, auto* p, ssize_t n) {
          dst.clear();
          return mirel::detail::AppendUtf(kernels, dst, p, p + n, mirel::OnMalformed::kStop).malformed ==
                 nullptr;
        },
        kernels != nullptr ? kernels->name : "scalar");
  } while (kernels != nullptr);
#endif
}

/// Converts source by every implementation, into a destination that held text, and expects the oracle's
/// result.
template <class CharOut, class CharIn> void Check(View<CharIn> source) {
  static thread_local Text<CharOut> expected;
  const bool isWellFormed = Convert(expected, source);
  ForEachConverter<CharOut, CharIn>([&](const auto& convert, const char* name) {
    basic_xstring<CharOut> dst(3, 'x'); // without room, so that the conversion makes it grow
    const CharIn* const src = source.data();
    const ssize_t srcLen = static_cast<ssize_t>(source.size());
    const bool ok = convert(dst, src, srcLen);
    const View<CharOut> units(dst.data(), static_cast<std::size_t>(dst.size()));
    if (ok != isWellFormed || units != expected) // expectations would take too long for billions of texts
      FAIL() << name << ": " << testing::PrintToString(source) << (ok ? " is " : " is not ")
             << "converted: " << testing::PrintToString(units) << ", but the oracle "
             << (isWellFormed ? "converts" : "stops") << " after " << testing::PrintToString(expected);
  });
}

/// Checks source by itself, and with one sequence before it and three after it. These take two bytes in
/// UTF-8, or three if source seems to begin with a sequence of three: a kernel converts several sequences of
/// one length at once.
template <class T> void CheckAmongSequences(View<T> source) {
  using Other = std::conditional_t<sizeof(T) == 1, char16, char8>;
  static thread_local Text<T> text;
  const bool isThreeBytes =
      sizeof(T) == 1 ? (source[0] & 0xF0) == 0xE0 : static_cast<char16>(source[0]) >= 0x800;
  const char32_t c = isThreeBytes ? 0x20AC : 0xE9;
  text.clear();
  Put(text, c);
  text += source;
  for (int k = 0; k < 3; ++k)
    Put(text, c);
  Check<Other>(source);
  Check<Other>(View<T>(text));
}

} // namespace oracle
