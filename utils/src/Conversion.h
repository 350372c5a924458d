// What the conversions share: the loop that all of them are made of, and what they know of malformed text.

#pragma once

#include <cstdint>
#include <cstring>

#include <utils/CodePoints.h>
#include <utils/Malformed.h>

#include "KernelTable.h"

namespace mirel::detail {

/// How a conversion ended.
template <class CharIn> struct Appended {
  const CharIn* malformed; ///< the first malformed sequence, at which a strict conversion stopped; or null
  ssize_t replacements;    ///< how many U+FFFD a lossy conversion has put in the place of such
};

/// Converts [src, end) by the given kernels, and without any if they are null, behind what dst holds.
template <class CharOut, class CharIn>
Appended<CharIn> AppendUtf(const Kernels* kernels, basic_xstring<CharOut>& dst, const CharIn* src,
                           const CharIn* end, OnMalformed onMalformed);

/// FindMalformed() by the given kernels, and without any if they are null: the first malformed sequence of
/// [p, end), or end.
template <class T> const T* FindMalformed(const Kernels* kernels, const T* p, const T* end);

/// The lengths of [p, end), malformed text counted as U+FFFD, by the given kernels or without any.
template <class T> Lengths Measure(const Kernels* kernels, const T* p, const T* end);

/// What is wrong with the sequence at p, which Decode() finds to have the given length.
MalformedReason ReasonOf(const char8* p, const char8* end, const Sequence& sequence);
MalformedReason ReasonOf(const char16* p, const char16* end, const Sequence& sequence);

/// How many units at the end of [begin, end) begin a sequence that units behind them may complete.
ssize_t CutOffAtEnd(const char8* begin, const char8* end);
ssize_t CutOffAtEnd(const char16* begin, const char16* end);

/// Skips ASCII at the beginning of a text that the kernels don't take, eight bytes at a time: 14 bytes are
/// checked in half the time that single ones take.
inline const char8* SkipAscii(const char8* p, const char8* end) {
  for (uint64_t word = 0; end - p >= ssize_t(sizeof(word)); p += sizeof(word)) {
    std::memcpy(&word, p, sizeof(word));
    if ((word & 0x8080808080808080) != 0)
      break;
  }
  return p;
}
inline const char16* SkipAscii(const char16* p, const char16*) { return p; }

/// Shorter texts are decoded one code point at a time in the time that a kernel takes to copy them into a
/// block.
constexpr ssize_t kLeastForKernels = 24;

/// After malformed text, so many units must be well-formed before the kernels are tried again: where faults
/// are dense, each trial would be in vain.
constexpr ssize_t kWellFormedBeforeKernels = 64;

} // namespace mirel::detail
