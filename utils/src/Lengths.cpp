// How long a text is: in code points, and in units of the other encoding.

#include <utils/Utf.h>

#include "Conversion.h"

namespace mirel {

namespace detail {

namespace {

/// Adds the lengths of the sequences from p on, one by one: to the end, or, where there are kernels, until
/// the text seems to be well-formed. @return where it stopped
template <class T> const T* MeasureScalar(const T* p, const T* end, bool hasKernels, Lengths& lengths) {
  for (const T* malformed = p; p != end && !(hasKernels && p - malformed >= kWellFormedBeforeKernels);) {
    const Sequence sequence = Decode(p, end);
    p += sequence.length;
    ++lengths.codePoints;
    lengths.units += EncodedLength<OtherUnit<T>>(sequence.codePoint);
    if (!sequence.isWellFormed)
      malformed = p;
  }
  return p;
}

} // namespace

template <class T> Lengths Measure(const Kernels* kernels, const T* p, const T* end) {
  const UnitKernels<T>* const k = kernels;
  Lengths lengths{0, 0};
  while (p != end) {
    const bool hasKernels = k != nullptr && end - p >= kMinUnitsForKernels;
    if (hasKernels) {
      const Measured<T> measured = k->measure(p, end);
      lengths.codePoints += measured.lengths.codePoints;
      lengths.units += measured.lengths.units;
      p = measured.p;
    } else {
      const ssize_t ascii = SkipAscii(p, end) - p;
      lengths.codePoints += ascii;
      lengths.units += ascii;
      p += ascii;
    }
    p = MeasureScalar(p, end, hasKernels, lengths);
  }
  return lengths;
}
template Lengths Measure(const Kernels* kernels, const char8* p, const char8* end);
template Lengths Measure(const Kernels* kernels, const char16* p, const char16* end);

namespace {

template <class T> Lengths MeasureText(const T* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  return Measure(BestKernels(), p, p + pn);
}

} // namespace

} // namespace detail

ssize_t Utf16Length(const char8* p, ssize_t pn) {
  return detail::Saturated(detail::MeasureText(p, pn).units);
}

ssize_t Utf8Length(const char16* p, ssize_t pn) {
  return detail::Saturated(detail::MeasureText(p, pn).units);
}

ssize_t CountCodePoints(const char8* p, ssize_t pn) { return detail::MeasureText(p, pn).codePoints; }

ssize_t CountCodePoints(const char16* p, ssize_t pn) { return detail::MeasureText(p, pn).codePoints; }

} // namespace mirel
