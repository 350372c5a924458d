// Conversions of text in pieces.

#include <utils/UtfStream.h>

#include <algorithm>
#include <iterator>

#include "Conversion.h"

namespace mirel {

template <class CharOut, class CharIn> bool UtfStream<CharOut, CharIn>::HasStopped() const {
  return m_onMalformed == OnMalformed::kStop && m_malformed.reason != MalformedReason::kNone;
}

/// Converts the pn units at p, where a sequence begins, and records the first malformed sequence. Its reason
/// may depend on the units that follow, up to end.
template <class CharOut, class CharIn>
void UtfStream<CharOut, CharIn>::Convert(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn,
                                         const CharIn* end) {
  const auto result = detail::AppendUtf(detail::BestKernels(), dst, p, p + pn, m_onMalformed);
  m_replacements += result.replacements;
  if (result.malformed != nullptr && m_malformed.reason == MalformedReason::kNone) {
    const detail::Sequence sequence = detail::Decode(result.malformed, end);
    m_malformed = {m_converted + (result.malformed - p), sequence.length,
                   detail::ReasonOf(result.malformed, end, sequence)};
  }
  m_converted = HasStopped() ? m_malformed.offset : m_converted + pn;
}

/// Adds units to the pending ones until they are a sequence or can't become one, and converts them. A unit
/// that doesn't continue the sequence isn't taken. If the pn units end before that, all of them become
/// pending.
/// @return how many of the pn units were taken
template <class CharOut, class CharIn>
ssize_t UtfStream<CharOut, CharIn>::CompletePending(basic_xstring<CharOut>& dst, const CharIn* p,
                                                    ssize_t pn) {
  CharIn units[std::size(decltype(m_kept){}) + 1] = {};
  std::copy_n(m_kept, m_pending, units);
  const ssize_t n = std::min(pn, ssize_t(std::size(units)) - m_pending);
  std::copy_n(p, n, units + m_pending);
  const ssize_t all = m_pending + n, taken = detail::Decode(units, units + all).length - m_pending;
  if (detail::IncompleteAtEnd(units, units + all) == all) {
    std::copy_n(p, n, m_kept + m_pending);
    m_pending = all;
    return n;
  }
  Convert(dst, units, m_pending + taken, units + all);
  m_pending = 0;
  return taken;
}

template <class CharOut, class CharIn>
bool UtfStream<CharOut, CharIn>::Append(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  if (m_isFinished)
    *this = UtfStream(m_onMalformed);
  const CharIn* const end = p + pn;
  while (m_pending != 0 && p != end) // none is pending once the stream has stopped
    p += CompletePending(dst, p, end - p);
  if (p != end && !HasStopped()) {
    const ssize_t cutOff = detail::IncompleteAtEnd(p, end);
    Convert(dst, p, end - p - cutOff, end);
    m_pending = HasStopped() ? 0 : cutOff;
    std::copy_n(end - cutOff, m_pending, m_kept);
  }
  return !HasStopped();
}

template <class CharOut, class CharIn> bool UtfStream<CharOut, CharIn>::Finish(basic_xstring<CharOut>& dst) {
  if (m_isFinished)
    *this = UtfStream(m_onMalformed);
  if (!HasStopped())
    Convert(dst, m_kept, m_pending, m_kept + m_pending);
  m_pending = 0;
  m_isFinished = true;
  return !HasStopped();
}

template class UtfStream<char16, char8>;
template class UtfStream<char8, char16>;

} // namespace mirel
