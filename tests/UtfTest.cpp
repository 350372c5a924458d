// The conversions beside their oracle, on all short inputs and on those that change between the ways in which
// plain text, text near the end and everything else are converted.
#include "Oracle.h"

#include <vector>

namespace {

using namespace oracle;

TEST(Utf, EveryScalarValueBothWays) {
  Text<char8> allBytes, bytes;
  Text<char16> allUnits, units;
  for (char32_t c = 0; c <= 0x10FFFF; ++c) {
    if (IsLead(c) || IsTrail(c))
      continue;
    bytes.clear(), units.clear();
    Put(bytes, c), Put(units, c);
    ASSERT_NO_FATAL_FAILURE(CheckUtf8(bytes));
    ASSERT_NO_FATAL_FAILURE(CheckUtf16(units));
    allBytes += bytes, allUnits += units;
  }
  CheckUtf8(allBytes), CheckUtf16(allUnits);
  ASSERT_TRUE(Convert(units, allBytes) && units == allUnits) << "the oracle goes both ways";
}

TEST(Utf, EverySequenceOfUpToThreeBytes) {
  for (unsigned bytes = 0; bytes < 1u << 24; ++bytes) {
    const char8 text[] = {static_cast<char8>(bytes >> 16), static_cast<char8>(bytes >> 8),
                          static_cast<char8>(bytes)};
    const std::size_t zeros = bytes < 0x100 ? 2 : bytes < 0x10000; // they were seen before
    ASSERT_NO_FATAL_FAILURE(CheckAmongLetters(View<char8>(text, 3).substr(zeros)));
  }
}

TEST(Utf, FourBytes) {
  const unsigned tails[] = {0x7F, 0x80, 0x9A, 0xBF, 0xC0};
  for (unsigned lead = 0xF0; lead < 0x100; ++lead)
    for (unsigned second = 0; second < 0x100; ++second)
      for (const unsigned c : tails)
        for (const unsigned d : tails) {
          const char8 text[] = {static_cast<char8>(lead), static_cast<char8>(second), static_cast<char8>(c),
                                static_cast<char8>(d)};
          ASSERT_NO_FATAL_FAILURE(CheckAmongLetters(View<char8>(text, 4)));
        }
}

TEST(Utf, SurrogatesMustPair) {
  const char16 values[] = {0,      0x41,   0x7F,   0x80,   0x7FF,  0x800, 0xD7FF,
                           0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xE000, 0xFFFF};
  for (const char16 a : values)
    for (const char16 b : values)
      for (const char16 c : values)
        ASSERT_NO_FATAL_FAILURE(CheckAmongLetters(Text<char16>{a, b, c}));
}

TEST(Utf, OneThatIsDifferentInARun) {
  const char8* const bytes[] = {
      "a", "\xC3\xA9", "\xE2\x82\xAC", "\xF0\x9F\x98\x80", "\xDF\xBF", "\xEF\xBC\x8C",
      // overlong, surrogates, cut off or wrong in one byte
      "\xC1\xA9", "\xE0\x9F\xBF", "\xED\xA0\x80", "\xC3", "\xE1", "\xE1\x82", "\xFF", "\xC3 ", "\x82\xAC",
      "\xC3\xA9\xA9", "\xE1 \xAC", "\xE1\x82 ", "\xF0\xA0\x80\x80"};
  const Text<char16> units[] = {{'a'},    {0xE9},   {0x20AC},         {0x7F},   {0x80},  {0x7FF},
                                {0x0800}, {0xFF0C}, {0xD83D, 0xDE00}, {0xD83D}, {0xDE00}};
  const auto run = [](const auto& one, std::size_t n) {
    auto text = one;
    for (text.clear(); n > 0; --n)
      text += one;
    return text;
  };
  std::vector<std::size_t> lengths{1020, 1023, 1024, 5000};
  for (std::size_t n = 0; n < 72; ++n)
    lengths.push_back(n);
  for (const std::size_t n : lengths)
    for (int filler = 0; filler < 3; ++filler) {
      for (const char8* one : bytes)
        CheckUtf8(run(Text<char8>(bytes[filler]), n) + one + run(Text<char8>(bytes[filler]), n));
      for (const Text<char16>& one : units)
        CheckUtf16(run(units[filler], n) + one + run(units[filler], n));
    }
}

TEST(Utf, CutOffAtEveryPlace) {
  Text<char8> text;
  Text<char16> units;
  for (int i = 0; i < 3; ++i)
    text += "a\u00E9\u20AC\U0001F600\U0001F600\u20AC\u20AC\u00E9\u00E9\u00E9\u00E9\u00E9\u20AC";
  ASSERT_TRUE(Convert(units, text));
  for (std::size_t size = 0; size <= text.size(); ++size) // what is behind the end would be well-formed
    CheckUtf8(View<char8>(text).substr(0, size));
  for (std::size_t size = 0; size <= units.size(); ++size)
    CheckUtf16(View<char16>(units).substr(0, size));
}

TEST(Utf, EntryPoints) {
  mirel::string16 wide = Of<char16>("old");
  mirel::string8 narrow = "old";
  EXPECT_TRUE(mirel::Utf16FromUtf8(wide, "a\u20AC\0b") && wide.size() == 2 && wide[1] == 0x20AC);
  EXPECT_TRUE(mirel::Utf8FromUtf16(narrow, wide.c_str()) && narrow._Eq("a\u20AC"));
  EXPECT_TRUE((mirel::UtfToUtf<char16, char8>(wide, nullptr, 0)) && wide.empty());
  EXPECT_TRUE(mirel::UtfToUtf(narrow, wide.data(), 0) && narrow.empty());
  mirel::Utf16FromAscii(wide, "A\x80\xFF\0", 4);
  EXPECT_EQ(Std(wide), (Text<char16>{'A', '?', '?', 0}));
  mirel::Utf16FromAscii(wide, nullptr, 0);
  EXPECT_TRUE(wide.empty());
}

} // namespace
