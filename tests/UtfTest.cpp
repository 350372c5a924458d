// The conversions compared with their oracle, by every kernel of the processor and by the scalar path: all
// short inputs, and inputs in which different sequences, malformed ones and the ends of blocks meet.
#include "Oracle.h"

#include <algorithm>
#include <vector>

#include <utils/CodePoints.h>
#include <utils/Utf.h>

namespace {

using namespace oracle;

TEST(Utf, EveryScalarValueConvertsBothWays) {
  Text<char8> allBytes, bytes;
  Text<char16> allUnits, units;
  for (char32_t c = 0; c <= 0x10FFFF; ++c) {
    if (IsSurrogate(c))
      continue;
    bytes.clear();
    units.clear();
    Put(bytes, c);
    Put(units, c);
    ASSERT_NO_FATAL_FAILURE(Check<char16>(View<char8>(bytes)));
    ASSERT_NO_FATAL_FAILURE(Check<char8>(View<char16>(units)));
    allBytes += bytes;
    allUnits += units;
  }
  Check<char16>(View<char8>(allBytes));
  Check<char8>(View<char16>(allUnits));
  ASSERT_TRUE(Convert(units, allBytes));
  ASSERT_EQ(units, allUnits) << "the oracle's two directions differ";
}

TEST(Utf, EverySequenceOfUpToThreeBytesConvertsAsByTheOracle) {
  for (unsigned bytes = 0; bytes < 1u << 24; ++bytes) {
    const char8 text[] = {static_cast<char8>(bytes >> 16), static_cast<char8>(bytes >> 8),
                          static_cast<char8>(bytes)};
    const std::size_t zeros = bytes < 0x100 ? 2 : bytes < 0x10000; // dropped, to test shorter texts too
    const View<char8> view = View<char8>(text, 3).substr(zeros);
    ASSERT_NO_FATAL_FAILURE(CheckAmongSequences(view));
    const Sequence expected = First(view);
    const auto decoded = mirel::detail::Decode(view.data(), view.data() + view.size());
    if (decoded.codePoint != expected.codePoint || decoded.length != int(expected.length) ||
        decoded.isWellFormed != expected.isWellFormed)
      FAIL() << testing::PrintToString(view) << " is decoded as " << testing::PrintToString(decoded.codePoint)
             << " of " << decoded.length << " bytes, but is " << testing::PrintToString(expected.codePoint)
             << " of " << expected.length;
  }
}

TEST(Utf, FourBytesConvertAsByTheOracle) {
  const unsigned nearContinuations[] = {0x7F, 0x80, 0x9A, 0xBF, 0xC0};
  for (unsigned lead = 0xF0; lead < 0x100; ++lead)
    for (unsigned second = 0; second < 0x100; ++second)
      for (const unsigned third : nearContinuations)
        for (const unsigned fourth : nearContinuations) {
          const char8 text[] = {static_cast<char8>(lead), static_cast<char8>(second),
                                static_cast<char8>(third), static_cast<char8>(fourth)};
          ASSERT_NO_FATAL_FAILURE(CheckAmongSequences(View<char8>(text, 4)));
        }
}

TEST(Utf, SurrogatesMustPair) {
  const char16 values[] = {0,      0x41,   0x7F,   0x80,   0x7FF,  0x800, 0xD7FF,
                           0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xE000, 0xFFFF};
  for (const char16 a : values)
    for (const char16 b : values)
      for (const char16 c : values)
        ASSERT_NO_FATAL_FAILURE(CheckAmongSequences<char16>(Text<char16>{a, b, c}));
}

#ifndef MIREL_SHARED
/// Converts source by every kernel into room of every size, and expects the beginning of the result there.
/// A sanitizer checks that nothing is written past the end of the room.
template <class CharOut, class CharIn> void CheckEveryRoom(View<CharIn> source) {
  Text<CharOut> expected;
  ASSERT_TRUE(Convert(expected, source));
  const CharIn* const end = source.data() + source.size();
  for (int k = 0; const mirel::detail::Kernels* const kernels = mirel::detail::KernelsAt(k); ++k)
    for (std::size_t room = 0; room < expected.size() + 3; ++room) {
      std::vector<CharOut> out(room);
      const mirel::detail::UnitKernels<CharIn>& of = *kernels;
      const auto at = of.convert(source.data(), end, out.data(), out.data() + room);
      const View<CharOut> written(out.data(), static_cast<std::size_t>(at.out - out.data()));
      ASSERT_EQ(written, View<CharOut>(expected).substr(0, written.size()))
          << kernels->name << ", room for " << room;
      ASSERT_EQ(at.stop == mirel::detail::Stop::kEnd, room >= expected.size())
          << kernels->name << ", room for " << room;
      ASSERT_EQ(at.p == end, at.stop == mirel::detail::Stop::kEnd);
    }
}

TEST(Utf, StaysWithinItsRoom) {
  const char8* const sequences[] = {"a", "\u00E9", "\u20AC", "\U0001F600", "a\u20AC", "\u00E9\U0001F600b"};
  for (const char8* const sequence : sequences)
    for (int n = 0; n < 70; ++n) {
      Text<char8> bytes;
      for (int k = 0; k < n; ++k)
        bytes += sequence;
      Text<char16> units;
      ASSERT_TRUE(Convert(units, bytes));
      ASSERT_NO_FATAL_FAILURE(CheckEveryRoom<char16>(View<char8>(bytes)));
      ASSERT_NO_FATAL_FAILURE(CheckEveryRoom<char8>(View<char16>(units)));
    }
}
#endif

/// Expects that the destination keeps its capacity, or gets that of the result and its terminator.
template <class CharOut, class CharIn> void CheckCapacity(const Text<CharIn>& text, bool isWellFormed) {
  ForEachConverter<CharOut, CharIn>([&](const auto& convert, const char* name) {
    for (const ssize_t before : {0, 1, 30, 400, 2000}) {
      basic_xstring<CharOut> dst;
      dst.reserve(before);
      const CharIn* const src = text.data();
      const ssize_t srcLen = static_cast<ssize_t>(text.size());
      EXPECT_EQ(convert(dst, src, srcLen), isWellFormed) << name;
      EXPECT_EQ(dst.capacity(), std::max(before, dst.size() + 1)) << name << " from " << before;
      const auto* const data = dst.data();
      EXPECT_EQ(dst.c_str(), data) << name << " from " << before;
    }
  });
}

TEST(Utf, CapacityIsGivenBack) {
  Text<char8> bytes;
  Text<char16> units;
  for (int n = 0; n < 200; ++n) {
    bytes += n % 3 == 0 ? "a" : "\u20AC";
    units += n % 3 == 0 ? char16{'a'} : char16{0x20AC};
  }
  for (const std::size_t n : {1u, 5u, 20u, 97u, 200u}) {
    CheckCapacity<char16>(bytes.substr(0, n - n % 7 + 1), true); // at boundaries of sequences
    CheckCapacity<char8>(units.substr(0, n), true);
  }
  CheckCapacity<char16>(bytes + "\xFF", false);
  CheckCapacity<char8>(units + char16{0xD800}, false);
  mirel::string16 wide;
  mirel::Utf16FromAscii(wide, bytes.data(), 100);
  const char16* const data = wide.data();
  EXPECT_EQ(wide.c_str(), data) << "the terminator has room";
}

/// A view is copied in parts of 1,024 units.
TEST(Utf, APairMayStandWhereAPartOfAViewEnds) {
  for (const std::size_t n : {1022u, 1023u, 1024u}) {
    mirel::string8 dst;
    EXPECT_TRUE(mirel::Utf8FromUtf16(dst, std::u16string(n, u'a') + u"\U0001F600b"));
    EXPECT_EQ(std::string(dst.data(), std::size_t(dst.size())), std::string(n, 'a') + "\U0001F600b");
  }
}

TEST(Utf, NonAsciiBecomesAQuestionMarkAtEveryPlace) {
  mirel::string16 wide;
  for (std::size_t n = 1; n < 100; ++n)
    for (std::size_t at = 0; at < n; ++at) {
      std::vector<char8> text(n, 'a');
      Text<char16> expected(n, 'a');
      text[at] = static_cast<char8>(0x80 + at);
      expected[at] = '?';
      mirel::Utf16FromAscii(wide, text.data(), static_cast<ssize_t>(n));
      ASSERT_EQ(Std(wide), expected);
    }
  mirel::Utf16FromAscii(wide, nullptr, 0);
  EXPECT_TRUE(wide.empty());
}

} // namespace
