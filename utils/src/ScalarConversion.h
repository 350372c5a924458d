// The scalar path of the conversions: one code point at a time, for processors without kernels and for what
// the kernels leave.
//
// Well-formed text is decoded by the traits of Boost.Locale. From malformed text on, a lossy conversion
// decodes by utils/Sequences.h, which knows maximal subparts. One decoder for both took 1.25 to 1.45 times
// as long.

#pragma once

#include <type_traits>

#include <boost/locale/utf.hpp>

#include <utils/Sequences.h>

#include "KernelTable.h"

namespace mirel::detail {

/// Converts one code point at a time, and decides what is well-formed. Never inlined: otherwise a
/// text of 14 units takes 1.5 times as long, although the kernels convert it.
template <class CharOut, class CharIn>
[[gnu::noinline]] static Progress<CharIn> ConvertScalar(const CharIn* src, const CharIn* srcEnd, CharOut* out,
                                                        const CharOut* outEnd) {
  // As unsigned units: a signed byte from 80 on is negative. The comparison with 0x80 below would take it for
  // ASCII, and the traits would convert it implicitly, which -fsanitize=implicit-conversion reports.
  using Unsigned = std::make_unsigned_t<CharIn>;
  namespace utf = boost::locale::utf;
  using Encoding = utf::utf_traits<CharOut>;
  const Unsigned* p = reinterpret_cast<const Unsigned*>(src);
  const Unsigned* const end = reinterpret_cast<const Unsigned*>(srcEnd);
  Stop stop = Stop::kEnd;
  while (p != end) {
    const Unsigned* next = p;
    const utf::code_point c =
        *p < 0x80 ? utf::code_point{*next++} : utf::utf_traits<Unsigned>::decode(next, end);
    const bool isMalformed = c == utf::illegal || c == utf::incomplete;
    if (isMalformed || outEnd - out < Encoding::width(c)) {
      stop = isMalformed ? Stop::kMalformed : Stop::kNoRoom;
      break;
    }
    out = Encoding::encode(c, out);
    p = next;
  }
  return {reinterpret_cast<const CharIn*>(p), out, stop};
}

/// Converts from malformed text on, with U+FFFD for each maximal subpart, until kWellFormedBeforeKernels
/// units in a row are well-formed.
template <class CharOut, class CharIn>
static Progress<CharIn> ReplaceScalar(const CharIn* p, const CharIn* end, CharOut* out, const CharOut* outEnd,
                                      ssize_t& replacements) {
  for (const CharIn* malformed = p; p != end && p - malformed < kWellFormedBeforeKernels;) {
    const Sequence sequence = Decode(p, end);
    if (outEnd - out < EncodedLength<CharOut>(sequence.codePoint))
      return {p, out, Stop::kNoRoom};
    out = Encode(sequence.codePoint, out);
    p += sequence.length;
    if (!sequence.isWellFormed) {
      ++replacements;
      malformed = p;
    }
  }
  return {p, out, p == end ? Stop::kEnd : Stop::kMalformed};
}

} // namespace mirel::detail
