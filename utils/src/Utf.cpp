// The conversions between UTF-8, UTF-16 and ASCII.
//
// Kernels convert what is well-formed, straight into the destination's storage. What they don't take, and all
// text on processors without kernels, goes through the traits of Boost, one code point at a time.

#include <utils/Storage.h>
#include <utils/xstring.h>

#include <algorithm>
#include <limits>
#include <type_traits>

#include <boost/locale/utf.hpp>

#include "KernelTable.h"

namespace mirel {

namespace {

namespace utf = boost::locale::utf;

constexpr ssize_t kMax = std::numeric_limits<ssize_t>::max();

/// Makes room for n units and the terminator that c_str() may ask for.
template <class T> void ReserveTerminated(basic_xstring<T>& s, ssize_t n) { s.reserve(n < kMax ? n + 1 : n); }

} // namespace

void Utf16FromAscii(string16& dst, const char8* src, ssize_t srcLen) {
  MIREL_ASSERT_AS(srcLen >= 0, "newSize >= 0");
  if (srcLen > 0)
    ReserveTerminated(dst, srcLen);
  if (const detail::Kernels* const kernels = detail::BestKernels())
    kernels->utf16FromAscii(src, src + srcLen, dst.data());
  else
    for (ssize_t i = 0; i < srcLen; ++i)
      dst.data()[i] = detail::UnitValue(src[i]) < 0x80 ? detail::UnitValue(src[i]) : '?';
  detail::Storage::SetSize(dst, srcLen);
}

namespace detail {

namespace {

/// Converts one code point at a time, and judges what is well-formed.
template <class CharOut, class CharIn>
Progress<CharOut, CharIn> ConvertScalar(const CharIn* src, const CharIn* srcEnd, CharOut* out,
                                        const CharOut* outEnd) {
  // As unsigned units: with char the traits would convert negative values without saying so.
  using Unsigned = std::make_unsigned_t<CharIn>;
  using Encoding = utf::utf_traits<CharOut>;
  const Unsigned* p = reinterpret_cast<const Unsigned*>(src);
  const Unsigned* const end = reinterpret_cast<const Unsigned*>(srcEnd);
  const auto stop = [&](Stop why) {
    return Progress<CharOut, CharIn>{reinterpret_cast<const CharIn*>(p), out, why};
  };
  while (p != end) {
    const Unsigned* next = p;
    const utf::code_point c =
        *p < 0x80 ? utf::code_point{*next++} : utf::utf_traits<Unsigned>::decode(next, end);
    if (c == utf::illegal || c == utf::incomplete)
      return stop(Stop::kMalformed);
    if (outEnd - out < Encoding::width(c))
      return stop(Stop::kNoRoom);
    out = Encoding::encode(c, out);
    p = next;
  }
  return stop(Stop::kEnd);
}

/// Converts as far as there is room for the result, or up to malformed text.
template <class CharOut, class CharIn>
Progress<CharOut, CharIn> Convert(const Kernels* k, const CharIn* p, const CharIn* end, CharOut* out,
                                  CharOut* outEnd) {
  Progress<CharOut, CharIn> progress{p, out, Stop::kMalformed};
  if (k != nullptr) {
    if constexpr (sizeof(CharIn) == 1)
      progress = k->utf16FromUtf8(p, end, out, outEnd);
    else
      progress = k->utf8FromUtf16(p, end, out, outEnd);
  }
  return progress.stop == Stop::kMalformed ? ConvertScalar(progress.p, end, progress.out, outEnd) : progress;
}

/// The most units of the result for one of the source, and the most of the source for one of the result.
template <class CharOut> constexpr ssize_t kMostOut = sizeof(CharOut) == 1 ? 3 : 1;
template <class CharOut> constexpr ssize_t kMostIn = sizeof(CharOut) == 1 ? 1 : 3;

} // namespace

template <class CharOut, class CharIn>
bool UtfToUtf(const Kernels* kernels, basic_xstring<CharOut>& result, const CharIn* src, ssize_t srcLen) {
  const ssize_t oldCapacity = result.capacity();
  result.clear();
  // Where the result may fit in the capacity that there is, it is tried: a string that holds one result after
  // the other would otherwise grow and shrink each time.
  if (srcLen > 0 && oldCapacity <= srcLen / kMostIn<CharOut>)
    ReserveTerminated(result, srcLen);
  const CharIn* const end = src + srcLen;
  for (const CharIn* p = src;;) {
    CharOut* const outEnd = result.data() + std::max(result.capacity() - 1, ssize_t(0));
    const Progress<CharOut, CharIn> progress = Convert(kernels, p, end, result.data_end(), outEnd);
    p = progress.p;
    Storage::SetSize(result, progress.out - result.data());
    if (progress.stop != Stop::kNoRoom) {
      Storage::GiveBack(result, std::max(oldCapacity, result.size() + 1));
      return progress.stop == Stop::kEnd;
    }
    const ssize_t rest = end - p, size = result.size();
    const ssize_t most = size + kMostOut<CharOut> * std::min(rest, (kMax - size) / kMostOut<CharOut>);
    ReserveTerminated(result, result.capacity() <= srcLen ? srcLen : most);
  }
}

template bool UtfToUtf(const Kernels* kernels, string16& result, const char8* src, ssize_t srcLen);
template bool UtfToUtf(const Kernels* kernels, string8& result, const char16* src, ssize_t srcLen);

} // namespace detail

template <> bool UtfToUtf<char16, char8>(string16& result, const char8* src, ssize_t srcLen) {
  MIREL_ASSERT(srcLen >= 0);
  return detail::UtfToUtf(detail::BestKernels(), result, src, srcLen);
}

template <> bool UtfToUtf<char8, char16>(string8& result, const char16* src, ssize_t srcLen) {
  MIREL_ASSERT(srcLen >= 0);
  return detail::UtfToUtf(detail::BestKernels(), result, src, srcLen);
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

} // namespace mirel
