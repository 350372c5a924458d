// Malformed text, lengths, code points, and conversions that are lossy, append or take pieces, compared with
// the oracle and, where it is installed, with ICU: by every kernel of the processor and by the scalar path.
#include "TextChecks.h"

#include <random>
#include <vector>

#include <utils/Utf.h>

#ifdef HAVE_ICU
#include <unicode/ustring.h>
#endif

namespace {

using namespace oracle;

const Text<char8> kPieces8[] = {
    "a", "\xC3\xA9", "\xE2\x82\xAC", "\xF0\x9F\x98\x80", "\xDF\xBF", "\xEF\xBC\x8C", "\xED\x9F\xBF",
    "\xF4\x8F\xBF\xBF",
    // malformed: overlong, surrogates, beyond U+10FFFF, truncated or wrong in one byte, invalid
    "\xC0\xAF", "\xC1\xA9", "\xE0\x9F\xBF", "\xED\xA0\x80", "\xF0\x8F\xBF\xBF", "\xF4\x90\x80\x80",
    "\xF5\x80\x80\x80", "\x80", "\xC3", "\xE1", "\xE2\x82", "\xE0\xA0", "\xF0\x9F\x98", "\xF1\x80", "\xFF",
    "\xC3 ", "\x82\xAC", "\xC3\xA9\xA9", "\xE1 \xAC", "\xE1\x82 ", "\xE2\xC0\xAC", "\xF0\xA0\x80 "};
const Text<char16> kPieces16[] = {{'a'},    {0xE9},   {0x20AC}, {0xD83D, 0xDE00}, {0x7F},
                                  {0x80},   {0x7FF},  {0x800},  {0xFF0C},         {0xDBFF, 0xDFFF},
                                  {0xD800}, {0xDFFF}, {0xDBFF}, {0xDC00, 0xD800}};
const auto& Pieces(char8) { return kPieces8; }
const auto& Pieces(char16) { return kPieces16; }

/// Makes a random text of size units: some of the well-formed pieces, with random code points in place of the
/// first four at times, and a random share of malformed pieces. The last piece may be truncated.
template <class T, class Random> Text<T> Mixture(Random& random, std::size_t size) {
  const auto& pieces = Pieces(T());
  const auto kinds = random(), rarity = 1 + random() % 60;
  constexpr std::size_t kWellFormed = sizeof(T) == 1 ? 8 : 10;
  Text<T> text;
  while (text.size() < size) {
    const std::size_t kind = random() % (random() % rarity == 0 ? std::size(pieces) : kWellFormed);
    static constexpr char32_t kLimits[] = {0, 0x80, 0x800, 0x10000, 0x110000};
    const auto length = kind % 4;
    const char32_t c = kLimits[length] + char32_t(random()) % (kLimits[length + 1] - kLimits[length]);
    if (kind < kWellFormed && (kinds >> kind & 1) == 0 && kinds % 8 != 0)
      continue;
    if (kind < 4 && random() % 2 == 0 && !IsSurrogate(c))
      Put(text, c);
    else
      text += pieces[kind];
  }
  text.resize(size);
  return text;
}

template <class T> class UtfText : public testing::Test {};
TYPED_TEST_SUITE(UtfText, CodeUnits);

/// One or two sequences between n equal ones on both sides: every kind of block, and every place in it.
TYPED_TEST(UtfText, SequencesAtEveryPlaceInABlockAreReadAsByTheOracle) {
  const auto& pieces = Pieces(TypeParam());
  const Text<TypeParam> fault(1, static_cast<TypeParam>(sizeof(TypeParam) == 1 ? 0xFF : 0xDC00));
  for (std::size_t n = 0; n < 135; ++n)
    for (const auto& filler : {pieces[0], pieces[1], pieces[2], pieces[3]})
      for (const auto& first : pieces) {
        Text<TypeParam> text;
        for (std::size_t k = 0; k < n; ++k)
          text += filler;
        ASSERT_NO_FATAL_FAILURE(CheckText<TypeParam>(text + first + text));
        const auto& second = pieces[n % std::size(pieces)];
        ASSERT_NO_FATAL_FAILURE(CheckText<TypeParam>(text + first + second));
        // Kernels that replace malformed text begin a block at a fault.
        ASSERT_NO_FATAL_FAILURE(CheckText<TypeParam>(fault + text + first + second + text));
      }
}

TYPED_TEST(UtfText, MixturesAreReadAsByTheOracle) {
  std::mt19937 random(3);
  ASSERT_NO_FATAL_FAILURE(CheckText(Text<TypeParam>())) << "a null pointer is an empty text";
  for (int round = 0; round < 3000; ++round)
    ASSERT_NO_FATAL_FAILURE(CheckText(Mixture<TypeParam>(random, random() % (round % 64 == 0 ? 4000 : 500))));
}

/// More units than the lanes of a kernel can count before they are summed.
TYPED_TEST(UtfText, LongTextIsCounted) {
  const Text<TypeParam> text(1200000, 'a');
  EXPECT_EQ(mirel::CountCodePoints(text.data(), 1200000), 1200000);
  EXPECT_EQ(OtherLength(text), 1200000);
  ForEachKernels([&](const mirel::detail::Kernels* kernels) {
    SCOPED_TRACE(kernels != nullptr ? kernels->name : "scalar");
    const auto lengths = mirel::detail::Measure(kernels, text.data(), text.data() + text.size());
    EXPECT_EQ(lengths.codePoints, 1200000);
    EXPECT_EQ(lengths.units, 1200000);
  });
}

TEST(UtfText, EachFaultHasItsReason) {
  struct {
    Text<char8> text;
    ssize_t length;
    MalformedReason reason;
    const char* words;
  } const rows[] = {{"\xC3", 1, MalformedReason::kTruncated, "truncated sequence"},
                    {"\xC3x", 1, MalformedReason::kTruncated, "truncated sequence"},
                    {"\xE2\x82\xC3", 2, MalformedReason::kTruncated, "truncated sequence"},
                    {"\xF0\x9F\x98", 3, MalformedReason::kTruncated, "truncated sequence"},
                    {"\xF4", 1, MalformedReason::kTruncated, "truncated sequence"},
                    {"\x80", 1, MalformedReason::kUnexpectedContinuation, "unexpected continuation byte"},
                    {"\xBF", 1, MalformedReason::kUnexpectedContinuation, "unexpected continuation byte"},
                    {"\xC0\x80", 1, MalformedReason::kOverlong, "overlong sequence"},
                    {"\xC1", 1, MalformedReason::kOverlong, "overlong sequence"},
                    {"\xE0\x9F\xBF", 1, MalformedReason::kOverlong, "overlong sequence"},
                    {"\xF0\x8F\xBF", 1, MalformedReason::kOverlong, "overlong sequence"},
                    {"\xED\xA0\x80", 1, MalformedReason::kSurrogate, "surrogate in UTF-8"},
                    {"\xF4\x90", 1, MalformedReason::kBeyondUnicode, "code point above U+10FFFF"},
                    {"\xF5\x80", 1, MalformedReason::kInvalidByte, "invalid byte"},
                    {"\xFF", 1, MalformedReason::kInvalidByte, "invalid byte"},
                    {"\xC3\xA9", 2, MalformedReason::kNone, "well-formed sequence"}};
  for (const auto& row : rows) {
    const auto malformed = mirel::ExplainMalformed("a" + row.text, 1);
    EXPECT_EQ(malformed.offset, 1);
    EXPECT_EQ(malformed.length, row.length) << testing::PrintToString(row.text);
    EXPECT_EQ(malformed.reason, row.reason) << testing::PrintToString(row.text);
    EXPECT_STREQ(mirel::Describe(malformed.reason), row.words);
  }
  EXPECT_STREQ(mirel::Describe(mirel::ExplainMalformed(mirel::string16(1, 0xD800), 0).reason),
               "unpaired surrogate");
}

TYPED_TEST(UtfText, AnyPiecesGiveTheResultOfTheWhole) {
  std::mt19937 random(4);
  for (int round = 0; round < 400; ++round) {
    const Text<TypeParam> text = Mixture<TypeParam>(random, random() % 14);
    SCOPED_TRACE(testing::PrintToString(text));
    std::vector<std::size_t> every;
    for (std::size_t i = 0; i <= text.size(); ++i) {
      every.push_back(i);
      for (std::size_t k = i; k <= text.size(); ++k)
        ASSERT_NO_FATAL_FAILURE(CheckPieces(text, {i, k, text.size()}));
    }
    ASSERT_NO_FATAL_FAILURE(CheckPieces(text, every));
  }
}

TEST(UtfText, AStreamStopsAtMalformedText) {
  mirel::Utf8Stream stream;
  mirel::string16 dst;
  EXPECT_TRUE(stream.Append(dst, "ab\xE2"));
  EXPECT_EQ(stream.pending(), 1);
  EXPECT_EQ(stream.position(), 3);
  EXPECT_TRUE(stream.Append(dst, "\x82", 1));
  EXPECT_EQ(dst.size(), 2);
  EXPECT_FALSE(stream.Append(dst, "cd", 2));
  EXPECT_EQ(stream.malformed().offset, 2);
  EXPECT_EQ(stream.malformed().length, 2);
  EXPECT_EQ(stream.malformed().reason, MalformedReason::kTruncated);
  EXPECT_FALSE(stream.Append(dst, "e", 1)) << "a stopped stream takes nothing";
  EXPECT_FALSE(stream.Finish(dst));
  EXPECT_EQ(dst.size(), 2);
  EXPECT_TRUE(stream.Append(dst, "e", 1)) << "the next text begins";
  EXPECT_EQ(stream.malformed().offset, kNpos);
  EXPECT_TRUE(stream.Append(dst, nullptr, 0));
  EXPECT_TRUE(stream.Finish(dst));
  EXPECT_TRUE(stream.Finish(dst)) << "an empty text is well-formed";
  EXPECT_EQ(dst.size(), 3);
}

TYPED_TEST(UtfText, AppendingManyTimesAllocatesSeldom) {
  basic_xstring<Other<TypeParam>> dst;
  const Text<TypeParam> text(17, 'a');
  EXPECT_LT(allocation::Count([&] {
              for (int i = 0; i < 20000; ++i)
                AppendOther(dst, text.data(), 17);
            }),
            50);
  EXPECT_EQ(dst.size(), 20000 * 17);
}

TEST(UtfText, TakesStringsViewsAndLiterals) {
  const mirel::string8 text = "a\u20AC\xFF";
  EXPECT_EQ(mirel::FindMalformed(text), 4);
  EXPECT_EQ(mirel::FindMalformed(std::string("a\u20AC\xFF")), 4);
  EXPECT_EQ(mirel::FindMalformed("a\u20AC\xFF"), 4);
  EXPECT_FALSE(mirel::IsWellFormed(std::string_view("\xFF")));
  EXPECT_TRUE(mirel::IsWellFormed("a"));
  EXPECT_EQ(mirel::CountCodePoints(text), 3);
  EXPECT_EQ(mirel::CountCodePoints("a\u20AC\xFF"), 3);
  EXPECT_EQ(mirel::Utf16Length("\U0001F600"), 2);
  EXPECT_STREQ(mirel::Describe(static_cast<MalformedReason>(99)), "well-formed sequence");
  EXPECT_FALSE(mirel::IsWellFormed(text));
  EXPECT_EQ(mirel::ExplainMalformed(text, 4).reason, MalformedReason::kInvalidByte);
  EXPECT_EQ(mirel::Utf16Length(text), 3);
  EXPECT_EQ((--mirel::CodePoints(text).end()).position(), 4);
  EXPECT_EQ(*mirel::CodePoints("b").begin(), U'b');
  mirel::string16 wide;
  EXPECT_EQ(mirel::Utf16FromUtf8Lossy(wide, "a\u20AC\xFF"), 1);
  EXPECT_EQ(Std(wide), (Text<char16>{'a', 0x20AC, 0xFFFD}));
  EXPECT_TRUE(mirel::AppendUtf16(wide, std::string("b")));
  EXPECT_TRUE(mirel::IsWellFormed(wide));
  EXPECT_EQ(*--mirel::CodePoints(wide).end(), U'b');
  EXPECT_EQ(mirel::CountCodePoints(wide), 4);
  EXPECT_EQ(mirel::Utf8Length(wide), 8);
  EXPECT_FALSE(mirel::AppendUtf16(wide, text));
  EXPECT_EQ(mirel::Utf16FromUtf8Lossy(wide, text), 1);
  EXPECT_FALSE(mirel::Utf8Stream().Append(wide, text));
  EXPECT_FALSE(mirel::Utf16FromUtf8(wide, text));
  EXPECT_EQ(Std(wide), (Text<char16>{'a', 0x20AC}));
  EXPECT_TRUE(mirel::Utf16FromUtf8(wide, "yz\0 after the end"));
  mirel::string8 narrow;
  EXPECT_TRUE(mirel::Utf8FromUtf16(narrow, wide.c_str()));
  EXPECT_EQ(Std(narrow), "yz");
  EXPECT_TRUE(mirel::Utf16FromUtf8(wide, std::string_view("xyz").substr(1)));
  EXPECT_TRUE(mirel::Utf8FromUtf16(narrow, wide));
  EXPECT_TRUE(mirel::AppendUtf8(narrow, wide));
  EXPECT_EQ(Std(narrow), "yzyz");
  EXPECT_EQ(mirel::Utf8FromUtf16Lossy(narrow, mirel::string16(2, 0xDC00)), 2);
  EXPECT_EQ(Std(narrow), "\uFFFD\uFFFD");
}

TYPED_TEST(UtfText, CodePointsAreAppended) {
  basic_xstring<TypeParam> s;
  Text<TypeParam> expected;
  for (const char32_t c : {0u, 0x7Fu, 0x80u, 0x7FFu, 0x800u, 0xFFFFu, 0xD7FFu, 0xE000u, 0x10000u, 0x10FFFFu,
                           0xD800u, 0xDFFFu, 0x110000u}) {
    mirel::AppendCodePoint(s, c);
    Put(expected, IsSurrogate(c) || c > 0x10FFFF ? 0xFFFD : c);
    EXPECT_EQ(Std(s), expected);
  }
}

using Iterator = mirel::CodePointIterator<char8>;
static_assert(std::is_same_v<std::iterator_traits<Iterator>::iterator_category, std::input_iterator_tag>);
static_assert(std::is_same_v<Iterator::iterator_concept, std::bidirectional_iterator_tag>);
#ifdef __cpp_lib_ranges
static_assert(std::bidirectional_iterator<Iterator>);
static_assert(std::ranges::bidirectional_range<mirel::CodePointRange<char16>>);
#endif

#ifdef HAVE_ICU
TEST(UtfText, AMillionMutatedTextsAreReplacedAsByIcu) {
  std::mt19937 random(8);
  mirel::string16 wide;
  mirel::string8 narrow;
  char16_t units[256];
  char bytes[1024];
  for (int round = 0; round < 1000000; ++round) {
    Text<char8> text = Mixture<char8>(random, 1 + random() % 40);
    text[random() % text.size()] = static_cast<char8>(random());
    int32_t n = 0, count = 0;
    UErrorCode error = U_ZERO_ERROR;
    u_strFromUTF8WithSub(units, 256, &n, text.data(), int32_t(text.size()), 0xFFFD, &count, &error);
    ASSERT_EQ(mirel::Utf16FromUtf8Lossy(wide, text.data(), ssize_t(text.size())), count);
    ASSERT_EQ(std::u16string(wide.begin(), wide.end()), std::u16string(units, std::size_t(n)))
        << testing::PrintToString(text);
    wide[ssize_t(random()) % wide.size()] = static_cast<char16>(0xD800 + random() % 0x800);
    const std::u16string mutated(wide.begin(), wide.end());
    u_strToUTF8WithSub(bytes, 1024, &n, mutated.data(), int32_t(mutated.size()), 0xFFFD, &count, &error);
    ASSERT_EQ(mirel::Utf8FromUtf16Lossy(narrow, wide), count);
    ASSERT_EQ(Std(narrow), std::string(bytes, std::size_t(n))) << testing::PrintToString(mutated);
  }
}
#endif

} // namespace
