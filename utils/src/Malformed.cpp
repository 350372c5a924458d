// Finds malformed text and says why it is malformed.

#include <utils/Utf.h>

#include "Conversion.h"

namespace mirel {

const char* Describe(MalformedReason reason) {
  switch (reason) {
  case MalformedReason::kTruncated: return "truncated sequence";
  case MalformedReason::kUnexpectedContinuation: return "unexpected continuation byte";
  case MalformedReason::kOverlong: return "overlong sequence";
  case MalformedReason::kSurrogate: return "surrogate in UTF-8";
  case MalformedReason::kBeyondUnicode: return "code point above U+10FFFF";
  case MalformedReason::kInvalidByte: return "invalid byte";
  case MalformedReason::kUnpairedSurrogate: return "unpaired surrogate";
  case MalformedReason::kNone: break;
  }
  return "well-formed sequence";
}

namespace detail {

MalformedReason ReasonOf(const char8* p, const char8* end, const Sequence& sequence) {
  const unsigned lead = UnitValue(*p);
  if (sequence.isWellFormed)
    return MalformedReason::kNone;
  if (lead < 0xC0)
    return MalformedReason::kUnexpectedContinuation;
  if (lead < 0xC2)
    return MalformedReason::kOverlong;
  if (lead > 0xF4)
    return MalformedReason::kInvalidByte;
  if (sequence.length > 1 || end - p < 2 || !IsContinuation(p[1]))
    return MalformedReason::kTruncated;
  // What is left is a second byte that the lead byte doesn't allow.
  if (lead == 0xED)
    return MalformedReason::kSurrogate;
  return lead == 0xF4 ? MalformedReason::kBeyondUnicode : MalformedReason::kOverlong;
}

MalformedReason ReasonOf(const char16*, const char16*, const Sequence& sequence) {
  return sequence.isWellFormed ? MalformedReason::kNone : MalformedReason::kUnpairedSurrogate;
}

ssize_t IncompleteAtEnd(const char8* begin, const char8* end) {
  for (int k = 1; k <= 3 && end - begin >= k; ++k)
    if (const char8* const p = end - k; !IsContinuation(*p)) {
      const Sequence sequence = Decode(p, end);
      return sequence.length == k && ReasonOf(p, end, sequence) == MalformedReason::kTruncated ? k : 0;
    }
  return 0;
}

ssize_t IncompleteAtEnd(const char16*, const char16* end) { return IsHighSurrogate(end[-1]) ? 1 : 0; }

template <class T> const T* FindMalformed(const Kernels* kernels, const T* p, const T* end) {
  const UnitKernels<T>* const k = kernels;
  p = k != nullptr && end - p >= kMinUnitsForKernels ? k->skip(p, end) : SkipAscii(p, end);
  while (p != end) {
    const Sequence sequence = Decode(p, end);
    if (!sequence.isWellFormed)
      break;
    p += sequence.length;
  }
  return p;
}
template const char8* FindMalformed(const Kernels* kernels, const char8* p, const char8* end);
template const char16* FindMalformed(const Kernels* kernels, const char16* p, const char16* end);

namespace {

template <class T> ssize_t Find(const T* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  const T* const malformed = FindMalformed(BestKernels(), p, p + pn);
  return malformed != p + pn ? malformed - p : ssize_t(xvector<T>::npos);
}

template <class T> MalformedText Explain(const T* p, ssize_t pn, ssize_t offset) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  MIREL_ASSERT(0 <= offset && offset < pn);
  const Sequence sequence = Decode(p + offset, p + pn);
  return {offset, sequence.length, ReasonOf(p + offset, p + pn, sequence)};
}

} // namespace

} // namespace detail

ssize_t FindMalformed(const char8* p, ssize_t pn) { return detail::Find(p, pn); }

ssize_t FindMalformed(const char16* p, ssize_t pn) { return detail::Find(p, pn); }

MalformedText ExplainMalformed(const char8* p, ssize_t pn, ssize_t offset) {
  return detail::Explain(p, pn, offset);
}

MalformedText ExplainMalformed(const char16* p, ssize_t pn, ssize_t offset) {
  return detail::Explain(p, pn, offset);
}

} // namespace mirel
