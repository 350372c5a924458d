// What the conversions, checks and counts share: AppendUtf() is in Utf.cpp, FindMalformed(), ReasonOf() and
// IncompleteAtEnd() in Malformed.cpp, and Measure() in Lengths.cpp.

#pragma once

#include <cstdint>
#include <cstring>

#include <utils/Malformed.h>
#include <utils/Sequences.h>
#include <utils/xstring.h>

#include "KernelTable.h"

namespace mirel::detail {

/// How a conversion ended.
template <class CharIn> struct Appended {
  const CharIn* malformed; ///< the first malformed sequence, at which a strict conversion stopped; or null
  ssize_t replacements;    ///< how many U+FFFD a lossy conversion wrote for malformed text
};

/// Appends the conversion of [src, end) to dst, by the given kernels; by the scalar path alone if they are
/// null.
template <class CharOut, class CharIn>
Appended<CharIn> AppendUtf(const Kernels* kernels, basic_xstring<CharOut>& dst, const CharIn* src,
                           const CharIn* end, OnMalformed onMalformed);

/// Returns the first malformed sequence of [p, end), or end, by the given kernels; by the scalar path alone
/// if they are null.
template <class T> const T* FindMalformed(const Kernels* kernels, const T* p, const T* end);

/// Returns the lengths of [p, end), malformed text counted as U+FFFD, by the given kernels; by the scalar
/// path alone if they are null.
template <class T> Lengths Measure(const Kernels* kernels, const T* p, const T* end);

/// Returns what is wrong with the sequence at p; `sequence` is what Decode(p, end) returned.
MalformedReason ReasonOf(const char8* p, const char8* end, const Sequence& sequence);
MalformedReason ReasonOf(const char16* p, const char16* end, const Sequence& sequence);

/// Returns how many units at the end of [begin, end), which isn't empty, begin a sequence that further units
/// may complete.
ssize_t IncompleteAtEnd(const char8* begin, const char8* end);
ssize_t IncompleteAtEnd(const char16* begin, const char16* end);

/// Skips whole groups of eight ASCII bytes at the beginning of a text that the kernels don't take. SWAR (SIMD
/// within a register) checks 14 bytes in half the time of a loop over single bytes.
inline const char8* SkipAscii(const char8* p, const char8* end) {
  for (uint64_t bytes = 0; end - p >= ssize_t(sizeof(bytes)); p += sizeof(bytes)) {
    std::memcpy(&bytes, p, sizeof(bytes));
    if ((bytes & 0x8080808080808080) != 0)
      break;
  }
  return p;
}
/// Skips nothing; it lets the templates call SkipAscii() for both widths.
inline const char16* SkipAscii(const char16* p, const char16*) { return p; }

} // namespace mirel::detail
