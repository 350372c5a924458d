// Compares the functions for text with the oracle, for the tests and the fuzzer.

#pragma once

#include <vector>

#include <utils/Utf.h>

#include "../utils/src/Conversion.h"
#include "Oracle.h"

namespace oracle {

using mirel::MalformedReason;
using mirel::OnMalformed;

template <class T> using Other = std::conditional_t<sizeof(T) == 1, char16, char8>;

/// The oracle's results for a text.
template <class T> struct Expected {
  explicit Expected(View<T> source) {
    std::size_t at = 0;
    for (; at < source.size(); at += sequences.back().length) {
      Sequence sequence = First(source.substr(at));
      sequence.offset = at;
      malformed += !sequence.isWellFormed;
      if (!sequence.isWellFormed && first == kNpos)
        first = static_cast<ssize_t>(at);
      if (first == kNpos)
        Put(strict, sequence.codePoint);
      Put(lossy, sequence.codePoint);
      sequences.push_back(sequence);
    }
  }
  std::vector<Sequence> sequences;
  Text<Other<T>> strict, lossy;
  ssize_t malformed = 0, first = kNpos;
};

/// Checks the code points, walked forwards and backwards.
template <class T> void CheckCodePoints(View<T> source, const Expected<T>& expected) {
  const auto range = mirel::CodePoints(source.data(), ssize_t(source.size()));
  auto i = range.begin();
  for (const Sequence& sequence : expected.sequences) {
    ASSERT_NE(i, range.end());
    ASSERT_EQ(i.position(), ssize_t(sequence.offset));
    ASSERT_EQ(*i, sequence.codePoint);
    ASSERT_EQ(i.isMalformed(), !sequence.isWellFormed);
    ++i;
  }
  ASSERT_EQ(i, range.end());
  ASSERT_EQ(i.position(), ssize_t(source.size()));
  for (std::size_t k = expected.sequences.size(); k-- > 0;) {
    --i;
    ASSERT_EQ(i.position(), ssize_t(expected.sequences[k].offset)) << "backwards";
    ASSERT_EQ(*i, expected.sequences[k].codePoint) << "backwards";
  }
  ASSERT_EQ(i, range.begin());
}

/// Calls f with each table of kernels for this processor, and with null.
template <class F> void ForEachKernels(const F& f) {
#ifdef MIREL_SHARED // a shared library hides its kernels
  static_cast<void>(f);
#else
  const mirel::detail::Kernels* kernels = nullptr;
  for (int k = 0; (kernels = mirel::detail::KernelsAt(k)) != nullptr; ++k)
    f(kernels);
  f(nullptr);
#endif
}

/// Checks the functions that the public ones call, with each table of kernels and by the scalar path.
template <class T> void CheckKernels(View<T> source, const Expected<T>& expected) {
  const T *const p = source.data(), *const end = p + source.size();
  const ssize_t n = ssize_t(source.size()), count = ssize_t(expected.sequences.size());
  ForEachKernels([&](const mirel::detail::Kernels* kernels) {
    SCOPED_TRACE(kernels != nullptr ? kernels->name : "scalar");
    ASSERT_EQ(mirel::detail::FindMalformed(kernels, p, end) - p,
              expected.first == kNpos ? n : expected.first);
    const mirel::detail::Lengths lengths = mirel::detail::Measure(kernels, p, end);
    ASSERT_EQ(lengths.codePoints, count);
    ASSERT_EQ(lengths.units, ssize_t(expected.lossy.size()));
    basic_xstring<Other<T>> dst(3, 'x');
    const auto lossy = mirel::detail::AppendUtf(kernels, dst, p, end, OnMalformed::kReplace);
    ASSERT_EQ(Std(dst), Text<Other<T>>(3, 'x') + expected.lossy);
    ASSERT_EQ(lossy.replacements, expected.malformed);
    ASSERT_EQ(lossy.malformed, expected.first == kNpos ? nullptr : p + expected.first);
  });
}

// Functions of utils/Utf.h under a name for both widths. They choose the kernels themselves.
inline bool AppendOther(mirel::string16& dst, const char8* p, ssize_t n) {
  return mirel::AppendUtf16(dst, p, n);
}
inline bool AppendOther(mirel::string8& dst, const char16* p, ssize_t n) {
  return mirel::AppendUtf8(dst, p, n);
}
inline ssize_t Lossy(mirel::string16& dst, View<char8> s) {
  return mirel::Utf16FromUtf8Lossy(dst, s.data(), ssize_t(s.size()));
}
inline ssize_t Lossy(mirel::string8& dst, View<char16> s) {
  return mirel::Utf8FromUtf16Lossy(dst, s.data(), ssize_t(s.size()));
}
inline ssize_t OtherLength(View<char8> s) { return mirel::Utf16Length(s.data(), ssize_t(s.size())); }
inline ssize_t OtherLength(View<char16> s) { return mirel::Utf8Length(s.data(), ssize_t(s.size())); }

template <class T> void CheckCalls(View<T> source, const Expected<T>& expected) {
  const ssize_t n = ssize_t(source.size());
  ASSERT_EQ(mirel::FindMalformed(source.data(), n), expected.first);
  ASSERT_EQ(mirel::IsWellFormed(source.data(), n), expected.first == kNpos);
  ASSERT_EQ(mirel::CountCodePoints(source.data(), n), ssize_t(expected.sequences.size()));
  ASSERT_EQ(OtherLength(source), ssize_t(expected.lossy.size()));
  basic_xstring<Other<T>> dst(3, 'x');
  ASSERT_EQ(AppendOther(dst, source.data(), n), expected.first == kNpos);
  ASSERT_EQ(Std(dst), Text<Other<T>>(3, 'x') + expected.strict);
  if constexpr (sizeof(T) == 2) { // the standard library's units are another type
    ASSERT_EQ(mirel::Utf8FromUtf16(dst, std::u16string(source.begin(), source.end())),
              expected.first == kNpos);
    ASSERT_EQ(Std(dst), expected.strict);
  }
  ASSERT_EQ(Lossy(dst, source), expected.malformed);
  ASSERT_EQ(Std(dst), expected.lossy);
  for (const Sequence& sequence : expected.sequences) {
    const auto explained = mirel::ExplainMalformed(source.data(), n, ssize_t(sequence.offset));
    ASSERT_EQ(explained.length, ssize_t(sequence.length));
    ASSERT_EQ(explained.reason == MalformedReason::kNone, sequence.isWellFormed);
  }
}

template <class T> void CheckText(const Text<T>& text) {
  SCOPED_TRACE(testing::PrintToString(text));
  const std::vector<T> exact(text.begin(), text.end()); // so that a sanitizer checks its end
  const View<T> source(exact.data(), exact.size());
  const Expected<T> expected(source);
  ASSERT_NO_FATAL_FAILURE(Check<Other<T>>(source));
  ASSERT_NO_FATAL_FAILURE(CheckKernels(source, expected));
  ASSERT_NO_FATAL_FAILURE(CheckCalls(source, expected));
  ASSERT_NO_FATAL_FAILURE(CheckCodePoints(source, expected));
}

/// Checks the conversion of a text in pieces that end at the cuts.
template <class T> void CheckPieces(const Text<T>& text, const std::vector<std::size_t>& cuts) {
  const Expected<T> expected{View<T>(text)};
  for (const OnMalformed policy : {OnMalformed::kStop, OnMalformed::kReplace}) {
    const bool isStrict = policy == OnMalformed::kStop;
    mirel::UtfStream<Other<T>, T> stream(policy);
    for (int again = 0; again < 2; ++again) { // a finished stream begins another text
      basic_xstring<Other<T>> dst(1, 'x');
      std::size_t at = 0;
      for (const std::size_t cut : cuts) {
        const bool goesOn = stream.Append(dst, text.data() + at, ssize_t(cut - at));
        const bool mayStop = isStrict && expected.first != kNpos && expected.first < ssize_t(cut);
        if (!mayStop) {
          ASSERT_TRUE(goesOn) << "up to " << cut;
        } else if (ssize_t(cut) >= expected.first + 4) { // no sequence is longer
          ASSERT_FALSE(goesOn) << "up to " << cut;
        }
        at = cut;
      }
      const bool ok = stream.Finish(dst);
      ASSERT_EQ(ok, !isStrict || expected.first == kNpos);
      ASSERT_EQ(Std(dst), Text<Other<T>>(1, 'x') + (isStrict ? expected.strict : expected.lossy));
      ASSERT_EQ(stream.malformed().offset, expected.first);
      ASSERT_EQ(stream.replacements(), isStrict ? 0 : expected.malformed);
      ASSERT_EQ(stream.position(), isStrict && !ok ? expected.first : ssize_t(text.size()));
      if (expected.first != kNpos) {
        const auto whole = mirel::ExplainMalformed(text.data(), ssize_t(text.size()), expected.first);
        ASSERT_EQ(stream.malformed().length, whole.length);
        ASSERT_EQ(stream.malformed().reason, whole.reason);
      }
    }
  }
}

} // namespace oracle
