// The conversions between UTF-8, UTF-16 and ASCII.
//
// Kernels convert blocks of text, straight into the destination's storage. What they leave, and all text on
// processors without kernels, is converted one code point at a time by ScalarConversion.h.

#include <utils/Storage.h>
#include <utils/Utf.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <limits>

#include "Conversion.h"
#include "ScalarConversion.h"

namespace mirel {

namespace {

constexpr ssize_t kMax = std::numeric_limits<ssize_t>::max();

/// Makes room for n units and the terminator that c_str() may ask for.
template <class T> void ReserveTerminated(basic_xstring<T>& s, ssize_t n) { s.reserve(n < kMax ? n + 1 : n); }

} // namespace

void Utf16FromAscii(string16& dst, const char8* src, ssize_t srcLen) {
  MIREL_ASSERT_AS(srcLen >= 0, "newSize >= 0");
  if (srcLen > 0)
    ReserveTerminated(dst, srcLen);
  char16* const out = dst.data();
  const detail::Kernels* const kernels = detail::BestKernels();
  for (ssize_t i = kernels != nullptr ? kernels->utf16FromAscii(src, srcLen, out) : 0; i < srcLen; ++i)
    out[i] = detail::UnitValue(src[i]) < 0x80 ? detail::UnitValue(src[i]) : '?';
  detail::Storage::SetSize(dst, srcLen);
}

namespace detail {

namespace {

/// Converts from malformed text on, and replaces what is malformed, until the text seems to be well-formed:
/// in blocks, or one code point at a time where there are no kernels or less than a block of text or room is
/// left. If it reports Stop::kMalformed, the conversion goes on, whether malformed text follows or not.
template <class CharOut, class CharIn>
Progress<CharIn> Replace(const UnitKernels<CharIn>* kernels, const CharIn* p, const CharIn* end, CharOut* out,
                         CharOut* outEnd, ssize_t& replacements) {
  if (kernels != nullptr)
    if (const auto blocks = kernels->replace(p, end, out, outEnd, replacements); blocks.p != p)
      return blocks;
  return ReplaceScalar(p, end, out, outEnd, replacements);
}

/// The most units of the result for one of the source, and the most of the source for one of the result.
template <class CharOut> constexpr ssize_t kMaxOutPerIn = sizeof(CharOut) == 1 ? 3 : 1;
template <class CharOut> constexpr ssize_t kMaxInPerOut = sizeof(CharOut) == 1 ? 1 : 3;

/// Returns a + b, or kMax if the sum is larger.
ssize_t Sum(ssize_t a, ssize_t b) { return a < kMax - b ? a + b : kMax; }

/// The string that a conversion appends to: makes room, and gives back in the end what wasn't needed.
template <class CharOut> class Destination {
public:
  /// Makes no room yet if the result may fit: a string that is used for one result after the other would
  /// otherwise grow and shrink each time.
  Destination(basic_xstring<CharOut>& s, ssize_t srcLen)
      : m_string(s), m_oldSize(s.size()), m_oldCapacity(s.capacity()), m_srcLen(srcLen) {
    if (srcLen > 0 && m_oldCapacity - m_oldSize <= srcLen / kMaxInPerOut<CharOut>)
      Grow(Sum(m_oldSize, srcLen));
  }

  CharOut* Out() { return m_string.data_end(); }
  /// The last unit is for the terminator.
  CharOut* OutEnd() { return m_string.data() + std::max(m_string.capacity() - 1, ssize_t(0)); }
  void SetEnd(const CharOut* out) { Storage::SetSize(m_string, out - m_string.data()); }

  /// Makes more room when the last `rest` units of the source are left: first for one unit of the result for
  /// each unit of the whole source; if that was too little, for the most that the rest can take.
  void GrowFor(ssize_t rest) {
    const ssize_t size = m_string.size(), tried = Sum(m_oldSize, m_srcLen);
    const ssize_t maxSize =
        size + kMaxOutPerIn<CharOut> * std::min(rest, (kMax - size) / kMaxOutPerIn<CharOut>);
    Grow(m_string.capacity() <= tried ? tried : maxSize);
  }
  /// Gives back what isn't needed. A string that held text before and has grown keeps at least twice its old
  /// capacity.
  void Finish() {
    if (m_string.capacity() != m_oldCapacity)
      Storage::Shrink(m_string, std::max(MinCapacity(), m_string.size() + 1));
  }

private:
  ssize_t MinCapacity() const { return m_oldSize == 0 ? m_oldCapacity : Sum(m_oldCapacity, m_oldCapacity); }
  void Grow(ssize_t n) { ReserveTerminated(m_string, std::max(n, MinCapacity())); }

  basic_xstring<CharOut>& m_string;
  const ssize_t m_oldSize, m_oldCapacity, m_srcLen;
};

} // namespace

template <class CharOut, class CharIn>
Appended<CharIn> AppendUtf(const Kernels* kernels, basic_xstring<CharOut>& dst, const CharIn* src,
                           const CharIn* end, OnMalformed onMalformed) {
  const UnitKernels<CharIn>* const k = kernels;
  Appended<CharIn> result{nullptr, 0};
  Destination<CharOut> destination(dst, end - src);
  for (const CharIn* p = src;;) {
    Progress<CharIn> at{p, destination.Out(), Stop::kMalformed};
    if (k != nullptr)
      at = k->convert(p, end, at.out, destination.OutEnd());
    if (at.stop == Stop::kMalformed)
      at = ConvertScalar(at.p, end, at.out, destination.OutEnd());
    if (at.stop == Stop::kMalformed) {
      if (result.malformed == nullptr)
        result.malformed = at.p;
      if (onMalformed == OnMalformed::kReplace)
        at = Replace(k, at.p, end, at.out, destination.OutEnd(), result.replacements);
    }
    p = at.p;
    destination.SetEnd(at.out);
    if (at.stop == Stop::kNoRoom) {
      destination.GrowFor(end - p);
    } else if (at.stop == Stop::kEnd || onMalformed == OnMalformed::kStop) {
      destination.Finish();
      return result;
    }
  }
}

template Appended<char8> AppendUtf(const Kernels* kernels, string16& dst, const char8* src, const char8* end,
                                   OnMalformed onMalformed);
template Appended<char16> AppendUtf(const Kernels* kernels, string8& dst, const char16* src,
                                    const char16* end, OnMalformed onMalformed);

namespace {

template <class CharOut, class CharIn>
bool AppendStrict(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn) {
  return AppendUtf(BestKernels(), dst, p, p + pn, OnMalformed::kStop).malformed == nullptr;
}

template <class CharOut, class CharIn>
ssize_t ConvertLossy(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  dst.clear();
  return AppendUtf(BestKernels(), dst, p, p + pn, OnMalformed::kReplace).replacements;
}

} // namespace

} // namespace detail

template <> bool UtfToUtf<char16, char8>(string16& result, const char8* src, ssize_t srcLen) {
  MIREL_ASSERT(srcLen >= 0);
  result.clear();
  return detail::AppendUtf(detail::BestKernels(), result, src, src + srcLen, OnMalformed::kStop).malformed ==
         nullptr;
}

template <> bool UtfToUtf<char8, char16>(string8& result, const char16* src, ssize_t srcLen) {
  MIREL_ASSERT(srcLen >= 0);
  result.clear();
  return detail::AppendUtf(detail::BestKernels(), result, src, src + srcLen, OnMalformed::kStop).malformed ==
         nullptr;
}

bool Utf16FromUtf8(string16& dst, const char8* src, ssize_t srcLen) {
  return UtfToUtf<char16, char8>(dst, src, srcLen);
}

bool Utf16FromUtf8(string16& dst, const char8* src) {
  MIREL_ASSERT(src);
  return UtfToUtf<char16, char8>(dst, src, GetStringLength(src));
}

bool Utf8FromUtf16(string8& dst, const char16* src, ssize_t srcLen) {
  return UtfToUtf<char8, char16>(dst, src, srcLen);
}

bool Utf8FromUtf16(string8& dst, const char16* src) {
  MIREL_ASSERT(src);
  return UtfToUtf<char8, char16>(dst, src, GetStringLength(src));
}

// A char16_t may not be read as a char16: the text is copied part by part.
bool Utf8FromUtf16(string8& dst, std::u16string_view text) {
  const ssize_t oldCapacity = dst.capacity();
  dst.clear();
  bool isWellFormed = true;
  while (!text.empty() && isWellFormed) {
    char16 part[1024];
    const std::size_t n = std::min(text.size(), std::size(part));
    std::memcpy(part, text.data(), n * sizeof(char16));
    // A surrogate pair that the part's end would cut off is left to the next part.
    const ssize_t cutOff = n < text.size() ? detail::IncompleteAtEnd(part, part + n) : 0;
    isWellFormed = detail::AppendStrict(dst, part, static_cast<ssize_t>(n) - cutOff);
    text.remove_prefix(n - static_cast<std::size_t>(cutOff));
  }
  detail::Storage::Shrink(dst, std::max(oldCapacity, dst.size() + 1));
  return isWellFormed;
}

bool AppendUtf16(string16& dst, const char8* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  return detail::AppendStrict(dst, p, pn);
}

bool AppendUtf8(string8& dst, const char16* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  return detail::AppendStrict(dst, p, pn);
}

ssize_t Utf16FromUtf8Lossy(string16& dst, const char8* p, ssize_t pn) {
  return detail::ConvertLossy(dst, p, pn);
}

ssize_t Utf8FromUtf16Lossy(string8& dst, const char16* p, ssize_t pn) {
  return detail::ConvertLossy(dst, p, pn);
}

} // namespace mirel
