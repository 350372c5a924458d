// The conversions against a decoder of our own, written from the Unicode Standard: table 3-7 lists the
// well-formed UTF-8 sequences by their first two bytes, definition D91 the surrogate pairs.
#include "Support.h"

#include <optional>
#include <vector>

namespace {

using Units = std::basic_string<char16>;

struct Row {
  int first, last, secondFirst, secondLast, length;
};
constexpr Row kTable[] = {
    {0x00, 0x7F, 0, 0, 1},       {0xC2, 0xDF, 0x80, 0xBF, 2}, {0xE0, 0xE0, 0xA0, 0xBF, 3},
    {0xE1, 0xEC, 0x80, 0xBF, 3}, {0xED, 0xED, 0x80, 0x9F, 3}, {0xEE, 0xEF, 0x80, 0xBF, 3},
    {0xF0, 0xF0, 0x90, 0xBF, 4}, {0xF1, 0xF3, 0x80, 0xBF, 4}, {0xF4, 0xF4, 0x80, 0x8F, 4}};

/// The length of the well-formed sequence that text begins with, 0 if there is none.
std::size_t SequenceLength(const std::string& text, std::size_t at) {
  const auto byte = [&](std::size_t i) { return i < text.size() ? static_cast<unsigned char>(text[i]) : -1; };
  for (const Row& row : kTable) {
    if (byte(at) < row.first || byte(at) > row.last)
      continue;
    bool ok = row.length == 1 || (byte(at + 1) >= row.secondFirst && byte(at + 1) <= row.secondLast);
    for (int i = 2; i < row.length; ++i)
      ok = ok && byte(at + static_cast<std::size_t>(i)) >= 0x80 &&
           byte(at + static_cast<std::size_t>(i)) <= 0xBF;
    return ok ? static_cast<std::size_t>(row.length) : 0;
  }
  return 0;
}

std::string Utf8(char32_t c) {
  const auto tail = [c](int shift) { return static_cast<char>(0x80 | (c >> shift & 0x3F)); };
  if (c < 0x80)
    return {static_cast<char>(c)};
  if (c < 0x800)
    return {static_cast<char>(0xC0 | c >> 6), tail(0)};
  if (c < 0x10000)
    return {static_cast<char>(0xE0 | c >> 12), tail(6), tail(0)};
  return {static_cast<char>(0xF0 | c >> 18), tail(12), tail(6), tail(0)};
}

Units Utf16(char32_t c) {
  if (c < 0x10000)
    return {static_cast<char16>(c)};
  return {static_cast<char16>(0xD800 + ((c - 0x10000) >> 10)),
          static_cast<char16>(0xDC00 + ((c - 0x10000) & 0x3FF))};
}

bool IsSurrogate(char32_t c) { return c >= 0xD800 && c <= 0xDFFF; }

/// Converts from a destination that held text, and checks result and units.
void ExpectUtf16(const std::string& text, bool ok, const Units& units) {
  static mirel::string16 dst;
  dst.assign(3, 0x78);
  ASSERT_EQ(mirel::Utf16FromUtf8(dst, text.data(), static_cast<ssize_t>(text.size())), ok)
      << testing::PrintToString(text);
  ASSERT_EQ(Std(dst), units) << testing::PrintToString(text);
}
void ExpectUtf8(const Units& units, bool ok, const std::string& text) {
  static mirel::string8 dst;
  dst.assign(3, 'x');
  ASSERT_EQ(mirel::Utf8FromUtf16(dst, units.data(), static_cast<ssize_t>(units.size())), ok)
      << testing::PrintToString(units);
  ASSERT_EQ(Std(dst), text) << testing::PrintToString(units);
}

TEST(Utf, EveryScalarValueBothWays) {
  std::string allBytes;
  Units allUnits;
  for (char32_t c = 0; c <= 0x10FFFF; ++c) {
    if (IsSurrogate(c))
      continue;
    ASSERT_NO_FATAL_FAILURE(ExpectUtf16(Utf8(c), true, Utf16(c)));
    ASSERT_NO_FATAL_FAILURE(ExpectUtf8(Utf16(c), true, Utf8(c)));
    allBytes += Utf8(c), allUnits += Utf16(c);
  }
  ExpectUtf16(allBytes, true, allUnits);
  ExpectUtf8(allUnits, true, allBytes);
}

TEST(Utf, EverySequenceOfUpToThreeBytes) {
  // Decoding stops at the first bad sequence, so of each sequence only the longest good prefix matters.
  const auto check = [](const std::string& text) {
    Units units;
    std::size_t at = 0;
    for (std::size_t n; at < text.size() && (n = SequenceLength(text, at)) != 0; at += n) {
      char32_t c = static_cast<unsigned char>(text[at]) & (n == 1 ? 0x7Fu : 0xFFu >> (n + 1));
      for (std::size_t i = 1; i < n; ++i)
        c = c << 6 | (static_cast<unsigned char>(text[at + i]) & 0x3F);
      units += Utf16(c);
    }
    ExpectUtf16(text, at == text.size(), units);
  };
  for (unsigned bytes = 0; bytes < 1u << 24; ++bytes) {
    const std::string text = {static_cast<char>(bytes >> 16), static_cast<char>(bytes >> 8),
                              static_cast<char>(bytes)};
    ASSERT_NO_FATAL_FAILURE(
        check(text.substr(bytes < 0x100 ? 2 : bytes < 0x10000))); // zeros were seen before
    ASSERT_NO_FATAL_FAILURE(check(text + "more")); // what is near the end is converted in another way
  }
  const unsigned tails[] = {0x7F, 0x80, 0x9A, 0xBF, 0xC0};
  for (unsigned lead = 0xF0; lead < 0x100; ++lead)
    for (unsigned second = 0; second < 0x100; ++second)
      for (const unsigned c : tails)
        for (const unsigned d : tails)
          for (const char* more : {"", "more"}) {
            const std::string text = {static_cast<char>(lead), static_cast<char>(second),
                                      static_cast<char>(c), static_cast<char>(d)};
            ASSERT_NO_FATAL_FAILURE(check(text + more));
          }
  for (const std::size_t before : {15u, 16u, 47u, 48u, 1023u, 1024u, 5000u})
    for (const char* text :
         {"\xC3\xA9", "\xE2\x82\xAC", "\xF0\x9F\x98\x80", "\xFF", "\xE2\x82", "\xED\xA0\x80"})
      check(std::string(before, 'a') + text + std::string(before, 'b'));
}

TEST(Utf, SurrogatesMustPair) {
  const char32_t values[] = {0,      0x41,   0x7F,   0x80,   0x7FF,  0x800, 0xD7FF,
                             0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xE000, 0xFFFF};
  const auto isLead = [](char32_t c) { return c >= 0xD800 && c <= 0xDBFF; };
  for (const char32_t a : values)
    for (const char32_t b : values)
      for (const char32_t c : values) {
        const char32_t units[] = {a, b, c};
        std::string text;
        int i = 0;
        for (; i < 3; ++i) {
          if (!IsSurrogate(units[i]))
            text += Utf8(units[i]);
          else if (isLead(units[i]) && i < 2 && IsSurrogate(units[i + 1]) && !isLead(units[i + 1]))
            text += Utf8(0x10000 + ((units[i] - 0xD800) << 10) + (units[i + 1] - 0xDC00)), ++i;
          else
            break;
        }
        Units input = {static_cast<char16>(a), static_cast<char16>(b), static_cast<char16>(c)};
        ExpectUtf8(input, i == 3, text);
        ExpectUtf8(input += Units(40, 'z'), i == 3, i == 3 ? text + std::string(40, 'z') : text);
      }
}

TEST(Utf, EntryPoints) {
  mirel::string16 wide = Of<char16>("old");
  mirel::string8 narrow = "old";
  EXPECT_TRUE(mirel::Utf16FromUtf8(wide, "a\u20AC\0b") && wide.size() == 2 && wide[1] == 0x20AC);
  EXPECT_TRUE(mirel::Utf8FromUtf16(narrow, wide.c_str()) && narrow._Eq("a\u20AC"));
  EXPECT_TRUE((mirel::UtfToUtf<char16, char8>(wide, nullptr, 0)) && wide.empty());
  EXPECT_TRUE(mirel::UtfToUtf(narrow, wide.data(), 0) && narrow.empty());
  mirel::Utf16FromAscii(wide, "A\x80\xFF\0", 4);
  EXPECT_EQ(Std(wide), (Units{'A', '?', '?', 0}));
  mirel::Utf16FromAscii(wide, nullptr, 0);
  EXPECT_TRUE(wide.empty());
}

} // namespace
